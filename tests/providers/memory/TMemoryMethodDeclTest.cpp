// SPDX-License-Identifier: Apache-2.0
#include "TMemoryMethodDecl.h"

#include "Collect.h"

namespace NQRVZEP20 {
namespace {

class TMemoryMethodDeclTest : public testing::Test {
protected:
  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  boost::shared_ptr<ICIMMethodDecl> const fMethod =
      fNs->CreateClass(nullptr, "X_Disk", kNone)->AddMethodDecl("Reset", TType::kCIMTypeUint32, kNone);
};

TEST_F(TMemoryMethodDeclTest, ParameterHasItsNameTypeAndClass) {
  struct {
    char const* fName;
    char const* fType;
    char const* fClassName;
  } const rows[] = {{"Zone", "string", ""},       {"Force", "boolean", ""},        {"Bytes", "uint8[16]", ""},
                    {"To", "reference", "X_Bay"}, {"All", "reference[]", "X_Bay"}, {"Any", "reference", ""}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    TMemoryType const type(row.fType);
    auto const parameter = fMethod->AddParameterDecl(row.fName, type.GetType(), type.GetMaxArraySize(), row.fClassName, kNone);
    EXPECT_EQ(parameter->GetName(kNone), row.fName);
    EXPECT_EQ(parameter->GetType(kNone), type.GetType());
    EXPECT_EQ(parameter->GetMaxArraySize(kNone), type.GetMaxArraySize());
    EXPECT_EQ(parameter->GetReferencedClassName(kNone), row.fClassName);
    EXPECT_EQ(parameter->GetMethod(kNone).lock(), fMethod);
  }
  EXPECT_THAT(Names(*fMethod, &ICIMMethodDecl::EnumerateParameterDecls),
              ElementsAre("Zone", "Force", "Bytes", "To", "All", "Any"));
  EXPECT_EQ(VisitsUntilSecond(*fMethod, &ICIMMethodDecl::EnumerateParameterDecls), 2);
}

TEST_F(TMemoryMethodDeclTest, ParameterIsRefusedWithItsReason) {
  fMethod->AddParameterDecl("Zone", TType::kCIMTypeString, 0, "", kNone);
  struct {
    char const* fName;
    TType fType;
    unsigned int fBound;
    char const* fClassName;
    EZEPStatusCode fStatus;
  } const rows[] = {
      {"ZONE", TType::kCIMTypeUint8, 0, "", kZEPStatusAlreadyExists},
      {"A", TType::kCIMTypeInvalid, 0, "", kZEPStatusTypeMismatch},
      {"A", TType::kCIMTypeArrayFlag, 0, "", kZEPStatusTypeMismatch},
      {"A", TType::kCIMTypeString, 4, "", kZEPStatusNotArray},
      {"A", TType::kCIMTypeString, 0, "X_Disk", kZEPStatusNotReference},
      {"A b", TType::kCIMTypeString, 0, "", kZEPStatusInvalidCIMName},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    EXPECT_STATUS(fMethod->AddParameterDecl(row.fName, row.fType, row.fBound, row.fClassName, kNone), row.fStatus);
  }
  EXPECT_THAT(Names(*fMethod, &ICIMMethodDecl::EnumerateParameterDecls), ElementsAre("Zone"));
}

}  // namespace
}  // namespace NQRVZEP20
