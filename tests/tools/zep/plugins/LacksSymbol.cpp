// SPDX-License-Identifier: Apache-2.0

// A plug-in that cannot be loaded, because it uses a function that no library has.

int SymbolThatIsMissing(int number);

extern "C" __attribute__((visibility("default"))) int UseIt() { return SymbolThatIsMissing(1); }
