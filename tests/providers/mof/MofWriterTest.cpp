// SPDX-License-Identifier: Apache-2.0
#include "TCIMCopy.h"
#include "tests/providers/mof/MofTexts.h"

#include <limits>
#include <sstream>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

TEST(MofWriterTest, ValuesOfEveryTypeAreReadBackUnchanged) {
  auto const ns = NewNamespace();
  int number = 0;
  auto cls = ns->DefineClass("X_A");
  auto const add = [&](char const* type, TCIMValue const& value) { cls.Property("P" + std::to_string(++number), type, value); };
  std::string everyByte;
  for (int c = 0; c < 256; ++c) everyByte += static_cast<char>(c);
  add("boolean", true);
  add("boolean", false);
  add("uint8", static_cast<unsigned char>(255));
  add("sint8", static_cast<signed char>(-128));
  add("sint16", std::numeric_limits<short>::min());
  add("uint64", std::numeric_limits<unsigned long>::max());
  add("sint64", std::numeric_limits<long>::min());
  for (double const real : {0.1, 1e300, -2.5, 0.0, -0.0, 5e-324, 100000.0, 1e22, 123456789.125}) add("real64", real);
  for (float const real : {0.1f, 16777217.0f, 3.4e38f, 1e-45f}) add("real32", real);
  for (std::string const& text : {std::string(), everyByte, std::string("'\"\\"), std::string(500, 'x'), std::string(200, '"'),
                                  std::string(" leading and trailing "), std::string("line\nline\n")})
    add("string", text);
  add("datetime", TCIMDateTime("20070315143000.000000+060"));
  add("datetime", TCIMDateTime("00000001020304.000005:000"));
  add("string[]", TCIMValue(TType::kCIMTypeString, 0, {}));
  add("string[2]", TCIMValue(TType::kCIMTypeString, 2, {TCIMValue("a, b"), NullOf("string")}));
  add("real64[]", TCIMValue(TType::kCIMTypeReal64, 0, {TCIMValue(0.1), TCIMValue(1e9)}));
  auto const again = ReadBack(WriteMof(*ns));
  for (auto const& decl : All(*ns->GetClass("X_A", kNone), &ICIMClass::EnumeratePropertyDecls)) {
    SCOPED_TRACE(decl->GetName(kNone));
    TCIMValue const value = decl->GetDefaultValue(kNone);
    TCIMValue const read = again->GetClass("X_A", kNone)->GetPropertyDecl(decl->GetName(kNone), kNone)->GetDefaultValue(kNone);
    EXPECT_EQ(read, value);
    EXPECT_EQ(read.GetMaxArraySize(), value.GetMaxArraySize());
  }
}

TEST(MofWriterTest, CharactersAreReadBackWithTheirCode) {
  auto const ns = NewNamespace();
  auto cls = ns->DefineClass("X_A");
  for (unsigned short const code : {0, 10, 34, 39, 65, 92, 127, 233, 0xd800, 0xffff})
    cls.Property("P" + std::to_string(code), "char16", TCIMChar16(code));
  std::string const text = WriteMof(*ns);
  EXPECT_THAT(text, HasSubstr("char16 P65 = 'A';"));
  EXPECT_THAT(text, HasSubstr("char16 P39 = '\\x0027';"));
  EXPECT_THAT(text, HasSubstr("char16 P34 = '\"';"));
  auto const again = ReadBack(text);
  for (auto const& decl : All(*again->GetClass("X_A", kNone), &ICIMClass::EnumeratePropertyDecls))
    EXPECT_EQ("P" + decl->GetDefaultValue(kNone).ToString(), decl->GetName(kNone));
}

TEST(MofWriterTest, PlainClassesComeBeforeAssociationsAndACopyHasTheSameText) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_Link").Association();
  ns->DefineClass("X_B");
  ns->DefineClass("X_FastLink", "X_Link");
  ns->DefineClass("QRVSG_ZEPProduct", "X_B").Key("Name", "string");
  ns->DefineClass("X_Mixed", "X_B").Association();
  ns->DefineClass("X_Plain", "X_B");
  ns->AddInstance("QRVSG_ZEPProduct", {{"Name", "a"}});
  std::string const text = WriteMof(*ns);
  std::vector<std::string> classes;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);)
    if (line.rfind("class ", 0) == 0) classes.push_back(line.substr(6, line.find(' ', 6) - 6));
  EXPECT_THAT(classes, ElementsAre("X_B", "QRVSG_ZEPProduct", "X_Plain", "X_Mixed", "X_Link", "X_FastLink"));

  auto const copy = NewNamespace();
  TCIMCopy::CopyClasses(ns, copy, false);
  EXPECT_EQ(WriteMof(*copy), text);
  EXPECT_EQ(WriteMof(*ReadBack(text)), text);
}

// A copy creates an association that is a subclass of a plain class later than the source did.
TEST(MofWriterTest, ACopyHasTheSameTextWhenKindsAreMixed) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_Top");
  ns->DefineClass("X_Link", "X_Top").Association();
  ns->DefineClass("X_Plain", "X_Top");
  ns->DefineClass("X_LowLink", "X_Plain").Association();
  auto const copy = NewNamespace();
  TCIMCopy::CopyClasses(ns, copy, false);
  EXPECT_EQ(WriteMof(*copy), WriteMof(*ns));
  EXPECT_EQ(WriteMof(*ReadBack(WriteMof(*ns))), WriteMof(*ns));
}

}  // namespace
}  // namespace NQRVZEP20
