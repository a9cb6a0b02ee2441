// SPDX-License-Identifier: Apache-2.0
#include "tests/providers/mof/MofTexts.h"

namespace NQRVZEP20 {
namespace {

TEST(MofReaderTest, AnErrorCarriesTheStatusOfTheRefusal) {
  EXPECT_EQ(StatusOfText("class X_A {"), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOfText("class X_A { }; class X_A { };"), kZEPStatusAlreadyExists);
  EXPECT_EQ(StatusOfText("class X_B : X_C { };"), kZEPStatusNotFound);
}

TEST(MofReaderTest, ASyntaxErrorChangesNothing) {
  auto const ns = NewNamespace();
  EXPECT_EQ(StatusOfText("class X_A { }; class X_B {", ns), kZEPStatusInvalidFormat);
  EXPECT_THAT(ClassNames(*ns), IsEmpty());
}

TEST(MofReaderTest, ASecondTextMayUseTheFirst) {
  auto const ns = Read("class X_A { };");
  ReadMofText("class X_B : X_A { [Key] string P; };", "b", ns);
  EXPECT_THAT(SubClassNames(*ns->GetClass("X_A", kNone)), ElementsAre("X_B"));
}

}  // namespace
}  // namespace NQRVZEP20
