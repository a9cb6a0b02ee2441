// SPDX-License-Identifier: Apache-2.0
#include "collect/TValueWords.h"

#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "providers/memory/TMemoryClass.h"
#include "providers/memory/TMemoryNamespace.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

using TType = TCIMValue::TCIMType;

class TValueWordsTest : public testing::Test {
protected:
  // The words of the property P that the function describes.
  TValueWords Words(std::vector<std::string> const& values, std::vector<std::string> const& words, char const* type = "uint16") {
    std::string const name = "X_" + std::to_string(++fClasses);
    fNamespace->DefineClass(name).Property("P", type).ValueMap(values, words);
    return WordsOf(name);
  }

  TValueWords WordsOf(std::string const& className) {
    return TValueWords(*fNamespace->GetClass(className, TCIMContext())->GetPropertyDecl("P", TCIMContext()));
  }

  boost::shared_ptr<TMemoryNamespace> fNamespace = boost::make_shared<TMemoryNamespace>("root/test");
  int fClasses = 0;
};

TCIMValue Uint16(int value) { return TCIMValue(static_cast<unsigned short>(value)); }

TEST_F(TValueWordsTest, AValueIsPrintedWithItsWord) {
  TValueWords const words = Words({"0", "2", "5"}, {"Unknown", "Degraded", "OK"});
  EXPECT_EQ(words.TextOf(Uint16(5)), "5 (OK)");
  EXPECT_EQ(words.TextOf(Uint16(3)), "3");
  EXPECT_EQ(words.TextOf(TCIMValue(TType::kCIMTypeUint16, 0)), "NULL");
  EXPECT_EQ(words.TextOf(TCIMValue(TType::kCIMTypeUint16, 0, {Uint16(2), Uint16(1), TCIMValue(TType::kCIMTypeUint16, 0)})),
            "{ 2 (Degraded), 1, NULL }");
}

TEST_F(TValueWordsTest, RangesHaveAWordToo) {
  TValueWords const words =
      Words({"..7", "9", "10..20", "15", "0x8000..0xFFFF", ".."}, {"low", "nine", "teens", "never", "vendor", "rest"});
  struct TRow {
    int fValue;
    char const* fWord;
  };
  for (TRow const& row : {TRow{0, "low"}, TRow{7, "low"}, TRow{8, "rest"}, TRow{9, "nine"}, TRow{10, "teens"}, TRow{15, "teens"},
                          TRow{20, "teens"}, TRow{21, "rest"}, TRow{0x8000, "vendor"}, TRow{65535, "vendor"}})
    EXPECT_EQ(words.WordFor(Uint16(row.fValue)), row.fWord) << row.fValue;
}

TEST_F(TValueWordsTest, NumbersAreComparedExactly) {
  TValueWords const words =
      Words({"-5..-1", "0x10", "18446744073709551615", "9007199254740993.."}, {"below", "sixteen", "most", "large"}, "uint64");
  EXPECT_EQ(words.WordFor(TCIMValue(-3)), "below");
  EXPECT_EQ(words.WordFor(TCIMValue(16ul)), "sixteen");
  EXPECT_EQ(words.WordFor(TCIMValue(18446744073709551615ul)), "most");
  EXPECT_EQ(words.WordFor(TCIMValue(18446744073709551614ul)), "large");
  EXPECT_EQ(words.WordFor(TCIMValue(9007199254740992ul)), "");
}

TEST_F(TValueWordsTest, InvalidEntriesAreIgnored) {
  TValueWords const words = Words({"", "x", "1..x", "..x", "5.", "99999999999999999999"}, {"a", "b", "c", "d", "e", "f"});
  for (int const value : {0, 1, 2, 5, 9}) EXPECT_EQ(words.WordFor(Uint16(value)), "") << value;
}

TEST_F(TValueWordsTest, TextsAreComparedAsTexts) {
  TValueWords const words = Words({"on", "off"}, {"Running", "Stopped"}, "string");
  EXPECT_EQ(words.TextOf(TCIMValue("on")), "on (Running)");
  EXPECT_EQ(words.TextOf(TCIMValue("ON")), "ON");
}

TEST_F(TValueWordsTest, WithoutValueMapTheWordsCountFromZero) {
  fNamespace->DefineClass("X_A")
      .Property("P", "uint8")
      .Qualifier("Values", TCIMValue(TType::kCIMTypeString, 0, {TCIMValue("zero"), TCIMValue("one")}));
  EXPECT_EQ(WordsOf("X_A").WordFor(TCIMValue(static_cast<unsigned char>(1))), "one");
}

TEST_F(TValueWordsTest, SurplusValuesAndWordsAreIgnored) {
  EXPECT_EQ(Words({"0", "1"}, {"zero"}).Entries().size(), 1u);
  EXPECT_EQ(Words({"0"}, {"zero", "one"}).Entries().size(), 1u);
}

TEST_F(TValueWordsTest, AnOverridingPropertyInheritsWords) {
  fNamespace->DefineClass("X_Top").Property("P", "uint16").ValueMap({"5"}, {"OK"});
  fNamespace->DefineClass("X_Middle", "X_Top");
  fNamespace->DefineClass("X_Bottom", "X_Middle").Property("P", "uint16").Override();
  fNamespace->DefineClass("X_Own", "X_Bottom").Property("P", "uint16").ValueMap({"5"}, {"Fine"});
  EXPECT_EQ(WordsOf("X_Bottom").TextOf(Uint16(5)), "5 (OK)");
  EXPECT_EQ(WordsOf("X_Own").TextOf(Uint16(5)), "5 (Fine)");
}

TEST_F(TValueWordsTest, APropertyThatIsNotEnumeratedHasNoWords) {
  fNamespace->DefineClass("X_A").Property("P", "uint16");
  EXPECT_TRUE(WordsOf("X_A").Entries().empty());
  EXPECT_EQ(WordsOf("X_A").TextOf(Uint16(5)), "5");
}

}  // namespace
}  // namespace NQRVZEP20
