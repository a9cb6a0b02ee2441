// SPDX-License-Identifier: Apache-2.0

// The complete schema of the DMTF: loaded, copied, written and read back.

#include "tests/DmtfSchema.h"

#include "Mof.h"
#include "TCIMCopy.h"
#include "tests/providers/memory/Collect.h"

#include <map>
#include <memory>

namespace NQRVZEP20 {
namespace {

class DmtfSchemaTest : public testing::Test {
protected:
  static void SetUpTestSuite() {
    if (DmtfArchive().empty()) return;
    fSchema = std::make_unique<TDmtfSchema>();
  }
  static void TearDownTestSuite() { fSchema.reset(); }

  void SetUp() override {
    NEEDS(fSchema, kNoDmtfSchema);
    ASSERT_TRUE(fSchema->IsThere()) << "unzip failed";
    ReadMofFile(fSchema->MainFile(), fSource);
  }

  static std::unique_ptr<TDmtfSchema> fSchema;
  boost::shared_ptr<TMemoryNamespace> fSource = NewNamespace();
};

std::unique_ptr<TDmtfSchema> DmtfSchemaTest::fSchema;

using TClasses = std::vector<boost::shared_ptr<ICIMClass>>;

TClasses AllClasses(ICIMNamespace const& ns) {
  TClasses all;
  for (auto const& root : All(ns, &ICIMNamespace::EnumerateClasses)) {
    all.push_back(root);
    root->EnumerateSubClasses(TAddToVectorCallback<ICIMClass>(all), kNone);
  }
  return all;
}

bool IsIndication(boost::shared_ptr<ICIMClass> cls) {
  for (; cls; cls = cls->GetSuperClass(kNone))
    if (cls->GetQualifier("Indication", kNone)) return true;
  return false;
}

int StepsAbove(boost::shared_ptr<ICIMClass> cls) {
  int steps = 0;
  while ((cls = cls->GetSuperClass(kNone))) ++steps;
  return steps;
}

// The number of elements of each kind, by a name of the kind.
class TCounts {
public:
  explicit TCounts(ICIMNamespace const& ns) {
    fCounts["qualifier declarations"] = static_cast<int>(All(ns, &ICIMNamespace::EnumerateQualifierDecls).size());
    fCounts["root classes"] = static_cast<int>(All(ns, &ICIMNamespace::EnumerateClasses).size());
    for (auto const& cls : AllClasses(ns)) CountClass(cls);
  }

  std::map<std::string, int> const& Get() const { return fCounts; }

private:
  void CountClass(boost::shared_ptr<ICIMClass> cls) {
    ++fCounts["classes"];
    ++fCounts[cls->GetName(kNone).substr(0, 4) + " classes"];
    if (cls->GetClassFlag(kNone)) ++fCounts["associations"];
    if (cls->IsAbstract(kNone)) ++fCounts["abstract"];
    if (IsIndication(cls)) ++fCounts["indications"];
    int& deepest = fCounts["deepest"];
    deepest = std::max(deepest, StepsAbove(cls));
    CountQualifiers(*cls);
    for (auto const& property : All(*cls, &ICIMClass::EnumeratePropertyDecls)) CountProperty(*property);
    for (auto const& method : All(*cls, &ICIMClass::EnumerateMethodDecls)) CountMethod(*method);
  }

  void CountProperty(ICIMPropertyDecl const& property) {
    ++fCounts["properties"];
    TType const type = property.GetType(kNone);
    if ((type & TType::kCIMTypeArrayFlag) != 0) ++fCounts["arrays"];
    ++fCounts[type.ToString()];
    TCIMValue const value = property.GetDefaultValue(kNone);
    if (value.IsReference() && !value.GetReferencedClass()) ++fCounts["references to nothing"];
    CountQualifiers(property);
  }

