// SPDX-License-Identifier: Apache-2.0
#include "ICIMQualifierDecl.h"
#include "Mof.h"
#include "TMofError.h"
#include "tests/providers/memory/Collect.h"

#include <sys/types.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <limits>

// While one lives, every file fails with that error once so many bytes of it were read.
class TReadFault {
public:
  TReadFault(std::size_t readable, int error) {
    gReadable = readable;
    gError = error;
  }
  ~TReadFault() { gError = 0; }

  static inline std::size_t gReadable = 0;
  static inline int gError = 0;
};

// The linker puts these in the place of read.
extern "C" ssize_t __real_read(int fd, void* buffer, std::size_t size);
extern "C" ssize_t __wrap_read(int fd, void* buffer, std::size_t size) {
  if (TReadFault::gError == 0) return __real_read(fd, buffer, size);
  auto const position = static_cast<std::size_t>(::lseek(fd, 0, SEEK_CUR));
  if (position < TReadFault::gReadable) return __real_read(fd, buffer, std::min(size, TReadFault::gReadable - position));
  errno = TReadFault::gError;
  return -1;
}

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

using testing::HasSubstr;
using testing::StartsWith;

// What most texts here begin with, in one line.
constexpr char kQualifiers[] =
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);"
    "Qualifier Association : boolean = false, Scope(association);"
    "Qualifier Abstract : boolean = false, Scope(class), Flavor(Restricted);"
    "Qualifier Static : boolean = false, Scope(property, method);"
    "Qualifier Description : string = null, Scope(any), Flavor(Translatable);"
    "Qualifier Values : string[], Scope(property);"
    "Qualifier Max : uint32 = 7, Scope(reference);\n";

boost::shared_ptr<TMemoryNamespace> Read(std::string const& text) {
  auto const ns = NewNamespace();
  ReadMofText(kQualifiers + text, "test.mof", ns);
  return ns;
}

// What is wrong with the text, without its qualifiers: "2:1: expected ...".
std::string ErrorOf(std::string const& text) {
  try {
    Read(text);
  } catch (TMofError const& error) {
    std::string const what = error.what();
    EXPECT_THAT(what, StartsWith("test.mof:"));
    return what.substr(9);
  }
  return "no error";
}

// The status of the error that the statement throws.
template <class TStatement>
EZEPStatusCode StatusOf(TStatement const& statement) {
  try {
    statement();
  } catch (TMofError const& error) {
    return error.GetStatusCode().GetCode();
  }
  return kZEPStatusOK;
}

EZEPStatusCode StatusOfText(std::string const& text, boost::shared_ptr<TMemoryNamespace> ns = NewNamespace()) {
  return StatusOf([&] { ReadMofText(text, "a", ns); });
}

boost::shared_ptr<ICIMPropertyDecl const> Property(ICIMNamespace const& ns, std::string const& cls, std::string const& name) {
  return ns.GetClass(cls, kNone)->GetPropertyDecl(name, kNone);
}

TCIMValue DefaultOf(std::string const& declaration) {
  return Property(*Read("class X_A { " + declaration + " };"), "X_A", "P")->GetDefaultValue(kNone);
}

// ---- Qualifier declarations ----

TEST(MofReaderTest, AQualifierDeclarationHasTypeDefaultScopeAndFlavor) {
  using Q = ICIMQualifierDecl;
  struct TRow {
    std::string text;
    int type;
    std::string value;
    unsigned int scope, flavor;
  };
  for (TRow const& row : {
           TRow{"Qualifier Q : boolean = TRUE, Scope(any);", TType::kCIMTypeBoolean, "true", Q::kScopeAny, Q::kFlavorDefault},
           TRow{"QUALIFIER Q : STRING, SCOPE(Class, ASSOCIATION, indication), FLAVOR(disableoverride);", TType::kCIMTypeString,
                "NULL", Q::kScopeClass | Q::kScopeAssociation | Q::kScopeIndication, Q::kFlavorToSubclass},
           TRow{"qualifier Q : sint64 = -5, scope(property, reference), flavor(EnableOverride, Restricted);",
                TType::kCIMTypeSint64, "-5", Q::kScopeProperty | Q::kScopeReference, Q::kFlavorEnableOverride},
           TRow{"Qualifier Q : string[] = {\"a\", \"b\"}, Scope(method, parameter), Flavor(DisableOverride, Restricted, "
                "Translatable);",
                TType::kCIMTypeString | TType::kCIMTypeArrayFlag, "{ a, b }", Q::kScopeMethod | Q::kScopeParameter,
                Q::kFlavorTranslatable},
           TRow{"Qualifier Q : uint8[3], Scope(), Flavor(ToSubclass Translatable);",
                TType::kCIMTypeUint8 | TType::kCIMTypeArrayFlag, "NULL", 0, Q::kFlavorDefault | Q::kFlavorTranslatable},
       }) {
    SCOPED_TRACE(row.text);
    auto const decl = Read(row.text)->GetQualifierDecl("Q", kNone);
    EXPECT_EQ(decl->GetType(kNone), row.type);
    TCIMValue const value = decl->GetDefaultValue(kNone);
    EXPECT_EQ(value.IsNull() ? "NULL" : value.ToString(), row.value);
    EXPECT_EQ(decl->GetScope(kNone), row.scope);
    EXPECT_EQ(decl->GetFlavor(kNone), row.flavor);
  }
  EXPECT_EQ(Read("Qualifier Q : uint8[3], Scope(any);")->GetQualifierDecl("Q", kNone)->GetDefaultValue(kNone).GetMaxArraySize(),
            3u);
}

