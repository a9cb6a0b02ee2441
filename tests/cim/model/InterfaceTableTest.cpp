// SPDX-License-Identifier: Apache-2.0

// Tests the table of docs/writing-a-provider.md, which lists the operations that each use needs: a model with only those
// operations is sufficient, each of them is called, and the log names one that is left out.

#include "TCIMCopy.h"
#include "TCIMSchemaHelper.h"
#include "TableModel.h"
#include "providers/mof/Mof.h"
#include "tests/providers/memory/Collect.h"

#include <regex>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

enum EUse { kCopyFrom = 1, kCopyInto, kQueries, kReferences };

// The contents of the documented table.
struct TDocumented {
  std::map<EUse, std::set<std::string>> fOperations;  // "ICIMClass::GetName"
  std::map<EUse, std::set<std::string>> fWithBody;    // those that may be left out
};

std::vector<std::string> CellsOf(std::string const& row) {
  std::vector<std::string> cells;
  std::istringstream text(row.substr(1));
  for (std::string cell; std::getline(text, cell, '|');) cells.push_back(cell);
  return cells;
}

TDocumented const& Documented() {
  static TDocumented const documented = [] {
    static std::regex const operation(R"(`(\w+)`(\*?))");
    TDocumented read;
    std::istringstream lines(ReadFile(SourcePath("docs/writing-a-provider.md")));
    for (std::string line; std::getline(lines, line);) {
      if (line.rfind("| `ICIM", 0) != 0) continue;
      std::vector<std::string> const cells = CellsOf(line);
      std::string const interface = cells.at(0).substr(2, cells[0].rfind('`') - 2);
      for (EUse const use : {kCopyFrom, kCopyInto, kQueries, kReferences})
        for (std::sregex_iterator found(cells.at(use).begin(), cells[use].end(), operation), end; found != end; ++found) {
          std::string const name = interface + "::" + (*found)[1].str();
          read.fOperations[use].insert(name);
          if ((*found)[2].length() != 0) read.fWithBody[use].insert(name);
        }
    }
    return read;
  }();
  return documented;
}

TTable TableOf(EUse use, std::string const& without = "") {
  TTable table;
  table.fOperations = Documented().fOperations.at(use);
  table.fOperations.erase(without);
  return table;
}

// A namespace that has one of everything that a copy carries over.
boost::shared_ptr<TMemoryNamespace> SourceOfEverything() {
  auto const source = NewNamespace();
  source->DefineClass("X_A").Key("Id", "uint32");
  source->DefineClass("X_B", "X_A")
      .Description("b")
      .Property("Name", "string", "x")
      .Description("n")
      .Static("Count", "uint16", 1)
      .Method("Reset", "uint32")
      .Description("r")
      .In("Force", "boolean")
      .Description("f");
  source->DefineClass("X_Link").Association().KeyReference("From", "X_A");
  source->DefineClass("QRVSG_ZEPProduct").Key("Name", "string").Reference("Part", "X_A");
  auto const part = source->AddInstance("X_A", {{"Id", 7}});
  source->AddInstance("QRVSG_ZEPProduct", {{"Name", "zep"}, {"Part", part->GetReference()}});
  return source;
}

// The MOF text of a copy of it, from a source and into a destination that have just the operations of the tables.
struct TCopied {
  std::string fText;
  EZEPStatusCode fStatus = kZEPStatusOK;
  std::string fReason;
  std::vector<std::string> fLog;
};

TCopied Copy(TTable const* from, TTable const* into) {
  TCopied copied;
  OnNewThread([&] {
    TLogCapture const log;
    boost::shared_ptr<ICIMNamespace> source = SourceOfEverything();
    boost::shared_ptr<TMemoryNamespace> const copy = NewNamespace();
    boost::shared_ptr<ICIMNamespace> destination = copy;
    if (from) source = boost::make_shared<TTableNamespace>(*from, source);
    if (into) destination = boost::make_shared<TTableNamespace>(*into, copy);
    try {
      TCIMCopy::CopyClasses(source, destination, false);
      if (into) into->fIsChecked = false;  // the copy is whole; what looks at it may call anything
      copied.fText = WriteMof(*copy);
    } catch (TZEPFailure const& failure) {
      copied.fStatus = failure.GetStatusCode().GetCode();
      copied.fReason = failure.Reason();
    } catch (std::logic_error const& notInTable) {
      ADD_FAILURE() << notInTable.what();
    }
    copied.fLog = log.Entries();
  });
  return copied;
}

