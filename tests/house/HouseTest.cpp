// SPDX-License-Identifier: Apache-2.0

// Rules for the complete source tree: which room may include which, and what libzepcore.so exports.

#include "tests/Support.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <map>
#include <memory>
#include <regex>
#include <set>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

struct TRoom {
  char const* fFolder;
  std::vector<std::string> fMayInclude;  // the rooms whose headers it may include, besides itself
};

TRoom const kRooms[] = {
    {"include", {}},
    {"core", {"include"}},
    {"cim/value", {"include", "core"}},
    {"cim/model", {"include", "core", "cim/value"}},
    {"loaders", {"include", "core", "platform/include"}},
    {"os", {"include", "core", "loaders", "platform/include"}},
    {"ipmi", {"include", "core", "loaders", "platform/include"}},
    {"proxy", {"include", "core"}},
    {"platform/include", {}},
    {"platform/smbios", {"core", "platform/include"}},
    {"platform/ipmi", {"core", "platform/include"}},
    {"platform/usblan", {"core", "platform/include"}},
    {"providers/memory", {"include"}},
    {"providers/reasons", {"include", "providers/memory"}},
    {"providers/mof", {"include", "core", "providers/memory"}},
    {"providers/host", {"include", "core", "loaders", "providers/memory", "providers/reasons", "platform/include"}},
    {"providers/storage", {"include", "providers/memory", "providers/reasons"}},
    {"providers/devices", {"include", "providers/memory", "providers/reasons"}},
    {"providers/sensors", {"include", "core", "providers/memory", "providers/reasons"}},
    {"providers/controller", {"include", "core", "providers/memory", "providers/reasons", "platform/include"}},
    {"providers/network", {"include", "providers/memory", "providers/reasons"}},
    {"collect", {"include", "core", "providers/memory", "providers/mof", "providers/reasons"}},
    {"tools/zep",
     {"include", "core", "loaders", "os", "proxy", "platform/include", "providers/memory", "providers/mof", "providers/reasons",
      "collect"}},
};

fs::path const kSource = SourcePath();

std::vector<fs::path> SourcesOf(std::string const& folder) {
  std::vector<fs::path> sources;
  if (!fs::exists(kSource / folder)) return sources;
  for (auto const& entry : fs::recursive_directory_iterator(kSource / folder)) {
    std::string const extension = entry.path().extension().string();
    if (extension == ".h" || extension == ".cpp") sources.push_back(entry.path());
  }
  return sources;
}