// ---- Classes ----

TEST(MofReaderTest, ClassesPropertiesAndReferencesAreDeclared) {
  auto const ns = Read(
      "[Abstract, Description(\"what\" \" it is\")] class X_A { [Key] uint32 Id; string Names[]; uint8 Bytes[16]; };\n"
      "class X_B : x_a { string P = \"d\"; };\n"
      "[Association] CLASS X_Link AS $L { [Key] X_A REF From; X_B ref To; };");
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_A", "X_Link"));
  EXPECT_THAT(SubClassNames(*ns->GetClass("X_A", kNone)), ElementsAre("X_B"));
  EXPECT_TRUE(ns->GetClass("X_A", kNone)->IsAbstract(kNone));
  EXPECT_FALSE(ns->GetClass("X_B", kNone)->IsAbstract(kNone));
  EXPECT_TRUE(ns->GetClass("X_Link", kNone)->GetClassFlag(kNone));
  EXPECT_EQ(ns->GetClass("X_A", kNone)->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "what it is");
  EXPECT_TRUE(Property(*ns, "X_B", "Id")->IsKey(kNone));
  EXPECT_EQ(Property(*ns, "X_A", "Names")->GetType(kNone), TType::kCIMTypeString | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(Property(*ns, "X_A", "Names")->GetDefaultValue(kNone).GetMaxArraySize(), 0u);
  EXPECT_EQ(Property(*ns, "X_A", "Bytes")->GetDefaultValue(kNone).GetMaxArraySize(), 16u);
  EXPECT_EQ(Property(*ns, "X_B", "P")->GetDefaultValue(kNone).ToString(), "d");
  TCIMValue const to = Property(*ns, "X_Link", "To")->GetDefaultValue(kNone);
  EXPECT_TRUE(to.IsReference() && to.IsNull());
  EXPECT_EQ(to.GetReferencedClass(), ns->GetClass("X_B", kNone));
}

TEST(MofReaderTest, MethodsHaveParameters) {
  auto const ns = Read(
      "class X_A { uint32 Reset(); [Description(\"f\")] boolean Find([Description(\"n\")] string Names[8], X_A REF Where, "
      "X_A REF All[], datetime When); };");
  auto const methods = All(*ns->GetClass("X_A", kNone), &ICIMClass::EnumerateMethodDecls);
  ASSERT_EQ(methods.size(), 2u);
  EXPECT_THAT(Names(*methods[0], &ICIMMethodDecl::EnumerateParameterDecls), IsEmpty());
  EXPECT_EQ(methods[1]->GetReturnType(kNone), TType::kCIMTypeBoolean);
  EXPECT_EQ(methods[1]->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "f");
  auto const parameters = All(*methods[1], &ICIMMethodDecl::EnumerateParameterDecls);
  ASSERT_EQ(parameters.size(), 4u);
  EXPECT_EQ(parameters[0]->GetType(kNone), TType::kCIMTypeString | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(parameters[0]->GetMaxArraySize(kNone), 8u);
  EXPECT_EQ(parameters[0]->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "n");
  EXPECT_EQ(parameters[1]->GetType(kNone), TType::kCIMTypeReference);
  EXPECT_EQ(parameters[1]->GetReferencedClassName(kNone), "X_A");
  EXPECT_EQ(parameters[2]->GetType(kNone), TType::kCIMTypeReference | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(parameters[2]->GetReferencedClassName(kNone), "X_A");
  EXPECT_EQ(parameters[3]->GetType(kNone), TType::kCIMTypeDateTime);
}

TEST(MofReaderTest, ReferencesMayLeadForwardAndInCircles) {
  auto const ns = Read("class X_A { X_B REF B; }; class X_B { X_A REF A; X_B REF Self; };");
  EXPECT_EQ(Property(*ns, "X_A", "B")->GetDefaultValue(kNone).GetReferencedClass(), ns->GetClass("X_B", kNone));
  EXPECT_EQ(Property(*ns, "X_B", "A")->GetDefaultValue(kNone).GetReferencedClass(), ns->GetClass("X_A", kNone));
}

TEST(MofReaderTest, WordsThatAreKeywordsElsewhereAreNamesToo) {
  auto const ns = Read("class Qualifier { string class; uint8 ref; boolean of; string Scope(string any); };");
  EXPECT_THAT(Names(*ns->GetClass("Qualifier", kNone), &ICIMClass::EnumeratePropertyDecls), ElementsAre("class", "ref", "of"));
}

TEST(MofReaderTest, AQualifierWithoutValueIsTrueOrTheDeclaredDefault) {
  auto const ns = Read("class X_A { [Key, Max, Values, Description] string P; [Key(false), Max(3)] string Q; };");
  auto const valueOf = [&](char const* property, char const* qualifier) {
    return Property(*ns, "X_A", property)->GetQualifier(qualifier, kNone)->GetValue(kNone);
  };
  EXPECT_EQ(valueOf("P", "Key"), TCIMValue(true));
  EXPECT_EQ(valueOf("P", "Max"), TCIMValue(7u));
  EXPECT_TRUE(valueOf("P", "Values").IsNull());
  EXPECT_TRUE(valueOf("P", "Description").IsNull());
  EXPECT_EQ(valueOf("Q", "Key"), TCIMValue(false));
  EXPECT_EQ(valueOf("Q", "Max"), TCIMValue(3u));
}

TEST(MofReaderTest, AQualifierHasTheDeclaredFlavorUnlessItNamesItsOwn) {
  using Q = ICIMQualifierDecl;
  struct TRow {
    char const* text;
    unsigned int flavor;
  };
  for (TRow const& row : {TRow{"Description(\"a\")", Q::kFlavorDefault | Q::kFlavorTranslatable},
                          TRow{"Description(\"a\") : DisableOverride", Q::kFlavorToSubclass},
                          TRow{"Description(\"a\") : Restricted translatable", Q::kFlavorEnableOverride | Q::kFlavorTranslatable},
                          TRow{"Values {\"a\"} : ToSubclass", Q::kFlavorDefault},
                          TRow{"Key : Restricted", Q::kFlavorEnableOverride}, TRow{"Key", Q::kFlavorToSubclass}}) {
    auto const ns = Read(std::string("class X_A { [") + row.text + "] string P; };");
    auto const qualifiers = All(*Property(*ns, "X_A", "P"), &ICIMNamedElement::EnumerateQualifiers);
    ASSERT_EQ(qualifiers.size(), 1u) << row.text;
    EXPECT_EQ(qualifiers.front()->GetFlavor(kNone), row.flavor) << row.text;
  }
}

TEST(MofReaderTest, TheValueOfAStaticPropertyIsThatOfTheClass) {
  auto const ns =
      Read("class X_A { [Static] uint16 Count = 3; [Static(false)] uint16 Plain = 4; [Static(null)] uint8 No = 5; };");
  auto const statics = All(*ns->GetClass("X_A", kNone), &ICIMClass::EnumerateStaticProperties);
  ASSERT_EQ(statics.size(), 1u);
  EXPECT_EQ(statics.front()->GetName(kNone), "Count");
  EXPECT_EQ(statics.front()->GetValue(kNone).ToString(), "3");
  EXPECT_TRUE(Property(*ns, "X_A", "Count")->GetDefaultValue(kNone).IsNull());
  EXPECT_EQ(Property(*ns, "X_A", "Plain")->GetDefaultValue(kNone).ToString(), "4");
}

// ---- Values ----

TEST(MofReaderTest, ValuesOfEveryTypeAreRead) {
  struct TRow {
    char const* declaration;
    TCIMValue value;
  };
  for (TRow const& row : {
           TRow{"boolean P = TRUE;", TCIMValue(true)},
           TRow{"boolean P = False;", TCIMValue(false)},
           TRow{"uint8 P = 255;", TCIMValue(static_cast<unsigned char>(255))},
           TRow{"uint8 P = 0;", TCIMValue(static_cast<unsigned char>(0))},
           TRow{"uint8 P = -0;", TCIMValue(static_cast<unsigned char>(0))},
           TRow{"sint8 P = -128;", TCIMValue(static_cast<signed char>(-128))},
           TRow{"uint16 P = 0xFfFf;", TCIMValue(static_cast<unsigned short>(65535))},
           TRow{"sint16 P = -0x8000;", TCIMValue(std::numeric_limits<short>::min())},
           TRow{"uint32 P = 0777;", TCIMValue(511u)},
           TRow{"uint32 P = 1011B;", TCIMValue(11u)},
           TRow{"uint32 P = 0x1e;", TCIMValue(30u)},
           TRow{"uint32 P = 0x1b;", TCIMValue(27u)},
           TRow{"sint32 P = +7;", TCIMValue(7)},
           TRow{"uint64 P = 18446744073709551615;", TCIMValue(std::numeric_limits<unsigned long>::max())},
           TRow{"sint64 P = -9223372036854775808;", TCIMValue(std::numeric_limits<long>::min())},
           TRow{"real32 P = 0.1;", TCIMValue(0.1f)},
           TRow{"real64 P = -1.5E+2;", TCIMValue(-150.0)},
           TRow{"real64 P = 1e-2;", TCIMValue(0.01)},
           TRow{"real64 P = +.5;", TCIMValue(0.5)},
           TRow{"real64 P = 3;", TCIMValue(3.0)},
           TRow{"string P = \"a b\";", TCIMValue("a b")},
           TRow{"string P = \"\";", TCIMValue("")},
           TRow{"datetime P = \"20070315143000.000000+060\";", TCIMValue(TCIMDateTime("20070315143000.000000+060"))},
           TRow{"datetime P = \"00000001020304.000005:000\";", TCIMValue(TCIMDateTime("00000001020304.000005:000"))},
           TRow{"uint8 P[] = {1, 2};",
                TCIMValue(TType::kCIMTypeUint8, 0,
                          {TCIMValue(static_cast<unsigned char>(1)), TCIMValue(static_cast<unsigned char>(2))})},
           TRow{"string P[4] = {};", TCIMValue(TType::kCIMTypeString, 4, {})},
           TRow{"string P[] = {\"a\" \"b\", NULL};", TCIMValue(TType::kCIMTypeString, 0, {TCIMValue("ab"), NullOf("string")})},
       }) {
    SCOPED_TRACE(row.declaration);
    TCIMValue const value = DefaultOf(row.declaration);
    EXPECT_EQ(value, row.value);
    EXPECT_EQ(value.GetMaxArraySize(), row.value.GetMaxArraySize());
  }
  for (char const* declaration : {"uint8 P = NULL;", "string P[3] = null;", "char16 P = Null;"})
    EXPECT_TRUE(DefaultOf(declaration).IsNull()) << declaration;
  EXPECT_EQ(DefaultOf("string P[3] = null;").GetMaxArraySize(), 3u);
}

TEST(MofReaderTest, CharactersAreReadByTheirCode) {
  for (auto const& [literal, code] :
       {std::pair("'A'", "65"), std::pair("'\\x41'", "65"), std::pair("'\\xFFFF'", "65535"), std::pair("'\\x0'", "0"),
        std::pair("'\\n'", "10"), std::pair("'\\''", "39"), std::pair("'\"'", "34"), std::pair("'\xc3\xa9'", "233"),
        std::pair("'\xe2\x82\xac'", "8364"), std::pair("67", "67")})
    EXPECT_EQ(DefaultOf(std::string("char16 P = ") + literal + ";").ToString(), code) << literal;
}

TEST(MofReaderTest, EscapesOfStringsAreResolved) {
  for (auto const& [literal, text] :
       {std::pair(R"("\b\t\n\f\r")", "\b\t\n\f\r"), std::pair(R"("\"\'\\")", "\"'\\"),
        std::pair(R"("\x41\X42\x043C")", "AB\xd0\xbc"), std::pair(R"("\xe9t\xE9")", "\xc3\xa9t\xc3\xa9"),
        std::pair(R"("\x20AC")", "\xe2\x82\xac"), std::pair("\"\xc3\xa9\"", "\xc3\xa9"),
        std::pair("\"// no comment /* */\"", "// no comment /* */"),
        std::pair("\"a\" // joined\n  \"b\" /* too */ \"c\"", "abc")})
    EXPECT_EQ(DefaultOf(std::string("string P = ") + literal + ";").ToString(), text) << literal;
  EXPECT_EQ(DefaultOf("string P = \"a\\x0\";").ToString(), std::string("a\0", 2));
}

TEST(MofReaderTest, BlanksCommentsAndLineEndsSeparate) {
  auto const ns = Read("/* a\n * block **/class/**/X_A{// end\r\n\tstring\fP\v;};// no line end");
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_A"));
  EXPECT_THAT(ClassNames(*Read("")), IsEmpty());
  EXPECT_THAT(ClassNames(*Read("// nothing")), IsEmpty());
}

TEST(MofReaderTest, OtherPragmasArePassedOver) {
  EXPECT_THAT(ClassNames(*Read("#pragma locale (\"en_US\")\n#PRAGMA namespace(\"root\" \"/x\") class X_A { };")),
              ElementsAre("X_A"));
}

// ---- Instances ----

constexpr char kDisks[] =
    "class X_Disk { [Key] uint32 Id; string Name = \"unnamed\"; uint16 Sizes[4]; X_Disk REF Mirror; };"
    "[Association] class X_Link { [Key] X_Disk REF From; [Key] X_Disk REF To; };"
    "[Abstract] class X_Thing { };\n";

std::vector<std::string> PathsOf(ICIMNamespace const& ns, std::string const& cls) {
  return InstancePaths(*ns.GetClass(cls, kNone));
}

TCIMValue ValueOf(ICIMNamespace const& ns, std::string const& path, std::string const& property) {
  TCIMReference const reference(boost::const_pointer_cast<ICIMNamespace>(ns.GetClass("X_Disk", kNone)->GetNamespace(kNone)),
                                "ns:" + path, kNone);
  return boost::dynamic_pointer_cast<ICIMInstance>(reference.GetCIMElement(false))->GetProperty(property, kNone)->GetValue(kNone);
}

TEST(MofReaderTest, InstancesAreMadeWithTheirValues) {
  auto const ns = Read(std::string(kDisks) +
                       "instance of X_Disk { Id = 1; Name = \"sda\"; Sizes = {5, 6}; };\n"
                       "[Description(\"dropped\")] INSTANCE OF x_disk { [Key] id = 0x2; Name = NULL; };\n"
                       "instance of X_Disk { Id = 3; };");
  EXPECT_THAT(PathsOf(*ns, "X_Disk"), ElementsAre("X_Disk.Id=\"1\"", "X_Disk.Id=\"2\"", "X_Disk.Id=\"3\""));
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Name").ToString(), "sda");
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Sizes").ToString(), "{ 5, 6 }");
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Sizes").GetMaxArraySize(), 4u);
  EXPECT_TRUE(ValueOf(*ns, "X_Disk.Id=\"2\"", "Name").IsNull());
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"3\"", "Name").ToString(), "unnamed");
}

