// SPDX-License-Identifier: Apache-2.0
#include "TCIMCopy.h"

#include "TracedModel.h"
#include "providers/memory/TMemoryClass.h"
#include "tests/providers/memory/Collect.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <stdexcept>

namespace NQRVZEP20 {
namespace {

using testing::Contains;
using testing::Not;

constexpr char kLine[] = "[Debug] TCopyPropertyDecl::operator() - Get an Exception";

// Namespaces that are written to may refer to traced classes, which a trace outlives.
class TCIMCopyTest : public testing::Test {
protected:
  TCIMCopyTest() : fSource(NewNamespace()), fCopy(boost::make_shared<TMemoryNamespace>("root/copy")) {
    fSource->DeclareStandardQualifiers();
  }

  void CopyAll(bool noProductInstances = false) { TCIMCopy::CopyClasses(fSource, fCopy, noProductInstances); }
  void CopyTraced(bool noProductInstances = false) {
    TCIMCopy::CopyClasses(Traced(fSource, "src"), Traced(fCopy, "dst"), noProductInstances);
  }
  boost::shared_ptr<ICIMNamespace> Traced(boost::shared_ptr<ICIMNamespace> ns, std::string const& label) {
    return boost::make_shared<TTracedNamespace>(fTrace, ns, label);
  }

  // The calls that begin with one of the words, in order.
  std::vector<std::string> Calls(std::vector<std::string> const& words) const {
    std::vector<std::string> calls;
    for (std::string const& call : fTrace.fCalls)
      for (std::string const& word : words)
        if (call.rfind(word, 0) == 0) calls.push_back(call);
    return calls;
  }
  void FailOn(std::string const& call, EZEPStatusCode status = kZEPStatusFail) {
    fTrace.fOnCall[call] = [status] { throw TZEPException(status); };
  }

