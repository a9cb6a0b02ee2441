// SPDX-License-Identifier: Apache-2.0
#pragma once

// MOF texts that tests read, and their errors.

#include "ICIMQualifierDecl.h"
#include "Mof.h"
#include "TMofError.h"
#include "tests/providers/memory/Collect.h"

namespace NQRVZEP20 {

// Most texts begin with these declarations, on one line.
constexpr char kQualifiers[] =
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);"
    "Qualifier Association : boolean = false, Scope(association);"
    "Qualifier Abstract : boolean = false, Scope(class), Flavor(Restricted);"
    "Qualifier Static : boolean = false, Scope(property, method);"
    "Qualifier Description : string = null, Scope(any), Flavor(Translatable);"
    "Qualifier Values : string[], Scope(property);"
    "Qualifier Max : uint32 = 7, Scope(reference);\n";

constexpr char kDisks[] =
    "class X_Disk { [Key] uint32 Id; string Name = \"unnamed\"; uint16 Sizes[4]; X_Disk REF Mirror; };"
    "[Association] class X_Link { [Key] X_Disk REF From; [Key] X_Disk REF To; };"
    "[Abstract] class X_Thing { };\n";

inline boost::shared_ptr<TMemoryNamespace> Read(std::string const& text) {
  auto const ns = NewNamespace();
  ReadMofText(kQualifiers + text, "test.mof", ns);
  return ns;
}

// The namespace that a written text describes.
inline boost::shared_ptr<TMemoryNamespace> ReadBack(std::string const& text) {
  auto const ns = NewNamespace();
  ReadMofText(text, "written.mof", ns);
  return ns;
}

// The error of the text, without the name of the file: "2:1: expected ...". The text begins on line 2.
inline std::string ErrorOf(std::string const& text) {
  try {
    Read(text);
  } catch (TMofError const& error) {
    std::string const message = error.what();
    EXPECT_THAT(message, testing::StartsWith("test.mof:"));
    return message.substr(9);
  }
  return "no error";
}

struct TErrorRow {
  std::string fText, fError;
};

inline void ExpectErrors(std::vector<TErrorRow> const& rows) {
  for (TErrorRow const& row : rows) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(ErrorOf(row.fText), row.fError);
  }
}

// The status of the TMofError that the statement throws.
template <class TStatement>
EZEPStatusCode StatusOf(TStatement const& statement) {
  try {
    statement();
  } catch (TMofError const& error) {
    return error.GetStatusCode().GetCode();
  }
  return kZEPStatusOK;
}

inline EZEPStatusCode StatusOfText(std::string const& text, boost::shared_ptr<TMemoryNamespace> ns = NewNamespace()) {
  return StatusOf([&] { ReadMofText(text, "a", ns); });
}

inline boost::shared_ptr<ICIMPropertyDecl const> Property(ICIMNamespace const& ns, std::string const& cls,
                                                          std::string const& name) {
  return ns.GetClass(cls, kNone)->GetPropertyDecl(name, kNone);
}

// The default of the property P that the text declares.
inline TCIMValue DefaultOf(std::string const& declaration) {
  return Property(*Read("class X_A { " + declaration + " };"), "X_A", "P")->GetDefaultValue(kNone);
}

}  // namespace NQRVZEP20
