// SPDX-License-Identifier: Apache-2.0
#include "TCIMReference.h"

#include "Fakes.h"
#include "TCIMReferenceImpl.h"
#include "providers/memory/TMemoryNamespace.h"
#include "tests/Support.h"

#include <map>
#include <type_traits>

namespace NQRVZEP20 {
namespace {

using TNames = std::vector<std::string>;

// A namespace with the class X_Disk, whose keys are Id (uint32) and Name (string), and X_Link, which refers to disks.
class TCIMReferenceTest : public testing::Test {
protected:
  TCIMReferenceTest() {
    fNs->Add("X_Disk").Add("Id", ECIMType::kCIMTypeUint32).Add("Name", ECIMType::kCIMTypeString);
    fNs->Add("X_Link").Add("Disk", ECIMType::kCIMTypeReference).Add("Port", ECIMType::kCIMTypeUint8);
  }

  TCIMReference Empty() const { return TCIMReference(fNs, TCIMContext()); }
  TCIMReference Parsed(std::string const& path) const { return TCIMReference(fNs, path, TCIMContext()); }

  TCIMReference Disk(unsigned int id) const {
    TCIMReference disk = Empty();
    disk.SetClassName("X_Disk");
    disk.AddKeyValue("Id", TCIMValue(id));
    return disk;
  }

  static TNames KeysOf(TCIMReference const& reference) {
    TNames keys;
    reference.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> key) {
      keys.push_back(key.first + "=" + key.second.ToString(10));
      return true;
    });
    return keys;
  }

  static TCIMValue KeyOf(TCIMReference const& reference, std::string const& name) {
    TCIMValue found;
    reference.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> key) {
      if (key.first == name) found = key.second;
      return true;
    });
    return found;
  }

  boost::shared_ptr<TFakeNamespace> const fNs = boost::make_shared<TFakeNamespace>();
};

// ---- Parsing: valid paths ----

TEST_F(TCIMReferenceTest, ReadsPaths) {
  struct {
    char const* fPath;
    char const* fClassName;
    TNames fKeys;
  } const kRows[] = {
      {"X_Disk", "X_Disk", {}},
      {"ns:X_Disk", "X_Disk", {}},
      {":X_Disk", "X_Disk", {}},
      {"root/cimv2:X_Disk", "X_Disk", {}},
      {"a.b:X_Disk", "X_Disk", {}},  // a "." before the ":" belongs to the namespace
      {"ns:X_Disk.Id=\"5\"", "X_Disk", {"Id=5"}},
      {":X_Disk.Id=\"5\"", "X_Disk", {"Id=5"}},
      {"a.b:X_Disk.Id=\"5\"", "X_Disk", {"Id=5"}},
      {"ns:X_Disk.Id=\"5\",Name=\"sda\"", "X_Disk", {"Id=5", "Name=sda"}},
      {"ns:X_Disk.Name=\"sda\",Id=\"5\"", "X_Disk", {"Id=5", "Name=sda"}},
      {"ns:X_Disk.Id=\"5\".Name=\"sda\"", "X_Disk", {"Id=5", "Name=sda"}},  // "." separates keys just as "," does
      {"ns:X_Disk.Name=\"\"", "X_Disk", {"Name="}},
      {"ns:X_Disk.Name=\"a.b,c=d:e\"", "X_Disk", {"Name=a.b,c=d:e"}},
      {"ns:X_Disk.Id=\" 7seven\"", "X_Disk", {"Id=7"}},  // the number is read as TCIMValue reads it from text
      {"ns:X_Disk.Id=\"none\"", "X_Disk", {"Id=0"}},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fPath);
    TCIMReference const reference = Parsed(row.fPath);
    EXPECT_EQ(reference.GetClassName(), row.fClassName);
    EXPECT_EQ(reference.GetClass(), fNs->Class(row.fClassName));
    EXPECT_EQ(KeysOf(reference), row.fKeys);
  }
}

TEST_F(TCIMReferenceTest, AKeyHasTheDeclaredType) {
  TCIMReference const disk = Parsed("ns:X_Disk.Id=\"5\",Name=\"5\"");
  EXPECT_EQ(KeyOf(disk, "Id"), TCIMValue(5u));
  EXPECT_EQ(KeyOf(disk, "Name"), TCIMValue("5"));
}

TEST_F(TCIMReferenceTest, NumbersOfOtherTypesCanBeKeys) {
  fNs->Class("X_Disk")->Add("Load", ECIMType::kCIMTypeReal64).Add("Offset", ECIMType::kCIMTypeSint64);
  EXPECT_EQ(KeysOf(Parsed("ns:X_Disk.Load=\"-0.5\",Offset=\"-9223372036854775808\"")),
            (TNames{"Load=-0.5", "Offset=-9223372036854775808"}));
}

TEST_F(TCIMReferenceTest, AChar16KeyIsSetButCannotBePrintedOrCompared) {
  fNs->Class("X_Disk")->Add("Letter", ECIMType::kCIMTypeChar16);
  TCIMReference const disk = Parsed("ns:X_Disk.Letter=\"C\"");
  EXPECT_EQ(KeyOf(disk, "Letter").GetType(), ECIMType::kCIMTypeChar16);
  EXPECT_STATUS(disk.GetPath(), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(disk == Parsed("ns:X_Disk.Letter=\"C\"")), kZEPStatusInvalidDateTime);
  EXPECT_STATUS((void)(disk < Parsed("ns:X_Disk.Letter=\"C\"")), kZEPStatusInvalidDateTime);
}

TEST_F(TCIMReferenceTest, WithoutNamespacePrefixAPathWithKeysIsAClassName) {
  TLogCapture log;
  EXPECT_STATUS(Parsed("X_Disk.Id=\"5\""), kZEPStatusInvalidReference);
  EXPECT_EQ(fNs->fCalls.fNames, TNames({"X_Disk.Id=\"5\""}));
  EXPECT_EQ(log.Entries(), TNames({"[Error] Reference specifies invalid class, path=X_Disk.Id=\"5\""}));
}

// The class name that is looked up shows where each path is split.
TEST_F(TCIMReferenceTest, SplitsOffTheClassName) {
  struct {
    char const* fPath;
    char const* fClassName;
  } const kRows[] = {
      {"", ""},
      {":", ""},
      {":.", ""},
      {"ns:", ""},
      {"ns:.Id=\"5\"", ""},
      {"Y", "Y"},
      {"Y.Id", "Y.Id"},
      {"ns:Y", "Y"},
      {"ns:Y ", "Y "},
      {"ns: Y", " Y"},
      {"a:b:Y", "b:Y"},  // only the first prefix is dropped
      {"a:b:Y.Id=\"5\"", "b:Y"},
      {"//host:5988/ns:Y.Id=\"5\"", "5988/ns:Y"},
      {"a.b:Y.Id=\"5\"", "Y"},
      {"Y.Name=\"a:b\"", "b\""},  // without a prefix, a ":" in a value counts as one
      {"Y.Name=\"a:b.c\"", "b"},
      {"ns:Y.Name=\"a:b.c\"", "Y"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fPath);
    fNs->fCalls.fNames.clear();
    EXPECT_STATUS(Parsed(row.fPath), kZEPStatusInvalidReference);
    EXPECT_EQ(fNs->fCalls.fNames, TNames({row.fClassName}));
  }
}

