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

// Each word may be an address.
TEST(TextsTest, ALongTextWithoutAddressesIsSearchedInTime) {
  std::string text;
  for (int word = 0; word < 200000; ++word) text += "a1b2,";
  EXPECT_THAT(AddressesIn(text, true), IsEmpty());
}

TEST(TextsTest, FindsTheNamesOfHomeDirectories) {
  EXPECT_THAT(HomesIn("/home/alice/bin:/home/bob,/home/ and /home"), ElementsAre("alice", "bob"));
  EXPECT_THAT(HomesIn("\xe2\x80\x9c/home/j\xc3\xb6rg\xe2\x80\x9d and /home/a.b-c_d."), ElementsAre("j\xc3\xb6rg", "a.b-c_d"));
}

TEST(TextsTest, LettersOfAnyLanguageContinueAWordAndOtherCharactersEndIt) {
  struct TRow {
    char const* fWhat;
    std::string fCharacter;
    bool fContinues;
  };
  TRow const rows[] = {
      {"umlaut", "\xc3\xa4", true},
      {"Cyrillic", "\xd0\xb6", true},
      {"Chinese", "\xe4\xb8\xad", true},
      {"beyond 16 bits", "\xf0\x90\x90\xb7", true},
      {"no-break space", "\xc2\xa0", false},
      {"angle quote", "\xc2\xab", false},
      {"multiplication sign", "\xc3\x97", false},
      {"thin space", "\xe2\x80\x89", false},
      {"quotation mark", "\xe2\x80\x9c", false},
      {"dash", "\xe2\x80\x93", false},
      {"arrow", "\xe2\x86\x92", false},
      {"ideographic space", "\xe3\x80\x80", false},
      {"corner bracket", "\xe3\x80\x8c", false},
      {"byte order mark", "\xef\xbb\xbf", false},
      {"fullwidth comma", "\xef\xbc\x8c", false},
      {"a byte that is not UTF-8", "\xff", false},
      {"part of a character", "\xe4\xb8", false},
      {"the rest of a character", "\x80", false},
  };
  for (TRow const& row : rows) {
    std::string const text = row.fCharacter + "ab" + row.fCharacter;
    EXPECT_EQ(SizeOfWordCharacter(text, 0), row.fContinues ? row.fCharacter.size() : 0) << row.fWhat;
    EXPECT_EQ(EndOfWord(text, row.fCharacter.size()), row.fContinues ? text.size() : row.fCharacter.size() + 2) << row.fWhat;
    EXPECT_NE(IsWordBound(text, row.fCharacter.size(), text.size()), row.fContinues) << row.fWhat;
    EXPECT_NE(IsWordBound(text, 0, row.fCharacter.size() + 2), row.fContinues) << row.fWhat;
    EXPECT_EQ(Compact(text), row.fContinues ? text : "ab") << row.fWhat;
  }
}

// The marks are those of the normal form.
TEST(SpellingsTest, AValueHasASpellingInEachEncoding) {
  EXPECT_THAT(SpellingsOf("KQ12345"), IsSupersetOf({"KQ12345", "4b513132333435", "4b-51-31-32-33-34-35"}));
  EXPECT_THAT(Base64Of("KQ12345"),
              IsSupersetOf({"S1ExMjM0N", "tRMTIzND", "LUTEyMzQ1", "SwBRADEAMgAzADQANQ", "AEsAUQAxADIAMwA0AD"}));
  EXPECT_THAT(Base64Of("KQ123"), ElementsAre("SwBRADEAMgAzA", "sAUQAxADIAMw", "LAFEAMQAyADMA",  // of UTF-16 alone
                                             "AEsAUQAxADIAM", "BLAFEAMQAyAD", "ASwBRADEAMgAz"));
  EXPECT_THAT(Base64Of("KQ"), IsEmpty());
  EXPECT_THAT(SpellingsOf("525400112202"), IsSupersetOf({"52-54-00-11-22-02", "5254-0011-2202"}));
  EXPECT_THAT(SpellingsOf("192.0.2.1"), IsSupersetOf({"c0000201", "010200c0"}));
  EXPECT_THAT(SpellingsOf("2001:db8::1"),
              IsSupersetOf({"20010db8000000000000000000000001", "2001-0db8-0000-0000-0000-0000-0000-0001"}));
  EXPECT_THAT(SpellingsOf("3F2A9C54-11D0-4B8E-9A7E-52540011AA01"),
              IsSupersetOf({"3f2a9c5411d04b8e9a7e52540011aa01", "549c2a3f-d011-8e4b-9a7e-52540011aa01"}));
}

TEST(SpellingsTest, TheCanonicalFormIsThatOfAllSpellings) {
  for (char const* mac : {"525400112202", "52:54:00:11:22:02", "52-54-00-11-22-02", "5254.0011.2202"})
    EXPECT_EQ(CanonicalForm(mac), "525400112202");
  EXPECT_EQ(CanonicalForm("2001:DB8:0::1"), CanonicalForm("2001:db8::1"));
  EXPECT_EQ(CanonicalForm("naa.5000C500A1B2C3D4"), CanonicalForm("0x5000c500a1b2c3d4"));
  EXPECT_EQ(CanonicalForm("3F2A9C54-11D0-4B8E-9A7E-52540011AA01"), "3f2a9c5411d04b8e9a7e52540011aa01");
  EXPECT_EQ(CanonicalForm("ZX81 77"), CanonicalForm("zx81_77"));
  EXPECT_NE(CanonicalForm("1.11.1.1"), CanonicalForm("11.1.1.1"));
  EXPECT_EQ(CanonicalForm("()"), "()");
}

}  // namespace
}  // namespace NQRVZEP20