TEST(MofReaderTest, AReferenceIsAPathOrAnAlias) {
  auto const ns = Read(std::string(kDisks) +
                       "instance of X_Link { From = $A; To = \"X_Disk.Id=2\"; };\n"
                       "instance of X_Disk as $a { Id = 1; Mirror = $B; };\n"
                       "instance of X_Disk as $B { Id = 2; Mirror = $A; };\n"
                       "instance of X_Link { From = \"root/x:X_Disk.Id=\\\"2\\\"\"; To = \"//h.example/ns:x_disk.id=0x1\"; };");
  EXPECT_THAT(PathsOf(*ns, "X_Link"), ElementsAre("X_Link.From=\"X_Disk.Id=\"1\"\",To=\"X_Disk.Id=\"2\"\"",
                                                  "X_Link.From=\"X_Disk.Id=\"2\"\",To=\"X_Disk.id=\"1\"\""));
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Mirror").ToString(), "X_Disk.Id=\"2\"");
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"2\"", "Mirror").ToString(), "X_Disk.Id=\"1\"");
}

TEST(MofReaderTest, KeysOfEveryTypeAreReadFromPaths) {
  auto const ns = Read(
      "class X_K { [Key] string S; [Key] boolean B; [Key] sint8 N; [Key] real64 R; [Key] datetime D; [Key] char16 C; };"
      "class X_L { [Key] X_K REF K; }; class X_M { X_L REF L; };"
      "class X_Disk { X_M REF M; };"
      "instance of X_M { L = \"X_L.K=\\\"X_K.S=\\\\\\\"a,\\\\\\\\\\\\\\\"=b\\\\\\\",B=TRUE,N=-5,R=0.5,"
      "D=\\\\\\\"20070315143000.000000+060\\\\\\\",C=','\\\"\"; };");
  auto const instance = All(*ns->GetClass("X_M", kNone), &ICIMClass::EnumerateInstances).front();
  TCIMReference const link = instance->GetProperty("L", kNone)->GetValue(kNone);
  link.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    EXPECT_EQ(key.second.ToString(), "X_K.B=\"true\",C=\"44\",D=\"20070315143000.000000+060\",N=\"-5\",R=\"0.5\",S=\"a,\\\"=b\"");
    return true;
  });
  EXPECT_EQ(link.GetClassName(), "X_L");
}

