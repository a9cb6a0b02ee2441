// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TSecretIndex.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <ctime>

namespace NQRVZEP20 {
namespace {

// The text with each spelling of the secret replaced by "X".
std::string Without(std::string const& secret, std::string const& text) {
  TSecretIndex index;
  index.Add(ESecretKind::kUsers, secret);
  return index.Rewritten(text, [](TSecret const*, std::string const&) { return "X"; }).value_or(text);
}

TEST(TSecretIndexTest, ASecretIsFoundWithItsSignsOrWithoutThem) {
  EXPECT_EQ(Without("(bob)", "by (bob) or bob"), "by X or X");
  EXPECT_EQ(Without("(bob)", "bobby"), "bobby");
  EXPECT_EQ(Without("(bob", "%28bob"), "%28X");
}

TEST(TSecretIndexTest, NoReplacementJoinsItsNeighbour) {
  EXPECT_EQ(Without("(bob)", "a(bob)b"), "a(X)b");
  EXPECT_EQ(Without("(bob)", "(Bob)(bob)"), "X(X)");
}

TEST(TSecretIndexTest, EachMarkMayBeAnotherOneOrEscaped) {
  struct TRow {
    char const *fSecret, *fText, *fResult;
  };
  TRow const rows[] = {
      {"ZX81-77 A5", "usb-Maker_ZX81-77_A5-0:0", "usb-Maker_X-0:0"},
      {"ZX81-77 A5", "ZX81_77_A5, zx81.77.a5, ZX81-77%20A5, ZX81-77%2520A5", "X, X, X, X"},
      {"ZX81-77 A5", R"(ZX81-77\x20A5 and ZX81\\x2d77\\x20A5 and ZX81-77\u0020A5)", "X and X and X"},
      {"ZX81-77 A5", "ZX81-77 A51, ZX81-77", "ZX81-77 A51, ZX81-77"},
      {"ZX81-77 A5", "ZX8177A5 and SNzx8177a5-1", "X and X-1"},
      {"john.doe@corp.example", "john.doe%40corp.example", "X"},
      {"CORP\\alice", R"(CORP\alice CORP\\alice CORP\\\\alice CORP%5Calice)", "X X X X"},
      {"KQ\"12", R"(KQ"12 KQ\"12 KQ\\\"12)", "X X X"},
      {"KQ\\xff12345", R"(KQ\xff12345 KQ\\xff12345)", "X X"},
      {"J\xc3\xbcrgen7", "J%C3%BCrgen7 j\xc3\xbcrgen7", "X X"},
      {"web-server", "web-server, web_server; a web server", "X, X; a web server"},
      {"zx-81", "\\nzx-81 %20zx-81 \\x0azx-81 \\u000azx-81", "\\nX %20X \\x0aX \\u000aX"},
      {"10.0.0.1", "10-0-0-1 and 10.0.0.11", "X and 10.0.0.11"},
  };
  for (TRow const& row : rows) EXPECT_EQ(Without(row.fSecret, row.fText), row.fResult) << row.fSecret;
}

TEST(TSecretIndexTest, AWorldWideNameIsFoundWithAnyPrefix) {
  for (char const* secret : {"naa.5000c500a1b2c3d4", "0x5000c500a1b2c3d4", "5000c500a1b2c3d4", "wwn-0x5000c500a1b2c3d4"})
    for (char const* text : {"wwn-0x5000c500a1b2c3d4-part1", "naa.5000c500a1b2c3d4-part1", "50:00:c5:00:a1:b2:c3:d4-part1",
                             "5000C500A1B2C3D4-part1"})
      EXPECT_THAT(Without(secret, text), testing::MatchesRegex("((wwn-|naa.)?(0x)?)X-part1")) << secret << " in " << text;
}

TEST(TSecretIndexTest, Base64IsFoundAlsoInALongerWord) {
  EXPECT_EQ(Without("frontend", "host=ZnJvbnRlbmQ= and eGZyb250ZW5keA=="), "host=X= and X==");
  EXPECT_EQ(Without("5CIA2R", "NUNJQTJS eDVDSUEyUng="), "X X=");
  EXPECT_EQ(Without("abc?def>ghi~jkl", "(eHhhYmM/ZGVmPmdoaX5qa2w=)"), "(X=)");
}

TEST(TSecretIndexTest, ASecretIsFoundInItsEncodings) {
  struct TRow {
    char const *fSecret, *fText, *fResult;
  };
  TRow const rows[] = {
      {"J7K2-91", "4a374b32 2d3931 4a37 4b32 2d39 31 4a 37 4b 32 2d 39 31", "X X X"},
      {"J7K2-91", "0x4a 0x37 0x4b 0x32 0x2d 0x39 0x31, 0x4A,0x37,0x4B,0x32,0x2D,0x39,0x31", "X, X"},
      {"J7K2-91", R"(\x4a\x37\x4b\x32\x2d\x39\x31 \u004a\u0037\u004b\u0032\u002d\u0039\u0031)", R"(\X \X)"},
      {"J7K2-91", "%4A%37%4B%32%2D%39%31", "%X"},
      {"J7K2-91", "004a0037004b0032002d00390031 4a0037004b0032002d0039003100", "X X"},
      {"J7K2-91", "SgA3AEsAMgAtADkAMQA= AEoANwBLADIALQA5ADE=", "X= X="},
      {"Q7k", "UQA3AGsA", "X"},
      {"198.51.100.23", "23.100.51.198.in-addr.arpa", "X"},
      {"2001:db8::7", "7.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.0.8.b.d.0.1.0.0.2.ip6.arpa", "X"},
      {"prod.example", "CN=db1,DC=prod,DC=example", "CN=db1,X"},
  };
  for (TRow const& row : rows) EXPECT_EQ(Without(row.fSecret, row.fText), row.fResult) << row.fSecret << " in " << row.fText;
}

TEST(TSecretIndexTest, AWordOfLettersIsFoundInItsOwnCaseAndInUpperAndLowerCase) {
  EXPECT_EQ(Without("Server", "Server SERVER server sErver"), "X X X sErver");
  TSecretIndex index;
  for (char const* value : {"Bob", "bOB"}) index.Add(ESecretKind::kUsers, value);
  EXPECT_EQ(index.Rewritten("BOb", [](TSecret const*, std::string const&) { return "X"; }), "X");
}

TEST(TSecretIndexTest, AValueThatIsKnownInAnotherSpellingIsNoSecretOfItsOwn) {
  TSecretIndex index;
  for (char const* value : {"525400112202", "52:54:00:11:22:02", "52-54-00-11-22-02", "2001:db8::1", "2001:DB8:0::1", "ZX81-77",
                            "zx81_77", "1.11.1.1", "11.1.1.1"})
    index.Add(ESecretKind::kAddresses, value);
  EXPECT_EQ(index.Secrets().size(), 5u);
}

// Each text has the first word of all secrets.
TEST(TSecretIndexTest, ManySecretsWithTheSameFirstWordAreFoundInTime) {
  TSecretIndex index;
  std::string text;
  for (int number = 0; number < 5000; ++number) {
    std::string const address = "192." + std::to_string(number / 250) + "." + std::to_string(number % 250 + 1) + ".7";
    index.Add(ESecretKind::kAddresses, address);
    text += address + " ";
  }
  std::size_t hits = 0;
  index.Rewritten(text, [&](TSecret const*, std::string const&) { return ++hits, "X"; });
  EXPECT_EQ(hits, 5000u);
}

std::string Times(std::size_t number, std::string const& text) {
  std::string result;
  for (std::size_t at = 0; at < number; ++at) result += text;
  return result;
}

TEST(TSecretIndexTest, ALongSecretIsFoundInATextAndInAWord) {
  std::string const words = Times(20000, "a1-"), word = Times(20000, "a1B");
  EXPECT_EQ(Without(words + "z", "on " + words + "z here"), "on X here");
  EXPECT_EQ(Without(words + "z", "on a1-a1 here"), "on a1-a1 here");
  EXPECT_EQ(Without(word + "z", word + "Z here, usb" + word + "z"), "X here, X");
}

TEST(TSecretIndexTest, TheBeginOfALongSecretIsASpellingOfIt) {
  std::string const same = Times(100, "a1-");
  EXPECT_EQ(Without(same + "z7-z8", "on " + same + "z7-y here"), "on X-y here");
  EXPECT_EQ(Without(same + "z7-z8", "on " + same + "z77-y here"), "on X-z77-y here");
}

TEST(TSecretIndexTest, SecretsWithTheSameBeginAreDifferent) {
  std::string const same = Times(100, "a1-");
  TSecretIndex index;
  for (char const* end : {"b2", "c3", "c3-d4", "c3-d4-e5-f6"}) index.Add(ESecretKind::kSerials, same + end);
  auto const end = [&](TSecret const* secret, std::string const&) { return secret->fValue.substr(same.size()); };
  EXPECT_EQ(index.Rewritten(same + "c3-d4 " + same + "b2 " + same + "c3", end), "c3-d4 b2 c3");
}

// Each text almost has a secret everywhere.
TEST(TSecretIndexTest, LongSecretsAreLookedForInTime) {
  std::string const words = Times(20000, "a1-"), word = Times(20000, "a1b");
  std::clock_t const begin = std::clock();
  EXPECT_EQ(Without(words + "z", Times(100, Times(60, "a1-") + "b ")), Times(100, Times(60, "a1-") + "b "));
  EXPECT_THAT(Without(words + "z", Times(5, words)), testing::MatchesRegex("(X-)*"));
  EXPECT_EQ(Without(word + "z", Times(5, Times(15, "a1b") + "c")), Times(5, Times(15, "a1b") + "c"));
  EXPECT_LT((std::clock() - begin) / CLOCKS_PER_SEC, 10);
}

TEST(TSecretIndexTest, ManySecretsWithTheSameFirstBytesAreFoundInTime) {
  TSecretIndex index;
  std::string text;
  for (int number = 0; number < 5000; ++number) {
    index.Add(ESecretKind::kSerials, "SNQ12X" + std::to_string(100000 + number));
    text += "usbSNQ12X" + std::to_string(300000 + number) + " usbSNQ12X" + std::to_string(100000 + number) + " ";
  }
  std::size_t hits = 0;
  index.Rewritten(text, [&](TSecret const* secret, std::string const& spelling) {
    return hits += "usb" + secret->fValue == spelling ? 1 : 0, "X";
  });
  EXPECT_EQ(hits, 5000u);
}

}  // namespace
}  // namespace NQRVZEP20
