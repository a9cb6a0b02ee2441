// SPDX-License-Identifier: Apache-2.0
#include "ICIMQualifierDecl.h"
#include "Mof.h"
#include "TCIMCopy.h"
#include "tests/providers/memory/Collect.h"

#include <limits>

namespace NQRVZEP20 {
namespace {

using testing::EndsWith;
using testing::HasSubstr;

boost::shared_ptr<TMemoryNamespace> ReadBack(std::string const& text) {
  auto const ns = NewNamespace();
  ReadMofText(text, "written.mof", ns);
  return ns;
}

std::string TextOfClass(TMemoryNamespace const& ns, std::string const& name) { return WriteMofClass(*ns.GetClass(name, kNone)); }

TEST(MofWriterTest, QualifierDeclarationsAreWritten) {
  auto const ns = NewNamespace();
  ns->CreateQualifierDecl("X_Words", TCIMValue(TType::kCIMTypeString, 3, {TCIMValue("a"), TCIMValue("b")}),
                          ICIMQualifierDecl::kScopeClass | ICIMQualifierDecl::kScopeMethod,
                          ICIMQualifierDecl::kFlavorTranslatable, kNone);
  ns->CreateQualifierDecl("X_Max", NullOf("sint64"), ICIMQualifierDecl::kScopeAny, ICIMQualifierDecl::kFlavorDefault, kNone);
  ns->CreateQualifierDecl("X_None", TCIMValue(true), 0, 0, kNone);
  std::string const text = WriteMof(*ns);
  EXPECT_EQ(text,
            "Qualifier X_Words : string[3] = {\"a\", \"b\"},\n"
            "    Scope(class, method),\n"
            "    Flavor(DisableOverride, Restricted, Translatable);\n"
            "\n"
            "Qualifier X_Max : sint64,\n"
            "    Scope(any),\n"
            "    Flavor(EnableOverride, ToSubclass);\n"
            "\n"
            "Qualifier X_None : boolean = TRUE,\n"
            "    Scope(),\n"
            "    Flavor(DisableOverride, Restricted);\n"
            "\n");
  EXPECT_EQ(WriteMof(*ReadBack(text)), text);
}

TEST(MofWriterTest, AClassIsWritten) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_Device").Abstract().Key("Id", "uint32");
  auto const cls = ns->DefineClass("X_Disk", "X_Device")
                       .Description("A \"disk\".")
                       .Property("State", "uint8", 1)
                       .ValueMap({"0", "1"}, {"Unknown", "Ready"})
                       .Property("Sizes", "uint64[4]")
                       .Reference("Mirror", "X_Disk")
                       .Qualifier("Key", false)
                       .Static("Count", "uint16", 2)
                       .Method("Stop", "boolean")
                       .Method("Reset", "uint32")
                       .In("Force", "boolean")
                       .Out("Log", "string[]")
                       .Class();
  All(*cls, &ICIMClass::EnumerateMethodDecls)[0]->AddParameterDecl("Where", TType::kCIMTypeReference, 0, "X_Disk", kNone);
  cls->AddQualifier(ns->GetQualifierDecl("Version", kNone), TCIMValue("1"), ICIMQualifierDecl::kFlavorToSubclass, kNone);
  cls->AddQualifier(ns->GetQualifierDecl("DisplayName", kNone), NullOf("string"), ICIMQualifierDecl::kFlavorDefault, kNone);
  EXPECT_EQ(TextOfClass(*ns, "X_Disk"),
            "[Description(\"A \\\"disk\\\".\"), Version(\"1\") : DisableOverride ToSubclass,\n"
            " DisplayName(NULL) : EnableOverride ToSubclass]\n"
            "class X_Disk : X_Device {\n"
            "\n"
            "  [ValueMap {\"0\", \"1\"}, Values {\"Unknown\", \"Ready\"}]\n"
            "  uint8 State = 1;\n"
            "\n"
            "  uint64 Sizes[4];\n"
            "\n"
            "  [Key(FALSE)]\n"
            "  X_Disk REF Mirror;\n"
            "\n"
            "  [Static]\n"
            "  uint16 Count = 2;\n"
            "\n"
            "  boolean Stop(\n"
            "    X_Disk REF Where);\n"
            "\n"
            "  uint32 Reset(\n"
            "    [In]\n"
            "    boolean Force,\n"
            "    [In(FALSE), Out]\n"
            "    string Log[]);\n"
            "};\n"
            "\n");
  std::string const text = WriteMof(*ns);
  EXPECT_EQ(WriteMof(*ReadBack(text)), text);
}

TEST(MofWriterTest, ValuesOfEveryTypeComeBackAsTheyWere) {
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

TEST(MofWriterTest, CharactersComeBackByTheirCode) {
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

TEST(MofWriterTest, LongTextsAndListsAreBrokenIntoLines) {
  auto const ns = NewNamespace();
  std::string words;
  for (int at = 0; at < 60; ++at) words += "word" + std::to_string(at) + " ";
  std::vector<std::string> values(80, "a value");
  ns->DefineClass("X_A").Description(words).Property("P", "uint8").ValueMap(values, values).Description(std::string(300, 'x'));
  std::string const text = TextOfClass(*ns, "X_A");
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) EXPECT_LE(line.size(), 105u) << line;
  EXPECT_THAT(text, HasSubstr("[Description(\n     \"word0 word1 "));
  auto const again = ReadBack(WriteMof(*ns));
  EXPECT_EQ(again->GetClass("X_A", kNone)->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), words);
  EXPECT_EQ(WriteMof(*again), WriteMof(*ns));
}

TEST(MofWriterTest, NoCharacterIsCutInTwo) {
  auto const ns = NewNamespace();
  std::string text;
  for (int at = 0; at < 200; ++at) text += "\xe2\x82\xac";
  ns->DefineClass("X_A").Description(text);
  std::istringstream lines(TextOfClass(*ns, "X_A"));
  for (std::string line; std::getline(lines, line);) {
    std::size_t const quote = line.find('"');
    if (quote == line.npos) continue;
    EXPECT_EQ(line.substr(quote + 1, 3), "\xe2\x82\xac") << line;
  }
}

TEST(MofWriterTest, InstancesAreWrittenWithWhatIsNotTheirDefault) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_Disk").Key("Id", "uint32").Property("Name", "string", "unnamed").Property("Size", "uint64");
  ns->DefineClass("X_Link").Association().KeyReference("From", "X_Disk").Key("Port", "string");
  ns->DefineClass("X_Use").Reference("Link", "X_Link");
  auto const disk = ns->AddInstance("X_Disk", {{"Id", 1}, {"Name", "sda"}});
  ns->AddInstance("X_Disk", {{"Id", 2}, {"Name", TCIMValue()}, {"Size", 5}});
  auto const link = ns->AddInstance("X_Link", {{"From", disk->GetReference()}, {"Port", "a\"\n"}});
  ns->AddInstance("X_Use", {{"Link", link->GetReference()}});
  std::string const text = WriteMof(*ns);
  EXPECT_THAT(text, EndsWith("instance of X_Disk {\n"
                             "  Id = 1;\n"
                             "  Name = \"sda\";\n"
                             "};\n"
                             "\n"
                             "instance of X_Disk {\n"
                             "  Id = 2;\n"
                             "  Name = NULL;\n"
                             "  Size = 5;\n"
                             "};\n"
                             "\n"
                             "instance of X_Use {\n"
                             "  Link = \"X_Link.From=\\\"X_Disk.Id=1\\\",Port=\\\"a\\\\\\\"\\\\n\\\"\";\n"
                             "};\n"
                             "\n"
                             "instance of X_Link {\n"
                             "  From = \"X_Disk.Id=1\";\n"
                             "  Port = \"a\\\"\\n\";\n"
                             "};\n"
                             "\n"));
  auto const again = ReadBack(text);
  EXPECT_EQ(WriteMof(*again), text);
  EXPECT_EQ(InstancePaths(*again->GetClass("X_Link", kNone)), InstancePaths(*ns->GetClass("X_Link", kNone)));
}