  TTrace fTrace;
  boost::shared_ptr<TMemoryNamespace> fSource, fCopy;
};

boost::shared_ptr<ICIMPropertyDecl> Decl(ICIMNamespace const& ns, std::string const& cls, std::string const& name) {
  for (auto const& decl : All(*ns.GetClass(cls, kNone), &ICIMClass::EnumeratePropertyDecls))
    if (decl->GetName(kNone) == name) return decl;
  return {};
}

// ---- CopyClasses ----

TEST_F(TCIMCopyTest, QualifierDeclarationsComeFirstThenTheTwoPasses) {
  fSource->DefineClass("X_Link").Association();
  fSource->DefineClass("X_Disk");
  CopyTraced();
  EXPECT_THAT(
      Calls({"EnumerateQualifierDecls", "EnumerateClasses", "CreateClass", "EnumerateSubClasses", "GetClassFlag"}),
      ElementsAre("EnumerateQualifierDecls src:", "EnumerateClasses src:", "GetClassFlag src:X_Link",
                  "EnumerateSubClasses src:X_Link", "GetClassFlag src:X_Disk", "CreateClass dst:X_Disk",
                  "EnumerateSubClasses src:X_Disk", "EnumerateClasses src:", "GetClassFlag src:X_Link", "CreateClass dst:X_Link",
                  "EnumerateSubClasses src:X_Link", "GetClassFlag src:X_Disk", "EnumerateSubClasses src:X_Disk"));
  EXPECT_EQ(fTrace.fCalls[1], "CreateQualifierDecl dst:Abstract");
  EXPECT_EQ(fTrace.fContextEntries, 0u);
}

TEST_F(TCIMCopyTest, AQualifierDeclarationIsCopiedWithAllFiveAttributes) {
  auto const source = NewNamespace();
  source->CreateQualifierDecl("X_Words", TCIMValue(TType::kCIMTypeString, 3, {TCIMValue("a"), TCIMValue("b")}),
                              ICIMQualifierDecl::kScopeMethod, ICIMQualifierDecl::kFlavorTranslatable, kNone);
  source->CreateQualifierDecl("X_Max", NullOf("sint64"), ICIMQualifierDecl::kScopeAny, 0, kNone);
  TCIMCopy::CopyClasses(source, fCopy, false);

  EXPECT_THAT(Names(*fCopy, &ICIMNamespace::EnumerateQualifierDecls), ElementsAre("X_Words", "X_Max"));
  auto const words = fCopy->GetQualifierDecl("X_Words", kNone);
  EXPECT_EQ(words->GetType(kNone), TType(TType::ECIMType(TType::kCIMTypeString | TType::kCIMTypeArrayFlag)));
  EXPECT_EQ(words->GetDefaultValue(kNone).ToString(), "{ a, b }");
  EXPECT_EQ(words->GetDefaultValue(kNone).GetMaxArraySize(), 3u);
  EXPECT_EQ(words->GetScope(kNone), ICIMQualifierDecl::kScopeMethod);
  EXPECT_EQ(words->GetFlavor(kNone), ICIMQualifierDecl::kFlavorTranslatable);
  auto const max = fCopy->GetQualifierDecl("X_Max", kNone);
  EXPECT_EQ(max->GetType(kNone), TType::kCIMTypeSint64);
  EXPECT_TRUE(max->GetDefaultValue(kNone).IsNull());
  EXPECT_EQ(max->GetScope(kNone), ICIMQualifierDecl::kScopeAny);
  EXPECT_EQ(max->GetFlavor(kNone), 0u);
}

TEST_F(TCIMCopyTest, EachClassOfATreeIsMadeOnceUnderItsSuperclass) {
  fSource->DefineClass("X_A");
  fSource->DefineClass("X_B", "X_A");
  fSource->DefineClass("X_Link").Association();
  fSource->DefineClass("X_C", "X_B");
  fSource->DefineClass("X_FastLink", "X_Link");
  fSource->DefineClass("X_D", "X_A");
  CopyTraced();
  EXPECT_THAT(Calls({"CreateClass"}),
              ElementsAre("CreateClass dst:X_A", "CreateClass dst:X_B under X_A", "CreateClass dst:X_C under X_B",
                          "CreateClass dst:X_D under X_A", "CreateClass dst:X_Link", "CreateClass dst:X_FastLink under X_Link"));
  EXPECT_THAT(ClassNames(*fCopy), ElementsAre("X_A", "X_Link"));
  EXPECT_THAT(SubClassNames(*fCopy->GetClass("X_A", kNone)), ElementsAre("X_B", "X_C", "X_D"));
}

TEST_F(TCIMCopyTest, AQualifierThatTheDestinationDeclaresAlreadyEndsTheCopy) {
  fSource->DefineClass("X_A");
  fCopy->CreateQualifierDecl("Aggregate", TCIMValue(false), ICIMQualifierDecl::kScopeAny, 0, kNone);
  EXPECT_STATUS(CopyAll(), kZEPStatusAlreadyExists);
  EXPECT_THAT(Names(*fCopy, &ICIMNamespace::EnumerateQualifierDecls), ElementsAre("Aggregate", "Abstract"));
  EXPECT_THAT(ClassNames(*fCopy), IsEmpty());
}

TEST_F(TCIMCopyTest, AFailureEndsTheCopyAndKeepsTheObjectsMadeSoFar) {
  fSource->DefineClass("X_A").Property("Name", "string");
  fSource->DefineClass("X_B")
      .Property("Name", "string")
      .Method("Reset", "uint32")
      .In("Force", "boolean")
      .Method("Stop", "uint32");
  fSource->DefineClass("X_C");
  FailOn("AddParameterDecl dst:X_B.Reset.Force", kZEPStatusOutOfMemory);
  EXPECT_STATUS(CopyTraced(), kZEPStatusOutOfMemory);
  EXPECT_THAT(ClassNames(*fCopy), ElementsAre("X_A", "X_B"));
  EXPECT_THAT(Names(*fCopy->GetClass("X_B", kNone), &ICIMClass::EnumeratePropertyDecls), ElementsAre("Name"));
  EXPECT_THAT(Names(*fCopy->GetClass("X_B", kNone), &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset"));
}

TEST_F(TCIMCopyTest, NothingButTheDeclarationsOfPropertiesSwallowsAnException) {
  for (std::string const call :
       {"CreateQualifierDecl dst:Key", "EnumerateClasses src:", "GetClassFlag src:X_B", "CreateClass dst:X_B under X_A",
        "GetClass dst:X_A", "GetQualifierDecl dst:Description", "AddQualifier dst:X_B Description", "BeginDeclarations dst:X_B",
        "EndDeclarations dst:X_B", "EnumeratePropertyDecls src:X_B", "SetStaticProperty dst:X_B.Count",
        "AddMethodDecl dst:X_B.Reset", "AddQualifier dst:X_B.Reset Description", "AddParameterDecl dst:X_B.Reset.Force",
        "AddQualifier dst:X_B.Reset.Force In", "GetQualifier src:X_B PLUGINNAME", "IsAbstract src:X_B",
        "EnumerateSubClasses src:X_A"}) {
    SCOPED_TRACE(call);
    TTrace trace;
    trace.fOnCall[call] = [] { throw TZEPException(kZEPStatusCorruptedContainer); };
    auto const source = NewNamespace();
    source->DefineClass("X_A");
    source->DefineClass("X_B", "X_A")
        .Description("b")
        .Static("Count", "uint16", 1)
        .Method("Reset", "uint32")
        .Description("r")
        .In("Force", "boolean");
    auto const copy = NewNamespace();
    EXPECT_STATUS(TCIMCopy::CopyClasses(boost::make_shared<TTracedNamespace>(trace, source, "src"),
                                        boost::make_shared<TTracedNamespace>(trace, copy, "dst"), false),
                  kZEPStatusCorruptedContainer);
  }
}

TEST_F(TCIMCopyTest, AnEmptyNamespaceIsAFailedAssertion) {
  boost::shared_ptr<ICIMNamespace> const none;
  EXPECT_STATUS(TCIMCopy::CopyClasses(none, fCopy, false), kZEPStatusFail);
  EXPECT_STATUS(TCIMCopy::CopyClasses(fSource, none, false), kZEPStatusFail);
}

// ---- CopyClass ----

TEST_F(TCIMCopyTest, AClassIsCopiedInTheOrderOfItsParts) {
  fSource->DefineClass("X_A");
  fSource->DefineClass("X_B", "X_A")
      .Description("b")
      .Property("Name", "string", "x")
      .Override()
      .Static("Count", "uint16", 1)
      .Method("Reset", "uint32")
      .Description("r")
      .In("Force", "boolean");
  CopyAll();
  auto const copy = NewNamespace();
  copy->DefineClass("X_A");
  TCIMCopy::CopyClass(Traced(fSource, "src")->GetClass("X_B", kNone), Traced(copy, "dst"));
  EXPECT_THAT(
      fTrace.fCalls,
      ElementsAre("GetClass src:X_B", "GetClass dst:X_A", "CreateClass dst:X_B under X_A", "EnumerateQualifiers src:X_B",
                  "GetQualifierDecl dst:Description", "AddQualifier dst:X_B Description",

                  "BeginDeclarations dst:X_B", "EnumeratePropertyDecls src:X_B", "GetPropertyDecl dst:X_B.Name",
                  "GetQualifier src:X_B.Name OVERRIDE", "GetDefaultValue src:X_B.Name", "AddPropertyDecl dst:X_B.Name",
                  "EnumerateQualifiers src:X_B.Name", "GetQualifierDecl dst:Override", "AddQualifier dst:X_B.Name Override",
                  "GetPropertyDecl dst:X_B.Count", "GetQualifier src:X_B.Count OVERRIDE", "GetDefaultValue src:X_B.Count",
                  "AddPropertyDecl dst:X_B.Count", "EnumerateQualifiers src:X_B.Count", "GetQualifierDecl dst:Static",
                  "AddQualifier dst:X_B.Count Static", "EndDeclarations dst:X_B",

                  "EnumerateStaticProperties src:X_B", "SetStaticProperty dst:X_B.Count",

                  "EnumerateMethodDecls src:X_B", "AddMethodDecl dst:X_B.Reset", "EnumerateQualifiers src:X_B.Reset",
                  "GetQualifierDecl dst:Description", "AddQualifier dst:X_B.Reset Description",
                  "EnumerateParameterDecls src:X_B.Reset", "AddParameterDecl dst:X_B.Reset.Force", "GetQualifierDecl dst:In",
                  "AddQualifier dst:X_B.Reset.Force In"));
}

TEST_F(TCIMCopyTest, ASuperclassThatIsMissingEndsTheCopyOfAClass) {
  fSource->DefineClass("X_A");
  fSource->DefineClass("X_B", "X_A");
  EXPECT_STATUS(TCIMCopy::CopyClass(fSource->GetClass("X_B", kNone), fCopy), kZEPStatusNotFound);
  EXPECT_THAT(ClassNames(*fCopy), IsEmpty());
}

TEST_F(TCIMCopyTest, AnEmptyAnswerForAClassCountsAsNotFound) {
  fSource->DefineClass("X_A").Key("Id", "uint32");
  fSource->DefineClass("X_B", "X_A");
  auto const instance = fSource->AddInstance("X_A", {{"Id", 1}});
  TCIMValue nullReference = NullOf("reference");
  nullReference.SetReferencedClass(fSource->GetClass("X_A", kNone));
  fTrace.fAnswersUnknownClassByEmpty = true;
  auto const destination = Traced(fCopy, "dst");
  EXPECT_STATUS(TCIMCopy::CopyClass(fSource->GetClass("X_B", kNone), destination), kZEPStatusNotFound);
  EXPECT_STATUS(TCIMCopy::CopyInstance(instance, destination), kZEPStatusNotFound);
  EXPECT_STATUS(TCIMCopy::CopyValue(nullReference, destination), kZEPStatusNotFound);
  EXPECT_STATUS(TCIMCopy::CopyValue(instance->GetReference(), destination), kZEPStatusNotFound);
  EXPECT_THAT(fTrace.fCalls, ElementsAre("GetClass dst:X_A", "GetClass dst:X_A", "GetClass dst:X_A", "GetClass dst:X_A"));
  EXPECT_THAT(ClassNames(*fCopy), IsEmpty());
}

// A class X_B with one of everything that can be made in a destination, below X_A, and the product class with an instance.
boost::shared_ptr<TMemoryNamespace> SourceOfEverything() {
  auto const source = NewNamespace();
  source->DefineClass("X_A");
  source->DefineClass("X_B", "X_A")
      .Description("b")
      .Property("Name", "string")
      .Description("n")
      .Property("Size", "uint64")
      .Method("Reset", "uint32")
      .Description("r")
      .In("Force", "boolean")
      .Method("Stop", "uint32");
  source->DefineClass("QRVSG_ZEPProduct").Key("Name", "string");
  source->AddInstance("QRVSG_ZEPProduct", {{"Name", "zep"}});
  return source;
}

TEST_F(TCIMCopyTest, AnyEmptyAnswerOfTheDestinationIsNotFoundBeforeAnythingElseIsDone) {
  for (std::string const call :
       {"CreateQualifierDecl dst:Key", "GetClass dst:X_A", "CreateClass dst:X_A", "CreateClass dst:X_B under X_A",
        "GetQualifierDecl dst:Description", "AddQualifier dst:X_B Description", "AddMethodDecl dst:X_B.Reset",
        "AddQualifier dst:X_B.Reset Description", "AddParameterDecl dst:X_B.Reset.Force", "AddQualifier dst:X_B.Reset.Force In",
        "GetClass dst:QRVSG_ZEPProduct", "CreateInstance dst:QRVSG_ZEPProduct", "GetProperty dst:QRVSG_ZEPProduct.Name"}) {
    SCOPED_TRACE(call);
    TTrace trace;
    trace.fEmptyAnswer = call;
    auto const copy = NewNamespace();
    EXPECT_STATUS(TCIMCopy::CopyClasses(boost::make_shared<TTracedNamespace>(trace, SourceOfEverything(), "src"),
                                        boost::make_shared<TTracedNamespace>(trace, copy, "dst"), false),
                  kZEPStatusNotFound);
    EXPECT_EQ(trace.fCalls.back(), call);
  }
}

TEST_F(TCIMCopyTest, TheReasonNamesTheObjectThatTheDestinationDidNotReturn) {
  std::pair<char const*, char const*> const rows[] = {
      {"CreateClass dst:X_B under X_A", "the destination returned no class X_B"},
      {"GetQualifierDecl dst:Description", "the destination returned no qualifier declaration Description"},
      {"AddParameterDecl dst:X_B.Reset.Force", "the destination returned no parameter declaration Force"},
      {"CreateInstance dst:QRVSG_ZEPProduct", "the destination returned no instance of QRVSG_ZEPProduct"},
  };
  for (auto const& [call, reason] : rows) {
    SCOPED_TRACE(call);
    TTrace trace;
    trace.fEmptyAnswer = call;
    auto const copy = boost::make_shared<TTracedNamespace>(trace, NewNamespace(), "dst");
    EXPECT_EQ(ReasonOf([&] { TCIMCopy::CopyClasses(SourceOfEverything(), copy, false); }), reason);
  }
}

TEST_F(TCIMCopyTest, AnEmptyAnswerWhileAPropertyIsDeclaredLeavesOneLineAndTheOthersAreCopied) {
  for (std::string const call : {"AddPropertyDecl dst:X_B.Name", "AddQualifier dst:X_B.Name Description"}) {
    SCOPED_TRACE(call);
    TTrace trace;
    trace.fEmptyAnswer = call;
    auto const copy = NewNamespace();
    OnNewThread([&] {
      TLogCapture const log;
      TCIMCopy::CopyClasses(SourceOfEverything(), boost::make_shared<TTracedNamespace>(trace, copy, "dst"), false);
      EXPECT_THAT(log.Entries(), ElementsAre(kLine));
    });
    EXPECT_TRUE(Decl(*copy, "X_B", "Size"));
    auto const next = std::find(trace.fCalls.begin(), trace.fCalls.end(), call) + 1;
    EXPECT_EQ(*next, "GetPropertyDecl dst:X_B.Size");
  }
}

TEST_F(TCIMCopyTest, ARootClassLooksUpNoSuperclass) {
  fSource->DefineClass("X_A");
  TCIMCopy::CopyClass(fSource->GetClass("X_A", kNone), Traced(fCopy, "dst"));
  EXPECT_THAT(Calls({"GetClass", "CreateClass"}), ElementsAre("CreateClass dst:X_A"));
}

TEST_F(TCIMCopyTest, AClassThatIsThereAlreadyEndsTheCopyOfAClass) {
  fSource->DefineClass("X_A");
  fCopy->DefineClass("X_A");
  EXPECT_STATUS(TCIMCopy::CopyClass(fSource->GetClass("X_A", kNone), fCopy), kZEPStatusAlreadyExists);
}

TEST_F(TCIMCopyTest, AQualifierThatTheDestinationDoesNotDeclareEndsTheCopyOfAClass) {
  fSource->DefineClass("X_A").Description("a").Property("Name", "string");
  EXPECT_STATUS(TCIMCopy::CopyClass(fSource->GetClass("X_A", kNone), fCopy), kZEPStatusNotFound);
  EXPECT_THAT(ClassNames(*fCopy), ElementsAre("X_A"));
  EXPECT_THAT(Names(*fCopy->GetClass("X_A", kNone), &ICIMClass::EnumeratePropertyDecls), IsEmpty());
}

TEST_F(TCIMCopyTest, AnUndeclaredQualifierIsNotRequested) {
  fSource->DefineClass("X_A").Description("a");
  EXPECT_STATUS(TCIMCopy::CopyClass(fSource->GetClass("X_A", kNone), Traced(fCopy, "dst")), kZEPStatusNotFound);
  EXPECT_THAT(fTrace.fCalls, ElementsAre("CreateClass dst:X_A", "GetQualifierDecl dst:Description"));
}

TEST_F(TCIMCopyTest, AnUndeclaredQualifierOfAPropertyLeavesTheDeclarationWithoutItAndOneLine) {
  fSource->DefineClass("X_A").Property("Name", "string").Description("n").Property("Size", "uint64");
  OnNewThread([&] {
    TLogCapture const log;
    TCIMCopy::CopyClass(fSource->GetClass("X_A", kNone), fCopy);
    EXPECT_THAT(log.Entries(), ElementsAre(kLine));
  });
  EXPECT_THAT(Names(*fCopy->GetClass("X_A", kNone), &ICIMClass::EnumeratePropertyDecls), ElementsAre("Name", "Size"));
  EXPECT_FALSE(Decl(*fCopy, "X_A", "Name")->GetQualifier("Description", kNone));
}

TEST_F(TCIMCopyTest, ACopiedQualifierHasItsValueAndItsOwnFlavor) {
  auto const cls = fSource->DefineClass("X_A").Class();
  cls->AddQualifier(fSource->GetQualifierDecl("Description", kNone), TCIMValue("a"), ICIMQualifierDecl::kFlavorToSubclass, kNone);
  cls->AddQualifier(fSource->GetQualifierDecl("Abstract", kNone), TCIMValue(false), 0, kNone);
  CopyAll();
  auto const copy = fCopy->GetClass("X_A", kNone);
  EXPECT_THAT(Names(*copy, &ICIMNamedElement::EnumerateQualifiers), ElementsAre("Description", "Abstract"));
  EXPECT_EQ(copy->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "a");
  EXPECT_EQ(copy->GetQualifier("Description", kNone)->GetFlavor(kNone), ICIMQualifierDecl::kFlavorToSubclass);
  EXPECT_EQ(copy->GetQualifier("Description", kNone)->GetDeclaration(kNone), fCopy->GetQualifierDecl("Description", kNone));
  EXPECT_FALSE(copy->IsAbstract(kNone));
}

TEST_F(TCIMCopyTest, AMethodIsCopiedWithItsParametersAndTheirQualifiers) {
  auto const cls = fSource->DefineClass("X_A").Method("Find", "sint32").Description("f").Out("Names", "string[8]").Class();
  auto const method = All(*cls, &ICIMClass::EnumerateMethodDecls).front();
  method->AddParameterDecl("Disk", TType::kCIMTypeReference, 0, "X_A", kNone);
  method->AddParameterDecl("Disks", TType::ECIMType(TType::kCIMTypeReference | TType::kCIMTypeArrayFlag), 2, "X_Unknown", kNone);
  CopyAll();

  auto const copy = All(*fCopy->GetClass("X_A", kNone), &ICIMClass::EnumerateMethodDecls).front();
  EXPECT_EQ(copy->GetName(kNone), "Find");
  EXPECT_EQ(copy->GetReturnType(kNone), TType::kCIMTypeSint32);
  EXPECT_EQ(copy->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "f");
  auto const parameters = All(*copy, &ICIMMethodDecl::EnumerateParameterDecls);
  ASSERT_EQ(parameters.size(), 3u);
  EXPECT_EQ(parameters[0]->GetName(kNone), "Names");
  EXPECT_EQ(parameters[0]->GetType(kNone), TType::kCIMTypeString | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(parameters[0]->GetMaxArraySize(kNone), 8u);
  EXPECT_THAT(Names(*parameters[0], &ICIMNamedElement::EnumerateQualifiers), ElementsAre("In", "Out"));
  EXPECT_EQ(parameters[1]->GetReferencedClassName(kNone), "X_A");
  EXPECT_EQ(parameters[2]->GetType(kNone), TType::kCIMTypeReference | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(parameters[2]->GetMaxArraySize(kNone), 2u);
  EXPECT_EQ(parameters[2]->GetReferencedClassName(kNone), "X_Unknown");
}

// ---- Property declarations ----

TEST_F(TCIMCopyTest, ADeclarationKeepsTypeBoundDefaultAndMarks) {
  fSource->DefineClass("X_A").Key("Id", "uint32").Property("Sizes", "uint8[16]").Property("Letter", "char16", TCIMChar16(67));
  fSource->DefineClass("X_B", "X_A").Property("Letter", "char16").Override().Reference("Other", "X_A");
  CopyAll();
  EXPECT_TRUE(Decl(*fCopy, "X_A", "Id")->IsKey(kNone));
  EXPECT_EQ(Decl(*fCopy, "X_A", "Sizes")->GetDefaultValue(kNone).GetMaxArraySize(), 16u);
  EXPECT_EQ(Decl(*fCopy, "X_A", "Sizes")->GetType(kNone), TType::kCIMTypeUint8 | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(Decl(*fCopy, "X_A", "Letter")->GetDefaultValue(kNone).ToString(), "67");
  EXPECT_EQ(Decl(*fCopy, "X_B", "Letter")->GetQualifier("Override", kNone)->GetValue(kNone).ToString(), "Letter");
  TCIMValue const other = Decl(*fCopy, "X_B", "Other")->GetDefaultValue(kNone);
  EXPECT_TRUE(other.IsReference() && other.IsNull());
  EXPECT_EQ(other.GetReferencedClass(), fCopy->GetClass("X_A", kNone));
}

TEST_F(TCIMCopyTest, ADeclarationThatThrowsIsSkippedWithOneLine) {
  struct TRow {
    std::string fCall;
    std::vector<std::string> fDeclared;  // what the class has afterwards
  };
  for (TRow const& row :
       {TRow{"GetPropertyDecl dst:X_B.Bad", {"First", "Last"}}, TRow{"GetQualifier src:X_B.Bad OVERRIDE", {"First", "Last"}},
        TRow{"GetDefaultValue src:X_B.Bad", {"First", "Last"}}, TRow{"GetClass dst:X_A", {"First", "Last"}},
        TRow{"AddPropertyDecl dst:X_B.Bad", {"First", "Last"}}, TRow{"EnumerateQualifiers src:X_B.Bad", {"First", "Bad", "Last"}},
        TRow{"GetQualifierDecl dst:Weak", {"First", "Bad", "Last"}},
        TRow{"AddQualifier dst:X_B.Bad Weak", {"First", "Bad", "Last"}}}) {
    SCOPED_TRACE(row.fCall);
    TTrace trace;
    trace.fOnCall[row.fCall] = [] { throw TZEPException(kZEPStatusNotFound); };
    auto const source = NewNamespace();
    source->DefineClass("X_A");
    source->DefineClass("X_B")
        .Property("First", "string")
        .Reference("Bad", "X_A")
        .Qualifier("Weak", true)
        .Property("Last", "string")
        .Method("Reset", "uint32");
    auto const copy = NewNamespace();
    OnNewThread([&] {
      TLogCapture const log;
      TCIMCopy::CopyClasses(boost::make_shared<TTracedNamespace>(trace, source, "src"),
                            boost::make_shared<TTracedNamespace>(trace, copy, "dst"), false);
      EXPECT_THAT(log.Entries(), ElementsAre(kLine));
    });
    EXPECT_EQ(Names(*copy->GetClass("X_B", kNone), &ICIMClass::EnumeratePropertyDecls), row.fDeclared);
    EXPECT_THAT(Names(*copy->GetClass("X_B", kNone), &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset"));
  }
}

TEST_F(TCIMCopyTest, ADeclarationThatRefersToAClassThatIsNotThereYetIsSkipped) {
  auto const early = fSource->DefineClass("X_Early").Class();
  fSource->DefineClass("X_Late");
  TCIMValue reference = NullOf("reference");
  reference.SetReferencedClass(fSource->GetClass("X_Late", kNone));
  early->AddPropertyDecl("Late", reference, kNone);
  OnNewThread([&] {
    TLogCapture const log;
    CopyAll();
    EXPECT_THAT(log.Entries(), ElementsAre(kLine));
  });
  EXPECT_FALSE(Decl(*fCopy, "X_Early", "Late"));
}

TEST_F(TCIMCopyTest, OtherExceptionsOfADeclarationPassThroughAfterEndDeclarations) {
  fSource->DefineClass("X_A").Property("Bad", "string");
  fTrace.fOnCall["AddPropertyDecl dst:X_A.Bad"] = [] { throw std::runtime_error("no memory"); };
  EXPECT_THROW(CopyTraced(), std::runtime_error);
  EXPECT_EQ(fTrace.fCalls.back(), "EndDeclarations dst:X_A");
}

TEST_F(TCIMCopyTest, AStaticPropertyOfASkippedDeclarationEndsTheCopy) {
  fSource->DefineClass("X_A").Static("Count", "uint16", 1);
  FailOn("AddPropertyDecl dst:X_A.Count");
  EXPECT_STATUS(CopyTraced(), kZEPStatusNotFound);
}

TEST_F(TCIMCopyTest, AStaticPropertyIsCopiedWithItsValue) {
  fSource->DefineClass("X_A").Static("Count", "uint16", 2);
  fSource->DefineClass("X_B", "X_A").Class()->SetStaticProperty("Count", TCIMValue(static_cast<unsigned short>(3)), kNone);
  CopyAll();
  for (auto const& [name, text] : {std::pair("X_A", "2"), std::pair("X_B", "3")}) {
    auto const values = All(*fCopy->GetClass(name, kNone), &ICIMClass::EnumerateStaticProperties);
    ASSERT_EQ(values.size(), 1u);
    EXPECT_EQ(values.front()->GetValue(kNone).ToString(), text);
  }
}

// ---- A destination that no longer exists ----

TEST_F(TCIMCopyTest, AStepGoesOnWithoutItsNamespace) {
  auto const cls =
      fSource->DefineClass("X_A").Property("Plain", "string").Property("Marked", "string").Qualifier("Read", true).Class();
  auto const target = boost::static_pointer_cast<ICIMClass>(fCopy->DefineClass("X_A").Class());
  boost::weak_ptr<ICIMNamespace> gone;
  {
    auto const expired = NewNamespace();
    gone = expired;
  }
  TCopyPropertyDecl copyDeclaration(gone, target);
  OnNewThread([&] {
    TLogCapture const log;
    for (auto const& decl : All(*cls, &ICIMClass::EnumeratePropertyDecls)) EXPECT_TRUE(copyDeclaration(decl));
    // Only a qualifier needs the namespace; everything else is copied. GetPropertyDecl throws for an unknown name here.
    EXPECT_THAT(log.Entries(), ElementsAre(kLine, kLine));
  });
  target->BeginDeclarations(kNone);
  OnNewThread([&] {
    TLogCapture const log;
    for (auto const& decl : All(*cls, &ICIMClass::EnumeratePropertyDecls)) EXPECT_TRUE(copyDeclaration(decl));
    EXPECT_THAT(log.Entries(), ElementsAre(kLine));
  });
  EXPECT_THAT(Names(*target, &ICIMClass::EnumeratePropertyDecls), ElementsAre("Plain", "Marked"));

  EXPECT_STATUS(TCopyQualifierDecls{gone}(fSource->GetQualifierDecl("Key", kNone)), kZEPStatusFail);
  EXPECT_STATUS((TCopyClass{gone, false, false}(cls)), kZEPStatusFail);
  EXPECT_STATUS((TCopyClassTree{gone, false, false}(cls)), kZEPStatusFail);
  EXPECT_TRUE((TCopyClassTree{gone, true, false}(cls)));  // of the other pass: nothing is written
}

TEST_F(TCIMCopyTest, StepsThatNeedNoNamespaceAreDoneWithoutOne) {
  auto const cls =
      fSource->DefineClass("X_A").Static("Count", "uint16", 1).Property("Name", "string").Method("Reset", "uint32").Class();
  auto const target = fCopy->DefineClass("X_A").Property("Count", "uint16").Property("Name", "string").Class();
  cls->AddMethodDecl("Stop", TType::kCIMTypeUint32, kNone)->AddParameterDecl("Force", TType::kCIMTypeBoolean, 0, "", kNone);
  auto const instance = fSource->AddInstance("X_A", {{"Name", "a"}});
  auto const copiedInstance = target->CreateInstance(kNone);
  boost::weak_ptr<ICIMNamespace> const gone;

  cls->EnumerateStaticProperties(TCopyStaticProperty(gone, target), kNone);
  cls->EnumerateMethodDecls(TCopyMethodDecl(gone, target), kNone);
  instance->EnumerateProperties(TCopyInstanceProperty(gone, copiedInstance), kNone);

  EXPECT_THAT(Names(*target, &ICIMClass::EnumerateStaticProperties), ElementsAre("Count"));
  EXPECT_THAT(Names(*target, &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset", "Stop"));
  EXPECT_EQ(copiedInstance->GetProperty("Name", kNone)->GetValue(kNone).ToString(), "a");

  cls->AddQualifier(fSource->GetQualifierDecl("Description", kNone), TCIMValue("a"), 0, kNone);
  EXPECT_STATUS(cls->EnumerateQualifiers(TCopyQualifier(gone, target), kNone), kZEPStatusFail);
}

TEST_F(TCIMCopyTest, EachStepCalledByItselfReturnsTrueAndNeedsTheNamespaceForQualifiersOnly) {
  auto const cls = fSource->DefineClass("X_A")
                       .Description("a")
                       .Static("Count", "uint16", 1)
                       .Property("Name", "string")
                       .Method("Reset", "uint32")
                       .Class();
  auto const method = All(*cls, &ICIMClass::EnumerateMethodDecls).front();
  auto const parameter = method->AddParameterDecl("Force", TType::kCIMTypeBoolean, 0, "", kNone);
  auto const qualifier = cls->GetQualifier("Description", kNone);
  auto const count = All(*cls, &ICIMClass::EnumerateStaticProperties).front();
  auto const name = fSource->AddInstance("X_A", {{"Name", "a"}})->GetProperty("Name", kNone);

  for (bool isExpired : {false, true}) {
    SCOPED_TRACE(isExpired);
    auto const copy = NewNamespace();
    auto const target = copy->DefineClass("X_A").Property("Count", "uint16").Property("Name", "string").Class();
    boost::shared_ptr<ICIMNamespace> other = NewNamespace();
    boost::weak_ptr<ICIMNamespace> const destination = isExpired ? other : copy;
    other.reset();
    ASSERT_EQ(destination.expired(), isExpired);

    EXPECT_TRUE(::TCopyStaticProperty(destination, target)(count));
    EXPECT_EQ(All(*target, &ICIMClass::EnumerateStaticProperties).front()->GetValue(kNone).ToString(), "1");
    EXPECT_TRUE(::TCopyMethodDecl(destination, target)(method));
    auto const copiedMethod = All(*target, &ICIMClass::EnumerateMethodDecls).front();
    EXPECT_THAT(Names(*copiedMethod, &ICIMMethodDecl::EnumerateParameterDecls), ElementsAre("Force"));
    auto const plain = target->AddMethodDecl("Plain", TType::kCIMTypeUint32, kNone);
    EXPECT_TRUE(::TCopyParameterDecl(destination, plain)(parameter));
    EXPECT_THAT(Names(*plain, &ICIMMethodDecl::EnumerateParameterDecls), ElementsAre("Force"));
    auto const instance = target->CreateInstance(kNone);
    EXPECT_TRUE(::TCopyInstanceProperty(destination, instance)(name));
    EXPECT_EQ(instance->GetProperty("Name", kNone)->GetValue(kNone).ToString(), "a");

    ::TCopyQualifier copyQualifier(destination, target);
    if (isExpired) {
      EXPECT_STATUS(copyQualifier(qualifier), kZEPStatusFail);  // a failed assertion
      EXPECT_FALSE(target->GetQualifier("Description", kNone));
    } else {
      EXPECT_TRUE(copyQualifier(qualifier));
      EXPECT_EQ(target->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "a");
    }
  }
}

TEST_F(TCIMCopyTest, TheStepsForDeclarationsClassesAndKeysReturnTrue) {
  fSource->DefineClass("X_A").Key("Id", "uint32");
  auto const cls = fSource->GetClass("X_A", kNone);
  auto const bare = boost::make_shared<TMemoryNamespace>("root/bare");
  auto const key = fSource->GetQualifierDecl("Key", kNone);
  EXPECT_TRUE(::TCopyQualifierDecls{bare}(key));
  EXPECT_TRUE((::TCopyClass{bare, true, false}(cls)));  // of the other pass
  EXPECT_THAT(ClassNames(*bare), IsEmpty());
  EXPECT_TRUE((::TCopyClass{bare, false, false}(cls)));
  EXPECT_THAT(ClassNames(*bare), ElementsAre("X_A"));
  fCopy->CreateQualifierDecl("Key", TCIMValue(false), ICIMQualifierDecl::kScopeAny, 0, kNone);
  EXPECT_TRUE((::TCopyClassTree{fCopy, false, false}(cls)));
  EXPECT_THAT(ClassNames(*fCopy), ElementsAre("X_A"));

  TCIMReference path(fCopy, kNone);
  path.SetClass(fCopy->GetClass("X_A", kNone));
  EXPECT_TRUE((::TCopyReferenceKeys{fCopy, path}(std::make_pair(std::string("Id"), TCIMValue(7u)))));
  EXPECT_EQ(path.GetPath(), "X_A.Id=\"7\"");
}

// ---- Instances ----

class ProductCopyTest : public TCIMCopyTest {
protected:
  ProductCopyTest() { fSource->DefineClass("QRVSG_ZEPProduct").Key("Name", "string").Property("Version", "string", "0"); }

  std::vector<std::string> CopiedProducts() const { return InstancePaths(*fCopy->GetClass("QRVSG_ZEPProduct", kNone)); }
};

TEST_F(ProductCopyTest, TheInstancesOfTheProductClassAreCopied) {
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}, {"Version", "1.2"}});
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "b"}});
  CopyAll();
  EXPECT_THAT(CopiedProducts(), ElementsAre("QRVSG_ZEPProduct.Name=\"a\"", "QRVSG_ZEPProduct.Name=\"b\""));
  auto const first = All(*fCopy->GetClass("QRVSG_ZEPProduct", kNone), &ICIMClass::EnumerateInstances).front();
  EXPECT_EQ(first->GetProperty("Version", kNone)->GetValue(kNone).ToString(), "1.2");
}

TEST_F(ProductCopyTest, WithTheFlagNoInstanceIsCopied) {
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  CopyTraced(true);
  EXPECT_THAT(CopiedProducts(), IsEmpty());
  EXPECT_THAT(fTrace.fCalls, Contains("EnumerateInstances src:QRVSG_ZEPProduct"));
  EXPECT_THAT(fTrace.fCalls, Not(Contains("CreateInstance dst:QRVSG_ZEPProduct")));
}

TEST_F(ProductCopyTest, InstancesOfOtherClassesAndOfSubclassesAreNotCopied) {
  fSource->DefineClass("X_Product", "QRVSG_ZEPProduct");
  fSource->DefineClass("qrvsg_Disk").Key("Id", "uint32");
  fSource->AddInstance("X_Product", {{"Name", "sub"}});
  fSource->AddInstance("qrvsg_Disk", {{"Id", 1}});
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  CopyAll();
  EXPECT_THAT(CopiedProducts(), ElementsAre("QRVSG_ZEPProduct.Name=\"a\""));
  EXPECT_THAT(InstancePaths(*fCopy->GetClass("X_Product", kNone)), IsEmpty());
  EXPECT_THAT(InstancePaths(*fCopy->GetClass("qrvsg_Disk", kNone)), IsEmpty());
}

TEST(ProductClassNameTest, CaseMatters) {
  auto const source = NewNamespace(), copy = NewNamespace();
  source->DefineClass("qrvsg_zepproduct").Key("Name", "string");
  source->AddInstance("qrvsg_zepproduct", {{"Name", "a"}});
  TCIMCopy::CopyClasses(source, copy, false);
  EXPECT_THAT(InstancePaths(*copy->GetClass("qrvsg_zepproduct", kNone)), IsEmpty());
}

TEST_F(ProductCopyTest, AProductClassOfAPlugInHasItsInstancesLeftOut) {
  fSource->CreateQualifierDecl("PLUGINNAME", NullOf("string"), ICIMQualifierDecl::kScopeAny, 0, kNone);
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  fSource->GetClass("QRVSG_ZEPProduct", kNone)
      ->AddQualifier(fSource->GetQualifierDecl("PLUGINNAME", kNone), TCIMValue("Clock"), 0, kNone);
  CopyTraced();
  EXPECT_THAT(CopiedProducts(), IsEmpty());
  EXPECT_THAT(Calls({"GetQualifier src:", "IsAbstract", "EnumerateInstances"}),
              ElementsAre("GetQualifier src:QRVSG_ZEPProduct.Name OVERRIDE", "GetQualifier src:QRVSG_ZEPProduct.Version OVERRIDE",
                          "GetQualifier src:QRVSG_ZEPProduct PLUGINNAME", "IsAbstract src:QRVSG_ZEPProduct"));
}

TEST_F(ProductCopyTest, AnAbstractProductClassHasItsInstancesLeftOut) {
  auto const source = NewNamespace();
  source->DefineClass("QRVSG_ZEPProduct").Abstract().Key("Name", "string");
  TCIMCopy::CopyClasses(Traced(source, "src"), fCopy, false);
  EXPECT_THAT(fTrace.fCalls, Not(Contains("EnumerateInstances src:QRVSG_ZEPProduct")));
}

TEST_F(ProductCopyTest, TheProductClassMayBeAnAssociation) {
  auto const source = NewNamespace();
  source->DefineClass("QRVSG_ZEPProduct").Association().Key("Name", "string");
  source->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  TCIMCopy::CopyClasses(source, fCopy, false);
  EXPECT_THAT(CopiedProducts(), ElementsAre("QRVSG_ZEPProduct.Name=\"a\""));

  fCopy = NewNamespace();
  TCIMCopy::CopyClasses(source, fCopy, true);
  EXPECT_THAT(CopiedProducts(), IsEmpty());
}

TEST_F(ProductCopyTest, AnInstanceThatIsRefusedEndsTheCopy) {
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  fSource->DefineClass("X_Later");
  FailOn("CommitInstance dst:QRVSG_ZEPProduct", kZEPStatusAlreadyExists);
  EXPECT_STATUS(CopyTraced(), kZEPStatusAlreadyExists);
  EXPECT_THAT(ClassNames(*fCopy), ElementsAre("QRVSG_ZEPProduct"));
}

TEST_F(ProductCopyTest, AnInstanceIsCopiedStepByStep) {
  fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}, {"Version", TCIMValue()}});
  CopyAll(true);
  auto const source = All(*Traced(fSource, "src")->GetClass("QRVSG_ZEPProduct", kNone), &ICIMClass::EnumerateInstances).front();
  fTrace.fCalls.clear();
  TCIMCopy::CopyInstance(source, Traced(fCopy, "dst"));
  EXPECT_THAT(fTrace.fCalls, ElementsAre("GetClass of instance src:QRVSG_ZEPProduct", "GetClass dst:QRVSG_ZEPProduct",
                                         "CreateInstance dst:QRVSG_ZEPProduct", "EnumerateProperties src:QRVSG_ZEPProduct",
                                         "GetProperty dst:QRVSG_ZEPProduct.Name", "CommitInstance dst:QRVSG_ZEPProduct"));
  auto const copy = All(*fCopy->GetClass("QRVSG_ZEPProduct", kNone), &ICIMClass::EnumerateInstances).front();
  EXPECT_EQ(copy->GetProperty("Version", kNone)->GetValue(kNone).ToString(), "0");  // the default, not NULL
}

TEST_F(ProductCopyTest, AnInstanceOfAClassThatTheDestinationLacksIsRefused) {
  auto const instance = fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  EXPECT_STATUS(TCIMCopy::CopyInstance(instance, fCopy), kZEPStatusNotFound);
}

TEST_F(ProductCopyTest, APropertyThatTheDestinationLacksIsNotFound) {
  auto const instance = fSource->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}, {"Version", "1"}});
  fCopy->DefineClass("QRVSG_ZEPProduct").Key("Name", "string");
  EXPECT_STATUS(TCIMCopy::CopyInstance(instance, fCopy), kZEPStatusNotFound);
  EXPECT_THAT(CopiedProducts(), IsEmpty());
}

