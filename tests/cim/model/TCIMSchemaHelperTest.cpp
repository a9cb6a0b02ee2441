// SPDX-License-Identifier: Apache-2.0
#include "TCIMSchemaHelper.h"

#include "Fakes.h"
#include "providers/memory/TMemoryNamespace.h"
#include "tests/Support.h"

#include <functional>
#include <set>

namespace NQRVZEP20 {
namespace {

using TNames = std::vector<std::string>;
using TNamespace = boost::shared_ptr<ICIMNamespace>;
using TQuery = std::function<std::string(TNamespace)>;

TCIMValue NullOf(ECIMType type) {
  TCIMValue value;
  value.SetNullValue(type, 0);
  return value;
}

TCIMValue Strings(TNames const& texts) {
  return TCIMValue(ECIMType::kCIMTypeString, 0, std::vector<TCIMValue>(texts.begin(), texts.end()));
}

// A query, and the class and property that it reads.
struct TSingleQuery {
  char const* fName;
  TQuery fQuery;
  char const* fClassName;
  char const* fProperty;
};

std::vector<TSingleQuery> const& PlainQueries() {
  using THelper = TCIMSchemaHelper;
  static std::vector<TSingleQuery> const queries = {
      {"GetSystemProductName", THelper::GetSystemProductName, "QRVSG_ComputerSystem", "ProductName"},
      {"GetSystemName", THelper::GetSystemName, "QRVSG_ComputerSystem", "Name"},
      {"GetOperatingSystemName", THelper::GetOperatingSystemName, "QRVSG_OperatingSystem", "Name"},
      {"GetOperatingSystemVersion", THelper::GetOperatingSystemVersion, "QRVSG_OperatingSystem", "Version"},
      {"GetOperatingSystemType", THelper::GetOperatingSystemType, "QRVSG_OperatingSystem", "OSType"},
      {"GetDataSourceVersion", [](TNamespace ns) { return THelper::GetDataSourceVersion(ns, TCIMContext()); }, "QRVSG_ZEPProduct",
       "Version"},
      {"GetDataSourceBuild", [](TNamespace ns) { return THelper::GetDataSourceBuild(ns, TCIMContext()); }, "QRVSG_ZEPProduct",
       "Build"},
  };
  return queries;
}

std::vector<TSingleQuery> const& LoggedQueries() {
  using THelper = TCIMSchemaHelper;
  static std::vector<TSingleQuery> const queries = {
      {"GetRawMTMString", THelper::GetRawMTMString, "QRVSG_ComputerSystem", "ProductName"},
      {"GetRawSerialNumberString", [](TNamespace ns) { return THelper::GetRawSerialNumberString(ns, TCIMContext()); },
       "QRVSG_ComputerSystem", "SerialNumber"},
  };
  return queries;
}

std::vector<TSingleQuery> AllSingleQueries() {
  std::vector<TSingleQuery> queries = PlainQueries();
  queries.insert(queries.end(), LoggedQueries().begin(), LoggedQueries().end());
  return queries;
}

// The queries that use a single-property query.
std::vector<TSingleQuery> DerivedQueries() {
  using THelper = TCIMSchemaHelper;
  return {
      {"GetMTM", THelper::GetMTM, "QRVSG_ComputerSystem", "ProductName"},
      {"GetMachineType", THelper::GetMachineType, "QRVSG_ComputerSystem", "ProductName"},
      {"GetModelNumber", THelper::GetModelNumber, "QRVSG_ComputerSystem", "ProductName"},
      {"GetSerialNumber", [](TNamespace ns) { return THelper::GetSerialNumber(ns, TCIMContext()); }, "QRVSG_ComputerSystem",
       "SerialNumber"},
      {"GetDataSourceMajorVersion", [](TNamespace ns) { return THelper::GetDataSourceMajorVersion(ns, TCIMContext()); },
       "QRVSG_ZEPProduct", "Version"},
      {"GetDataSourceMinorVersion", [](TNamespace ns) { return THelper::GetDataSourceMinorVersion(ns, TCIMContext()); },
       "QRVSG_ZEPProduct", "Version"},
      {"GetDataSourceBuildVersion", THelper::GetDataSourceBuildVersion, "QRVSG_ZEPProduct", "Version"},
  };
}

class TCIMSchemaHelperTest : public testing::Test {
protected:
  // A namespace with one class that has one instance with one property.
  static boost::shared_ptr<TFakeNamespace> With(std::string const& className, std::string const& property,
                                                TCIMValue const& value) {
    auto const ns = boost::make_shared<TFakeNamespace>();
    ns->Add(className).AddInstance()->Add(property, value);
    return ns;
  }

  static boost::shared_ptr<TFakeNamespace> WithProductName(TCIMValue const& value) {
    return With("QRVSG_ComputerSystem", "ProductName", value);
  }

  static boost::shared_ptr<TFakeNamespace> WithSerialNumber(TCIMValue const& value) {
    return With("QRVSG_ComputerSystem", "SerialNumber", value);
  }