TEST(MofWriterTest, PlainClassesStandAboveAssociationsAndACopyHasTheSameText) {
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

// Where an association is a subclass of a plain class, the copy comes to it later than the source.
TEST(MofWriterTest, ACopyHasTheSameTextWhereKindsAreMixed) {
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

TEST(MofWriterTest, WhatMofCannotSayIsRefused) {
  using TDefine = std::function<void(TMemoryNamespace&)>;
  std::pair<char const*, TDefine> const rows[] = {
      {"a reference to no class", [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Property("P", "reference"); }},
      {"an array of references", [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Property("P", "reference[]"); }},
      {"a number without end",
       [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Property("P", "real64", std::numeric_limits<double>::infinity()); }},
      {"no number",
       [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Property("P", "real32", std::numeric_limits<float>::quiet_NaN()); }},
      {"a NULL character",
       [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Property("P", "char16", TCIMChar16(std::string("A"))); }},
      {"a NULL character among others",
       [](TMemoryNamespace& ns) {
         std::vector<TCIMValue> const characters = {TCIMValue(TCIMChar16(65)), TCIMValue(TCIMChar16(std::string()))};
         ns.DefineClass("X_A").Property("P", "char16[]", TCIMValue(TType::kCIMTypeChar16, 0, characters));
       }},
      {"a method that returns a reference",
       [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Method("M", TType::kCIMTypeReference); }},
      {"a parameter that refers to no class",
       [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Method("M", "uint8").In("P", "reference"); }},
      {"a reference to a class that is called as a type",
       [](TMemoryNamespace& ns) {
         ns.DefineClass("string");
         ns.DefineClass("X_A").Reference("P", "string");
       }},
      {"a static value of an inherited property",
       [](TMemoryNamespace& ns) {
         ns.DefineClass("X_A").Static("P", "uint16", 1);
         ns.DefineClass("X_B", "X_A").Class()->SetStaticProperty("P", TCIMValue(static_cast<unsigned short>(2)), kNone);
       }},
      {"a static value without its qualifier",
       [](TMemoryNamespace& ns) {
         ns.DefineClass("X_A").Property("P", "boolean").Class()->SetStaticProperty("P", TCIMValue(true), kNone);
       }},
      {"a default of a static property",
       [](TMemoryNamespace& ns) { ns.DefineClass("X_A").Property("P", "boolean", true).Qualifier("Static", true); }},
  };
  for (auto const& [what, define] : rows) {
    SCOPED_TRACE(what);
    auto const ns = NewNamespace();
    define(*ns);
    EXPECT_STATUS(WriteMof(*ns), kZEPStatusNotSupported);
  }
}

}  // namespace
}  // namespace NQRVZEP20