TEST_F(ProductCopyTest, AnInstanceOfAnyClassCanBeCopiedByItself) {
  fSource->DefineClass("X_Disk").Key("Id", "uint32").Property("Sizes", "uint64[4]");
  fSource->DefineClass("X_Link").Association().KeyReference("Disk", "X_Disk").Key("Port", "sint8");
  TCIMValue const sizes(TType::kCIMTypeUint64, 4, {TCIMValue(1ul), TCIMValue(2ul)});
  auto const disk = fSource->AddInstance("X_Disk", {{"Id", 7}, {"Sizes", sizes}});
  auto const link = fSource->AddInstance("X_Link", {{"Disk", disk->GetReference()}, {"Port", -1}});
  CopyAll(true);
  TCIMCopy::CopyInstance(disk, fCopy);
  TCIMCopy::CopyInstance(link, fCopy);
  EXPECT_THAT(InstancePaths(*fCopy->GetClass("X_Link", kNone)), ElementsAre("X_Link.Disk=\"X_Disk.Id=\"7\"\",Port=\"-1\""));
  auto const copiedLink = All(*fCopy->GetClass("X_Link", kNone), &ICIMClass::EnumerateInstances).front();
  TCIMReference const reference = copiedLink->GetProperty("Disk", kNone)->GetValue(kNone);
  auto const copiedDisk = All(*fCopy->GetClass("X_Disk", kNone), &ICIMClass::EnumerateInstances).front();
  EXPECT_EQ(reference.GetCIMElement(false), copiedDisk);
  EXPECT_EQ(copiedDisk->GetProperty("Sizes", kNone)->GetValue(kNone), sizes);
}

