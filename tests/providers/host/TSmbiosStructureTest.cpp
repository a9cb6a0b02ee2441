// SPDX-License-Identifier: Apache-2.0
#include "providers/host/TSmbiosStructure.h"

#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TSmbiosStructure StructureOf(std::string const& bytes) {
  return TSmbiosStructure(std::vector<unsigned char>(bytes.begin(), bytes.end()));
}

// The value, or "code: reason".
template <class T>
std::string ResultOf(TFinding<T> const& finding) {
  if (!finding) return finding.Why().fCode + ": " + finding.Why().fReason;
  if constexpr (std::is_same_v<T, std::string>)
    return *finding;
  else
    return std::to_string(*finding);
}

constexpr char const* kTooShort = "not-given: the firmware's structure ends before this field";

TEST(TSmbiosStructureTest, NumbersAreLittleEndian) {
  TSmbiosStructure const structure = StructureOf("\x01\x08\x02\x03\x12\x34\x56\xff\0\0"s);
  EXPECT_EQ(ResultOf(structure.Byte(4)), "18");
  EXPECT_EQ(ResultOf(structure.Word(4)), std::to_string(0x3412));
  EXPECT_EQ(ResultOf(structure.DWord(4)), std::to_string(0xff563412u));
}

TEST(TSmbiosStructureTest, FieldsAfterTheFormattedAreaAreMissing) {
  TSmbiosStructure const structure = StructureOf("\x01\x08\x02\x03\x12\x34\x56\xfftext\0\0"s);
  EXPECT_EQ(ResultOf(structure.Byte(7)), "255");
  EXPECT_EQ(ResultOf(structure.Byte(8)), kTooShort);
  EXPECT_EQ(ResultOf(structure.Word(6)), std::to_string(0xff56));
  EXPECT_EQ(ResultOf(structure.Word(7)), kTooShort);
  EXPECT_EQ(ResultOf(structure.DWord(5)), kTooShort);
  EXPECT_EQ(ResultOf(structure.Text(8)), kTooShort);
  EXPECT_TRUE(structure.Bytes(4, 4));
  EXPECT_FALSE(structure.Bytes(4, 5));
}

TEST(TSmbiosStructureTest, NothingOutsideTheBytesIsRead) {
  struct TRow {
    char const* fDescription;
    std::string fBytes;
  } const rows[] = {
      {"nothing at all", ""},
      {"half a header", "\x01\x1b"s},
      {"a header alone that promises more", "\x01\x1b\0\0"s},
      {"a formatted area that is cut", "\x01\x1b\0\0\1\1"s},
      {"a length below that of the header", "\x01\0\0\0\1\1\0\0"s},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fDescription);
    TSmbiosStructure const structure = StructureOf(row.fBytes);
    EXPECT_EQ(ResultOf(structure.Byte(0x07)), kTooShort);
    EXPECT_EQ(ResultOf(structure.DWord(0x17)), kTooShort);
    EXPECT_FALSE(structure.Text(0x04)) << *structure.Text(0x04);
    EXPECT_EQ(ResultOf(structure.Byte(static_cast<std::size_t>(-1) / 2)), kTooShort);
  }
}

TEST(TSmbiosStructureTest, StringsAreCountedFromOne) {
  TSmbiosStructure const structure = StructureOf("\x01\x08\0\0\1\2\3\0"s + "first\0second\0third\0\0"s);
  EXPECT_EQ(ResultOf(structure.Text(4)), "first");
  EXPECT_EQ(ResultOf(structure.Text(5)), "second");
  EXPECT_EQ(ResultOf(structure.Text(6)), "third");
  EXPECT_EQ(ResultOf(structure.Text(7)), "not-given: not given by the firmware");
}

TEST(TSmbiosStructureTest, AStringThatTheStructureDoesNotContainIsMissing) {
  struct TRow {
    char const* fDescription;
    std::string fStrings;
    bool fIsPresent;
  } const rows[] = {
      {"fewer texts than the number", "first\0\0"s, false},
      {"no text at all", "\0\0"s, false},
      {"no string set", "", false},
      {"a text without end", "first\0second"s, false},
      {"a set without its end", "first\0second\0"s, true},
      {"an empty text ends the set", "first\0\0second\0\0"s, false},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fDescription);
    TSmbiosStructure const structure = StructureOf("\x01\x05\0\0\2"s + row.fStrings);
    EXPECT_EQ(
        ResultOf(structure.Text(4)),
        row.fIsPresent ? "second" : "unexpected-form: the firmware refers to string 2, which the structure does not contain");
  }
}

TEST(TSmbiosStructureTest, AStringIsVerbatim) {
  TSmbiosStructure const structure = StructureOf("\x01\x05\0\0\1 \x1b[31m\xff Q \0\0"s);
  EXPECT_EQ(ResultOf(structure.Text(4)), " \x1b[31m\xff Q ");
}

TEST(TSmbiosStructureTest, EveryFieldOfAMissingStructureHasItsReason) {
  TSmbiosStructure const structure(TMissing{kMissingNeedsRoot, "needs root"});
  EXPECT_EQ(ResultOf(structure.Byte(0)), "needs-root: needs root");
  EXPECT_EQ(ResultOf(structure.Word(4)), "needs-root: needs root");
  EXPECT_EQ(ResultOf(structure.DWord(4)), "needs-root: needs root");
  EXPECT_EQ(ResultOf(structure.Text(4)), "needs-root: needs root");
  EXPECT_EQ(structure.Bytes(4, 1).Why().fCode, kMissingNeedsRoot);
}

}  // namespace
}  // namespace NQRVZEP20