TEST_F(TCIMReferenceTest, ReadsEscapes) {
  struct {
    char const* fWritten;
    char const* fRead;
  } const kRows[] = {
      {R"(a\"b)", R"(a"b)"},   // a quote
      {R"(a\\b)", R"(a\b)"},   // a backslash
      {R"(a\nb)", R"(a\nb)"},  // anything else keeps its backslash
      {R"(\\)", R"(\)"},      {R"(\")", R"(")"},          {R"(\\\")", R"(\")"},
      {R"(\\n)", R"(\n)"},    {R"(\,\=\.)", R"(\,\=\.)"}, {R"(\\\\)", R"(\\)"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fWritten);
    TCIMReference const disk = Parsed(std::string("ns:X_Disk.Name=\"") + row.fWritten + "\",Id=\"1\"");
    EXPECT_EQ(KeysOf(disk), TNames({"Id=1", std::string("Name=") + row.fRead}));
  }
}

TEST_F(TCIMReferenceTest, ZeroBytesAreOrdinaryCharacters) {
  using namespace std::string_literals;
  EXPECT_EQ(KeysOf(Parsed("ns:X_Disk.Name=\"a\0b\""s)), TNames({"Name=a\0b"s}));
}

TEST_F(TCIMReferenceTest, FirstOfTwoKeysOfOneNameWinsInAPath) {
  EXPECT_EQ(KeysOf(Parsed("ns:X_Disk.Id=\"1\",Name=\"a\",Id=\"2\"")), TNames({"Id=1", "Name=a"}));
}

TEST_F(TCIMReferenceTest, AnyPropertyOfTheClassMayBeAKeyOfThePath) {
  fNs->Class("X_Disk")->Add("Seen", ECIMType::kCIMTypeBoolean).Add("Made", ECIMType::kCIMTypeDateTime);
  EXPECT_EQ(KeysOf(Parsed("ns:X_Disk.Seen=\"true\",Made=\"20240229120000.000000+060\"")),
            TNames({"Made=20240229120000.000000+060", "Seen=true"}));
}

// ---- Parsing: failures ----

TEST_F(TCIMReferenceTest, MalformedPathsAreLoggedAsOneErrorAndThrowInvalidReference) {
  struct {
    char const* fPath;
    char const* fMessage;
  } const kRows[] = {
      {"", "Reference specifies invalid class, path="},
      {"Y_Disk", "Reference specifies invalid class, path=Y_Disk"},
      {"ns:Y_Disk", "Reference specifies invalid class, path=ns:Y_Disk"},
      {"ns:x_disk.Id=\"5\"", "Reference specifies invalid class, path=ns:x_disk.Id=\"5\""},
      {"ns:Y_Disk.", "Reference specifies invalid class, path=ns:Y_Disk."},  // the class is read first
      {"ns:X_Disk.Size=\"5\"", "Reference specifies invalid property, property=Size, path=ns:X_Disk.Size=\"5\""},
      {"ns:X_Disk.Size=5", "Reference specifies invalid property, property=Size, path=ns:X_Disk.Size=5"},  // before the quote
      {"ns:X_Disk.Size=", "Reference specifies invalid property, property=Size, path=ns:X_Disk.Size="},
      {"ns:X_Disk.=\"5\"", "Reference specifies invalid property, property=, path=ns:X_Disk.=\"5\""},
      {"ns:X_Disk. Id=\"5\"", "Reference specifies invalid property, property= Id, path=ns:X_Disk. Id=\"5\""},
      {"ns:X_Disk.Id =\"5\"", "Reference specifies invalid property, property=Id , path=ns:X_Disk.Id =\"5\""},
      {"ns:X_Disk.Id,Name=\"a\"", "Reference specifies invalid property, property=Id,Name, path=ns:X_Disk.Id,Name=\"a\""},
      {"ns:X_Disk.Id=\"5\"Name=\"a\"", "Reference missing '.' or ',', path=ns:X_Disk.Id=\"5\"Name=\"a\""},
      {"ns:X_Disk.Id=\"5\" ", "Reference missing '.' or ',', path=ns:X_Disk.Id=\"5\" "},
      {"ns:X_Disk.Id=\"5\"\"", "Reference missing '.' or ',', path=ns:X_Disk.Id=\"5\"\""},
      {"ns:X_Disk.Id=\"5\"\"6\"", "Reference missing '.' or ',', path=ns:X_Disk.Id=\"5\"\"6\""},
      {"ns:X_Disk.", "Reference missing property value, path=ns:X_Disk."},
      {"ns:X_Disk.Id", "Reference missing property value, path=ns:X_Disk.Id"},
      {"ns:X_Disk.Size", "Reference missing property value, path=ns:X_Disk.Size"},
      {"ns:X_Disk.Id=\"5\",", "Reference missing property value, path=ns:X_Disk.Id=\"5\","},
      {"ns:X_Disk.Id=\"5\",Name", "Reference missing property value, path=ns:X_Disk.Id=\"5\",Name"},
      {"ns:X_Disk.Id=", "Reference missing opening '\"', path=ns:X_Disk.Id="},
      {"ns:X_Disk.Id=5", "Reference missing opening '\"', path=ns:X_Disk.Id=5"},
      {"ns:X_Disk.Id= \"5\"", "Reference missing opening '\"', path=ns:X_Disk.Id= \"5\""},
      {"ns:X_Disk.Id=='5'", "Reference missing opening '\"', path=ns:X_Disk.Id=='5'"},
      {"ns:X_Disk.Id=\"", "Reference missing closing '\"', path=ns:X_Disk.Id=\""},
      {"ns:X_Disk.Id=\"5", "Reference missing closing '\"', path=ns:X_Disk.Id=\"5"},
      {"ns:X_Disk.Name=\"a\\", "Reference missing closing '\"', path=ns:X_Disk.Name=\"a\\"},
      {"ns:X_Disk.Name=\"a\\\"", "Reference missing closing '\"', path=ns:X_Disk.Name=\"a\\\""},
      {"ns:X_Disk.Id=\"5\",Name=\"a", "Reference missing closing '\"', path=ns:X_Disk.Id=\"5\",Name=\"a"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fPath);
    TLogCapture log;
    EXPECT_STATUS(Parsed(row.fPath), kZEPStatusInvalidReference);
    EXPECT_EQ(log.Entries(), TNames({std::string("[Error] ") + row.fMessage}));
  }
}

TEST_F(TCIMReferenceTest, PartsReadBeforeAFailureStaySet) {
  TCIMReference disk = Empty();
  EXPECT_STATUS(disk.SetPath("ns:X_Disk.Id=\"5\",Name=\"a"), kZEPStatusInvalidReference);
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(disk.GetNamespace(), fNs);

  EXPECT_STATUS(disk.SetPath("ns:X_Disk"), kZEPStatusInvalidOpSequence);
}

TEST_F(TCIMReferenceTest, AFailureAtTheFirstKeyLeavesTheClassSet) {
  TCIMReference disk = Empty();
  EXPECT_STATUS(disk.SetPath("ns:X_Disk.Size=\"5\""), kZEPStatusInvalidReference);
  EXPECT_EQ(disk.GetPath(), "X_Disk");
}

TEST_F(TCIMReferenceTest, AfterAnUnknownClassThePathCanBeSetAgain) {
  TCIMReference disk = Empty();
  EXPECT_STATUS(disk.SetPath("ns:Y_Disk"), kZEPStatusInvalidReference);
  EXPECT_FALSE(disk.GetClass());
  disk.SetPath("ns:X_Disk");
  EXPECT_EQ(disk.GetPath(), "X_Disk");
}

TEST_F(TCIMReferenceTest, AnUnknownPropertyMayBeReportedByAnEmptyPointer) {
  fNs->Class("X_Disk")->fAnswersUnknownByEmpty = true;
  TLogCapture log;
  EXPECT_STATUS(Parsed("ns:X_Disk.Size=\"5\""), kZEPStatusInvalidReference);
  EXPECT_EQ(log.Entries(), TNames({"[Error] Reference specifies invalid property, property=Size, path=ns:X_Disk.Size=\"5\""}));
}