// ---- What is wrong, and where ----

TEST(MofReaderTest, AnErrorTellsThePlaceAndWhatWasExpected) {
  struct TRow {
    std::string text, error;
  };
  for (TRow const& row : {
           TRow{"clas X_A { };", "2:1: expected \"qualifier\", \"class\", \"instance\" or a pragma, found \"clas\""},
           TRow{"class { };", "2:7: expected the name of a class, found \"{\""},
           TRow{"class X_A", "2:10: expected \"{\", found the end of the file"},
           TRow{"class X_A : { };", "2:13: expected the name of the superclass, found \"{\""},
           TRow{"class X_A { }", "2:14: expected \";\", found the end of the file"},
           TRow{"class X_A {\n  strin Name;\n};", "3:9: expected \"REF\" behind what is no type, found \"Name\""},
           TRow{"class X_A {\n  string Name\n};", "4:1: expected \"(\", \"=\" or \";\", found \"}\""},
           TRow{"class X_A { string; };", "2:19: expected a name, found \";\""},
           TRow{"class X_A { string P = ; };", "2:24: expected a value, found \";\""},
           TRow{"class X_A { string P = \"a\" x };", "2:28: expected \";\", found \"x\""},
           TRow{"class X_A { string P[0]; };", "2:22: expected \"]\" or a size of at least 1, found 0"},
           TRow{"class X_A { string P[4; };", "2:23: expected \"]\", found \";\""},
           TRow{"class X_A { uint32 M(string a; };", "2:30: expected \",\" or \")\", found \";\""},
           TRow{"class X_A { uint32 M() };", "2:24: expected \";\", found \"}\""},
           TRow{"class X_A { ; };", "2:13: expected a type, a class and \"REF\", or \"}\", found \";\""},
           TRow{"[Key class X_A { };", "2:6: expected \",\" or \"]\", found \"class\""},
           TRow{"[Key(] class X_A { };", "2:6: expected a value, found \"]\""},
           TRow{"[Key(true] class X_A { };", "2:10: expected \")\", found \"]\""},
           TRow{"[Key : Loud] class X_A { };", "2:8: expected a flavor, such as \"ToSubclass\", found \"Loud\""},
           TRow{"[Key : Restricted Loud] class X_A { };", "2:19: expected a flavor or \",\" or \"]\", found \"Loud\""},
           TRow{"[Key] qualifier Q : string;", "2:7: expected \"class\" or \"instance\", found \"qualifier\""},
           TRow{"Qualifier Q string;", "2:13: expected \":\", found \"string\""},
           TRow{"Qualifier Q : reference, Scope(any);", "2:15: expected a type, found \"reference\""},
           TRow{"Qualifier Q : string;", "2:21: expected \",\", found \";\""},
           TRow{"Qualifier Q : string, Flavor(Restricted);", "2:23: expected \"Scope\", found \"Flavor\""},
           TRow{"Qualifier Q : string, Scope(some);", "2:29: expected a scope, such as \"property\" or \"any\", found \"some\""},
           TRow{"Qualifier Q : string, Scope(any), Scope(any);", "2:35: expected \"Flavor\", found \"Scope\""},
           TRow{"Qualifier Q : string, Scope(any), Flavor(x);", "2:42: expected a flavor, such as \"ToSubclass\", found \"x\""},
           TRow{"instance X_A { };", "2:10: expected \"of\", found \"X_A\""},
           TRow{"instance of X_A as A { };", "2:20: expected an alias, such as \"$Disk\", found \"A\""},
           TRow{"instance of X_A { P; };", "2:20: expected \"=\", found \";\""},
           TRow{"instance of X_A { = 1; };", "2:19: expected the name of a property or \"}\", found \"=\""},
           TRow{"#pragma (\"x\")", "2:9: expected the name of a pragma, found \"(\""},
           TRow{"#pragma include (x)", "2:18: expected a string, found \"x\""},
           TRow{"#pragma include (\"x.mof\")", "2:18: a text that is no file cannot include one"},
           TRow{"#include", "2:1: this character begins nothing that is known here"},
           TRow{"class X_A { string P = \"a\n\"; };", "2:24: this string has no closing quote in its line"},
           TRow{"class X_A { string P = \"a\\\"", "2:24: this string has no closing quote in its line"},
           TRow{"class X_A { string P = \"a\\", "2:24: this string has no closing quote in its line"},
           TRow{"class X_A { char16 P = 'a", "2:24: this character has no closing quote in its line"},
           TRow{"class /* X_A { };", "2:7: this comment has no end"},
           TRow{"class / X_A { };", "2:7: this character begins nothing that is known here"},
           TRow{"class X_A { string P = \"a\\q\"; };", "2:26: this escape is unknown"},
           TRow{"class X_A { string P = \"\\xg\"; };", "2:25: expected one to four hexadecimal digits behind \"\\x\""},
           TRow{"class X_A { string P = \"\\xD800\"; };", "2:25: half of a surrogate pair is no character"},
           TRow{"class X_A { string P = 5; };", "2:24: expected a value of the type string"},
           TRow{"class X_A { uint8 P = \"5\"; };", "2:23: expected a value of the type uint8"},
           TRow{"class X_A { uint8 P = true; };", "2:23: expected a value of the type uint8"},
           TRow{"class X_A { string P = 'a'; };", "2:24: expected a value of the type string"},
           TRow{"class X_A { boolean P = 1; };", "2:25: expected a value of the type boolean"},
           TRow{"class X_A { uint8 P = 256; };", "2:23: the number is out of the range of uint8"},
           TRow{"class X_A { uint8 P = -1; };", "2:23: the number is out of the range of uint8"},
           TRow{"class X_A { sint8 P = 128; };", "2:23: the number is out of the range of sint8"},
           TRow{"class X_A { sint64 P = -9223372036854775809; };", "2:24: the number is out of the range of sint64"},
           TRow{"class X_A { uint64 P = 18446744073709551616; };", "2:24: the number is out of the range of uint64"},
           TRow{"class X_A { uint8 P = 1.5; };", "2:23: expected an integer"},
           TRow{"class X_A { uint8 P = 08; };", "2:23: expected an integer"},
           TRow{"class X_A { uint8 P = 0x; };", "2:23: expected an integer"},
           TRow{"class X_A { uint8 P = 12b; };", "2:23: expected an integer"},
           TRow{"class X_A { uint8 P = 1x; };", "2:23: expected an integer"},
           TRow{"class X_A { real32 P = 1e99; };", "2:24: the number is out of the range of real32"},
           TRow{"class X_A { real64 P = 1.2.3; };", "2:24: expected a number"},
           TRow{"class X_A { char16 P = 65536; };", "2:24: the number is out of the range of uint16"},
           TRow{"class X_A { char16 P = 'ab'; };", "2:24: expected one character of 16 bits between the quotes"},
           TRow{"class X_A { char16 P = ''; };", "2:24: expected one character of 16 bits between the quotes"},
           TRow{"class X_A { char16 P = '\xf0\x9f\x98\x80'; };", "2:24: expected one character of 16 bits between the quotes"},
           TRow{"class X_A { datetime P = \"today\"; };",
                "2:26: expected a datetime of 25 characters, such as \"20070315143000.000000+060\""},
           TRow{"class X_A { string P[] = \"a\"; };", "2:26: expected an array of values in braces"},
           TRow{"class X_A { string P = {\"a\"}; };", "2:24: expected one value, not an array of them"},
           TRow{"class X_A { string P[] = {\"a\"; };", "2:30: expected \",\" or \"}\", found \";\""},
           TRow{"class X_A { string P = $A; };", "2:24: an alias may stand only as the value of a reference of an instance"},
           TRow{"class X_B : X_A { };", "2:13: X_A is the superclass, and is not declared above"},
           TRow{"class X_A { };\nclass x_a { };", "3:7: x_a is declared already"},
           TRow{"class X_A { string P; uint8 p; };", "2:29: p is declared already in this class"},
           TRow{"class X_A { uint8 M(); uint8 m(); };", "2:30: m is declared already in this class"},
           TRow{"class X_A { uint8 M(string a, string A); };", "2:38: A is declared already in this method"},
           TRow{"class X_A { X_B REF P; };", "2:13: X_B is no class that is declared"},
           TRow{"class X_A { uint8 M(X_B REF P); };", "2:21: X_B is no class that is declared"},
           TRow{"class X_A { X_A REF P[]; };", "2:13: a property cannot be an array of references"},
           TRow{"class X_A { X_A REF M(); };", "2:21: a method returns neither a reference nor an array"},
           TRow{"class X_A { string M[](); };", "2:20: a method returns neither a reference nor an array"},
           TRow{"[Unheard] class X_A { };", "2:2: Unheard is no qualifier that is declared"},
           TRow{"class X_A { [Key, key] string P; };", "2:19: key is written twice here"},
           TRow{"class X_A { [Values(\"a\")] string P; };", "2:21: expected an array of values in braces"},
           TRow{"Qualifier key : string, Scope(any);", "2:11: key is declared already"},
           TRow{"instance of X_A { };", "2:13: X_A is no class that is declared"},
           TRow{kDisks + std::string("instance of X_Thing { };"), "3:13: X_Thing is abstract and has no instances"},
           TRow{kDisks + std::string("instance of X_Disk { Size = 1; };"), "3:22: Size is no property of the class"},
           TRow{kDisks + std::string("instance of X_Disk { Id = 1; ID = 2; };"), "3:30: ID has a value already"},
           TRow{kDisks + std::string("instance of X_Disk { Id = 1; };\ninstance of X_Disk { Id = 1; };"),
                "4:13: X_Disk has another instance with the same keys"},
           TRow{kDisks + std::string("instance of X_Disk { Id = $A; };"), "3:27: $A is the alias of no instance"},
           TRow{kDisks + std::string("instance of X_Disk as $A { Id = 1; Name = $A; };"), "3:36: Name is no reference"},
           TRow{kDisks + std::string("instance of X_Disk as $A { Id = 1; }; instance of X_Disk as $a { Id = 2; };"),
                "3:61: $a is the alias of another instance"},
           TRow{kDisks + std::string("instance of X_Disk { Mirror = \"X_Disc.Id=1\"; };"),
                "3:31: expected the path of an object whose class is declared, such as \"X_Disk.Id=5\""},
       }) {
    SCOPED_TRACE(row.text);
    EXPECT_EQ(ErrorOf(row.text), row.error);
  }
}