  static boost::shared_ptr<TFakeNamespace> WithVersion(TCIMValue const& value) {
    return With("QRVSG_ZEPProduct", "Version", value);
  }
};

// ---- Constants ----

TEST_F(TCIMSchemaHelperTest, ConstantsHaveTheirValues) {
  EXPECT_EQ(TCIMSchemaHelper::kSystemCreationClassName, "QRVSG_ComputerSystem");
  EXPECT_EQ(TCIMSchemaHelper::kOperatingSystemCreationClassName, "QRVSG_OperatingSystem");
  EXPECT_EQ(TCIMSchemaHelper::kContextName, "nspID");
  EXPECT_EQ(TCIMSchemaHelper::kPluginNSPName, "plugin");
  EXPECT_EQ(TCIMSchemaHelper::kCMPINSPName, "cmpi");
  EXPECT_EQ(TCIMSchemaHelper::GetSystemCreationClassName(), "QRVSG_ComputerSystem");
  EXPECT_EQ(TCIMSchemaHelper::GetOperatingSystemCreationClassName(), "QRVSG_OperatingSystem");
}

// ---- Single properties ----

TEST_F(TCIMSchemaHelperTest, ASinglePropertyQueryReturnsThePropertyUnchangedAndLogsNothing) {
  for (auto const& row : AllSingleQueries()) {
    SCOPED_TRACE(row.fName);
    TLogCapture log;
    EXPECT_EQ(row.fQuery(With(row.fClassName, row.fProperty, TCIMValue(" The text - as it is  "))), " The text - as it is  ");
    EXPECT_EQ(row.fQuery(With(row.fClassName, row.fProperty, TCIMValue(""))), "");
    EXPECT_EQ(log.Entries(), TNames());
  }
}

TEST_F(TCIMSchemaHelperTest, MissingDataThrowsNotFound) {
  auto queries = AllSingleQueries();
  for (auto const& derived : DerivedQueries()) queries.push_back(derived);
  for (auto const& row : queries) {
    SCOPED_TRACE(row.fName);
    auto const ns = boost::make_shared<TFakeNamespace>();
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);  // no class
    ns->fAnswersUnknownByEmpty = true;
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);
    auto& cls = ns->Add(row.fClassName);
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);  // no instance
    auto const instance = cls.AddInstance();
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);  // no such property
    instance->fCalls.fFailure = kZEPStatusNotFound;
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);
    instance->fCalls.fFailure.reset();
    instance->Add(row.fProperty, TCIMValue("1234ABC"));
    cls.fEnumerationFailure = kZEPStatusNotFound;
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);  // no instances to enumerate
    cls.fEnumerationFailure.reset();
    cls.AddInstance()->Add(row.fProperty, TCIMValue("1234ABC"));
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);  // two instances
  }
}

TEST_F(TCIMSchemaHelperTest, PlainQueriesLogNoFailure) {
  for (auto const& row : PlainQueries()) {
    SCOPED_TRACE(row.fName);
    TLogCapture log;
    auto const ns = boost::make_shared<TFakeNamespace>();
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);
    ns->Add(row.fClassName);
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);
    ns->Class(row.fClassName)->AddInstance();
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusNotFound);
    EXPECT_EQ(log.Entries(), TNames());
  }
}

TEST_F(TCIMSchemaHelperTest, PlainQueriesThrowWhatTheConversionThrows) {
  for (auto const& row : PlainQueries()) {
    SCOPED_TRACE(row.fName);
    TLogCapture log;
    EXPECT_STATUS(row.fQuery(With(row.fClassName, row.fProperty, NullOf(ECIMType::kCIMTypeString))), kZEPStatusValueIsNULL);
    EXPECT_STATUS(row.fQuery(With(row.fClassName, row.fProperty, TCIMValue(5u))), kZEPStatusTypeMismatch);
    EXPECT_STATUS(row.fQuery(With(row.fClassName, row.fProperty, Strings({"a"}))), kZEPStatusTypeMismatch);
    EXPECT_EQ(log.Entries(), TNames());
  }
}

TEST_F(TCIMSchemaHelperTest, OtherFailuresOfTheNamespacePassThrough) {
  auto queries = AllSingleQueries();
  for (auto const& derived : DerivedQueries()) queries.push_back(derived);
  for (auto const& row : queries) {
    SCOPED_TRACE(row.fName);
    auto const ns = With(row.fClassName, row.fProperty, TCIMValue("1234ABC"));
    TLogCapture log;
    ns->fCalls.fFailure = kZEPStatusConnectionFailed;
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusConnectionFailed);
    ns->fCalls.fFailure.reset();
    auto& cls = *ns->Class(row.fClassName);
    cls.fEnumerationFailure = kZEPStatusAccessDenied;
    EXPECT_STATUS(row.fQuery(ns), kZEPStatusAccessDenied);
    cls.fEnumerationFailure.reset();
    auto const broken = With(row.fClassName, row.fProperty, TCIMValue("1234ABC"));
    broken->Class(row.fClassName)->OnlyInstance().fCalls.fFailure = kZEPStatusFail;
    EXPECT_STATUS(row.fQuery(broken), kZEPStatusFail);
    for (auto const& entry : log.Entries()) EXPECT_EQ(entry, "[Debug] TCIMSchemaHelper- Detected MTM Entered");
  }
}

