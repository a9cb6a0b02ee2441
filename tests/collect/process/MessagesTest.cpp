// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Messages.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(MessagesTest, MessagesAreReadFromPiecesOfAnySize) {
  std::string const bytes = HeadOf(EMessage::kFailed, 3) + "why" + HeadOf(EMessage::kDone, 0);
  TMessageReader reader;
  std::string read;
  for (char const byte : bytes) {
    reader.Add(std::string_view(&byte, 1));
    while (auto const message = reader.Next()) read += std::to_string(static_cast<int>(message->fKind)) + message->fText + ";";
  }
  EXPECT_EQ(read, std::to_string(static_cast<int>(EMessage::kFailed)) + "why;" +
                      std::to_string(static_cast<int>(EMessage::kDone)) + ";");
  EXPECT_FALSE(reader.IsBad());
}

TEST(MessagesTest, WrongKindsAndLengthsAreBad) {
  for (std::string const& bytes : {std::string("\xff\0\0\0\0", 5), HeadOf(EMessage::kBytes, kLongestMessage + 1)}) {
    TMessageReader reader;
    reader.Add(bytes + HeadOf(EMessage::kDone, 0));
    EXPECT_FALSE(reader.Next());
    EXPECT_TRUE(reader.IsBad());
  }
}

TEST(MessagesTest, AMessageThatIsCutOffIsWaitedFor) {
  TMessageReader reader;
  reader.Add(HeadOf(EMessage::kBytes, kLongestMessage) + "begin");
  EXPECT_FALSE(reader.Next());
  EXPECT_FALSE(reader.IsBad());
}

}  // namespace
}  // namespace NQRVZEP20
