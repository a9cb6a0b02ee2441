// SPDX-License-Identifier: Apache-2.0
#include "tests/providers/mof/MofTexts.h"

#include <functional>
#include <limits>

namespace NQRVZEP20 {
namespace {

using testing::EndsWith;

std::string TextOfClass(TMemoryNamespace const& ns, std::string const& name) { return WriteMofClass(*ns.GetClass(name, kNone)); }

TEST(TMofWriterTest, QualifierDeclarationsAreWritten) {
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

TEST(TMofWriterTest, AClassIsWritten) {
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

TEST(TMofWriterTest, InstancesAreWrittenWithoutTheirDefaults) {
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

TEST(TMofWriterTest, DeclarationsThatMofCannotExpressAreRefused) {
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