TEST_F(TCIMReferenceTest, OtherFailuresOfTheClassLookupPassThroughUnlogged) {
  for (EZEPStatusCode const status : {kZEPStatusConnectionFailed, kZEPStatusInvalidReference, kZEPStatusFail}) {
    fNs->fCalls.fFailure = status;
    TLogCapture log;
    EXPECT_STATUS(Parsed("ns:X_Disk.Id=\"5\""), status);
    EXPECT_EQ(log.Entries(), TNames());
  }
}

TEST_F(TCIMReferenceTest, NotFoundOfTheClassLookupBecomesInvalidReference) {
  fNs->fCalls.fFailure = kZEPStatusNotFound;
  TLogCapture log;
  EXPECT_STATUS(Parsed("ns:X_Disk"), kZEPStatusInvalidReference);
  EXPECT_EQ(log.Entries(), TNames({"[Error] Reference specifies invalid class, path=ns:X_Disk"}));
}

TEST_F(TCIMReferenceTest, OtherFailuresOfThePropertyLookupPassThroughUnlogged) {
  for (EZEPStatusCode const status : {kZEPStatusConnectionFailed, kZEPStatusInvalidReference, kZEPStatusFail}) {
    fNs->Class("X_Disk")->fCalls.fFailure = status;
    TLogCapture log;
    TCIMReference disk = Empty();
    EXPECT_STATUS(disk.SetPath("ns:X_Disk.Id=\"5\""), status);
    EXPECT_EQ(log.Entries(), TNames());
    EXPECT_EQ(disk.GetClass(), fNs->Class("X_Disk"));
  }
}

TEST_F(TCIMReferenceTest, FailuresOfReadingAValuePassThroughUnlogged) {
  TCIMValue nullStrings(ECIMType::kCIMTypeString, 4);
  fNs->Class("X_Disk")->Add("Made", ECIMType::kCIMTypeDateTime).Add("Names", nullStrings.GetType(), nullStrings);
  fNs->Class("X_Disk")->Add("Nothing", ECIMType::kCIMTypeInvalid);
  struct {
    char const* fPath;
    EZEPStatusCode fStatus;
  } const kRows[] = {
      {"ns:X_Disk.Id=\"5\",Made=\"yesterday\"", kZEPStatusInvalidDateTime},
      {"ns:X_Disk.Id=\"5\",Names=\"a\"", kZEPStatusTypeMismatch},
      {"ns:X_Disk.Id=\"5\",Nothing=\"a\"", kZEPStatusTypeMismatch},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fPath);
    TLogCapture log;
    TCIMReference disk = Empty();
    EXPECT_STATUS(disk.SetPath(row.fPath), row.fStatus);
    EXPECT_EQ(log.Entries(), TNames());
    EXPECT_EQ(KeysOf(disk), TNames({"Id=5"}));
  }
}

TEST_F(TCIMReferenceTest, AConstructorWithABadPathThrows) {
  EXPECT_STATUS(TCIMReference(fNs, "ns:Y_Disk", TCIMContext()), kZEPStatusInvalidReference);
  EXPECT_STATUS(TCIMReference(nullptr, "ns:X_Disk", TCIMContext()), kZEPStatusInvalidOpSequence);
}

TEST_F(TCIMReferenceTest, SetPathNeedsALiveNamespaceAndNeitherClassNorKeys) {
  auto expired = boost::make_shared<TFakeNamespace>();
  TCIMReference withoutNamespace(nullptr, TCIMContext());
  TCIMReference withExpired(expired, TCIMContext());
  expired.reset();
  TCIMReference withClass = Empty();
  withClass.SetClass(fNs->Class("X_Disk"));
  TCIMReference withKeys = Disk(5);

  fNs->fCalls.fNames.clear();
  TLogCapture log;
  for (TCIMReference* reference : {&withoutNamespace, &withExpired, &withClass, &withKeys})
    EXPECT_STATUS(reference->SetPath("ns:X_Link"), kZEPStatusInvalidOpSequence);
  EXPECT_EQ(fNs->fCalls.fNames, TNames());  // nothing was parsed
  EXPECT_EQ(log.Entries(), TNames());
  EXPECT_EQ(withClass.GetPath(), "X_Disk");
  EXPECT_EQ(withKeys.GetPath(), "X_Disk.Id=\"5\"");
}

// ---- Parsing: references as key values ----

TEST_F(TCIMReferenceTest, ReadsAReferenceAsAKey) {
  TCIMReference const link = Parsed("ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"\",Port=\"1\"");
  EXPECT_EQ(KeysOf(link), TNames({"Disk=X_Disk.Id=\"5\"", "Port=1"}));
  TCIMReference const disk = KeyOf(link, "Disk");
  EXPECT_TRUE(disk == Disk(5));
  EXPECT_EQ(disk.GetNamespace(), fNs);
  EXPECT_EQ(KeyOf(link, "Disk").GetReferencedClass(), fNs->Class("X_Disk"));
}

TEST_F(TCIMReferenceTest, ReadsReferencesWithinReferences) {
  fNs->Add("X_Rack").Add("Link", ECIMType::kCIMTypeReference).Add("Row", ECIMType::kCIMTypeUint8);
  TCIMReference const rack =
      Parsed("ns:X_Rack.Link=\"a:X_Link.Disk=\"b:X_Disk.Id=\"5\",Name=\"x\\\"y\"\",Port=\"1\"\",Row=\"2\"");
  EXPECT_EQ(KeysOf(rack), TNames({R"(Link=X_Link.Disk="X_Disk.Id="5",Name="x\"y"",Port="1")", "Row=2"}));
}

TEST_F(TCIMReferenceTest, AReferenceKeyMayHaveADefaultThatIsNotNull) {
  TCIMReference disk = Disk(1);
  fNs->Add("X_Start").Add("Disk", ECIMType::kCIMTypeReference, TCIMValue(disk));
  EXPECT_EQ(KeysOf(Parsed("ns:X_Start.Disk=\"ns:X_Disk.Id=\"5\"\"")), TNames({"Disk=X_Disk.Id=\"5\""}));
}

// The default value, not the declared type, marks a key as a reference. Without one the value is read as escaped text.
TEST_F(TCIMReferenceTest, AReferenceTypeWithoutAReferenceDefaultIsReadAsEscapedText) {
  fNs->Add("X_Loose").Add("Disk", ECIMType::kCIMTypeReference, TCIMValue());
  TCIMReference const loose = Parsed("ns:X_Loose.Disk=\"ns:X_Disk.Id=\\\"5\\\"\"");
  EXPECT_EQ(KeysOf(loose), TNames({"Disk=X_Disk.Id=\"5\""}));

  TLogCapture log;
  EXPECT_STATUS(Parsed("ns:X_Loose.Disk=\"ns:Y\""), kZEPStatusInvalidReference);
  EXPECT_EQ(log.Entries(), TNames({"[Error] Reference specifies invalid class, path=ns:Y"}));
}