// As the library itself prints paths.
TEST(MofReaderTest, KeysOfAnyTypeMayStandInQuotes) {
  auto const ns = Read(
      "class X_K { [Key] boolean B; [Key] sint8 N; [Key] real64 R; [Key] char16 C; X_K REF Next; };"
      "instance of X_K { B = true; Next = \"X_K.B=\\\"false\\\",C=\\\"65\\\",N=\\\"-5\\\",R=\\\"0.5\\\"\"; };");
  auto const instance = All(*ns->GetClass("X_K", kNone), &ICIMClass::EnumerateInstances).front();
  EXPECT_EQ(instance->GetProperty("Next", kNone)->GetValue(kNone).ToString(), "X_K.B=\"false\",C=\"65\",N=\"-5\",R=\"0.5\"");
}

TEST(MofReaderTest, MalformedPathsAreRefused) {
  for (char const* path : {"",
                           ".",
                           "X_Disk.",
                           "X_Disk.Id",
                           "X_Disk.Id=",
                           "X_Disk.Id=x",
                           "X_Disk.Id=1,",
                           "X_Disk.Id=1;Id=2",
                           "X_Disk.Id=\\\"1",
                           "X_Disk.Id=1 2",
                           "X_Disk.Size=1",
                           "X_Disk.Id==1",
                           "X_Disk.Id={1}",
                           "X_Disk.Id=NULL",
                           "X_Disk.Id=256x",
                           "X_Disk.Id=\\\"\\\"",
                           "X_Disk.Id=\\\"x\\\"",
                           "X_Disk.Id=-1",
                           "=",
                           ":",
                           "X_Disk:"})
    EXPECT_THAT(ErrorOf(std::string(kDisks) + "instance of X_Disk { Mirror = \"" + path + "\"; };"),
                HasSubstr("expected the path of an object"))
        << path;
}

