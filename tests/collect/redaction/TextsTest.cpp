// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Texts.h"

#include "collect/redaction/Spellings.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::IsSupersetOf;

TEST(TextsTest, FindsAddressesAsWholeTokens) {
  EXPECT_THAT(AddressesIn("link 52:54:00:11:22:02, 192.0.2.1: up; [2001:db8::1]:80 fe80::1%eth0 at 2001:db8::/32.", true),
              ElementsAre("52:54:00:11:22:02", "192.0.2.1", "2001:db8::1", "fe80::1", "2001:db8::"));
  EXPECT_THAT(AddressesIn("version 1.2.3.4", false), IsEmpty());
  EXPECT_THAT(AddressesIn("at 10:20:30 0000:00:1f.2 x192.0.2.1 192.0.2.1x 1.2.3 300.1.1.1 26940d9d:fb5c84bd", true), IsEmpty());
}

TEST(TextsTest, FindsTheNamesOfHomeDirectories) {
  EXPECT_THAT(HomesIn("/home/alice/bin:/home/bob,/home/ and /home"), ElementsAre("alice", "bob"));
}

TEST(SpellingsTest, AValueHasASpellingInEachEncoding) {
  EXPECT_THAT(SpellingsOf("KQ12345"), IsSupersetOf({"kq12345", "4b513132333435", "4b:51:31:32:33:34:35", "s1exmjm0n"}));
  EXPECT_THAT(SpellingsOf("525400112202"), IsSupersetOf({"52:54:00:11:22:02", "52-54-00-11-22-02", "5254.0011.2202"}));
  EXPECT_THAT(SpellingsOf("192.0.2.1"), IsSupersetOf({"c0000201", "010200c0"}));
  EXPECT_THAT(SpellingsOf("2001:db8::1"),
              IsSupersetOf({"20010db8000000000000000000000001", "2001:0db8:0000:0000:0000:0000:0000:0001"}));
  EXPECT_THAT(SpellingsOf("3F2A9C54-11D0-4B8E-9A7E-52540011AA01"),
              IsSupersetOf({"3f2a9c5411d04b8e9a7e52540011aa01", "549c2a3f-d011-8e4b-9a7e-52540011aa01"}));
  EXPECT_THAT(SpellingsOf("a b\"c"), IsSupersetOf({"a%20b%22c", "a b\\\"c"}));
}

}  // namespace
}  // namespace NQRVZEP20