TEST_F(TCIMSchemaHelperTest, AnEmptyNamespacePointerIsAFailedAssertion) {
  TEnvironmentGuard const mode("ZEP_BOOST_ASSERT", nullptr);
  EXPECT_STATUS(TCIMSchemaHelper::GetSystemName(nullptr), kZEPStatusFail);
}

TEST_F(TCIMSchemaHelperTest, EveryCallPassesTheProviderNameInItsContext) {
  auto queries = AllSingleQueries();
  for (auto const& derived : DerivedQueries()) queries.push_back(derived);
  for (auto const& row : queries) {
    SCOPED_TRACE(row.fName);
    auto const ns = boost::make_shared<TFakeNamespace>();
    auto const instance = ns->Add(row.fClassName).AddInstance();
    auto const property = instance->Add(row.fProperty, TCIMValue("1234ABC"));
    try {
      row.fQuery(ns);
    } catch (TZEPException const&) {  // the text is not a version, but it has been read
    }
    TCIMContext const expected = {{"nspID", TCIMValue("plugin")}};
    for (TCalls const* calls : {&ns->fCalls, &ns->Class(row.fClassName)->fCalls, &instance->fCalls, &property->fCalls})
      EXPECT_EQ(calls->fContexts, std::vector<TCIMContext>{expected});
    EXPECT_EQ(ns->fCalls.fNames, TNames({row.fClassName}));
    EXPECT_EQ(instance->fCalls.fNames, TNames({row.fProperty}));
  }
}

TEST_F(TCIMSchemaHelperTest, TheCallersContextIsPassedOnAndMayNameTheProvider) {
  using THelper = TCIMSchemaHelper;
  struct {
    char const* fName;
    std::function<std::string(TNamespace, TCIMContext)> fQuery;
  } const kRows[] = {
      {"GetDataSourceVersion", THelper::GetDataSourceVersion},
      {"GetDataSourceBuild", THelper::GetDataSourceBuild},
      {"GetDataSourceMajorVersion", THelper::GetDataSourceMajorVersion},
      {"GetDataSourceMinorVersion", THelper::GetDataSourceMinorVersion},
      {"GetRawSerialNumberString", THelper::GetRawSerialNumberString},
      {"GetSerialNumber", THelper::GetSerialNumber},
      {"GetSerialNumber_vmwesxi", THelper::GetSerialNumber_vmwesxi},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fName);
    auto const ns = boost::make_shared<TFakeNamespace>();
    EXPECT_STATUS(row.fQuery(ns, {{"who", TCIMValue("me")}}), kZEPStatusNotFound);
    EXPECT_STATUS(row.fQuery(ns, {{"nspID", TCIMValue("cmpi")}}), kZEPStatusNotFound);
    EXPECT_EQ(ns->fCalls.fContexts, (std::vector<TCIMContext>{{{"nspID", TCIMValue("plugin")}, {"who", TCIMValue("me")}},
                                                              {{"nspID", TCIMValue("cmpi")}}}));
  }
}

TEST_F(TCIMSchemaHelperTest, LoggedQueriesLogEachReasonAtDebug) {
  for (auto const& row : LoggedQueries()) {
    SCOPED_TRACE(row.fName);
    std::string const property = row.fProperty;
    auto const none = boost::make_shared<TFakeNamespace>();
    auto const noInstance = boost::make_shared<TFakeNamespace>();
    noInstance->Add("QRVSG_ComputerSystem");
    auto const cannotEnumerate = With("QRVSG_ComputerSystem", property, TCIMValue("1234ABC"));
    cannotEnumerate->Class("QRVSG_ComputerSystem")->fEnumerationFailure = kZEPStatusNotFound;
    auto const two = With("QRVSG_ComputerSystem", property, TCIMValue("1234ABC"));
    two->Class("QRVSG_ComputerSystem")->AddInstance();
    auto const noProperty = With("QRVSG_ComputerSystem", "Other", TCIMValue("1234ABC"));
    struct {
      TNamespace fNs;
      std::string fMessage;
    } const kReasons[] = {
        {none, "TCIMSchemaHelper: no computer system"},
        {noInstance, "TCIMSchemaHelper: computer system instances != 1"},
        {two, "TCIMSchemaHelper: computer system instances != 1"},
        {cannotEnumerate, "TCIMSchemaHelper: computer system instances != 1"},
        {noProperty, "TCIMSchemaHelper: didn't find " + property + " property"},
        {With("QRVSG_ComputerSystem", property, NullOf(ECIMType::kCIMTypeString)), "TCIMSchemaHelper: " + property + " is NULL"},
        {With("QRVSG_ComputerSystem", property, NullOf(ECIMType::kCIMTypeUint32)), "TCIMSchemaHelper: " + property + " is NULL"},
        {With("QRVSG_ComputerSystem", property, TCIMValue(5u)), "TCIMSchemaHelper: " + property + " wasn't a string"},
        {With("QRVSG_ComputerSystem", property, Strings({"1234ABC"})), "TCIMSchemaHelper: " + property + " wasn't a string"},
    };
    for (auto const& reason : kReasons) {
      SCOPED_TRACE(reason.fMessage);
      TLogCapture log;
      EXPECT_STATUS(row.fQuery(reason.fNs), kZEPStatusNotFound);
      EXPECT_EQ(log.Entries(), TNames({"[Debug] " + reason.fMessage}));
    }
  }
}