// A nested path without keys or without a prefix takes the closing quote, and everything after it, as part of its class
// name.
TEST_F(TCIMReferenceTest, ANestedPathNeedsAPrefixAndKeys) {
  struct {
    char const* fPath;
    char const* fClassName;
  } const kRows[] = {
      {"ns:X_Link.Disk=\"ns:X_Disk\"", "X_Disk\""},
      {"ns:X_Link.Disk=\"ns:X_Disk\",Port=\"1\"", "X_Disk\",Port=\"1\""},
      {"ns:X_Link.Disk=\"X_Disk\"", "X_Disk\""},
      {"ns:X_Link.Disk=\"X_Disk.Id=\"5\"\"", "X_Disk.Id=\"5\"\""},
      {"ns:X_Link.Disk=\"\"", "\""},
      {"ns:X_Link.Disk=\"ns:X_Disk\",Port=\"a.b\"", "X_Disk\",Port=\"a"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fPath);
    fNs->fCalls.fNames.clear();
    TLogCapture log;
    EXPECT_STATUS(Parsed(row.fPath), kZEPStatusInvalidReference);
    EXPECT_EQ(fNs->fCalls.fNames, TNames({"X_Link", row.fClassName}));
    EXPECT_EQ(log.Entries(), TNames({std::string("[Error] Reference specifies invalid class, path=") + row.fPath}));
  }
}

TEST_F(TCIMReferenceTest, ANestedPathMayEndTheTextWithoutItsClosingQuote) {
  EXPECT_EQ(KeysOf(Parsed("ns:X_Link.Disk=\"X_Disk")), TNames({"Disk=X_Disk"}));
  EXPECT_EQ(KeysOf(Parsed("ns:X_Link.Disk=\"ns:X_Disk")), TNames({"Disk=X_Disk"}));
  EXPECT_EQ(KeysOf(Parsed("ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"")), TNames({"Disk=X_Disk.Id=\"5\""}));
}

TEST_F(TCIMReferenceTest, ReferencesAreNestedAtMost100Deep) {
  auto const nested = [](int depth) {
    std::string path;
    for (int i = 0; i < depth; ++i) path += "ns:X_Link.Disk=\"";
    return path + "ns:X_Link.Port=\"1\"" + std::string(static_cast<std::size_t>(depth), '"');
  };
  TCIMReference deepest = Empty();
  deepest.SetPath(nested(100));
  for (int depth : {101, 100000}) {
    SCOPED_TRACE(depth);
    TLogCapture log;
    TCIMReference tooDeep = Empty();
    EXPECT_STATUS(tooDeep.SetPath(nested(depth)), kZEPStatusInvalidReference);
    EXPECT_EQ(log.Entries(), std::vector<std::string>{"[Error] Reference nested too deeply, path=" + nested(depth)});
  }
}

TEST_F(TCIMReferenceTest, ReasonTravelsWithTheFailure) {
  EXPECT_EQ(ReasonOf([&] { TCIMReference(fNs, "ns:X_Nothing.Id=\"1\"", TCIMContext()); }),
            "Reference specifies invalid class, path=ns:X_Nothing.Id=\"1\"");
  EXPECT_EQ(ReasonOf([&] { Disk(7).AddKeyValue("Id", TCIMValue("5")); }), "Declaration type: uint32 Value type: string");
}

TEST_F(TCIMReferenceTest, FailuresInANestedPathLogTheCompletePathOnce) {
  struct {
    char const* fPath;
    char const* fMessage;
    char const* fLeft = "X_Link";  // a key is set when its value is complete
  } const kRows[] = {
      {"ns:X_Link.Disk=ns:X_Disk", "Reference missing opening '\"', path=ns:X_Link.Disk=ns:X_Disk"},
      {"ns:X_Link.Disk=\"", "Reference specifies invalid class, path=ns:X_Link.Disk=\""},
      {"ns:X_Link.Disk=\"ns:Y.Id=\"5\"\"", "Reference specifies invalid class, path=ns:X_Link.Disk=\"ns:Y.Id=\"5\"\""},
      {"ns:X_Link.Disk=\"ns:X_Disk.Port=\"5\"\"",
       "Reference specifies invalid property, property=Port, path=ns:X_Link.Disk=\"ns:X_Disk.Port=\"5\"\""},
      {"ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"x\"", "Reference missing '.' or ',', path=ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"x\""},
      {"ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"\"x", "Reference missing '.' or ',', path=ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"\"x",
       "X_Link.Disk=\"X_Disk.Id=\"5\"\""},
      {"ns:X_Link.Disk=\"ns:X_Disk.\"", "Reference missing property value, path=ns:X_Link.Disk=\"ns:X_Disk.\""},
      {"ns:X_Link.Disk=\"ns:X_Disk.Id=\"5", "Reference missing closing '\"', path=ns:X_Link.Disk=\"ns:X_Disk.Id=\"5"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fPath);
    TLogCapture log;
    TCIMReference link = Empty();
    EXPECT_STATUS(link.SetPath(row.fPath), kZEPStatusInvalidReference);
    EXPECT_EQ(log.Entries(), TNames({std::string("[Error] ") + row.fMessage}));
    EXPECT_EQ(link.GetPath(), row.fLeft);
  }
}

TEST_F(TCIMReferenceTest, ParsePathLeavesThePositionOnTheClosingQuoteOfTheEnclosingValue) {
  TCIMReference disk = Empty();
  std::string const path = "Disk=\"ns:X_Disk.Id=\"5\"\",Port=\"1\"";
  std::size_t pos = 5;
  TCIMReferenceImpl::ParsePath(disk, path, pos);
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(path.substr(pos), "\",Port=\"1\"");
}

TEST_F(TCIMReferenceTest, ParsePathFromTheStartEndsAtTheEnd) {
  for (std::string const path : {"X_Disk", "ns:X_Disk", "ns:X_Disk.Id=\"5\"", "ns:X_Link.Disk=\"X_Disk"}) {
    SCOPED_TRACE(path);
    TCIMReference reference = Empty();
    std::size_t pos = 0;
    TCIMReferenceImpl::ParsePath(*reference.GetBody(), path, pos);
    EXPECT_EQ(pos, path.size());
  }
}

// ---- Printing ----

TEST_F(TCIMReferenceTest, PrintsTheBareClassNameWithoutKeys) { EXPECT_EQ(Parsed("ns:X_Disk").GetPath(), "X_Disk"); }

TEST_F(TCIMReferenceTest, PrintsKeysInByteOrderWithoutNamespaceAndEscaped) {
  TCIMReference disk = Empty();
  disk.SetNameSpaceName("root/cimv2");
  disk.SetClassName("X_Disk");
  disk.AddKeyValue("Name", TCIMValue("a\"b"));
  disk.AddKeyValue("Id", TCIMValue(5u));
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\",Name=\"a\\\"b\"");
}

TEST_F(TCIMReferenceTest, PrintedPathsReadBackAfterAPrefix) {
  for (std::string const name : {"", "sda", "a\"b", "a\\b", "\\", "\"", "\\\"", "a\\nb", "a,b=c.d:e", " "}) {
    SCOPED_TRACE(name);
    TCIMReference disk = Empty();
    disk.SetClassName("X_Disk");
    disk.AddKeyValue("Id", TCIMValue(4000000000u));
    disk.AddKeyValue("Name", TCIMValue(name));
    EXPECT_TRUE(Parsed("ns:" + disk.GetPath()) == disk);
  }
}

TEST_F(TCIMReferenceTest, PrintsAReferenceKeyRaw) {
  TCIMReference disk = Empty();
  disk.SetClassName("X_Disk");
  disk.AddKeyValue("Name", TCIMValue("a\\\"b"));
  TCIMReference link = Empty();
  link.SetClassName("X_Link");
  link.AddKeyValue("Disk", TCIMValue(disk));
  EXPECT_EQ(disk.GetPath(), R"(X_Disk.Name="a\\\"b")");
  EXPECT_EQ(link.GetPath(), R"(X_Link.Disk="X_Disk.Name="a\\\"b"")");
}