// ---- Values ----

TEST_F(TCIMCopyTest, AValueThatIsNotAReferenceIsReturnedUnchanged) {
  boost::shared_ptr<ICIMNamespace> const none;  // it is not needed
  for (TCIMValue const& value :
       {TCIMValue(), TCIMValue(true), TCIMValue(5u), TCIMValue("a\"b"), TCIMValue(1.5), NullOf("string[4]"), NullOf("uint8"),
        NullOf("reference[3]"), TCIMValue(TType::kCIMTypeString, 2, {TCIMValue("x"), TCIMValue("y")})}) {
    SCOPED_TRACE(value.IsNull() ? "NULL" : value.ToString());
    TCIMValue const copy = TCIMCopy::CopyValue(value, none);
    EXPECT_EQ(copy, value);
    EXPECT_EQ(copy.GetType(), value.GetType());
    EXPECT_EQ(copy.GetMaxArraySize(), value.GetMaxArraySize());
  }
}

TEST_F(TCIMCopyTest, ANullReferenceRefersToTheClassOfTheSameNameInTheDestination) {
  fSource->DefineClass("X_Disk");
  fCopy->DefineClass("X_Disk");
  TCIMValue value = NullOf("reference");
  value.SetReferencedClass(fSource->GetClass("X_Disk", kNone));
  TCIMValue const copy = TCIMCopy::CopyValue(value, fCopy);
  EXPECT_TRUE(copy.IsNull());
  EXPECT_TRUE(copy.IsReference());
  EXPECT_EQ(copy.GetReferencedClass(), fCopy->GetClass("X_Disk", kNone));

  EXPECT_STATUS(TCIMCopy::CopyValue(value, NewNamespace()), kZEPStatusNotFound);
  EXPECT_STATUS(TCIMCopy::CopyValue(value, boost::shared_ptr<ICIMNamespace>()), kZEPStatusFail);
}

