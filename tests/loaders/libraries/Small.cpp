// SPDX-License-Identifier: Apache-2.0

// A library that a test opens. It has one function if SMALL_NUMBER is defined, and none otherwise.

#ifdef SMALL_NUMBER
extern "C" __attribute__((visibility("default"))) int SmallNumber() { return SMALL_NUMBER; }
#endif