TEST(MofReaderTest, KeysThatNeedThemselvesAreRefused) {
  constexpr char kNodes[] = "class X_N { [Key] X_N REF Next; };\n";
  EXPECT_EQ(ErrorOf(std::string(kNodes) + "instance of X_N as $A { Next = $A; };"), "3:32: $A is needed to tell its own keys");
  EXPECT_EQ(ErrorOf(std::string(kNodes) + "instance of X_N as $A { Next = $B; };\ninstance of X_N as $B { Next = $A; };"),
            "4:32: $A is needed to tell its own keys");

  std::string chain = kNodes;
  for (int at = 0; at < 30; ++at)
    chain += "instance of X_N as $N" + std::to_string(at) + " { Next = $N" + std::to_string(at + 1) + "; };\n";
  EXPECT_THAT(ErrorOf(chain + "instance of X_N as $N30 { };"),
              HasSubstr("keys lead from one instance to another more than 8 deep"));
}

TEST(MofReaderTest, AnErrorCarriesTheStatusOfTheRefusal) {
  EXPECT_EQ(StatusOfText("class X_A {"), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOfText("class X_A { }; class X_A { };"), kZEPStatusAlreadyExists);
  EXPECT_EQ(StatusOfText("class X_B : X_C { };"), kZEPStatusNotFound);
}