// ---- Machine type and model ----

TEST_F(TCIMSchemaHelperTest, IsValidMachineTypeChecksTheFirstFourCharacters) {
  for (char const* text : {"1234", "abcD", "Z9z0", "1234-", "1234ABC", "1234\n"}) {
    SCOPED_TRACE(text);
    EXPECT_TRUE(TCIMSchemaHelper::IsValidMachineType(text));
  }
  for (char const* text : {"", "123", "123 ", " 123", "12-4", "12_4",
                           "12\xe4"
                           "4",
                           "123\xc3"}) {
    SCOPED_TRACE(text);
    EXPECT_FALSE(TCIMSchemaHelper::IsValidMachineType(text));
  }
}

TEST_F(TCIMSchemaHelperTest, IsValidMTMChecksTheFirstSevenCharacters) {
  for (char const* text : {"1234ABC", "1234   ", "12345 x", "abcdxyz", "1234ABC-", "1234ABCDE"}) {
    SCOPED_TRACE(text);
    EXPECT_TRUE(TCIMSchemaHelper::IsValidMTM(text));
  }
  for (char const* text : {"", "1234", "1234AB", "1234AB-", "1234\tBC", "1234A_C", " 234ABC", "12 4ABC", "1234AB\xe4"}) {
    SCOPED_TRACE(text);
    EXPECT_FALSE(TCIMSchemaHelper::IsValidMTM(text));
  }
}

struct TProductNameRow {
  char const* fProductName;
  char const* fMtm;  // null: the name contains no MTM
};

TEST_F(TCIMSchemaHelperTest, FindsTheMTMInAProductName) {
  TProductNameRow const kRows[] = {
      // without brackets
      {"1234", "1234xxx"},
      {"1234ABC", "1234ABC"},
      {"1234abc", "1234abc"},
      {"1234ABC   ", "1234ABC"},
      {"1234  ", "1234xxx"},
      {"1234   ", "1234xxx"},  // trailing blanks are removed first
      {"1234A C", "1234A C"},
      {"1234 BC", "1234 BC"},
      {"12345", nullptr},
      {"123456", nullptr},
      {"12345678", nullptr},
      {"123", nullptr},
      {"", nullptr},
      {"   ", nullptr},
      {" 1234", nullptr},
      {"12-4", nullptr},
      {"1234A-C", nullptr},
      {"1234\t", nullptr},
      {"Server X1", nullptr},
      {"Server [1234ABC]", nullptr},

      // in brackets
      {"Server X1-[1234ABC]-", "1234ABC"},
      {"Server X1-[1234ABC]-   ", "1234ABC"},
      {"Server X1-[1234]-", "1234xxx"},
      {"-[1234ABC]", "1234ABC"},
      {"-[1234]", "1234xxx"},
      {"-[1234ABC]-[5678DEF]-", "1234ABC"},  // only the first counts
      {"Server X1-[1234   ]-", "1234xxx"},
      {"Server X1-[1234 B ]-", "1234 B "},
      {"Server X1-[1234]BC]-", "1234xxx"},  // 7 characters are not an MTM, 4 are a type
      {"Server X1-[1234ABC]x", "1234ABC"},
      {"Server X1-[1234A]-", nullptr},  // the "]" is two positions early
      {"Server X1-[1234AB]-", nullptr},
      {"Server X1-[123]-", nullptr},
      {"Server X1-[1234ABCD]-", nullptr},
      {"Server X1-[1234ABC", nullptr},
      {"Server X1-[1234", nullptr},
      {"Server X1-[", nullptr},
      {"Server X1-[1234AB-]-", nullptr},
      {"Server X1-[12-4ABC]-", nullptr},
      {"Server X1-[12-4]-", nullptr},
      {"Server X1-[]-[1234ABC]-", nullptr},
      {"Server X1-[    ABC]-", nullptr},
      {"1234-[", nullptr},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fProductName);
    auto const ns = WithProductName(TCIMValue(row.fProductName));
    if (row.fMtm == nullptr) {
      EXPECT_STATUS(TCIMSchemaHelper::GetMTM(ns), kZEPStatusInvalidFormat);
      continue;
    }
    EXPECT_EQ(TCIMSchemaHelper::GetMTM(ns), row.fMtm);
    EXPECT_EQ(TCIMSchemaHelper::GetMachineType(ns), std::string(row.fMtm).substr(0, 4));
    EXPECT_EQ(TCIMSchemaHelper::GetModelNumber(ns), std::string(row.fMtm).substr(4));
  }
}

