// SPDX-License-Identifier: Apache-2.0

// A consumer plug-in, whose consumer reports its end.

#include "INamespaceConsumer.h"

#include <cstdio>

extern "C" ZEP_EXPORT int const gFanConsumerMark = 1;

namespace {

class TFanConsumer : public NQRVZEP20::INamespaceConsumer {
public:
  ~TFanConsumer() override { std::puts("the Fan consumer ends"); }
};

}  // namespace

extern "C" ZEP_EXPORT NQRVZEP20::INamespaceConsumer* Fan_CreateINamespaceConsumer() { return new TFanConsumer; }
