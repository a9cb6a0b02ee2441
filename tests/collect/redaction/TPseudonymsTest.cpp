// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TPseudonyms.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using TJson = nlohmann::ordered_json;

TEST(TPseudonymsTest, APseudonymIsAWordANumberAndPerhapsLetters) {
  for (char const* text : {"serial-1", "host-12", "address-3b", "user-4zb", "text-5"})
    EXPECT_EQ(SizeOfPseudonym(text), std::string(text).size()) << text;
  EXPECT_EQ(SizeOfPseudonym("host-1-part2"), 6u);
  for (char const* text : {"serial", "serial-", "serial-a", "serial-1B", "serials-1", "serial-1\xc3\xa4", "Serial-1", ""})
    EXPECT_EQ(SizeOfPseudonym(text), 0u) << text;
}

TEST(TPseudonymsTest, SpellingsShareTheNumberOfTheirValue) {
  TPseudonyms pseudonyms("1");
  TSecret const mac{ESecretKind::kAddresses, "525400112202"}, serial{ESecretKind::kSerials, "ZX81"};
  EXPECT_EQ(pseudonyms.For(&mac, "52:54:00:11:22:02"), "address-1b");
  EXPECT_EQ(pseudonyms.For(&mac, "525400112202"), "address-1");
  EXPECT_EQ(pseudonyms.For(&serial, "ZX81"), "serial-1");
  EXPECT_EQ(pseudonyms.For(&mac, "52-54-00-11-22-02"), "address-1c");
  EXPECT_EQ(pseudonyms.For(nullptr, "host-7"), "text-1");
  EXPECT_EQ(*pseudonyms.SpellingOf("address-1b"), "52:54:00:11:22:02");
  EXPECT_EQ(pseudonyms.SpellingOf("address-2"), nullptr);
}

TEST(TPseudonymsTest, NoPseudonymHasMoreThanNineDigits) {
  TPseudonyms pseudonyms = TPseudonyms::From(TJson::parse(
      R"({"document":"zep redaction map","version":1,"map":"1","values":[{"pseudonym":"serial-999999999","value":"A"}]})"));
  TSecret const serial{ESecretKind::kSerials, "ZX81"};
  EXPECT_THROW(pseudonyms.For(&serial, "ZX81"), TRedactionError);
}

TEST(TPseudonymsTest, AnotherDocumentIsRefusedByPlace) {
  struct TRow {
    char const *fMap, *fWhy;
  };
  TRow const rows[] = {
      {"[]", "it is not a redaction map of zep"},
      {R"({"document":"zep report","version":1})", "it is not a redaction map of zep"},
      {R"({"document":"zep redaction map","version":2})", "/version: is not 1, the version that this zep reads"},
      {R"({"document":"zep redaction map","version":1,"map":"1"})", "/values: is not an array"},
      {R"({"document":"zep redaction map","version":1,"values":[]})", "/map: is not a text"},
      {R"({"document":"zep redaction map","version":1,"map":"1","values":[3]})", "/values/0: is not an object"},
      {R"({"document":"zep redaction map","version":1,"map":"1","values":[{"pseudonym":"x-1","value":"a"}]})",
       "/values/0/pseudonym: is not a pseudonym"},
      {R"({"document":"zep redaction map","version":1,"map":"1","values":[{"pseudonym":"host-1"}]})",
       "/values/0/value: is not a text"},
      {R"({"document":"zep redaction map","version":1,"map":"1","values":[{"pseudonym":"host-1","value":"a"},{"pseudonym":"host-1","value":"b"}]})",
       "/values/1/pseudonym: occurs twice"},
  };
  for (TRow const& row : rows) {
    try {
      TPseudonyms::From(TJson::parse(row.fMap));
      ADD_FAILURE() << row.fMap;
    } catch (TRedactionError const& failure) {
      EXPECT_STREQ(failure.what(), row.fWhy);
    }
  }
}

}  // namespace
}  // namespace NQRVZEP20
