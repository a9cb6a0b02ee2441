// SPDX-License-Identifier: Apache-2.0
#include "tests/providers/mof/MofTexts.h"

namespace NQRVZEP20 {
namespace {

TEST(TMofParserTest, AnErrorHasThePositionAndTheExpectedText) {
  ExpectErrors({
      {"clas X_A { };", "2:1: expected \"qualifier\", \"class\", \"instance\" or a pragma, found \"clas\""},
      {"class { };", "2:7: expected the name of a class, found \"{\""},
      {"class X_A", "2:10: expected \"{\", found the end of the file"},
      {"class X_A : { };", "2:13: expected the name of the superclass, found \"{\""},
      {"class X_A { }", "2:14: expected \";\", found the end of the file"},
      {"class X_A {\n  strin Name;\n};", "3:9: expected \"REF\" after \"strin\", which is not a type, found \"Name\""},
      {"class X_A {\n  string Name\n};", "4:1: expected \"(\", \"=\" or \";\", found \"}\""},
      {"class X_A { string; };", "2:19: expected a name, found \";\""},
      {"class X_A { string P = ; };", "2:24: expected a value, found \";\""},
      {"class X_A { string P = \"a\" x };", "2:28: expected \";\", found \"x\""},
      {"class X_A { string P[0]; };", "2:22: expected \"]\" or a size of at least 1, found 0"},
      {"class X_A { string P[4; };", "2:23: expected \"]\", found \";\""},
      {"class X_A { uint32 M(string a; };", "2:30: expected \",\" or \")\", found \";\""},
      {"class X_A { uint32 M() };", "2:24: expected \";\", found \"}\""},
      {"class X_A { ; };", "2:13: expected a type, a class and \"REF\", or \"}\", found \";\""},
      {"[Key class X_A { };", "2:6: expected \",\" or \"]\", found \"class\""},
      {"[Key(] class X_A { };", "2:6: expected a value, found \"]\""},
      {"[Key(true] class X_A { };", "2:10: expected \")\", found \"]\""},
      {"[Key : Loud] class X_A { };", "2:8: expected a flavor, such as \"ToSubclass\", found \"Loud\""},
      {"[Key : Restricted Loud] class X_A { };", "2:19: expected a flavor or \",\" or \"]\", found \"Loud\""},
      {"[Key] qualifier Q : string;", "2:7: expected \"class\" or \"instance\", found \"qualifier\""},
      {"Qualifier Q string;", "2:13: expected \":\", found \"string\""},
      {"Qualifier Q : reference, Scope(any);", "2:15: expected a type, found \"reference\""},
      {"Qualifier Q : string;", "2:21: expected \",\", found \";\""},
      {"Qualifier Q : string, Flavor(Restricted);", "2:23: expected \"Scope\", found \"Flavor\""},
      {"Qualifier Q : string, Scope(some);", "2:29: expected a scope, such as \"property\" or \"any\", found \"some\""},
      {"Qualifier Q : string, Scope(any), Scope(any);", "2:35: expected \"Flavor\", found \"Scope\""},
      {"Qualifier Q : string, Scope(any), Flavor(x);", "2:42: expected a flavor, such as \"ToSubclass\", found \"x\""},
      {"instance X_A { };", "2:10: expected \"of\", found \"X_A\""},
      {"instance of X_A as A { };", "2:20: expected an alias, such as \"$Disk\", found \"A\""},
      {"instance of X_A { P; };", "2:20: expected \"=\", found \";\""},
      {"instance of X_A { = 1; };", "2:19: expected the name of a property or \"}\", found \"=\""},
      {"#pragma (\"x\")", "2:9: expected the name of a pragma, found \"(\""},
      {"#pragma include (x)", "2:18: expected a string, found \"x\""},
      {"class X_A { string P[] = {\"a\"; };", "2:30: expected \",\" or \"}\", found \";\""},
  });
}

TEST(TMofParserTest, KeywordsMayAlsoBeNames) {
  auto const ns = Read("class Qualifier { string class; uint8 ref; boolean of; string Scope(string any); };");
  EXPECT_THAT(Names(*ns->GetClass("Qualifier", kNone), &ICIMClass::EnumeratePropertyDecls), ElementsAre("class", "ref", "of"));
}

TEST(TMofParserTest, OtherPragmasAreIgnored) {
  EXPECT_THAT(ClassNames(*Read("#pragma locale (\"en_US\")\n#PRAGMA namespace(\"root\" \"/x\") class X_A { };")),
              ElementsAre("X_A"));
}

}  // namespace
}  // namespace NQRVZEP20