TEST_F(TCIMSchemaHelperTest, FindsTheMTMInLegacyProductNames) {
  TProductNameRow const kRows[] = {
      {"System Model 1000-[1234ABC]", "1234ABC"},
      {"System Model 1000-[1234ABC]  ", "1234ABC"},
      {"System Model 1000-[1234   ]", "1234xxx"},
      {"System Model 200-[1234ABC]", "1234ABC"},
      {"System Model 200-[1234   ]", "1234xxx"},

      // after "- " only the fixed position marks the MTM
      {"System Model 3000- 1234ABC--", "1234ABC"},
      {"System Model 3000- 1234ABC]-", "1234ABC"},
      {"System Model 3000- 1234ABCD-  ", "1234ABC"},
      {"System Model 3000- 1234   --", "1234xxx"},
      {"System Model 3000- 1234AB---", nullptr},
      {"System Model 3000- 12-4ABC--", nullptr},
      {"System Model 3000- 1234ABC-", nullptr},    // too short
      {"System Model 3000- 1234ABC---", nullptr},  // too long
      {"System Model 3000- 1234ABC-]", nullptr},   // another closing character
      {"System Model 3001- 1234ABC--", nullptr},   // another model
      {"system Model 3000- 1234ABC--", nullptr},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fProductName);
    auto const ns = WithProductName(TCIMValue(row.fProductName));
    if (row.fMtm == nullptr)
      EXPECT_STATUS(TCIMSchemaHelper::GetMTM(ns), kZEPStatusInvalidFormat);
    else
      EXPECT_EQ(TCIMSchemaHelper::GetMTM(ns), row.fMtm);
  }
}

TEST_F(TCIMSchemaHelperTest, GetMTMLogsItsStartAndItsResult) {
  TLogCapture log;
  TCIMSchemaHelper::GetMTM(WithProductName(TCIMValue("Server X1-[1234]-")));
  EXPECT_EQ(log.Entries(),
            TNames({"[Debug] TCIMSchemaHelper- Detected MTM Entered", "[Debug] TCIMSchemaHelper- Detected MTM 1234xxx"}));
}

TEST_F(TCIMSchemaHelperTest, GetMTMLogsOnlyItsStartBeforeAFailure) {
  {
    TLogCapture log;
    EXPECT_STATUS(TCIMSchemaHelper::GetMTM(WithProductName(TCIMValue("12345"))), kZEPStatusInvalidFormat);
    EXPECT_EQ(log.Entries(), TNames({"[Debug] TCIMSchemaHelper- Detected MTM Entered"}));
  }
  TLogCapture log;
  EXPECT_STATUS(TCIMSchemaHelper::GetMTM(boost::make_shared<TFakeNamespace>()), kZEPStatusNotFound);
  EXPECT_EQ(log.Entries(),
            TNames({"[Debug] TCIMSchemaHelper- Detected MTM Entered", "[Debug] TCIMSchemaHelper: no computer system"}));
}

// ---- Serial number ----

TEST_F(TCIMSchemaHelperTest, ASerialNumberIsSevenLettersOrDigits) {
  struct {
    char const* fSerialNumber;
    char const* fResult;  // null: not in the expected form
  } const kRows[] = {
      {"KQ1234A", "KQ1234A"},     {"1234567", "1234567"}, {"abcdefg", "abcdefg"}, {"KQ1234A ", "KQ1234A"},
      {"KQ1234A    ", "KQ1234A"}, {"KQ1234AB", nullptr},  {"KQ1234", nullptr},    {"KQ1234 ", nullptr},
      {" KQ1234A", nullptr},      {"KQ 234A", nullptr},   {"KQ-234A", nullptr},   {"KQ1234A\t", nullptr},
      {"KQ1234\xe4", nullptr},    {"", nullptr},          {"       ", nullptr},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fSerialNumber);
    auto const ns = WithSerialNumber(TCIMValue(row.fSerialNumber));
    TLogCapture log;
    if (row.fResult == nullptr)
      EXPECT_STATUS(TCIMSchemaHelper::GetSerialNumber(ns, TCIMContext()), kZEPStatusInvalidFormat);
    else
      EXPECT_EQ(TCIMSchemaHelper::GetSerialNumber(ns, TCIMContext()), row.fResult);
    EXPECT_EQ(log.Entries(), TNames());
  }
}

TEST_F(TCIMSchemaHelperTest, ARawSerialNumberKeepsItsBlanks) {
  EXPECT_EQ(TCIMSchemaHelper::GetRawSerialNumberString(WithSerialNumber(TCIMValue(" KQ1234A ")), TCIMContext()), " KQ1234A ");
}

// ---- Parts of the data source's version ----