TEST(MofReaderTest, ATextThatIsWrongInFormChangesNothing) {
  auto const ns = NewNamespace();
  EXPECT_EQ(StatusOfText("class X_A { }; class X_B {", ns), kZEPStatusInvalidFormat);
  EXPECT_THAT(ClassNames(*ns), IsEmpty());
}

TEST(MofReaderTest, ASecondTextGoesOnFromTheFirst) {
  auto const ns = Read("class X_A { };");
  ReadMofText("class X_B : X_A { [Key] string P; };", "b", ns);
  EXPECT_THAT(SubClassNames(*ns->GetClass("X_A", kNone)), ElementsAre("X_B"));
}

// ---- Files ----

class MofFileTest : public testing::Test {
protected:
  MofFileTest() {
    fs::create_directories(fDir.Path("schema/core"));
    fs::create_directories(fDir.Path("outside"));
    WriteFile(fDir.Path("outside/out.mof"), "class X_Out { };");
  }

  void Write(std::string const& name, std::string const& text) { WriteFile(fDir.Path("schema/" + name), text); }

  // What reading schema/all.mof comes to: the classes, or the error without the folder.
  std::string Result() {
    auto const ns = NewNamespace();
    try {
      ReadMofFile(fDir.Path("schema/all.mof"), ns);
    } catch (TMofError const& error) {
      std::string what = error.what();
      EXPECT_THAT(what, StartsWith(fDir.Path("schema/")));
      return what.substr(fDir.Path("schema/").size());
    }
    std::string names;
    for (std::string const& name : ClassNames(*ns)) names += name + " ";
    return names;
  }

  TTempDir fDir;
};

TEST_F(MofFileTest, IncludesAreReadWhereTheyStandFromTheFolderOfTheirFile) {
  Write("all.mof", "class X_1 { };\n#pragma include (\"core/two.mof\")\nclass X_4 { };");
  Write("core/two.mof", "class X_2 { };\n#pragma include (\"three.mof\")");
  Write("core/three.mof", "class X_3 { }; #pragma include (\"../five.mof\")");
  Write("five.mof", "class X_5 { };");
  EXPECT_EQ(Result(), "X_1 X_2 X_3 X_5 X_4 ");
}

TEST_F(MofFileTest, AnErrorNamesTheIncludedFile) {
  Write("all.mof", "#pragma include (\"core/two.mof\")");
  Write("core/two.mof", "\n  class X_2 { }");
  EXPECT_EQ(Result(), "core/two.mof:2:16: expected \";\", found the end of the file");
}

