// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/NewPlugIn.h"

#include "CIMNames.h"
#include "collect/ClassTree.h"
#include "collect/MofFile.h"
#include "collect/PlugInFiles.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/plugin/NearNames.h"
#include "tools/zep/plugin/SchemaPart.h"
#include "tools/zep/plugin/ValueLines.h"
#include "tools/zep/processes/SharePath.h"

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <map>
#include <set>
#include <sstream>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

constexpr std::size_t kLongestName = 64;

// ---- The name ----

bool HasForm(std::string const& name) {
  auto const isLetter = [](unsigned char c) { return c < 0x80 && std::isalpha(c) != 0; };
  auto const isAllowed = [&](unsigned char c) { return isLetter(c) || (c >= '0' && c <= '9') || c == '_'; };
  return !name.empty() && name.size() <= kLongestName && isLetter(static_cast<unsigned char>(name.front())) &&
         std::all_of(name.begin(), name.end(), isAllowed);
}

// CMake has targets of its own of these names, and of one for the test.
bool IsOfCMake(std::string const& name) {
  static std::set<std::string> const names = {
      "all",     "clean",          "edit_cache", "help",          "install", "list_install_components",
      "package", "package_source", "preinstall", "rebuild_cache", "test"};
  return names.count(FoldName(name)) > 0;
}

void CheckName(std::string const& name) {
  if (!HasForm(name))
    throw TWrongUsage("the name of a plug-in consists of at most 64 letters, digits and underscores, and begins with a letter");
  if (IsOfCMake(name)) throw TWrongUsage("\"" + name + "\" is a target of CMake; choose another name");
  for (TPlugInFile const& other : FindPlugIns())
    if (other.fName == name)
      throw TWrongUsage("the plug-in " + other.fFile +
                        " exists already, and a host uses only one of a name; choose another name");
  if (fs::symlink_status(name).type() != fs::file_type::not_found)
    throw std::runtime_error(name + " exists already; remove it, or choose another name");
}

// ---- The class ----

std::vector<std::string> NamesOf(std::vector<TClassEntry> const& entries) {
  std::vector<std::string> names;
  for (TClassEntry const& entry : entries) names.push_back(entry.fName);
  return names;
}

[[noreturn]] void ThrowUnknown(std::string const& className, std::string const& mofFile,
                               std::vector<TClassEntry> const& entries) {
  std::vector<std::string> const near = NearNames(className, NamesOf(entries));
  throw std::runtime_error(
      "there is no class " + className + " in " + mofFile +
      (near.empty() ? "; zep classes --mof lists the classes of a schema" : "; similar names: " + Joined(near, ", ")));
}

// Classes at any depth below, not abstract.
std::vector<std::string> ConcreteClassesBelow(ICIMClass const& cls) {
  std::vector<std::string> names;
  cls.EnumerateSubClasses(
      [&](boost::shared_ptr<ICIMClass> below) {
        if (!below->IsAbstract(TCIMContext())) names.push_back(below->GetName(TCIMContext()));
        return names.size() < 5;
      },
      TCIMContext());
  return names;
}

void CheckClass(ICIMClass const& cls) {
  std::string const name = cls.GetName(TCIMContext());
  if (cls.GetClassFlag(TCIMContext()))
    throw std::runtime_error(
        name +
        " is an association, whose objects refer to objects of other classes; make a plug-in for one of these "
        "classes, and add the association to it");
  if (!cls.IsAbstract(TCIMContext())) return;
  std::vector<std::string> const below = ConcreteClassesBelow(cls);
  throw std::runtime_error(name + " is abstract and has no objects of its own; " +
                           (below.empty() ? "declare a class below it in a MOF file, which --mof names"
                                          : "choose a class below it, such as " + Joined(below, ", ")));
}

boost::shared_ptr<ICIMClass> ClassOf(TNamespaceView const& schema, std::string const& className, std::string const& mofFile) {
  std::vector<TClassEntry> const entries = ClassesOf(*schema.Get());
  auto const found =
      std::find_if(entries.begin(), entries.end(), [&](TClassEntry const& entry) { return IsSameName(entry.fName, className); });
  if (found == entries.end()) ThrowUnknown(className, mofFile, entries);
  CheckClass(*found->fClass);
  return found->fClass;
}