TEST_F(TCIMSchemaHelperTest, TheVersionIsSplitAtItsDots) {
  struct {
    char const* fVersion;
    char const* fMajor;  // null: not found
    char const* fMinor;
    char const* fBuild;
  } const kRows[] = {
      {"3.20.5", "3", "20", "5"},
      {"3.20.5.77", "3", "20", "77"},
      {"3.20", "3", nullptr, "20"},
      {"3", nullptr, nullptr, nullptr},
      {"", nullptr, nullptr, nullptr},
      {".", "", nullptr, ""},
      {"..", "", "", ""},
      {"3..5", "3", "", "5"},
      {" 3 . 20 . 5 ", " 3 ", " 20 ", " 5 "},
  };
  using THelper = TCIMSchemaHelper;
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fVersion);
    auto const ns = WithVersion(TCIMValue(row.fVersion));
    struct {
      char const* fExpected;
      TQuery fQuery;
      TNames fLogged;
    } const kParts[] = {
        {row.fMajor,
         [](TNamespace of) { return THelper::GetDataSourceMajorVersion(of, TCIMContext()); },
         {"[Debug] TCIMSchemaHelper::GetDataSourceMajorVersion - Throwing"}},
        {row.fMinor, [](TNamespace of) { return THelper::GetDataSourceMinorVersion(of, TCIMContext()); }, {}},
        {row.fBuild, THelper::GetDataSourceBuildVersion, {}},
    };
    for (auto const& part : kParts) {
      TLogCapture log;
      if (part.fExpected == nullptr)
        EXPECT_STATUS(part.fQuery(ns), kZEPStatusNotFound);
      else
        EXPECT_EQ(part.fQuery(ns), part.fExpected);
      EXPECT_EQ(log.Entries(), part.fExpected == nullptr ? part.fLogged : TNames());
    }
  }
}

// ---- VMware ESXi hosts ----

class TCIMSchemaHelperEsxiTest : public testing::Test {
protected:
  // An instance with one property.
  void Add(std::string const& className, std::string const& property, TCIMValue const& value) {
    auto& cls = fClasses.count(className) ? *fNs->Class(className) : fNs->Add(className);
    fClasses.insert(className);
    cls.AddInstance()->Add(property, value);
  }

  std::string SerialNumber() { return TCIMSchemaHelper::GetSerialNumber_vmwesxi(fNs, TCIMContext()); }

  boost::shared_ptr<TFakeNamespace> const fNs = boost::make_shared<TFakeNamespace>();

private:
  std::set<std::string> fClasses;
};

TEST_F(TCIMSchemaHelperEsxiTest, MissingDataIsUnknown) {
  for (bool const answersByEmpty : {false, true}) {
    fNs->fAnswersUnknownByEmpty = answersByEmpty;
    EXPECT_EQ(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), "Unknown");
    EXPECT_EQ(TCIMSchemaHelper::GetMTM_vmwesxi(fNs), "Unknown");
    EXPECT_EQ(TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs), "Unknown");
  }
  fNs->Add("CIM_PhysicalElement");
  fNs->Add("VMware_HypervisorSoftwareIdentity");
  EXPECT_EQ(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), "Unknown");
  EXPECT_EQ(TCIMSchemaHelper::GetMTM_vmwesxi(fNs), "Unknown");
  EXPECT_EQ(TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs), "Unknown");
}

TEST_F(TCIMSchemaHelperEsxiTest, ValuesThatCannotBeReadAreSkipped) {
  auto& elements = fNs->Add("CIM_PhysicalElement");
  elements.AddInstance()->Add("Model", TCIMValue("Server X1-[1234ABC]-"));
  elements.AddInstance();
  elements.AddInstance()->Add("Model", NullOf(ECIMType::kCIMTypeString));
  elements.AddInstance()->Add("Model", TCIMValue(5u));
  elements.AddInstance()->Add("Model", Strings({"Server X2-[5678DEF]-"}));
  EXPECT_EQ(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), "Server X1-[1234ABC]-");
}

TEST_F(TCIMSchemaHelperEsxiTest, TheLastModelWithBothBracketsIsTheProductName) {
  for (char const* model : {"Server X1-[1234ABC]-", "Chassis", "Server X2-[5678DEF]-", "Server X3-[9999", "Server X4]-", "-["})
    Add("CIM_PhysicalElement", "Model", TCIMValue(model));
  EXPECT_EQ(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), "Server X2-[5678DEF]-");
  EXPECT_EQ(TCIMSchemaHelper::GetMTM_vmwesxi(fNs), "5678DEF");
}

TEST_F(TCIMSchemaHelperEsxiTest, TheMTMIsTheTextBetweenTheFirstBrackets) {
  struct {
    char const* fModel;
    char const* fMtm;
  } const kRows[] = {
      {"Server X1-[1234ABC]-", "1234ABC"},
      {"Server X1-[12]-", "12"},  // any length, any characters
      {"Server X1-[1234 - A]-", "1234 - A"},
      {"Server X1-[1234ABC]-[5678DEF]-", "1234ABC"},
      {"Server X1-[-[1234ABC]-", "-[1234ABC"},
      {"Server X1-[]-", "Unknown"},           // no text between
      {"Server ]-X1-[1234ABC]-", "Unknown"},  // the first "]-" comes first
      {"]--[", "Unknown"},
      {"Server X1", "Unknown"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fModel);
    auto const ns = boost::make_shared<TFakeNamespace>();
    ns->Add("CIM_PhysicalElement").AddInstance()->Add("Model", TCIMValue(row.fModel));
    EXPECT_EQ(TCIMSchemaHelper::GetMTM_vmwesxi(ns), row.fMtm);
  }
}

TEST_F(TCIMSchemaHelperEsxiTest, TheLastLargeBuildNumberIsTheOperatingSystem) {
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", TCIMValue("12345"));
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", TCIMValue("23456"));
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", NullOf(ECIMType::kCIMTypeString));
  Add("VMware_HypervisorSoftwareIdentity", "Other", TCIMValue("34567"));
  EXPECT_EQ(TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs), "23456");
}

