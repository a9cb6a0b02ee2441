// SPDX-License-Identifier: Apache-2.0

// A consumer plug-in whose factory's name lacks the base name at its start.

#include "INamespaceConsumer.h"

extern "C" ZEP_EXPORT NQRVZEP20::INamespaceConsumer* CreateINamespaceConsumer() { return nullptr; }