TEST_F(MofFileTest, IncludesStayWithinTheFolderOfTheFirstFile) {
  fs::create_symlink(fDir.Path("outside/out.mof"), fDir.Path("schema/link.mof"));
  fs::create_directory_symlink(fDir.Path("outside"), fDir.Path("schema/elsewhere"));
  Write("core/up.mof", "#pragma include (\"../../outside/out.mof\")");
  constexpr char kRefusal[] = "the included file lies outside the folder of the first one";
  for (std::string const& name : {std::string("../outside/out.mof"), std::string("core/../../outside/out.mof"),
                                  std::string("link.mof"), std::string("elsewhere/out.mof"), fDir.Path("outside/out.mof")}) {
    SCOPED_TRACE(name);
    Write("all.mof", "#pragma include (\"" + name + "\")");
    EXPECT_EQ(Result(), std::string("all.mof:1:18: ") + kRefusal);
  }
  Write("all.mof", "#pragma include (\"core/up.mof\")");
  EXPECT_EQ(Result(), std::string("core/up.mof:1:18: ") + kRefusal);

  fs::create_directories(fDir.Path("schema2"));
  WriteFile(fDir.Path("schema2/a.mof"), "class X_A { };");  // a folder whose name only begins alike
  Write("all.mof", "#pragma include (\"../schema2/a.mof\")");
  EXPECT_EQ(Result(), std::string("all.mof:1:18: ") + kRefusal);

  fs::create_symlink("five.mof", fDir.Path("schema/inside.mof"));
  Write("five.mof", "class X_5 { };");
  Write("all.mof", "#pragma include (\"inside.mof\")");
  EXPECT_EQ(Result(), "X_5 ");
}

TEST_F(MofFileTest, IncludesThatLeadInACircleAreRefused) {
  Write("all.mof", "#pragma include (\"all.mof\")");
  EXPECT_EQ(Result(), "all.mof:1:18: the file includes itself");
  Write("all.mof", "#pragma include (\"core/../b.mof\")");
  Write("b.mof", "#pragma include (\"core/../all.mof\")");
  EXPECT_EQ(Result(), "core/../b.mof:1:18: the file includes itself");
}

TEST_F(MofFileTest, IncludesHaveALimitOfDepth) {
  Write("all.mof", "#pragma include (\"0.mof\")");
  for (int at = 0; at < 110; ++at) Write(std::to_string(at) + ".mof", "#pragma include (\"" + std::to_string(at + 1) + ".mof\")");
  EXPECT_EQ(Result(), "98.mof:1:18: files include one another more than 100 deep");
}

TEST_F(MofFileTest, WhatCannotBeReadIsToldWithItsReason) {
  EXPECT_EQ(Result(), "all.mof: cannot be read: No such file or directory");
  Write("all.mof", "#pragma include (\"none.mof\")");
  EXPECT_EQ(Result(), "all.mof:1:18: the included file cannot be read: No such file or directory");
  Write("all.mof", "#pragma include (\"core\")");
  EXPECT_EQ(Result(), "all.mof:1:18: the included file cannot be read: Is a directory");
  EXPECT_EQ(StatusOf([&] { ReadMofFile(fDir.Path("nothing"), NewNamespace()); }), kZEPStatusFileNotFound);
  EXPECT_EQ(StatusOf([&] { ReadMofFile(fDir.Path("schema"), NewNamespace()); }), kZEPStatusFileSystemError);
}

TEST_F(MofFileTest, AReadErrorInTheMiddleOfAFileIsItsOwnFailureAndNothingIsUsed) {
  std::string const text = "class X_1 { };\nclass X_2 { };\n";
  Write("all.mof", text);
  for (std::size_t const readable : {std::size_t(0), text.find('\n') + 1, text.size()}) {  // each a text of its own right
    SCOPED_TRACE(readable);
    TReadFault const fault(readable, EIO);
    auto const ns = NewNamespace();
    EXPECT_EQ(StatusOf([&] { ReadMofFile(fDir.Path("schema/all.mof"), ns); }), kZEPStatusFileSystemError);
    EXPECT_THAT(ClassNames(*ns), IsEmpty());
    EXPECT_EQ(Result(), "all.mof: cannot be read: Input/output error");
  }
  EXPECT_EQ(Result(), "X_1 X_2 ");
}

TEST_F(MofFileTest, AReadErrorInAnIncludedFileNamesTheDirective) {
  Write("all.mof", "#pragma include (\"a.mof\")\n");
  Write("a.mof", std::string(100, ' ') + "class X_1 { };");
  TReadFault const fault(60, EIO);
  EXPECT_EQ(Result(), "all.mof:1:18: the included file cannot be read: Input/output error");
}

// The memory of a process is a file without size, whose first bytes cannot be read.
TEST_F(MofFileTest, AFileThatTellsNoSizeIsReadAllTheSame) {
  EXPECT_EQ(StatusOf([] { ReadMofFile("/proc/self/mem", NewNamespace()); }), kZEPStatusFileSystemError);
  EXPECT_EQ(StatusOf([] { ReadMofFile("/proc/self/status", NewNamespace()); }), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOf([] { ReadMofFile("/proc/sys/kernel/ostype", NewNamespace()); }), kZEPStatusInvalidFormat);
}

TEST_F(MofFileTest, AnEmptyFileDeclaresNothing) {
  Write("all.mof", "");
  EXPECT_EQ(Result(), "");
}

}  // namespace
}  // namespace NQRVZEP20
