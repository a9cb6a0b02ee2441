// SPDX-License-Identifier: Apache-2.0
#include "TConfig.h"

#include "tests/os/HostTools.h"

#include <malloc.h>

#include <random>

namespace NQRVZEP20 {
namespace {

using TEntries = std::vector<std::string>;
using TSettings = std::vector<std::pair<std::string, std::string>>;

std::string const kStart = "[Debug] TConfig::parseConfigFile(): start to parse config file";
std::string const kMissing = "[Error] TConfig::parseConfigFile(): config file doesn't exist";
std::string const kMapIsEmpty = "[Error] TConfig::getValue(): map is empty";

TSettings SettingsOf(TConfig& config) {
  TSettings settings;
  for (std::string const& key : config.listKeys()) settings.emplace_back(key, config.getValue(key));
  return settings;
}

// Runs in a private working directory. Only child processes use the instance of the process.
class TConfigTest : public testing::Test {
protected:
  TConfigTest() : fDirectory(fDir.Path()) {}

  static TSettings SettingsIn(std::string const& text) {
    WriteFile("zep.cfg", text);
    TConfig config;
    return SettingsOf(config);
  }

  TTempDir fDir;
  TWorkingDirectory fDirectory;
};

// ---- Reading the file ----

TEST_F(TConfigTest, ReadsLinesOfKeyAndValue) {
  struct TRow {
    char const* fName;
    std::string fText;
    TSettings fSettings;
  };
  TRow const rows[] = {
      {"one line", "a=1\n", {{"a", "1"}}},
      {"last line without a newline", "a=1\nb=2", {{"a", "1"}, {"b", "2"}}},
      {"keys are sorted by their bytes", "b=1\na=2\nB=3\n\xc3\xa4=4\n", {{"B", "3"}, {"a", "2"}, {"b", "1"}, {"\xc3\xa4", "4"}}},
      {"first occurrence wins", "a=1\na=2\n", {{"a", "1"}}},
      {"also far apart", "a=1\nb=2\nc=3\na=4\nb=5\n", {{"a", "1"}, {"b", "2"}, {"c", "3"}}},
      {"the rest belongs to the value", "path=a=b\n", {{"path", "a=b"}}},
      {"value of one equals sign", "a==\n", {{"a", "="}}},
      {"comment", "#x=1\na=1\n", {{"a", "1"}}},
      {"comment of the sign alone", "#\n", {}},
      {"the sign elsewhere is text", "x=1#c\ny#=2\n #z=3\n", {{" #z", "3"}, {"x", "1#c"}, {"y#", "2"}}},
      {"nothing is stripped", "key = value \n\tk\t=\tv\t\n", {{"\tk\t", "\tv\t"}, {"key ", " value "}}},
      {"only a blank", " = \n", {{" ", " "}}},
      {"carriage returns stay", "a=1\r\nb=2\r\n\r\n", {{"\r", "\r"}, {"a", "1\r"}, {"b", "2\r"}}},
      {"a bare word maps to itself", "flag\n", {{"flag", "flag"}}},
      {"a bare word without a newline", "flag", {{"flag", "flag"}}},
      {"a bare word and a setting", "flag\nflag=1\n", {{"flag", "flag"}}},
      {"empty lines", "\n\na=1\n\n", {{"a", "1"}}},
      {"empty key", "=1\n=\n", {}},
      {"empty value", "a=\n", {}},
      {"empty value does not count as the first", "a=\na=1\n", {{"a", "1"}}},
      {"keys that begin with one another",
       "ab=1\na=2\nabc=3\nabcdefghij=4\nabcdefgh=5\n",
       {{"a", "2"}, {"ab", "1"}, {"abc", "3"}, {"abcdefgh", "5"}, {"abcdefghij", "4"}}},
      {"zero bytes",
       std::string("a\0b=c\0d\na=1\na\0=2\n", 17),
       {{"a", "1"}, {std::string("a\0", 2), "2"}, {std::string("a\0b", 3), std::string("c\0d", 3)}}},
      {"no more than newlines", "\n\n", {}},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    EXPECT_EQ(SettingsIn(row.fText), row.fSettings);
  }
}

TEST_F(TConfigTest, ReadsLongLinesAndManyOfThem) {
  std::string const key(100000, 'k'), value(1000000, 'v');
  EXPECT_EQ(SettingsIn(key + "=" + value), (TSettings{{key, value}}));

  // Random keys over few bytes, so that many are equal or prefixes of others, read line by line into a map.
  std::mt19937 random(7);
  for (std::size_t const commonLength : {0u, 3u, 20u}) {
    std::string text;
    std::map<std::string, std::string> expected;
    for (int i = 0; i < 20000; ++i) {
      std::string name(commonLength, 'c');
      for (unsigned int length = random() % 12 + 1; length > 0; --length) name += "ab\xff\x01"[random() % 4];
      text += name + "=" + std::to_string(i) + "\n";
      expected.emplace(name, std::to_string(i));
    }
    EXPECT_EQ(SettingsIn(text), TSettings(expected.begin(), expected.end()));
  }
}

TEST_F(TConfigTest, ASecondReadAddsOnlyMissingKeys) {
  WriteFile("zep.cfg", "a=1\nc=3\n");
  TConfig config;
  WriteFile("zep.cfg", "a=2\nb=2\nd=4\n");
  EXPECT_EQ(config.getValue("b"), "");  // the file is not read again
  config.parseConfigFile();
  EXPECT_EQ(SettingsOf(config), (TSettings{{"a", "1"}, {"b", "2"}, {"c", "3"}, {"d", "4"}}));
}

TEST_F(TConfigTest, ManyKeysOfTwoReadsAreFoundAndOthersAreNot) {
  std::mt19937 random(11);
  auto const randomKey = [&] { return "setting." + std::to_string(random() % 50000); };
  std::map<std::string, std::string> expected;
  auto const writeFile = [&](std::string const& value) {
    std::string text;
    for (int i = 0; i < 20000; ++i) {
      std::string const key = randomKey();
      text += key + "=" + value + std::to_string(i) + "\n";
      expected.emplace(key, value + std::to_string(i));
    }
    WriteFile("zep.cfg", text);
  };
  writeFile("first");
  TConfig config;
  writeFile("second");
  config.parseConfigFile();
  EXPECT_EQ(SettingsOf(config), TSettings(expected.begin(), expected.end()));
  for (int i = 0; i < 1000; ++i) {
    std::string const key = randomKey();
    auto const setting = expected.find(key);
    EXPECT_EQ(config.getValue(key), setting == expected.end() ? "" : setting->second) << key;
  }
}

TEST_F(TConfigTest, LogsThatItReads) {
  WriteFile("zep.cfg", "a=1\n");
  EXPECT_EQ(LogOf([] { TConfig config; }), (TEntries{kStart}));
}

TEST_F(TConfigTest, AMissingFileIsLogged) {
  EXPECT_EQ(LogOf([] {
              TConfig config;
              EXPECT_EQ(config.listKeys(), std::vector<std::string>{});
            }),
            (TEntries{kStart, kMissing, kMapIsEmpty}));
}

TEST_F(TConfigTest, AnEmptyFileIsReportedAsMissing) {
  WriteFile("zep.cfg", "");
  EXPECT_EQ(LogOf([] { TConfig config; }), (TEntries{kStart, kMissing}));
}

TEST_F(TConfigTest, ADirectoryOfThatNameIsNotAFile) {
  std::filesystem::create_directory("zep.cfg");
  EXPECT_EQ(LogOf([] { TConfig config; }), (TEntries{kStart, kMissing}));
}

TEST_F(TConfigTest, AFileThatCannotBeOpenedIsPassedOverInSilence) {
  WriteFile("zep.cfg", "a=1\n");
  std::filesystem::permissions("zep.cfg", std::filesystem::perms::none);
  std::filesystem::permissions(".", std::filesystem::perms::all);
  EXPECT_EQ(InChild([] {
              TLogger::GetInstance()->ClearLog();
              if (!BecomeUnprivileged()) return std::string("still root");
              TConfig config;
              std::string result = std::to_string(LoggedMessages().size()) + " messages, ";
              return result + std::to_string(config.listKeys().size()) + " keys";
            }),
            "0 messages, 0 keys");
}

// ---- Asking ----

TEST_F(TConfigTest, LogsItsAnswers) {
  WriteFile("zep.cfg", "key=value\n");
  TConfig config;
  EXPECT_EQ(LogOf([&] { EXPECT_EQ(config.getValue("key"), "value"); }),
            (TEntries{"[Debug] TConfig::getValue(): key key found, value is value"}));
  EXPECT_EQ(LogOf([&] { EXPECT_EQ(config.getValue("Key"), ""); }), (TEntries{"[Error] TConfig::getValue(): key not found"}));
  EXPECT_EQ(LogOf([&] { EXPECT_EQ(config.getValue(""), ""); }), (TEntries{"[Error] TConfig::getValue(): key not found"}));
  EXPECT_EQ(LogOf([&] { EXPECT_EQ(config.listKeys(), std::vector<std::string>{"key"}); }), TEntries{});
}

TEST_F(TConfigTest, BothQuestionsToAnEmptyMapNameTheFirst) {
  TConfig config;
  EXPECT_EQ(LogOf([&] { EXPECT_EQ(config.getValue("key"), ""); }), (TEntries{kMapIsEmpty}));
  EXPECT_EQ(LogOf([&] { EXPECT_EQ(config.listKeys(), std::vector<std::string>{}); }), (TEntries{kMapIsEmpty}));
}

// ---- The one of the process ----

TEST_F(TConfigTest, InstanceReadsTheFileOnce) {
  EXPECT_EQ(InChild([] {
              WriteFile("zep.cfg", "a=1\n");
              TConfig* const first = TConfig::GetInstance();
              WriteFile("zep.cfg", "a=2\nb=2\n");
              TConfig* const second = TConfig::GetInstance();
              return std::string(first == second ? "same, " : "another, ") + second->getValue("a") + second->getValue("b");
            }),
            "same, 1");
}

TEST_F(TConfigTest, InstanceIsNullUntilItsFirstUse) {
  EXPECT_EQ(InChild([] {
              if (TConfig::cfgInstance != nullptr) return "there already";
              return TConfig::GetInstance() == TConfig::cfgInstance ? "made" : "another";
            }),
            "made");
}

TEST_F(TConfigTest, InstanceMadeWithoutAFileStaysEmpty) {
  EXPECT_EQ(InChild([] {
              TConfig::GetInstance();
              WriteFile("zep.cfg", "a=1\n");
              return "[" + TConfig::GetInstance()->getValue("a") + "]";
            }),
            "[]");
}

TEST_F(TConfigTest, DestroyingAnotherDestroysTheInstanceAndKeepsItsAddress) {
  EXPECT_EQ(InChild([] {
              WriteFile("zep.cfg", "a=1\n");
              TConfig* const instance = TConfig::GetInstance();
              { TConfig another; }
              return TConfig::GetInstance() == instance ? "same address" : "another address";
            }),
            "same address");
}

TEST_F(TConfigTest, DestroyingAnotherFreesTheInstance) {
  if (kIsSanitized) GTEST_SKIP() << "the allocator of a sanitizer does not report how much memory is in use";
  EXPECT_EQ(InChild([] {
              WriteFile("zep.cfg", "a=" + std::string(100000, 'x'));
              TConfig::GetInstance();
              std::size_t const before = ::mallinfo2().uordblks;
              { TConfig another; }
              return before - ::mallinfo2().uordblks > 100000 ? "freed" : "kept";
            }),
            "freed");
}

}  // namespace
}  // namespace NQRVZEP20