std::vector<std::string> QuotedIncludesOf(fs::path const& source) {
  static std::regex const include(R"re(^\s*#\s*include\s*"([^"]+)")re");
  std::vector<std::string> names;
  std::ifstream file(source);
  std::smatch match;
  for (std::string line; std::getline(file, line);)
    if (std::regex_search(line, match, include)) names.push_back(match[1]);
  return names;
}

// The room that the folder belongs to: the folder itself, or one of the folders above it.
std::string RoomOf(fs::path folder) {
  for (; !folder.empty(); folder = folder.parent_path())
    for (TRoom const& room : kRooms)
      if (folder == room.fFolder) return room.fFolder;
  return "nowhere";
}

// The room of an included file, which is given relative to the root ("core/Log.h"), relative to the source, or by its name
// in one of the flat public folders.
std::string RoomNamedBy(std::string const& include, fs::path const& source) {
  if (fs::exists(kSource / include)) return RoomOf(fs::path(include).parent_path());
  if (fs::exists(source.parent_path() / include)) return RoomOf(fs::relative(source.parent_path(), kSource));
  for (char const* flat : {"include", "platform/include", "providers/memory", "providers/mof", "providers/reasons"})
    if (fs::exists(kSource / flat / include)) return flat;
  return "nowhere";
}

TEST(HouseTest, RoomsIncludeOnlyTheRoomsTheyMay) {
  int checked = 0;
  for (TRoom const& room : kRooms) {
    std::set<std::string> allowed(room.fMayInclude.begin(), room.fMayInclude.end());
    allowed.insert(room.fFolder);
    for (fs::path const& source : SourcesOf(room.fFolder))
      for (std::string const& include : QuotedIncludesOf(source)) {
        std::string const named = RoomNamedBy(include, source);
        EXPECT_TRUE(allowed.count(named)) << source << " includes \"" << include << "\", which is of " << named;
        ++checked;
      }
  }
  EXPECT_GT(checked, 100);
}

// ---- Tests and their sources ----

struct TTestWithoutSource {
  char const *fPath, *fReason;
};

TTestWithoutSource const kTestsWithoutSource[] = {
    {"cim/model/CopyMutexTest.cpp", "includes a single public header, as a caller of the mutex does"},
    {"cim/model/InterfaceBodiesTest.cpp", "all interfaces: the operations that a plug-in may leave out"},
    {"cim/model/InterfaceSlotsTest.cpp", "all interfaces: the order of their virtual operations"},
    {"cim/model/InterfaceTableTest.cpp", "all interfaces: the table in docs/writing-a-provider.md"},
    {"cim/value/TCIMTypeTest.cpp", "TCIMType is declared in TCIMValue.h"},
    {"cim/value/TCIMValueTextTest.cpp", "the part of TCIMValue that reads text"},
    {"ipmi/ChkResponseTest.cpp", "the part of IIPMILan that needs no library"},
    {"os/HostFaultsTest.cpp", "all of os: calls of the C library that fail"},
    {"providers/memory/ManyElementsTest.cpp", "the complete room, with large namespaces"},
    {"providers/memory/NamespaceCopyTest.cpp", "the complete room, through the interfaces alone"},
    {"providers/mof/DeepInheritanceTest.cpp", "the complete room, with large texts"},
    {"providers/mof/DmtfSchemaTest.cpp", "the complete room, with a real schema"},
    {"providers/storage/ChainTest.cpp", "the complete plug-in, through the interfaces alone"},
    {"proxy/DhcpParserTest.cpp", "the part of AutoProxyDiscovery that needs no network"},
    {"tools/zep/commands/ArgumentsTest.cpp", "every command of zep: its arguments"},
    {"tools/zep/commands/EnvelopeTest.cpp", "every command of zep: its exit status and document"},
    {"tools/zep/commands/ProvidersAtWorkTest.cpp", "commands/Providers: limits, interrupts and progress of plug-ins"},
    {"tools/zep/commands/RedactedSecretsTest.cpp", "commands/Redacting: what is left in the reports of recorded machines"},
};

char const* ReasonForNoSource(fs::path const& test) {
  for (TTestWithoutSource const& known : kTestsWithoutSource)
    if (test == known.fPath) return known.fReason;
  return nullptr;
}

// Whether the test, given relative to tests/, has a source or a header of its name: in the same folder of the source tree, or
// among the public headers. "ShowTest" may also be the test of "ShowCommand".
bool HasSource(fs::path const& test) {
  std::string const stem = test.stem().string();
  std::string const name = stem.substr(0, stem.size() - std::string("Test").size());
  for (fs::path const& folder : {test.parent_path(), fs::path("include")})
    for (char const* ending : {".cpp", ".h", "Command.cpp"})
      if (fs::exists(kSource / folder / (name + ending))) return true;
  return false;
}

TEST(HouseTest, EveryTestOfARoomHasASourceOfItsName) {
  int checked = 0;
  for (TRoom const& room : kRooms)
    for (fs::path const& path : SourcesOf("tests/" + std::string(room.fFolder))) {
      fs::path const test = fs::relative(path, kSource / "tests");
      std::string const name = test.filename().string();
      bool const isTest = name.size() > 8 && name.compare(name.size() - 8, 8, "Test.cpp") == 0;
      if (!isTest || RoomOf(test.parent_path()) != room.fFolder) continue;
      EXPECT_NE(HasSource(test), ReasonForNoSource(test) != nullptr) << test;
      ++checked;
    }
  EXPECT_GT(checked, 80);
  for (TTestWithoutSource const& known : kTestsWithoutSource)
    EXPECT_TRUE(fs::exists(kSource / "tests" / known.fPath)) << known.fPath << ", " << known.fReason;
}

// ---- Names of fields in the tests ----

// clang-tidy checks the names of fields outside of the tests. For the tests it would take too long: here the lines are compared
// with the forms that clang-format gives to declarations.

std::string WithoutTemplateArguments(std::string text) {
  static std::regex const innermost("<[^<>]*>");
  for (std::string before; before != text; text = std::regex_replace(before, innermost, "")) before = text;
  return text;
}

// The fields that a line of a class declares: "  char const *name, *text = nullptr;  // null: none" declares "name" and "text".
std::vector<std::string> FieldsDeclaredBy(std::string const& line) {
  static std::regex const other(R"(^\s*(//|#|(using|typedef|static|friend|enum|struct|class|union|template|return)\b))");
  static std::regex const valueOrComment(R"( = .*|\{.*|\[.*|;.*)");
  static std::regex const pointerToFunction(R"(^[^(]*\(\*(?:const )?(\w+)\)\(.*)");
  static std::regex const declaration(R"(^\s*(?:[\w:]+ )*[\w:]+[ *&]+(\w+(?:, [*&]*\w+)*)$)");
  static std::regex const name(R"(\w+)");
  std::smatch match;
  if (std::regex_search(line, other)) return {};
  std::string const plain = std::regex_replace(WithoutTemplateArguments(line), valueOrComment, "");
  if (std::regex_match(plain, match, pointerToFunction)) return {match[1]};
  if (!std::regex_match(plain, match, declaration)) return {};
  std::string const names = match[1];
  return {std::sregex_token_iterator(names.begin(), names.end(), name), std::sregex_token_iterator()};
}

// The fields of all classes of a source.
std::vector<std::string> FieldsOf(fs::path const& source) {
  static std::regex const beginning(R"(^(\s*)(?:struct|class|union)\b[^;]*\{$)");
  std::vector<std::string> fields, indents;  // of the classes that the line is part of, the innermost last
  std::ifstream file(source);
  std::smatch match;
  for (std::string line; std::getline(file, line);) {
    std::size_t const indent = std::min(line.find_first_not_of(' '), line.size());
    if (!indents.empty() && indent == indents.back().size() && line[indent] == '}') indents.pop_back();
    if (!indents.empty() && indent == indents.back().size() + 2)
      for (std::string& field : FieldsDeclaredBy(line)) fields.push_back(std::move(field));
    if (std::regex_match(line, match, beginning)) indents.push_back(match[1]);
  }
  return fields;
}

TEST(HouseTest, FieldsOfTestsBeginWithF) {
  static std::regex const isOfTheHouse("(f[A-Z0-9]|k[A-Z]).*");
  int checked = 0;
  for (fs::path const& source : SourcesOf("tests"))
    for (std::string const& field : FieldsOf(source)) {
      EXPECT_TRUE(std::regex_match(field, isOfTheHouse)) << source << ": " << field;
      ++checked;
    }
  EXPECT_GT(checked, 500);
}

TEST(HouseTest, ZepcoreHeaderIncludesEveryPublicHeader) {
  std::set<std::string> const all = [] {
    auto const names = QuotedIncludesOf(kSource / "include/zepcore.h");
    return std::set<std::string>(names.begin(), names.end());
  }();
  for (fs::path const& header : SourcesOf("include")) {
    std::string const name = header.filename().string();
    EXPECT_TRUE(name == "zepcore.h" || all.count(name)) << header;
  }
}

// The names of all tests in the tree, as "Suite.Name".
std::set<std::string> AllTests() {
  static std::regex const test(R"(^(?:TYPED_)?TEST(?:_F|_P)?\((\w+), (\w+)\))");
  std::set<std::string> tests;
  for (auto const& entry : fs::recursive_directory_iterator(kSource / "tests")) {
    if (entry.path().extension() != ".cpp") continue;
    std::ifstream file(entry.path());
    std::smatch match;
    for (std::string line; std::getline(file, line);)
      if (std::regex_search(line, match, test)) tests.insert(match[1].str() + "." + match[2].str());
  }
  return tests;
}

TEST(HouseTest, EveryKeptBehaviourNamesAFileAndATestThatExist) {
  static std::regex const row(R"(^\| .* \| `([^`]+)` \| `([^`]+)` \|$)");
  std::set<std::string> const tests = AllTests();
  std::istringstream lines(ReadFile((kSource / "docs/kept-behaviour.md").string()));
  int rows = 0;
  std::smatch match;
  for (std::string line; std::getline(lines, line);) {
    if (!std::regex_match(line, match, row)) continue;
    EXPECT_TRUE(fs::exists(kSource / match[1].str())) << match[1];
    EXPECT_TRUE(tests.count(match[2])) << match[2];
    ++rows;
  }
  EXPECT_GT(rows, 20);
}

TEST(HouseTest, EveryTestThatTheSecurityPageNamesExists) {
  static std::regex const named(R"(`(\w+Test\.\w+)`)");
  std::set<std::string> const tests = AllTests();
  std::string const page = ReadFile((kSource / "docs/security.md").string());
  int count = 0;
  for (std::sregex_iterator match(page.begin(), page.end(), named), end; match != end; ++match, ++count)
    EXPECT_TRUE(tests.count((*match)[1])) << (*match)[1];
  EXPECT_GT(count, 20);
}

std::string OutputOf(std::string const& command) {
  std::unique_ptr<FILE, int (*)(FILE*)> const pipe(::popen(command.c_str(), "r"), ::pclose);
  std::string output;
  std::array<char, 4096> chunk;
  while (std::size_t const got = std::fread(chunk.data(), 1, chunk.size(), pipe.get())) output.append(chunk.data(), got);
  return output;
}

// The symbols that the library itself defines in its dynamic symbol table.
std::vector<std::string> ExportedSymbols() {
  std::vector<std::string> symbols;
  std::istringstream lines(OutputOf("nm -D -C --defined-only " ZEP_LIBRARY));
  for (std::string line; std::getline(lines, line);)
    if (line.size() > 19) symbols.push_back(line.substr(19));
  return symbols;
}

TEST(HouseTest, OnlyPublicSymbolsAreExported) {
  static std::regex const isPublic(
      R"(^((typeinfo|typeinfo name|vtable) for )?(NQRVZEP20::|boost::assertion_failed|AutoProxyDiscovery|TCopy|copyInstMutex))"
      R"(|^(non-virtual |virtual )?thunk to NQRVZEP20::|^guard variable for NQRVZEP20::)");
  std::vector<std::string> const symbols = ExportedSymbols();
  EXPECT_GT(symbols.size(), 100u);
  for (std::string const& symbol : symbols) {
    if (symbol.rfind("__", 0) == 0) continue;  // belongs to a sanitizer
    EXPECT_TRUE(std::regex_search(symbol, isPublic)) << symbol;
  }
}

TEST(HouseTest, TypesThrownAndCastAcrossLibrariesAreExported) {
  std::vector<std::string> const list = ExportedSymbols();
  std::set<std::string> const symbols(list.begin(), list.end());
  for (char const* name : {"TZEPException", "TBoostAssertException", "ICIMClass", "ICIMInstance", "ICIMNamespace", "ILogger",
                           "INamespaceProvider", "INamespaceConsumer", "TCIMValueImpl"})
    EXPECT_TRUE(symbols.count(std::string("typeinfo for NQRVZEP20::") + name)) << name;
  EXPECT_TRUE(symbols.count("boost::assertion_failed(char const*, char const*, char const*, long)"));
  EXPECT_TRUE(symbols.count("boost::assertion_failed_msg(char const*, char const*, char const*, char const*, long)"));
}

TEST(HouseTest, PlatformLibrariesAndLibcurlAreNotLinked) {
  std::string const dynamic = OutputOf("readelf -d " ZEP_LIBRARY);
  EXPECT_NE(dynamic.find("libstdc++.so"), std::string::npos) << dynamic;
  for (char const* name : {"libsmbios", "libipmiClient", "ovdusblan", "libcurl", "libfreeipmi"})
    EXPECT_EQ(dynamic.find(name), std::string::npos) << name;
  EXPECT_NE(dynamic.find("(RUNPATH)            Library runpath: [$ORIGIN]"), std::string::npos) << dynamic;
}

}  // namespace
}  // namespace NQRVZEP20
