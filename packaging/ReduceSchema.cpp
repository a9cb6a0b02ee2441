// SPDX-License-Identifier: Apache-2.0

// Writes the reduced form of a schema that the package of the kit carries: what `zep plugin new` and `zep plugin check` need. The
// classes and properties are complete; of the qualifiers, those that describe values and instances remain, and of a description
// the first sentence. Methods are left out. The file begins with the notice at the beginning of the schema, word by word.
//
//   ReduceSchema SCHEMA.mof REDUCED.mof

#include "CIMNames.h"
#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "ICIMQualifierDecl.h"
#include "Mof.h"
#include "TCIMCopy.h"
#include "TMemoryNamespace.h"

#include <boost/make_shared.hpp>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <vector>

using namespace NQRVZEP20;

namespace {

TCIMContext const kNone;

constexpr char const* kKept[] = {"Abstract", "Aggregation", "ArrayType", "Association", "Description", "Indication",
                                 "Key",      "MaxLen",      "Override",  "PUnit",       "Required",    "Terminal",
                                 "Units",    "ValueMap",    "Values",    "Weak"};

bool IsKept(std::string const& qualifier) {
  return std::any_of(std::begin(kKept), std::end(kKept), [&](char const* kept) { return IsSameName(kept, qualifier); });
}

std::string FirstSentenceOf(std::string const& text) {
  std::string const line = text.substr(0, text.find_first_of("\r\n"));
  std::size_t const stop = line.find(". ");
  return stop == line.npos ? line : line.substr(0, stop + 1);
}

void CopyQualifiers(ICIMNamedElement const& from, boost::shared_ptr<ICIMNamespace> const& copy, ICIMNamedElement& to) {
  from.EnumerateQualifiers(
      [&](boost::shared_ptr<ICIMQualifier> const& qualifier) {
        std::string const name = qualifier->GetName(kNone);
        TCIMValue value = qualifier->GetValue(kNone);
        if (IsSameName(name, "Description") && !value.IsNull()) value = TCIMValue(FirstSentenceOf(value));
        if (IsKept(name)) to.AddQualifier(copy->GetQualifierDecl(name, kNone), value, qualifier->GetFlavor(kNone), kNone);
        return true;
      },
      kNone);
}

void CopyProperties(ICIMClass const& from, boost::shared_ptr<ICIMNamespace> const& copy) {
  auto const to = copy->GetClass(from.GetName(kNone), kNone);
  to->BeginDeclarations(kNone);
  from.EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> const& property) {
        TCIMValue const initial = TCIMCopy::CopyValue(property->GetDefaultValue(kNone), copy);
        CopyQualifiers(*property, copy, *to->AddPropertyDecl(property->GetName(kNone), initial, kNone));
        return true;
      },
      kNone);
  to->EndDeclarations(kNone);
}

// Superclasses first.
std::vector<boost::shared_ptr<ICIMClass>> ClassesOf(ICIMNamespace const& schema) {
  std::vector<boost::shared_ptr<ICIMClass>> classes;
  auto const add = [&](boost::shared_ptr<ICIMClass> const& cls) { return classes.push_back(cls), true; };
  schema.EnumerateClasses(
      [&](boost::shared_ptr<ICIMClass> const& root) { return add(root), root->EnumerateSubClasses(add, kNone), true; }, kNone);
  return classes;
}

// A property may refer to a class that comes later.
boost::shared_ptr<ICIMNamespace> Reduced(ICIMNamespace const& schema) {
  auto const copy = boost::make_shared<TMemoryNamespace>("mof");
  TCopyQualifierDecls copyDecl(copy);
  schema.EnumerateQualifierDecls(
      [&](boost::shared_ptr<ICIMQualifierDecl> decl) { return !IsKept(decl->GetName(kNone)) || copyDecl(decl); }, kNone);
  auto const classes = ClassesOf(schema);
  for (auto const& cls : classes) {
    auto const super = cls->GetSuperClass(kNone);
    auto const above = super ? copy->GetClass(super->GetName(kNone), kNone) : super;
    CopyQualifiers(*cls, copy, *copy->CreateClass(above, cls->GetName(kNone), kNone));
  }
  for (auto const& cls : classes) CopyProperties(*cls, copy);
  return copy;
}

// The comment at the beginning of the file.
std::string NoticeOf(std::string const& file) {
  std::ifstream stream(file);
  std::string notice;
  for (std::string line; std::getline(stream, line) && line.rfind("//", 0) == 0;)
    notice += line.substr(0, line.find_last_not_of("\r ") + 1) + "\n";
  return notice;
}

void Reduce(std::filesystem::path const& schema, std::string const& reduced) {
  auto const ns = boost::make_shared<TMemoryNamespace>("mof");
  ReadMofFile(schema.string(), ns);
  std::ofstream stream(reduced);
  stream
      << NoticeOf(schema.string()) << "//\n// This is a part of " << schema.filename().string()
      << ", made by zepcore: without methods and most qualifiers, and with the first\n"
         "// sentence of each description. CIM Schema, Copyright (c) DMTF. All rights reserved. Reproduced with attribution as\n"
         "// DMTF's notice permits.\n\n"
      << WriteMof(*Reduced(*ns));
  stream.close();
  if (!stream) throw std::runtime_error(reduced + " cannot be written");
}

}  // namespace

int main(int argc, char** argv) {
  try {
    if (argc != 3) throw std::runtime_error("usage: ReduceSchema SCHEMA.mof REDUCED.mof");
    Reduce(argv[1], argv[2]);
    return 0;
  } catch (std::exception const& failure) {
    std::cerr << failure.what() << "\n";
    return 1;
  }
}