TEST_F(TCIMCopyTest, ANullReferenceToNoClassStaysOne) {
  TCIMValue const copy = TCIMCopy::CopyValue(NullOf("reference"), fCopy);
  EXPECT_TRUE(copy.IsReference() && copy.IsNull());
  EXPECT_FALSE(copy.GetReferencedClass());
}

TEST_F(TCIMCopyTest, AReferenceTakesItsKeysAlongAtAnyDepth) {
  fSource->DefineClass("X_Disk").Key("Id", "uint32").Key("Name", "string");
  fSource->DefineClass("X_Link").KeyReference("Disk", "X_Disk");
  CopyAll();
  auto const disk = fSource->AddInstance("X_Disk", {{"Id", 5}, {"Name", "a\"b"}});
  TCIMValue const value = fSource->AddInstance("X_Link", {{"Disk", disk->GetReference()}})->GetReference();

  TCIMValue const copy = TCIMCopy::CopyValue(value, fCopy);
  EXPECT_EQ(copy.ToString(), value.ToString());
  EXPECT_EQ(copy.GetReferencedClass(), fCopy->GetClass("X_Link", kNone));
  TCIMReference const path = copy;
  EXPECT_EQ(path.GetNamespace(), fCopy);
  path.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    EXPECT_EQ(key.second.GetReferencedClass(), fCopy->GetClass("X_Disk", kNone));
    return true;
  });
}