// ---- The files ----

using TPlaces = std::map<std::string, std::string>;  // the texts for "@NAME@" and others

std::string ReadTemplate(std::string const& name) {
  fs::path const file = SharePath("plugin-template") / name;
  std::ifstream stream(file, std::ios::binary);
  std::ostringstream text;
  if (!(text << stream.rdbuf())) throw std::runtime_error("the template " + file.string() + " cannot be read; install zep anew");
  return text.str();
}

// Texts that were inserted are not searched.
std::string Filled(std::string const& form, TPlaces const& places) {
  std::string text;
  std::size_t at = 0;
  while (at < form.size()) {
    std::size_t const begin = form.find('@', at), end = form.find('@', begin == form.npos ? begin : begin + 1);
    if (end == form.npos) break;
    auto const place = places.find(form.substr(begin + 1, end - begin - 1));
    text += form.substr(at, begin - at) + (place == places.end() ? "@" : place->second);
    at = place == places.end() ? begin + 1 : end + 1;
  }
  return text + form.substr(at);
}

void WriteNew(fs::path const& file, std::string const& text) {
  errno = 0;
  std::ofstream stream(file, std::ios::binary);
  stream << text;
  stream.close();
  if (!stream) throw std::runtime_error(file.string() + " cannot be written: " + std::strerror(errno));
}

void WriteAll(fs::path const& directory, std::map<std::string, std::string> const& files) {
  std::error_code why;
  if (!fs::create_directory(directory, why))
    throw std::runtime_error(directory.string() + " cannot be created" +
                             (why ? ": " + why.message() : ", because it exists already"));
  try {
    for (auto const& [name, text] : files) WriteNew(directory / name, text);
  } catch (std::exception const&) {
    fs::remove_all(directory, why);
    throw;
  }
}

// The beginning of the MOF file. The notice of the DMTF permits copies that name their origin.
std::string OriginOf(std::string const& className, std::string const& schema) {
  std::string const text = "// The class " + className + " and all that it needs, without methods, from " + schema + ".\n";
  bool const isOfTheDmtf = schema.rfind("cim_schema_", 0) == 0;
  return text +
         (isOfTheDmtf
              ? "// CIM Schema, Copyright (c) DMTF. All rights reserved. Reproduced with attribution as DMTF's notice permits.\n"
              : "") +
         "\n";
}

std::map<std::string, std::string> FilesOf(std::string const& name, TPlaces const& places, std::string const& mof) {
  return {{"CMakeLists.txt", Filled(ReadTemplate("CMakeLists.txt.in"), places)},
          {"README.md", Filled(ReadTemplate("README.md.in"), places)},
          {name + ".cpp", Filled(ReadTemplate("Provider.cpp.in"), places)},
          {name + ".mof", mof},
          {name + "Test.cpp", Filled(ReadTemplate("ProviderTest.cpp.in"), places)}};
}

}  // namespace

TNewPlugIn MakePlugIn(std::string const& name, std::string const& className, std::string const& mofFile) {
  CheckName(name);
  TNamespaceView const schema = ViewOfMof(mofFile);
  auto const cls = ClassOf(schema, className, mofFile);
  TNewPlugIn made{name, cls->GetName(TCIMContext()), "root/" + FoldName(name), {}};

  std::string const origin = Printable(fs::path(mofFile).filename().string());
  TPlaces const places = {
      {"NAME", name}, {"CLASS", made.fClass}, {"NAMESPACE", made.fNamespace}, {"SCHEMA", origin}, {"VALUES", ValueLinesOf(*cls)}};
  auto const files = FilesOf(name, places, OriginOf(made.fClass, origin) + SchemaPartOf(cls));
  WriteAll(name, files);
  for (auto const& file : files) made.fFiles.push_back(file.first);
  return made;
}

}  // namespace NQRVZEP20::zep
