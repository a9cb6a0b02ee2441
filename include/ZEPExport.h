// SPDX-License-Identifier: Apache-2.0
#pragma once

// Marks a symbol that libzepcore.so exports. Every other symbol of the library is hidden.
#define ZEP_EXPORT __attribute__((visibility("default")))
