// SPDX-License-Identifier: Apache-2.0

// A consumer plug-in whose factory lacks the base name in front.

#include "INamespaceConsumer.h"

extern "C" ZEP_EXPORT NQRVZEP20::INamespaceConsumer* CreateINamespaceConsumer() { return nullptr; }