TEST_F(TCIMSchemaHelperEsxiTest, ALargeBuildNumberMayBeAnInteger) {
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", TCIMValue(20000000000ul));
  EXPECT_EQ(TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs), "20000000000");
}

TEST_F(TCIMSchemaHelperEsxiTest, ALargeBuildNumberOfAnotherTypeIsSkipped) {
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", TCIMValue("12345"));
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", Strings({"23456"}));
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", TCIMValue(TCIMChar16(std::string("x"))));
  Add("VMware_HypervisorSoftwareIdentity", "LargeBuildNumber", TCIMValue(TCIMDateTime()));
  EXPECT_EQ(TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs), "12345");
}

TEST_F(TCIMSchemaHelperEsxiTest, WithoutChassisTheSerialNumberIsNotFound) {
  EXPECT_STATUS(SerialNumber(), kZEPStatusNotFound);
  Add("OMC_UnitaryComputerSystem", "OtherIdentifyingInfo", Strings({"SN:KQ1234A"}));
  EXPECT_STATUS(SerialNumber(), kZEPStatusNotFound);
  fNs->Add("OMC_Chassis");
  EXPECT_STATUS(SerialNumber(), kZEPStatusNotFound);
}

TEST_F(TCIMSchemaHelperEsxiTest, TheSerialNumberIsThatOfTheLastChassisThatHasOne) {
  Add("OMC_Chassis", "Other", TCIMValue("x"));
  EXPECT_EQ(SerialNumber(), "Unknown");
  Add("OMC_Chassis", "SerialNumber", TCIMValue("KQ1234A"));
  Add("OMC_Chassis", "SerialNumber", TCIMValue("any text "));
  Add("OMC_Chassis", "SerialNumber", NullOf(ECIMType::kCIMTypeString));
  Add("OMC_Chassis", "SerialNumber", TCIMValue(5u));
  EXPECT_EQ(SerialNumber(), "any text ");
}

TEST_F(TCIMSchemaHelperEsxiTest, APlaceholderIsReplacedByTheOtherIdentifyingInfo) {
  struct {
    char const* fSerialNumber;
    char const* fResult;
  } const kRows[] = {
      {"XxXxXxX", "KQ1234A"}, {"none", "KQ1234A"}, {"None", "None"}, {"xxxxxxx", "xxxxxxx"}, {"none ", "none "}, {"", ""},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fSerialNumber);
    auto const ns = boost::make_shared<TFakeNamespace>();
    ns->Add("OMC_Chassis").AddInstance()->Add("SerialNumber", TCIMValue(row.fSerialNumber));
    ns->Add("OMC_UnitaryComputerSystem").AddInstance()->Add("OtherIdentifyingInfo", Strings({"x", "SN:KQ1234A", "UUID:0"}));
    EXPECT_EQ(TCIMSchemaHelper::GetSerialNumber_vmwesxi(ns, TCIMContext()), row.fResult);
  }
}

TEST_F(TCIMSchemaHelperEsxiTest, TheOtherIdentifyingInfoIsTheTextAfterTheColonOfTheFirstEntryWithOne) {
  TCIMValue const withNull(ECIMType::kCIMTypeString, 0, {NullOf(ECIMType::kCIMTypeString), TCIMValue("SN:A")});
  struct {
    char const* fWhat;
    TCIMValue fInfo;
    char const* fResult;
  } const kRows[] = {
      {"two with a colon", Strings({"a:b:c", "d:e"}), "b:c"},
      {"blanks", Strings({"SN: KQ1234A "}), " KQ1234A "},
      {"nothing after the colon", Strings({"SN:"}), ""},
      {"no colon", Strings({"a", "b"}), "Unknown"},
      {"no entry", Strings({}), "Unknown"},
      {"a NULL entry", withNull, "A"},
      {"no array", TCIMValue("SN:A"), "Unknown"},
      {"a number", TCIMValue(5u), "Unknown"},
      {"numbers", TCIMValue(ECIMType::kCIMTypeUint32, 0, {TCIMValue(5u)}), "Unknown"},
      {"NULL", NullOf(ECIMType::kCIMTypeString), "Unknown"},
      {"a NULL array", TCIMValue(ECIMType::kCIMTypeString, 4), "Unknown"},
  };
  for (auto const& row : kRows) {
    SCOPED_TRACE(row.fWhat);
    auto const ns = boost::make_shared<TFakeNamespace>();
    ns->Add("OMC_Chassis").AddInstance()->Add("SerialNumber", TCIMValue("none"));
    ns->Add("OMC_UnitaryComputerSystem").AddInstance()->Add("OtherIdentifyingInfo", row.fInfo);
    EXPECT_EQ(TCIMSchemaHelper::GetSerialNumber_vmwesxi(ns, TCIMContext()), row.fResult);
  }
}