TEST(InterfaceTableTest, TheTableNamesEveryOperationThatMayBeLeftOut) {
  EXPECT_THAT(Documented().fWithBody.at(kCopyFrom),
              ElementsAre("ICIMInstance::GetClass", "ICIMProperty::GetDeclaration", "ICIMProperty::GetName"));
  EXPECT_THAT(Documented().fWithBody.at(kCopyInto),
              ElementsAre("ICIMClass::AddMethodDecl", "ICIMClass::AddQualifier", "ICIMClass::CommitInstance",
                          "ICIMClass::SetStaticProperty", "ICIMMethodDecl::AddQualifier", "ICIMNamespace::CreateQualifierDecl",
                          "ICIMParameterDecl::AddQualifier", "ICIMPropertyDecl::AddQualifier"));
  EXPECT_EQ(Documented().fWithBody.count(kQueries), 0u);
  EXPECT_EQ(Documented().fWithBody.count(kReferences), 0u);
}

TEST(InterfaceTableTest, ASourceOfJustTheTablesOperationsIsCopiedAndEachIsNeeded) {
  TTable const table = TableOf(kCopyFrom);
  TCopied const copied = Copy(&table, nullptr);
  EXPECT_EQ(copied.fStatus, kZEPStatusOK);
  EXPECT_EQ(copied.fText, Copy(nullptr, nullptr).fText);
  EXPECT_THAT(copied.fText, HasSubstr("instance of QRVSG_ZEPProduct"));
  EXPECT_THAT(copied.fLog, IsEmpty());
  EXPECT_EQ(table.fCalled, table.fOperations);
}

TEST(InterfaceTableTest, ADestinationOfJustTheTablesOperationsIsCopiedIntoAndEachIsNeeded) {
  TTable const table = TableOf(kCopyInto);
  TCopied const copied = Copy(nullptr, &table);
  EXPECT_EQ(copied.fStatus, kZEPStatusOK);
  EXPECT_EQ(copied.fText, Copy(nullptr, nullptr).fText);
  EXPECT_THAT(copied.fLog, IsEmpty());
  EXPECT_EQ(table.fCalled, table.fOperations);
}

struct TLeftOut {
  EUse fUse;
  char const* fOperation;
  char const* fLine;
};

constexpr TLeftOut kLeftOut[] = {
    {kCopyFrom, "ICIMInstance::GetClass", "NQRVZEP20::TTableInstance does not implement ICIMInstance::GetClass"},
    {kCopyFrom, "ICIMProperty::GetName", "NQRVZEP20::TTableProperty does not implement ICIMProperty::GetName"},
    {kCopyFrom, "ICIMProperty::GetDeclaration", "NQRVZEP20::TTableProperty does not implement ICIMProperty::GetDeclaration"},
    {kCopyInto, "ICIMNamespace::CreateQualifierDecl",
     "NQRVZEP20::TTableNamespace does not implement ICIMNamespace::CreateQualifierDecl"},
    {kCopyInto, "ICIMClass::AddQualifier", "NQRVZEP20::TTableClass does not implement ICIMNamedElement::AddQualifier"},
    {kCopyInto, "ICIMClass::SetStaticProperty", "NQRVZEP20::TTableClass does not implement ICIMClass::SetStaticProperty"},
    {kCopyInto, "ICIMClass::AddMethodDecl", "NQRVZEP20::TTableClass does not implement ICIMClass::AddMethodDecl"},
    {kCopyInto, "ICIMClass::CommitInstance", "NQRVZEP20::TTableClass does not implement ICIMClass::CommitInstance"},
    {kCopyInto, "ICIMMethodDecl::AddQualifier", "NQRVZEP20::TTableMethodDecl does not implement ICIMNamedElement::AddQualifier"},
    {kCopyInto, "ICIMParameterDecl::AddQualifier",
     "NQRVZEP20::TTableParameterDecl does not implement ICIMNamedElement::AddQualifier"},
};