TEST_F(TCIMReferenceTest, PrintsAnArrayOfStringsEscaped) {
  std::vector<TCIMValue> const names = {TCIMValue("a\"b"), TCIMValue("c")};
  TCIMValue const value(ECIMType::kCIMTypeString, 0, names);
  fNs->Class("X_Disk")->Add("Names", value.GetType(), value);
  TCIMReference disk = Empty();
  disk.SetClassName("X_Disk");
  disk.AddKeyValue("Names", value);
  EXPECT_EQ(disk.GetPath(), R"(X_Disk.Names="{ a\"b, c }")");
}

TEST_F(TCIMReferenceTest, PrintingANullKeyThrows) {
  TCIMValue null;
  null.SetNullValue(ECIMType::kCIMTypeUint32, 0);
  TCIMReference disk = Empty();
  disk.SetClassName("X_Disk");
  disk.AddKeyValue("Id", null);
  EXPECT_STATUS(disk.GetPath(), kZEPStatusValueIsNULL);
}

TEST_F(TCIMReferenceTest, PrintingWithoutAClassIsAFailedAssertion) {
  TEnvironmentGuard const mode("ZEP_BOOST_ASSERT", nullptr);
  EXPECT_STATUS(Empty().GetPath(), kZEPStatusFail);
  EXPECT_STATUS(Empty().GetClassName(), kZEPStatusFail);
}

// ---- Parts ----

TEST_F(TCIMReferenceTest, ANewReferenceHasOnlyItsNamespace) {
  TCIMReference const reference = Empty();
  EXPECT_EQ(reference.GetNamespace(), fNs);
  EXPECT_FALSE(reference.GetClass());
  EXPECT_EQ(KeysOf(reference), TNames());
  EXPECT_EQ(reference.GetNameSpaceName(), "");
}

TEST_F(TCIMReferenceTest, DoesNotKeepItsNamespaceAlive) {
  auto ns = boost::make_shared<TFakeNamespace>();
  TCIMReference const reference(ns, TCIMContext());
  EXPECT_EQ(ns.use_count(), 1);
  ns.reset();
  EXPECT_FALSE(reference.GetNamespace());
}

TEST_F(TCIMReferenceTest, SetNamespaceReplacesTheNamespaceOnly) {
  auto const other = boost::make_shared<TFakeNamespace>();
  TCIMReference disk = Disk(5);
  disk.SetNamespace(other);
  EXPECT_EQ(disk.GetNamespace(), other);
  EXPECT_EQ(other.use_count(), 1);
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  disk.SetNamespace(nullptr);
  EXPECT_FALSE(disk.GetNamespace());
}

TEST_F(TCIMReferenceTest, NamespaceNameIsALabelThatOtherOperationsIgnore) {
  TCIMReference disk = Empty();
  disk.SetNameSpaceName("label");
  disk.SetPath("ns:X_Disk.Id=\"5\"");
  EXPECT_EQ(disk.GetNameSpaceName(), "label");
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  disk.Clear();
  EXPECT_EQ(disk.GetNameSpaceName(), "label");
}

TEST_F(TCIMReferenceTest, SetClassNameLooksTheClassUpWithTheContextOfTheReference) {
  TCIMContext const context = {{"who", TCIMValue("me")}};
  TCIMReference disk(fNs, context);
  disk.SetClassName("X_Disk");
  EXPECT_EQ(disk.GetClass(), fNs->Class("X_Disk"));
  EXPECT_EQ(fNs->fCalls.fContexts, (std::vector<TCIMContext>{context}));
}

TEST_F(TCIMReferenceTest, ParsingLooksEveryClassUpWithTheContextOfTheReference) {
  TCIMContext const context = {{"who", TCIMValue("me")}};
  TCIMReference const link(fNs, "ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\"\"", context);
  EXPECT_EQ(fNs->fCalls.fNames, TNames({"X_Link", "X_Disk"}));
  EXPECT_EQ(fNs->fCalls.fContexts, (std::vector<TCIMContext>{context, context}));
}

TEST_F(TCIMReferenceTest, SetContextReplacesTheCompleteContext) {
  TCIMReference disk(fNs, TCIMContext{{"who", TCIMValue("me")}});
  disk.SetContext(TCIMContext{{"why", TCIMValue(1u)}});
  disk.SetClassName("X_Disk");
  EXPECT_EQ(fNs->fCalls.fContexts, (std::vector<TCIMContext>{{{"why", TCIMValue(1u)}}}));
}

TEST_F(TCIMReferenceTest, OtherCallsPassAnEmptyContext) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference disk(fNs, "ns:X_Disk.Id=\"5\"", TCIMContext{{"who", TCIMValue("me")}});
  disk.AddKeyValue("Name", TCIMValue("a"));
  disk.GetPath();
  disk.GetCIMElement(false);

  auto const cls = fNs->Class("X_Disk");
  std::vector<TCIMContext> contexts = cls->fCalls.fContexts;
  for (auto const& decl : cls->fDecls)
    contexts.insert(contexts.end(), decl.second->fCalls.fContexts.begin(), decl.second->fCalls.fContexts.end());
  contexts.insert(contexts.end(), fNs->fLookedUpContexts.begin(), fNs->fLookedUpContexts.end());
  EXPECT_GE(contexts.size(), 8u);
  for (TCIMContext const& context : contexts) EXPECT_TRUE(context.empty());
}

TEST_F(TCIMReferenceTest, FailuresOfTheLookupPassThroughSetClassName) {
  TLogCapture log;
  TCIMReference disk = Empty();
  EXPECT_STATUS(disk.SetClassName("Y_Disk"), kZEPStatusNotFound);
  fNs->fCalls.fFailure = kZEPStatusConnectionFailed;
  EXPECT_STATUS(disk.SetClassName("X_Disk"), kZEPStatusConnectionFailed);
  EXPECT_EQ(log.Entries(), TNames());
  EXPECT_FALSE(disk.GetClass());
}

TEST_F(TCIMReferenceTest, SetClassNameWithoutALiveNamespaceThrowsBadWeakPtr) {
  TCIMReference disk(nullptr, TCIMContext());
  EXPECT_THROW(disk.SetClassName("X_Disk"), boost::bad_weak_ptr);
  auto ns = boost::make_shared<TFakeNamespace>();
  disk.SetNamespace(ns);
  ns.reset();
  EXPECT_THROW(disk.SetClassName("X_Disk"), boost::bad_weak_ptr);
}

TEST_F(TCIMReferenceTest, TheClassCanBeReplacedWhileThereAreNoKeys) {
  TCIMReference reference = Empty();
  reference.SetClassName("X_Disk");
  reference.SetClassName("X_Link");
  EXPECT_EQ(reference.GetClassName(), "X_Link");
  reference.SetClass(nullptr);
  EXPECT_FALSE(reference.GetClass());
}

