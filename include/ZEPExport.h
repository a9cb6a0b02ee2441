#pragma once

// Marks what libzepcore.so exports. Everything else in the library is hidden.
#define ZEP_EXPORT __attribute__((visibility("default")))