TEST(InterfaceTableTest, AnOperationThatIsLeftOutEndsTheCopyWithOneLineThatNamesClassAndOperation) {
  for (TLeftOut const& row : kLeftOut) {
    SCOPED_TRACE(row.fOperation);
    ASSERT_TRUE(Documented().fWithBody.at(row.fUse).count(row.fOperation));
    TTable const table = TableOf(row.fUse, row.fOperation);
    TCopied const copied = row.fUse == kCopyFrom ? Copy(&table, nullptr) : Copy(nullptr, &table);
    EXPECT_EQ(copied.fStatus, kZEPStatusNotImplemented);
    EXPECT_EQ(copied.fReason, row.fLine);
    EXPECT_THAT(copied.fLog, ElementsAre("[Error] " + std::string(row.fLine)));
  }
}

TEST(InterfaceTableTest, QualifiersOfPropertiesThatCannotBeAddedAreLeftOutAndLogged) {
  auto const source = NewNamespace(), copy = NewNamespace();
  source->DefineClass("X_A").Property("Name", "string", "x").Description("n").Property("Size", "uint64");
  TTable const table = TableOf(kCopyInto, "ICIMPropertyDecl::AddQualifier");
  OnNewThread([&] {
    TLogCapture const log;
    TCIMCopy::CopyClasses(source, boost::make_shared<TTableNamespace>(table, copy), false);
    EXPECT_THAT(log.Entries(),
                ElementsAre("[Error] NQRVZEP20::TTablePropertyDecl does not implement ICIMNamedElement::AddQualifier",
                            "[Debug] TCopyPropertyDecl::operator() - Get an Exception"));
  });
  EXPECT_THAT(WriteMofClass(*copy->GetClass("X_A", kNone)),
              testing::Eq("class X_A {\n\n  string Name = \"x\";\n\n  uint64 Size;\n};\n\n"));
}

TEST(InterfaceTableTest, QueriesNeedJustTheTablesOperations) {
  auto const ns = NewNamespace();
  ns->DefineClass("QRVSG_ComputerSystem").Property("ProductName", "string").Property("SerialNumber", "string");
  ns->AddInstance("QRVSG_ComputerSystem", {{"ProductName", "Server X1-[1234ABC]-"}, {"SerialNumber", "KQ12345"}});
  TTable const table = TableOf(kQueries);
  auto const asked = boost::make_shared<TTableNamespace>(table, ns);
  EXPECT_EQ(TCIMSchemaHelper::GetMTM(asked), "1234ABC");
  EXPECT_EQ(TCIMSchemaHelper::GetSerialNumber(asked, TCIMContext()), "KQ12345");
  EXPECT_EQ(table.fCalled, table.fOperations);
}

TEST(InterfaceTableTest, ReferencesNeedJustTheTablesOperations) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_A").Key("Id", "uint32");
  ns->AddInstance("X_A", {{"Id", 7}});
  TTable const table = TableOf(kReferences);
  boost::shared_ptr<ICIMNamespace> const asked = boost::make_shared<TTableNamespace>(table, ns);
  TCIMReference read(asked, "ns:X_A.Id=\"7\"", TCIMContext());
  EXPECT_EQ(read.GetPath(), "X_A.Id=\"7\"");
  EXPECT_TRUE(read.GetCIMElement(false));
  TCIMReference made(asked, TCIMContext());
  made.SetClassName("X_A");
  made.AddKeyValue("Id", TCIMValue(7u));
  EXPECT_EQ(made.GetPath(), read.GetPath());
  EXPECT_EQ(table.fCalled, table.fOperations);
}

}  // namespace
}  // namespace NQRVZEP20