TEST_F(TCIMReferenceTest, TheClassCannotBeChangedOnceThereAreKeys) {
  TCIMReference disk = Disk(5);
  EXPECT_STATUS(disk.SetClass(fNs->Class("X_Link")), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(disk.SetClass(disk.GetClass()), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(disk.SetClassName("X_Link"), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(disk.SetClassName("Y_Link"), kZEPStatusNotFound);  // the class is looked up first
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
}

TEST_F(TCIMReferenceTest, ClearRemovesNamespaceClassKeysAndElement) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference disk(fNs, "ns:X_Disk.Id=\"5\"", TCIMContext{{"who", TCIMValue("me")}});
  disk.GetCIMElement(false);
  EXPECT_EQ(fNs->fInstance.use_count(), 2);
  disk.Clear();
  EXPECT_FALSE(disk.GetNamespace());
  EXPECT_FALSE(disk.GetClass());
  EXPECT_EQ(KeysOf(disk), TNames());
  EXPECT_EQ(fNs->fInstance.use_count(), 1);

  fNs->fCalls.fContexts.clear();
  disk.SetNamespace(fNs);
  disk.SetPath("ns:X_Disk");
  EXPECT_EQ(fNs->fCalls.fContexts, (std::vector<TCIMContext>{{{"who", TCIMValue("me")}}}));  // the context was not removed
}

// ---- Adding keys ----

TEST_F(TCIMReferenceTest, AddKeyValueNeedsAClass) {
  TCIMReference disk = Empty();
  EXPECT_STATUS(disk.AddKeyValue("Id", TCIMValue(5u)), kZEPStatusInvalidOpSequence);
}

TEST_F(TCIMReferenceTest, AddKeyValueOfAnUnknownPropertyThrowsNotFoundUnlogged) {
  TCIMReference disk = Empty();
  disk.SetClassName("X_Disk");
  TLogCapture log;
  EXPECT_STATUS(disk.AddKeyValue("Size", TCIMValue(5u)), kZEPStatusNotFound);
  fNs->Class("X_Disk")->fAnswersUnknownByEmpty = true;
  EXPECT_STATUS(disk.AddKeyValue("Size", TCIMValue(5u)), kZEPStatusNotFound);
  fNs->Class("X_Disk")->fCalls.fFailure = kZEPStatusConnectionFailed;
  EXPECT_STATUS(disk.AddKeyValue("Id", TCIMValue(5u)), kZEPStatusConnectionFailed);
  EXPECT_EQ(log.Entries(), TNames());
  EXPECT_EQ(disk.GetPath(), "X_Disk");
}

TEST_F(TCIMReferenceTest, AddKeyValueOfAnotherTypeIsLoggedAndThrowsTypeMismatch) {
  TCIMValue nullString;
  nullString.SetNullValue(ECIMType::kCIMTypeString, 0);
  TCIMReference disk = Disk(7);
  struct {
    char const* fName;
    TCIMValue fValue;
    char const* fMessage;
  } const kRows[] = {
      {"Id", TCIMValue(5), "Core: Declaration type: uint32 Value type: sint32"},
      {"Id", TCIMValue("5"), "Core: Declaration type: uint32 Value type: string"},
      {"Name", TCIMValue(5u), "Core: Declaration type: string Value type: uint32"},
      {"Name", TCIMValue(disk), "Core: Declaration type: string Value type: reference"},
      {"Id", nullString, "Core: Declaration type: uint32 Value type: string"},
      {"Name", TCIMValue(ECIMType::kCIMTypeString, 4), "Core: Declaration type: string Value type: string"},  // an array
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fMessage);
    TCIMReference reference = Empty();
    reference.SetClassName("X_Disk");
    TLogCapture log;
    EXPECT_STATUS(reference.AddKeyValue(row.fName, row.fValue), kZEPStatusTypeMismatch);
    EXPECT_EQ(log.Entries(), TNames({std::string("[Error] ") + row.fMessage}));
    EXPECT_EQ(reference.GetPath(), "X_Disk");
  }
}

// The type of the value has no name, so the message cannot be built.
TEST_F(TCIMReferenceTest, AddKeyValueWithoutTypeThrowsTypeMismatchUnlogged) {
  TCIMReference disk = Empty();
  disk.SetClassName("X_Disk");
  TLogCapture log;
  EXPECT_STATUS(disk.AddKeyValue("Id", TCIMValue()), kZEPStatusTypeMismatch);
  EXPECT_EQ(log.Entries(), TNames());
}

TEST_F(TCIMReferenceTest, FirstKeyWins) {
  TCIMReference disk = Disk(5);
  TLogCapture log;
  disk.AddKeyValue("Id", TCIMValue(6u));
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(log.Entries(), TNames());
  EXPECT_STATUS(disk.AddKeyValue("Id", TCIMValue("6")), kZEPStatusTypeMismatch);  // the checks come first
}

TEST_F(TCIMReferenceTest, EnumeratesKeysInByteOrderUntilFalse) {
  fNs->Class("X_Disk")->Add("a", ECIMType::kCIMTypeUint32).Add("B", ECIMType::kCIMTypeUint32);
  TCIMReference disk = Empty();
  disk.SetClassName("X_Disk");
  for (char const* name : {"a", "Id", "B"}) disk.AddKeyValue(name, TCIMValue(1u));
  EXPECT_EQ(KeysOf(disk), TNames({"B=1", "Id=1", "a=1"}));

  int calls = 0;
  disk.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue>) { return ++calls < 2; });
  EXPECT_EQ(calls, 2);
}

// ---- Resolving ----

TEST_F(TCIMReferenceTest, WithoutKeysTheElementIsTheClass) {
  TCIMReference const disk = Parsed("ns:X_Disk");
  EXPECT_EQ(disk.GetCIMElement(false), fNs->Class("X_Disk"));
  EXPECT_EQ(disk.GetCIMElement(true), fNs->Class("X_Disk"));
  EXPECT_TRUE(fNs->fLookedUp.empty());
  EXPECT_FALSE(Empty().GetCIMElement(false));
}

TEST_F(TCIMReferenceTest, ClassOnlyReturnsTheClassEvenWithKeys) {
  EXPECT_EQ(Disk(5).GetCIMElement(true), fNs->Class("X_Disk"));
  EXPECT_TRUE(fNs->fLookedUp.empty());
}

TEST_F(TCIMReferenceTest, WithKeysTheInstanceIsLookedUpInTheNamespaceOfTheClass) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference disk = Disk(5);
  disk.SetNamespace(boost::make_shared<TFakeNamespace>());  // not the one used
  EXPECT_EQ(disk.GetCIMElement(false), fNs->fInstance);
  EXPECT_EQ(fNs->fLookedUp, (std::vector<TCIMReference const*>{&disk}));
}

TEST_F(TCIMReferenceTest, TheElementIsLookedUpOnceAndNeverAgain) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  auto const first = fNs->fInstance;
  TCIMReference disk = Disk(5);
  EXPECT_EQ(disk.GetCIMElement(false), first);

  fNs->fInstance = boost::make_shared<TFakeInstance>();
  disk.AddKeyValue("Name", TCIMValue("a"));
  EXPECT_EQ(disk.GetCIMElement(false), first);
  EXPECT_EQ(fNs->fLookedUp.size(), 1u);
}

TEST_F(TCIMReferenceTest, AFailureOfTheLookupPassesThroughAndIsNotRemembered) {
  TCIMReference const disk = Disk(5);
  fNs->fInstanceFailure = kZEPStatusAccessDenied;
  EXPECT_STATUS(disk.GetCIMElement(false), kZEPStatusAccessDenied);
  fNs->fInstanceFailure.reset();
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  EXPECT_EQ(disk.GetCIMElement(false), fNs->fInstance);
}

TEST_F(TCIMReferenceTest, AnUnknownInstanceThrowsNotFoundAndIsLookedUpAgain) {
  TCIMReference const disk = Disk(5);
  TLogCapture log;
  EXPECT_STATUS(disk.GetCIMElement(false), kZEPStatusNotFound);
  EXPECT_EQ(log.Entries(), TNames());
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  EXPECT_EQ(disk.GetCIMElement(false), fNs->fInstance);
  EXPECT_EQ(fNs->fLookedUp.size(), 2u);
}

