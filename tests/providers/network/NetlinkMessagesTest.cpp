// SPDX-License-Identifier: Apache-2.0
#include "providers/network/NetlinkMessages.h"

#include "tests/providers/network/NetlinkBytes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <vector>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

struct THeader {
  std::uint32_t fNumber;
};

std::string DumpOf(std::string const& attributes) { return Message(16, BytesOf(THeader{7}) + attributes) + End(); }

// The text of attribute 1 of each message of type 16, or the reason why it is missing.
std::vector<std::string> TextsIn(std::string const& dump) {
  std::vector<std::string> texts;
  VisitMessages<THeader>(dump, 16, [&](THeader const& header, TNetlinkAttributes const& attributes) {
    EXPECT_EQ(header.fNumber, 7u);
    auto const text = attributes.Text(1);
    texts.push_back(text ? *text : text.Why().fReason);
  });
  return texts;
}

TEST(NetlinkMessagesTest, AttributesAreFoundByType) {
  std::string const bytes = TextAttribute(1, "eth0") + NumberAttribute(2, std::uint32_t(1500)) + Attribute(3, "") +
                            NumberAttribute(4 | NLA_F_NESTED, std::uint16_t(9)) + TextAttribute(300, "unknown type");
  TNetlinkAttributes const attributes(bytes);
  EXPECT_EQ(*attributes.Text(1), "eth0");
  EXPECT_EQ(*attributes.Number<std::uint32_t>(2), 1500u);
  EXPECT_TRUE(attributes.Has(3));
  EXPECT_EQ(*attributes.Number<std::uint16_t>(4), 9u);
  EXPECT_FALSE(attributes.Has(5));
  EXPECT_FALSE(attributes.Has(300));
}

TEST(NetlinkMessagesTest, AMissingValueHasAReason) {
  std::string const bytes = TextAttribute(1, "") + NumberAttribute(2, std::uint16_t(1));
  TNetlinkAttributes const attributes(bytes);
  EXPECT_EQ(attributes.Text(1).Why().fReason, "the kernel reports an empty text");
  EXPECT_EQ(attributes.Number<std::uint32_t>(2).Why().fReason, "the kernel reports it with too few bytes");
  EXPECT_EQ(attributes.Number<std::uint32_t>(3).Why().fReason, "the kernel does not report it");
  EXPECT_EQ(attributes.Text(3).Why().fCode, "not-given");
}

TEST(NetlinkMessagesTest, NestedAttributesAreRead) {
  std::string const bytes =
      Attribute(18 | NLA_F_NESTED, TextAttribute(1, "vlan") + Attribute(2, NumberAttribute(1, std::uint16_t(10))));
  TNetlinkAttributes const info = TNetlinkAttributes(bytes).Nested(18);
  EXPECT_EQ(*info.Text(1), "vlan");
  EXPECT_EQ(*info.Nested(2).Number<std::uint16_t>(1), 10u);
  EXPECT_FALSE(info.Nested(3).Has(1));
}

TEST(NetlinkMessagesTest, DamagedAttributesEndTheList) {
  struct TRow {
    char const* fName;
    std::string fAttributes;
    std::string fText;
  } const rows[] = {
      {"whole", TextAttribute(1, "eth0"), "eth0"},
      {"without the zero at the end", Attribute(1, "eth0"), "eth0"},
      {"length 0", BytesOf(nlattr{0, 1}) + TextAttribute(1, "eth0"), "the kernel does not report it"},
      {"length below the header", BytesOf(nlattr{3, 1}) + TextAttribute(1, "eth0"), "the kernel does not report it"},
      {"length beyond the message", BytesOf(nlattr{200, 1}) + "eth0", "the kernel does not report it"},
      {"greatest length", BytesOf(nlattr{0xffff, 1}) + "eth0", "the kernel does not report it"},
      {"half a header", TextAttribute(1, "eth0") + std::string("\x08\0", 2), "eth0"},
      {"damaged after the first", TextAttribute(1, "eth0") + BytesOf(nlattr{99, 1}), "eth0"},
      {"no attribute", "", "the kernel does not report it"},
  };
  for (TRow const& row : rows) EXPECT_THAT(TextsIn(DumpOf(row.fAttributes)), ElementsAre(row.fText)) << row.fName;
}

TEST(NetlinkMessagesTest, DamagedMessagesEndTheDump) {
  std::string const good = Message(16, BytesOf(THeader{7}) + TextAttribute(1, "eth0"));
  auto const withLength = [&](std::uint32_t length) {
    std::string message = good;
    message.replace(0, sizeof length, BytesOf(length));
    return message;
  };
  EXPECT_THAT(TextsIn(good + good + End()), ElementsAre("eth0", "eth0"));
  for (std::uint32_t const length : {0u, 1u, 15u, 1000u, 0x7fffffffu, 0x80000000u, 0xffffffffu})
    EXPECT_THAT(TextsIn(good + withLength(length) + good), ElementsAre("eth0")) << length;
  EXPECT_THAT(TextsIn(Message(16, "abc")), IsEmpty()) << "too short for the header of the family";
  EXPECT_THAT(TextsIn(Message(17, BytesOf(THeader{7}))), IsEmpty()) << "another type";
  EXPECT_THAT(TextsIn(""), IsEmpty());
}

TEST(NetlinkMessagesTest, EveryLengthOfADumpIsRead) {
  std::string const dump = DumpOf(TextAttribute(1, "eth0") + NumberAttribute(2, std::uint32_t(5)));
  for (std::size_t length = 0; length < dump.size(); ++length) EXPECT_LE(TextsIn(dump.substr(0, length)).size(), 1u);
}

TEST(NetlinkMessagesTest, ErrorsOfTheKernelAreFound) {
  EXPECT_EQ(*ErrorIn(Message(NLMSG_ERROR, BytesOf(-EPERM))), EPERM);
  EXPECT_EQ(*ErrorIn(DumpOf("") + Message(NLMSG_DONE, BytesOf(-EINTR))), EINTR);
  EXPECT_EQ(*ErrorIn(Message(NLMSG_ERROR, BytesOf(INT32_MIN))), EIO) << "not the negative of an error";
  EXPECT_FALSE(ErrorIn(DumpOf("")));
  EXPECT_FALSE(ErrorIn(Message(NLMSG_ERROR, BytesOf(0)))) << "an acknowledgement";
  EXPECT_FALSE(ErrorIn(Message(NLMSG_ERROR, "")));
}

TEST(NetlinkMessagesTest, AnInterruptedDumpIsRecognised) {
  EXPECT_FALSE(IsInterrupted(DumpOf("")));
  EXPECT_TRUE(IsInterrupted(Message(16, BytesOf(THeader{7}), NLM_F_MULTI | NLM_F_DUMP_INTR) + End()));
}

}  // namespace
}  // namespace NQRVZEP20
