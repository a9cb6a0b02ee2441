// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/ValueLines.h"

#include "TMemoryNamespace.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20::zep {
namespace {

class ValueLinesTest : public testing::Test {
protected:
  std::string LinesOf(std::string const& className) { return ValueLinesOf(*fNs->GetClass(className, TCIMContext())); }

  boost::shared_ptr<TMemoryNamespace> const fNs = boost::make_shared<TMemoryNamespace>("ns");
};

TEST_F(ValueLinesTest, EachKeyGetsAnExampleOfItsType) {
  fNs->DefineClass("X_All")
      .Key("CreationClassName", "string")
      .Key("Name", "string")
      .Key("Number", "sint16")
      .Key("Is", "boolean")
      .Key("Real", "real32")
      .Key("Real64", "real64")
      .Key("Letter", "char16")
      .Key("At", "datetime")
      .KeyReference("Peer", "X_All");
  EXPECT_EQ(LinesOf("X_All"),
            R"(  // CreationClassName, string, key
  values.Set("CreationClassName", "X_All");
  // Name, string, key
  values.Set("Name", "example");
  // Number, sint16, key
  values.Set("Number", 1);
  // Is, boolean, key
  values.Set("Is", true);
  // Real, real32, key
  values.Set("Real", 1.0f);
  // Real64, real64, key
  values.Set("Real64", 1.0);
  // Letter, char16, key
  values.Set("Letter", TCIMChar16('1'));
  // At, datetime, key
  values.Set("At", TCIMDateTime("20260101000000.000000+000"));
  // Peer, reference to X_All (GetReference of another instance), key
  values.Set("Peer", TCIMValue());
)");
}

TEST_F(ValueLinesTest, OtherPropertiesAreNullAndKeysComeFirst) {
  fNs->DefineClass("X_Above").Property("Model", "string").Description("The model. More about it.");
  fNs->DefineClass("X_Disk", "X_Above")
      .Property("State", "uint16", 5)
      .ValueMap({"0", "5"}, {"Unknown", "OK"})
      .Property("Sizes", "uint64[]")
      .Key("Id", "uint32");
  EXPECT_EQ(LinesOf("X_Disk"),
            R"(  // Id, uint32, key
  values.Set("Id", 1);
  // Model, string: The model.
  values.Set("Model", TCIMValue());
  // State, uint16
  // Values: 0 (Unknown), 5 (OK)
  // It keeps its default, 5, unless it is set.
  // Sizes, uint64[]
  values.Set("Sizes", TCIMValue());
)");
}

TEST_F(ValueLinesTest, ADescriptionNeverEndsTheComment) {
  fNs->DefineClass("X_Odd")
      .Property("A", "string")
      .Description("one\\\nint two;")
      .Property("B", "string")
      .Description("three\rint four;")
      .Property("C", "string", "a\nint five; \\");
  EXPECT_EQ(LinesOf("X_Odd"),
            R"(  // A, string: one\.
  values.Set("A", TCIMValue());
  // B, string: three
  values.Set("B", TCIMValue());
  // C, string
  // It keeps its default, a\x0aint five; \, unless it is set.
)");
}

}  // namespace
}  // namespace NQRVZEP20::zep