TEST_F(TCIMReferenceTest, AClassWhoseNamespaceWasDestroyedThrowsBadWeakPtr) {
  auto ns = boost::make_shared<TFakeNamespace>();
  ns->Add("X_Disk").Add("Id", ECIMType::kCIMTypeUint32);
  TCIMReference const disk(ns, "ns:X_Disk.Id=\"5\"", TCIMContext());
  ns.reset();
  EXPECT_THROW(disk.GetCIMElement(false), boost::bad_weak_ptr);
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");  // the reference keeps the class alive
}

// ---- Copying and moving ----

TEST_F(TCIMReferenceTest, ACopyIsDeepAndBoundToItself) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference disk(fNs, "ns:X_Disk.Id=\"5\"", TCIMContext{{"who", TCIMValue("me")}});
  disk.SetNameSpaceName("label");
  TCIMReference copy = disk;
  copy.AddKeyValue("Name", TCIMValue("a"));
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(copy.GetPath(), "X_Disk.Id=\"5\",Name=\"a\"");
  EXPECT_EQ(copy.GetNameSpaceName(), "label");
  EXPECT_EQ(copy.GetNamespace(), fNs);
  EXPECT_NE(copy.GetBody(), disk.GetBody());

  copy.GetCIMElement(false);
  EXPECT_EQ(fNs->fLookedUp, (std::vector<TCIMReference const*>{&copy}));
}

TEST_F(TCIMReferenceTest, ACopyHasTheContext) {
  TCIMContext const context = {{"who", TCIMValue("me")}};
  TCIMReference const original(fNs, context);
  TCIMReference copy = original;
  copy.SetClassName("X_Disk");
  EXPECT_EQ(fNs->fCalls.fContexts, (std::vector<TCIMContext>{context}));
}

TEST_F(TCIMReferenceTest, ACopyHasTheResolvedElement) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference const disk = Disk(5);
  disk.GetCIMElement(false);
  TCIMReference const copy = disk;
  EXPECT_EQ(copy.GetCIMElement(false), fNs->fInstance);
  EXPECT_EQ(fNs->fLookedUp, (std::vector<TCIMReference const*>{&disk}));
}

TEST_F(TCIMReferenceTest, AssignmentReplacesEverythingAndBindsToTheTarget) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference const disk = Disk(5);
  TCIMReference target = Parsed("ns:X_Link.Port=\"1\"");
  target = disk;
  EXPECT_TRUE(target == disk);
  target.GetCIMElement(false);
  EXPECT_EQ(fNs->fLookedUp, (std::vector<TCIMReference const*>{&target}));
}

TEST_F(TCIMReferenceTest, SelfAssignmentChangesNothing) {
  TCIMReference disk = Disk(5);
  TCIMReference& self = disk;
  disk = self;
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
  disk = std::move(self);
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
}

TEST_F(TCIMReferenceTest, AMovedBodyIsBoundToItsNewHandle) {
  fNs->fInstance = boost::make_shared<TFakeInstance>();
  TCIMReference disk = Disk(5);
  TCIMReferenceImpl const* const body = disk.GetBody();
  TCIMReference moved = std::move(disk);
  EXPECT_EQ(moved.GetBody(), body);
  TCIMReference assigned = Empty();
  assigned = std::move(moved);
  EXPECT_EQ(assigned.GetBody(), body);
  EXPECT_EQ(assigned.GetPath(), "X_Disk.Id=\"5\"");
  assigned.GetCIMElement(false);
  EXPECT_EQ(fNs->fLookedUp, (std::vector<TCIMReference const*>{&assigned}));
}

TEST_F(TCIMReferenceTest, AVectorOfReferencesGrowsWithoutCopying) {
  static_assert(std::is_nothrow_move_constructible_v<TCIMReference>);
  std::vector<TCIMReference> disks;
  disks.push_back(Disk(0));
  TCIMReferenceImpl const* const first = disks[0].GetBody();
  for (unsigned int id = 1; id < 100; ++id) disks.push_back(Disk(id));
  EXPECT_EQ(disks[0].GetBody(), first);
  EXPECT_EQ(disks[99].GetPath(), "X_Disk.Id=\"99\"");
}

TEST_F(TCIMReferenceTest, AMovedFromReferenceCanBeAssignedToAndIsOtherwiseAFailedAssertion) {
  TEnvironmentGuard const mode("ZEP_BOOST_ASSERT", nullptr);
  TCIMReference disk = Disk(5);
  TCIMReference const moved = std::move(disk);
  EXPECT_STATUS(disk.GetPath(), kZEPStatusFail);
  EXPECT_STATUS(TCIMReference{disk}, kZEPStatusFail);
  disk = moved;
  EXPECT_EQ(disk.GetPath(), "X_Disk.Id=\"5\"");
}

// ---- Comparison ----

TEST_F(TCIMReferenceTest, EqualMeansTheSameClassObjectAndEqualKeys) {
  auto const other = boost::make_shared<TFakeNamespace>();
  other->Add("X_Disk").Add("Id", ECIMType::kCIMTypeUint32);
  TCIMReference const elsewhere(other, "ns:X_Disk.Id=\"5\"", TCIMContext());

  EXPECT_TRUE(Disk(5) == Disk(5));
  EXPECT_FALSE(Disk(5) == Disk(6));
  EXPECT_FALSE(Disk(5) == Parsed("ns:X_Disk"));
  EXPECT_FALSE(Disk(5) == Parsed("ns:X_Disk.Id=\"5\",Name=\"a\""));
  EXPECT_FALSE(Parsed("ns:X_Disk") == Parsed("ns:X_Link"));
  EXPECT_FALSE(Disk(5) == elsewhere);  // another class object of the same name
  EXPECT_TRUE(Empty() == Empty());
  EXPECT_FALSE(Empty() == Parsed("ns:X_Disk"));
}

TEST_F(TCIMReferenceTest, EqualityIgnoresTheOtherParts) {
  TCIMReference disk(fNs, "ns:X_Disk.Id=\"5\"", TCIMContext{{"who", TCIMValue("me")}});
  disk.SetNameSpaceName("label");
  disk.SetNamespace(nullptr);
  EXPECT_TRUE(disk == Disk(5));
  EXPECT_FALSE(disk < Disk(5));
}

TEST_F(TCIMReferenceTest, WithinAClassTheOrderIsThatOfTheKeys) {
  char const* const kAscending[] = {
      "ns:X_Disk",
      "ns:X_Disk.Id=\"5\"",
      "ns:X_Disk.Id=\"5\",Name=\"a\"",
      "ns:X_Disk.Id=\"5\",Name=\"b\"",
      "ns:X_Disk.Id=\"10\"",  // by value, not by text
      "ns:X_Disk.Id=\"10\",Name=\"\"",
      "ns:X_Disk.Name=\"\"",  // by name first
      "ns:X_Disk.Name=\"a\"",
  };
  for (char const* left : kAscending)
    for (char const* right : kAscending) {
      SCOPED_TRACE(std::string(left) + " and " + right);
      EXPECT_EQ(Parsed(left) < Parsed(right), &*std::find(std::begin(kAscending), std::end(kAscending), left) <
                                                  &*std::find(std::begin(kAscending), std::end(kAscending), right));
    }
}

TEST_F(TCIMReferenceTest, BetweenClassesTheOrderIsThatOfTheClassObjects) {
  bool const disksFirst = fNs->Class("X_Disk").owner_before(fNs->Class("X_Link"));
  for (char const* disk : {"ns:X_Disk", "ns:X_Disk.Id=\"5\""})
    for (char const* link : {"ns:X_Link", "ns:X_Link.Port=\"5\""}) {
      EXPECT_EQ(Parsed(disk) < Parsed(link), disksFirst);
      EXPECT_EQ(Parsed(link) < Parsed(disk), !disksFirst);
    }
}