  void CountMethod(ICIMMethodDecl const& method) {
    ++fCounts["methods"];
    CountQualifiers(method);
    for (auto const& parameter : All(method, &ICIMMethodDecl::EnumerateParameterDecls)) {
      ++fCounts["parameters"];
      CountQualifiers(*parameter);
    }
  }

  void CountQualifiers(ICIMNamedElement const& element) {
    for (char const* name : {"Description", "Values", "ValueMap", "Key"})
      if (element.GetQualifier(name, kNone)) ++fCounts[name];
  }

  std::map<std::string, int> fCounts;
};

// The numbers that an independent tokeniser found in the same files.
TEST_F(DmtfSchemaTest, TheSchemaIsLoadedCompletely) {
  EXPECT_EQ(TCounts(*fSource).Get(), (std::map<std::string, int>{{"qualifier declarations", 70},
                                                                 {"classes", 1631},
                                                                 {"CIM_ classes", 1570},
                                                                 {"PRS_ classes", 61},
                                                                 {"associations", 643},
                                                                 {"indications", 24},
                                                                 {"abstract", 107},
                                                                 {"root classes", 111},
                                                                 {"deepest", 9},
                                                                 {"properties", 7154},
                                                                 {"reference", 1257},
                                                                 {"arrays", 1009},
                                                                 {"methods", 428},
                                                                 {"parameters", 1693},
                                                                 {"Description", 10801},
                                                                 {"Values", 1898},
                                                                 {"ValueMap", 1913},
                                                                 {"Key", 720},
                                                                 {"string", 1946},
                                                                 {"uint16", 1650},
                                                                 {"uint64", 679},
                                                                 {"boolean", 610},
                                                                 {"uint32", 530},
                                                                 {"datetime", 179},
                                                                 {"uint8", 176},
                                                                 {"sint32", 76},
                                                                 {"real32", 31},
                                                                 {"sint16", 7},
                                                                 {"sint8", 6},
                                                                 {"real64", 4},
                                                                 {"sint64", 3}}));
}

TEST_F(DmtfSchemaTest, ACopyIsCompleteAndHasTheSameText) {
  auto const copy = NewNamespace();
  OnNewThread([&] {
    TLogCapture const log;
    TCIMCopy::CopyClasses(fSource, copy, false);
    EXPECT_THAT(log.Entries(), IsEmpty());  // nothing was skipped
  });
  EXPECT_EQ(TCounts(*copy).Get(), TCounts(*fSource).Get());
  std::string const text = WriteMof(*fSource);
  EXPECT_GT(text.size(), 4000000u);
  EXPECT_TRUE(WriteMof(*copy) == text);
}

TEST_F(DmtfSchemaTest, TheWrittenSchemaIsReadBackUnchanged) {
  std::string const text = WriteMof(*fSource);
  auto const again = NewNamespace();
  ReadMofText(text, "schema.mof", again);
  EXPECT_EQ(TCounts(*again).Get(), TCounts(*fSource).Get());
  EXPECT_TRUE(WriteMof(*again) == text);
}

TEST_F(DmtfSchemaTest, TheDeepestClassHasNineSuperclasses) {
  EXPECT_EQ(StepsAbove(fSource->GetClass("CIM_VTOCDiskPartition", kNone)), 9);
}

// A text of the first file that is split into several strings and escaped.
TEST_F(DmtfSchemaTest, StringsAreJoinedAndUnescaped) {
  auto const caption = fSource->GetClass("CIM_ManagedElement", kNone)->GetPropertyDecl("InstanceID", kNone);
  std::string const text = caption->GetQualifier("Description", kNone)->GetValue(kNone);
  EXPECT_THAT(text,
              testing::StartsWith("InstanceID is an optional property that may be used to opaquely and uniquely identify an "
                                  "instance of this class within the scope of the instantiating Namespace."));
  EXPECT_THAT(text, testing::HasSubstr("using the following \"preferred\" algorithm: \n<OrgID>:<LocalID> \nWhere"));
}

}  // namespace
}  // namespace NQRVZEP20
