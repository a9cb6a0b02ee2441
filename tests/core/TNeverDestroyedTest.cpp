// SPDX-License-Identifier: Apache-2.0
#include "core/TNeverDestroyed.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace NQRVZEP20 {
namespace {

struct TCounted {
  TCounted(int& destroyed, std::unique_ptr<std::string> text) : fDestroyed(destroyed), fText(std::move(text)) {}
  ~TCounted() { ++fDestroyed; }

  int& fDestroyed;
  std::unique_ptr<std::string> fText;
};

TEST(TNeverDestroyedTest, TheObjectOutlivesItsHolder) {
  int destroyed = 0;
  {
    TNeverDestroyed<TCounted> kept(destroyed, nullptr);
    EXPECT_EQ(&kept->fDestroyed, &destroyed);
  }
  EXPECT_EQ(destroyed, 0);
}

TEST(TNeverDestroyedTest, ArgumentsAreForwarded) {
  int destroyed = 0;
  TNeverDestroyed<TCounted> kept(destroyed, std::make_unique<std::string>("text"));
  EXPECT_EQ(*kept->fText, "text");
  (*kept).fText.reset();
}

}  // namespace
}  // namespace NQRVZEP20