TEST_F(TCIMSchemaHelperEsxiTest, TheLastSystemWithIdentifyingInfoCounts) {
  Add("OMC_Chassis", "SerialNumber", TCIMValue("none"));
  EXPECT_EQ(SerialNumber(), "Unknown");  // no such class
  Add("OMC_UnitaryComputerSystem", "OtherIdentifyingInfo", Strings({"SN:A"}));
  Add("OMC_UnitaryComputerSystem", "OtherIdentifyingInfo", Strings({"SN:B"}));
  Add("OMC_UnitaryComputerSystem", "OtherIdentifyingInfo", Strings({"no colon"}));
  Add("OMC_UnitaryComputerSystem", "Other", TCIMValue("x:y"));
  EXPECT_EQ(SerialNumber(), "B");
}

TEST_F(TCIMSchemaHelperEsxiTest, OtherFailuresOfTheNamespacePassThrough) {
  fNs->fCalls.fFailure = kZEPStatusConnectionFailed;
  EXPECT_STATUS(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), kZEPStatusConnectionFailed);
  EXPECT_STATUS(TCIMSchemaHelper::GetMTM_vmwesxi(fNs), kZEPStatusConnectionFailed);
  EXPECT_STATUS(TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs), kZEPStatusConnectionFailed);
  EXPECT_STATUS(SerialNumber(), kZEPStatusConnectionFailed);

  fNs->fCalls.fFailure.reset();
  fNs->Add("CIM_PhysicalElement").fEnumerationFailure = kZEPStatusAccessDenied;
  EXPECT_STATUS(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), kZEPStatusAccessDenied);
  fNs->Add("CIM_PhysicalElement").fEnumerationFailure = kZEPStatusNotFound;
  EXPECT_EQ(TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs), "Unknown");
}

TEST_F(TCIMSchemaHelperEsxiTest, LogsNothingAndPassesTheProviderNameInItsContext) {
  TLogCapture log;
  TCIMSchemaHelper::GetSystemProductName_vmwesxi(fNs);
  TCIMSchemaHelper::GetMTM_vmwesxi(fNs);
  TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(fNs);
  EXPECT_STATUS(SerialNumber(), kZEPStatusNotFound);
  EXPECT_EQ(log.Entries(), TNames());
  EXPECT_EQ(fNs->fCalls.fNames,
            TNames({"CIM_PhysicalElement", "CIM_PhysicalElement", "VMware_HypervisorSoftwareIdentity", "OMC_Chassis"}));
  EXPECT_EQ(fNs->fCalls.fContexts, std::vector<TCIMContext>(4, TCIMContext{{"nspID", TCIMValue("plugin")}}));
}

// ---- Against a namespace in memory ----

TEST(TCIMSchemaHelperInMemoryTest, QueriesReadAFilledNamespace) {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/cimv2");
  ns->DefineClass("QRVSG_ComputerSystem")
      .Key("Name", "string")
      .Property("ProductName", "string")
      .Property("SerialNumber", "string");
  ns->DefineClass("QRVSG_OperatingSystem").Key("Name", "string").Property("Version", "string").Property("OSType", "string");
  ns->DefineClass("QRVSG_ZEPProduct").Key("Version", "string").Property("Build", "string");
  auto const system = ns->AddInstance(
      "QRVSG_ComputerSystem", {{"Name", "host17"}, {"ProductName", "Server X1-[1234ABC]-"}, {"SerialNumber", "KQ1234A "}});
  ns->AddInstance("QRVSG_OperatingSystem", {{"Name", "Debian"}, {"Version", "12"}, {"OSType", "LINUX"}});
  ns->AddInstance("QRVSG_ZEPProduct", {{"Version", "3.20.5"}, {"Build", "ZP305"}});

  using THelper = TCIMSchemaHelper;
  EXPECT_EQ(THelper::GetSystemProductName(ns), "Server X1-[1234ABC]-");
  EXPECT_EQ(THelper::GetSystemName(ns), "host17");
  EXPECT_EQ(THelper::GetOperatingSystemName(ns), "Debian");
  EXPECT_EQ(THelper::GetOperatingSystemVersion(ns), "12");
  EXPECT_EQ(THelper::GetOperatingSystemType(ns), "LINUX");
  EXPECT_EQ(THelper::GetMTM(ns), "1234ABC");
  EXPECT_EQ(THelper::GetMachineType(ns), "1234");
  EXPECT_EQ(THelper::GetModelNumber(ns), "ABC");
  EXPECT_EQ(THelper::GetSerialNumber(ns, TCIMContext()), "KQ1234A");
  EXPECT_EQ(THelper::GetDataSourceVersion(ns, TCIMContext()), "3.20.5");
  EXPECT_EQ(THelper::GetDataSourceBuild(ns, TCIMContext()), "ZP305");
  EXPECT_EQ(THelper::GetDataSourceMajorVersion(ns, TCIMContext()), "3");
  EXPECT_EQ(THelper::GetDataSourceMinorVersion(ns, TCIMContext()), "20");
  EXPECT_EQ(THelper::GetDataSourceBuildVersion(ns), "5");

  system->Set("ProductName", TCIMValue());
  EXPECT_STATUS(THelper::GetMTM(ns), kZEPStatusNotFound);
  EXPECT_STATUS(THelper::GetSystemProductName(ns), kZEPStatusValueIsNULL);
}

}  // namespace
}  // namespace NQRVZEP20