TEST_F(TCIMReferenceTest, ComparingArraysOfKeysThrows) {
  TCIMValue const one(ECIMType::kCIMTypeUint8, 0, {TCIMValue(static_cast<unsigned char>(1))});
  TCIMValue const two(ECIMType::kCIMTypeUint8, 0, {TCIMValue(static_cast<unsigned char>(2))});
  fNs->Class("X_Disk")->Add("Bytes", one.GetType(), one);
  TCIMReference left = Parsed("ns:X_Disk");
  TCIMReference right = left;
  left.AddKeyValue("Bytes", one);
  right.AddKeyValue("Bytes", two);
  EXPECT_STATUS((void)(left < right), kZEPStatusNotImplemented);
  EXPECT_FALSE(left == right);
}

TEST_F(TCIMReferenceTest, ANullKeySortsFirst) {
  TCIMReference null = Empty();
  null.SetClassName("X_Disk");
  null.AddKeyValue("Id", TCIMValue(ECIMType::kCIMTypeUint32, 0));
  EXPECT_TRUE(null < Disk(0));
  EXPECT_FALSE(Disk(0) < null);
  EXPECT_FALSE(null == Disk(0));
  EXPECT_TRUE(null == TCIMReference(null));
}

TEST_F(TCIMReferenceTest, ReferencesWithinKeysAreOrderedByTheirOwnKeys) {
  auto const link = [this](unsigned int id) { return Parsed("ns:X_Link.Disk=\"ns:X_Disk.Id=\"" + std::to_string(id) + "\"\""); };
  EXPECT_TRUE(link(9) < link(10));
  EXPECT_FALSE(link(10) < link(9));
  EXPECT_TRUE(link(9) == link(9));
}

TEST_F(TCIMReferenceTest, ReferencesAreKeysOfOrderedContainers) {
  std::map<TCIMReference, unsigned int> sizes;
  for (unsigned int id = 0; id < 100; ++id) sizes.emplace(Disk(id * 37 % 100), id);
  sizes.emplace(Disk(0), 1000);
  ASSERT_EQ(sizes.size(), 100u);
  EXPECT_EQ(sizes.begin()->first.GetPath(), "X_Disk.Id=\"0\"");
  EXPECT_EQ(sizes.rbegin()->first.GetPath(), "X_Disk.Id=\"99\"");
  EXPECT_EQ(sizes.at(Disk(37)), 1u);
}

// ---- In a TCIMValue ----

TEST_F(TCIMReferenceTest, ValuesCanHoldReferences) {
  TCIMReference disk = Disk(5);
  TCIMValue const value(disk);
  EXPECT_TRUE(value.IsReference());
  EXPECT_EQ(value.GetReferencedClass(), fNs->Class("X_Disk"));
  EXPECT_EQ(value.ToString(16), "X_Disk.Id=\"5\"");
  TCIMReference const out = value;
  EXPECT_TRUE(out == disk);
  TCIMReference six = Disk(6);
  EXPECT_TRUE(value < TCIMValue(six));
}

TEST_F(TCIMReferenceTest, AReferenceIsReadFromTheTextOfAValue) {
  std::string text = "ns:X_Disk.Id=\"5\"";
  TCIMValue const value(ECIMType::kCIMTypeReference, text, fNs);
  EXPECT_EQ(value.ToString(10), "X_Disk.Id=\"5\"");
  EXPECT_EQ(value.GetReferencedClass(), fNs->Class("X_Disk"));
}

// ---- Against a namespace in memory ----

class TCIMReferenceInMemoryTest : public testing::Test {
protected:
  TCIMReferenceInMemoryTest() {
    fNs->DefineClass("X_Disk").Key("Id", "uint32").Key("Name", "string").Property("Size", "uint64");
    fNs->DefineClass("X_Link").Association().KeyReference("Disk", "X_Disk").Key("Port", "uint8");
  }

  TCIMReference Parsed(std::string const& path) const { return TCIMReference(fNs, path, TCIMContext()); }

  boost::shared_ptr<TMemoryNamespace> const fNs = boost::make_shared<TMemoryNamespace>("root/storage");
};

TEST_F(TCIMReferenceInMemoryTest, APathResolvesToItsInstance) {
  auto const sda = fNs->AddInstance("X_Disk", {{"Id", 5u}, {"Name", "s\"d\\a"}});
  auto const sdb = fNs->AddInstance("X_Disk", {{"Id", 6u}, {"Name", "sdb"}});
  EXPECT_EQ(Parsed("ns:X_Disk.Id=\"5\",Name=\"s\\\"d\\\\a\"").GetCIMElement(false), sda);
  EXPECT_EQ(Parsed("ns:X_Disk.Name=\"sdb\",Id=\"6\"").GetCIMElement(false), sdb);
  EXPECT_STATUS(Parsed("ns:X_Disk.Name=\"sdb\",Id=\"7\"").GetCIMElement(false), kZEPStatusNotFound);
  EXPECT_STATUS(Parsed("ns:X_Disk.Id=\"6\"").GetCIMElement(false), kZEPStatusNotFound);
}

TEST_F(TCIMReferenceInMemoryTest, ThePathOfAnInstanceResolvesToTheInstance) {
  auto const disk = fNs->AddInstance("X_Disk", {{"Id", 5u}, {"Name", "a\",\\b=c.d:e"}});
  TCIMReference const path = disk->GetPath(TCIMContext());
  EXPECT_EQ(path.GetCIMElement(false), disk);
  EXPECT_TRUE(Parsed("ns:" + path.GetPath()) == path);
  EXPECT_EQ(Parsed("ns:" + path.GetPath()).GetCIMElement(false), disk);
}

TEST_F(TCIMReferenceInMemoryTest, AReferenceKeyResolvesToItsInstance) {
  auto const disk = fNs->AddInstance("X_Disk", {{"Id", 5u}, {"Name", "sda"}});
  auto const link = fNs->AddInstance("X_Link", {{"Disk", disk->GetReference()}, {"Port", 1}});
  TCIMReference const path = Parsed("ns:X_Link.Disk=\"ns:X_Disk.Id=\"5\",Name=\"sda\"\",Port=\"1\"");
  EXPECT_EQ(path.GetCIMElement(false), link);
  EXPECT_EQ(path.GetPath(), "X_Link.Disk=\"X_Disk.Id=\"5\",Name=\"sda\"\",Port=\"1\"");
}

TEST_F(TCIMReferenceInMemoryTest, UnknownNamesAreInvalid) {
  for (std::string const path : {"ns:X_Tape", "ns:X_Disk.Serial=\"5\"", "ns:X_Link.Disk=\"ns:X_Tape.Id=\"5\"\""}) {
    SCOPED_TRACE(path);
    EXPECT_STATUS(Parsed(path), kZEPStatusInvalidReference);
  }
}

// A class that is still being described returns an empty pointer for an unknown name.
TEST_F(TCIMReferenceInMemoryTest, UnknownNamesAreInvalidWhileTheClassIsBeingDescribed) {
  auto const cls = fNs->GetClass("X_Disk", TCIMContext());
  cls->BeginDeclarations(TCIMContext());
  EXPECT_STATUS(Parsed("ns:X_Disk.Serial=\"5\""), kZEPStatusInvalidReference);
  TCIMReference disk(fNs, TCIMContext());
  disk.SetClass(cls);
  EXPECT_STATUS(disk.AddKeyValue("Serial", TCIMValue(5u)), kZEPStatusNotFound);
}

}  // namespace
}  // namespace NQRVZEP20