TEST_F(TCIMCopyTest, TheElementsOfAnArrayOfReferencesAreCopiedToo) {
  fSource->DefineClass("X_Disk").Key("Id", "uint32");
  CopyAll();
  TCIMValue const element = fSource->AddInstance("X_Disk", {{"Id", 5}})->GetReference();
  TCIMValue const copy = TCIMCopy::CopyValue(TCIMValue(TType::kCIMTypeReference, 3, {element}), fCopy);
  std::vector<TCIMValue> const& elements = copy;
  ASSERT_EQ(elements.size(), 1u);
  EXPECT_EQ(elements[0].GetReferencedClass(), fCopy->GetClass("X_Disk", kNone));
  EXPECT_EQ(elements[0].ToString(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(copy.GetMaxArraySize(), 3u);
}

// ---- Threads ----

// Several threads copy instances, each into its own namespace; the sanitizer detects races on shared data.
TEST(CopyThreadsTest, ThreadsCopyInstancesAtOnce) {
  std::vector<std::thread> threads;
  std::atomic<int> copied{0};
  for (int number = 0; number < 4; ++number)
    threads.emplace_back([&copied] {
      auto const source = NewNamespace(), copy = NewNamespace();
      source->DefineClass("X_A").Key("Id", "uint32");
      copy->DefineClass("X_A").Key("Id", "uint32");
      for (int id = 0; id < 50; ++id) TCIMCopy::CopyInstance(source->AddInstance("X_A", {{"Id", id}}), copy);
      copied += static_cast<int>(InstancePaths(*copy->GetClass("X_A", kNone)).size());
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(copied, 200);
}

// Two threads copy into one namespace, which only one of them may touch at a time.
TEST(CopyThreadsTest, TwoThreadsCopyIntoOneNamespace) {
  auto const source = NewNamespace(), copy = NewNamespace();
  source->DefineClass("X_A").Key("Id", "uint32");
  copy->DefineClass("X_A").Key("Id", "uint32");
  std::vector<boost::shared_ptr<ICIMInstance>> instances;
  for (int id = 0; id < 200; ++id) instances.push_back(source->AddInstance("X_A", {{"Id", id}}));
  auto const copyEverySecond = [&](std::size_t first) {
    for (std::size_t at = first; at < instances.size(); at += 2) TCIMCopy::CopyInstance(instances[at], copy);
  };
  std::thread even(copyEverySecond, 0), odd(copyEverySecond, 1);
  even.join();
  odd.join();
  EXPECT_EQ(All(*copy->GetClass("X_A", kNone), &ICIMClass::EnumerateInstances).size(), 200u);
}

TEST(CopyThreadsTest, AnotherThreadWaitsButTheSameOneDoesNot) {
  auto const source = NewNamespace(), copy = NewNamespace();
  source->DefineClass("X_A").Key("Id", "uint32");
  copy->DefineClass("X_A").Key("Id", "uint32");
  auto const first = source->AddInstance("X_A", {{"Id", 1}}), second = source->AddInstance("X_A", {{"Id", 2}});
  std::atomic<bool> isDone{false};
  std::thread other;
  {
    boost::recursive_mutex::scoped_lock const lock(copyInstMutex);
    TCIMCopy::CopyInstance(first, copy);  // the mutex is recursive
    other = std::thread([&] {
      TCIMCopy::CopyInstance(second, copy);
      isDone = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_FALSE(isDone);
  }
  other.join();
  EXPECT_TRUE(isDone);
  EXPECT_EQ(All(*copy->GetClass("X_A", kNone), &ICIMClass::EnumerateInstances).size(), 2u);
}

bool CanAnotherThreadLock() {
  bool isLocked = false;
  std::thread([&] { isLocked = boost::recursive_mutex::scoped_try_lock(copyInstMutex).owns_lock(); }).join();
  return isLocked;
}

TEST(CopyThreadsTest, TheMutexIsHeldToTheCommitAndFreeAfterwards) {
  for (bool fails : {false, true}) {
    SCOPED_TRACE(fails);
    TTrace trace;
    auto const source = NewNamespace(), copy = NewNamespace();
    source->DefineClass("X_A").Key("Id", "uint32");
    copy->DefineClass("X_A").Key("Id", "uint32");
    auto const instance = source->AddInstance("X_A", {{"Id", 1}});
    bool isFree = true;
    trace.fOnCall["CommitInstance dst:X_A"] = [&] {
      isFree = CanAnotherThreadLock();
      if (fails) throw TZEPException(kZEPStatusFail);
    };
    auto const copyInstance = [&] { TCIMCopy::CopyInstance(instance, boost::make_shared<TTracedNamespace>(trace, copy, "dst")); };
    if (fails)
      EXPECT_STATUS(copyInstance(), kZEPStatusFail);
    else
      copyInstance();
    EXPECT_FALSE(isFree);
    EXPECT_TRUE(CanAnotherThreadLock());
  }
}

TEST(CopyThreadsTest, CopyingClassesTakesNoLock) {
  boost::recursive_mutex::scoped_lock const lock(copyInstMutex);
  std::thread([] {
    auto const source = NewNamespace(), copy = NewNamespace();
    source->DefineClass("X_A").Key("Id", "uint32");
    TCIMCopy::CopyClasses(source, copy, false);
    EXPECT_THAT(ClassNames(*copy), ElementsAre("X_A"));
  }).join();
}

}  // namespace
}  // namespace NQRVZEP20
