// SPDX-License-Identifier: Apache-2.0

// A consumer plug-in whose factory makes nothing.

#include "INamespaceConsumer.h"

extern "C" ZEP_EXPORT NQRVZEP20::INamespaceConsumer* Null_CreateINamespaceConsumer() { return nullptr; }
