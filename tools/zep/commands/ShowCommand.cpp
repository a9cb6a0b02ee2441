// SPDX-License-Identifier: Apache-2.0

// zep show: one object or class, by its path.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TCIMReference.h"
#include "TZEPException.h"
#include "collect/MofFile.h"
#include "collect/PlugIns.h"
#include "collect/TValueWords.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/InstanceJson.h"
#include "tools/zep/output/InstanceText.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <map>
#include <memory>
#include <set>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

struct TShowArguments {
  std::string fPath;
  bool fAsJson = false;
  bool fSample = false;
  std::string fMofFile;
  TPlugInArguments fPlugIns;
};

// The namespace that a path names before its class; empty when it names none.
std::string NamespaceOf(std::string const& path) {
  std::size_t const end = path.find_first_of(":\"");
  return end != std::string::npos && path[end] == ':' ? path.substr(0, end) : "";
}

// The instance whose path zep prints like this, in a document or else on a terminal. Not every printed path can be parsed: a key
// that is a reference is printed raw, bytes that are not UTF-8 are escaped, and an instance without keys has a number.
boost::shared_ptr<ICIMElement> FindPrinted(TNamespaceView const& view, std::string const& full) {
  std::string const path = full.substr(view.GetName().size() + 1);
  std::size_t const endOfClass = path.find_first_of(".#");
  if (endOfClass == path.npos) return {};
  auto const instances = view.InstancesOf(path.substr(0, endOfClass));
  for (auto const& instance : instances)
    if (view.PathOf(*instance) == full) return instance;
  for (auto const& instance : instances)
    if (Printable(view.PathOf(*instance)) == full) return instance;
  return {};
}

boost::shared_ptr<ICIMElement> FindRead(TNamespaceView const& view, std::string const& full) {
  try {
    return TCIMReference(view.Get(), full, TCIMContext()).GetCIMElement(false);
  } catch (TZEPException const& failure) {
    EZEPStatusCode const status = failure.GetStatusCode().GetCode();
    if (status != kZEPStatusInvalidReference && status != kZEPStatusNotFound) throw;
    return {};
  }
}

// The instance or class that the path names in that namespace; empty when there is none.
boost::shared_ptr<ICIMElement> Find(TNamespaceView const& view, std::string const& path) {
  std::string const named = NamespaceOf(path);
  if (!named.empty() && named != view.GetName()) return {};
  std::string const full = named.empty() ? view.GetName() + ":" + path : path;
  auto const element = FindRead(view, full);
  auto const instance = boost::dynamic_pointer_cast<ICIMInstance const>(element);
  bool const isExact = element && (!instance || view.PathOf(*instance) == full);
  auto const printed = isExact ? nullptr : FindPrinted(view, full);
  return printed ? printed : element;
}

// The class and those above it, the topmost first.
std::vector<boost::shared_ptr<ICIMClass const>> LineageOf(boost::shared_ptr<ICIMClass const> cls) {
  std::vector<boost::shared_ptr<ICIMClass const>> lineage;
  for (; cls; cls = cls->GetSuperClass(TCIMContext())) lineage.insert(lineage.begin(), cls);
  return lineage;
}

// Calls back with every property that instances of the class have. One that a class declares again is taken where it is
// declared last.
template <class TCallback>
void ForEachProperty(ICIMClass const& cls, std::vector<boost::shared_ptr<ICIMClass const>> const& lineage, TCallback callback) {
  std::set<std::string> seen;
  for (auto const& ancestor : lineage)
    ancestor->EnumeratePropertyDecls(
        [&](boost::shared_ptr<ICIMPropertyDecl> property) {
          std::string const name = property->GetName(TCIMContext());
          if (seen.insert(name).second) callback(*cls.GetPropertyDecl(name, TCIMContext()));
          return true;
        },
        TCIMContext());
}

// The class's own description, in lines, and an empty line; nothing when there is none.
std::string DescriptionOf(ICIMClass const& cls) {
  auto const qualifier = cls.GetQualifier("Description", TCIMContext());
  TCIMValue const value = qualifier ? qualifier->GetValue(TCIMContext()) : TCIMValue();
  if (value.IsNull()) return "";
  std::string description = value.ToString();
  for (char& c : description)
    if (c == '\t' || c == '\r') c = ' ';
  std::istringstream paragraphs(description);
  std::string text;
  for (std::string paragraph; std::getline(paragraphs, paragraph);)
    for (std::string const& line : Wrapped(Printable(paragraph), OutputWidth())) text += line + "\n";
  return text + "\n";
}

// The words for the values of the enumerated properties.
std::string ValuesAsText(ICIMClass const& cls, std::vector<boost::shared_ptr<ICIMClass const>> const& lineage) {
  TTable table({24, 54});
  ForEachProperty(cls, lineage, [&](ICIMPropertyDecl const& property) {
    TValueWords const words(property);
    std::string values;
    for (auto const& [entry, word] : words.Entries()) values += (values.empty() ? "" : ", ") + entry + " (" + word + ")";
    if (!values.empty()) table.Add({property.GetName(TCIMContext()), values});
  });
  return table.IsEmpty() ? "" : "\nValues\n" + table.GetText();
}

std::string SignatureOf(ICIMMethodDecl const& method) {
  std::string parameters;
  method.EnumerateParameterDecls(
      [&](boost::shared_ptr<ICIMParameterDecl> parameter) {
        std::string const className = parameter->GetReferencedClassName(TCIMContext());
        std::string const type = NameOf(parameter->GetType(TCIMContext())) + (className.empty() ? "" : " to " + className);
        parameters += (parameters.empty() ? "" : ", ") + type + " " + parameter->GetName(TCIMContext());
        return true;
      },
      TCIMContext());
  return NameOf(method.GetReturnType(TCIMContext())) + " " + method.GetName(TCIMContext()) + "(" + parameters + ")";
}

// Every method, including inherited ones; of a method that is declared again, the lowest declaration.
std::vector<boost::shared_ptr<ICIMMethodDecl>> MethodsOf(std::vector<boost::shared_ptr<ICIMClass const>> const& lineage) {
  std::vector<boost::shared_ptr<ICIMMethodDecl>> methods;
  std::map<std::string, std::size_t> numbers;  // in methods, by name
  for (auto const& ancestor : lineage)
    ancestor->EnumerateMethodDecls(
        [&](boost::shared_ptr<ICIMMethodDecl> method) {
          auto const [place, isNew] = numbers.emplace(method->GetName(TCIMContext()), methods.size());
          if (isNew) methods.emplace_back();
          methods[place->second] = method;
          return true;
        },
        TCIMContext());
  return methods;
}

std::string MethodsAsText(std::vector<boost::shared_ptr<ICIMClass const>> const& lineage) {
  std::string text;
  for (auto const& method : MethodsOf(lineage))
    for (std::string const& line : Wrapped(Printable(SignatureOf(*method)), OutputWidth())) text += line + "\n";
  return text.empty() ? "" : "\nMethods\n" + text;
}

std::string ClassAsText(TNamespaceView const& view, boost::shared_ptr<ICIMClass const> cls) {
  auto const lineage = LineageOf(cls);
  std::string const name = cls->GetName(TCIMContext());
  std::string heading = view.GetName() + ":" + name;
  for (std::size_t at = lineage.size() - 1; at-- > 0;) heading += " : " + lineage[at]->GetName(TCIMContext());

  TTable table({24, 10, 5, 35});
  table.Add({"Property", "Type", "Key", "Default"});
  ForEachProperty(*cls, lineage, [&](ICIMPropertyDecl const& property) {
    table.Add({property.GetName(TCIMContext()), NameOf(property.GetType(TCIMContext())),
               property.IsKey(TCIMContext()) ? "key" : "",
               TValueWords(property).TextOf(property.GetDefaultValue(TCIMContext()))});
  });

  std::string text = Heading(view, heading) + DescriptionOf(*cls) + table.GetText() + ValuesAsText(*cls, lineage) +
                     MethodsAsText(lineage) + "\nInstances\n";
  auto const instances = view.InstancesOf(name);
  for (auto const& instance : instances) text += Printable(view.PathOf(*instance)) + "\n";
  if (instances.empty()) text += Printable("none: " + view.WhyNoInstance(name).fReason) + "\n";
  return text;
}

TJson ValuesAsJson(TValueWords const& words) {
  TJson values = TJson::array();
  for (auto const& [entry, word] : words.Entries()) values.push_back({{"value", entry}, {"word", word}});
  return values;
}

TJson ClassAsJson(TNamespaceView const& view, boost::shared_ptr<ICIMClass const> cls) {
  auto const lineage = LineageOf(cls);
  TJson properties = TJson::object();
  ForEachProperty(*cls, lineage, [&](ICIMPropertyDecl const& property) {
    TJson& json = properties[property.GetName(TCIMContext())];
    json = {{"type", NameOf(property.GetType(TCIMContext()))},
            {"key", property.IsKey(TCIMContext())},
            {"default", ValueAsJson(property.GetDefaultValue(TCIMContext()))}};
    TValueWords const words(property);
    if (!words.Entries().empty()) json["values"] = ValuesAsJson(words);
  });
  TJson methods = TJson::array();
  for (auto const& method : MethodsOf(lineage)) methods.push_back(SignatureOf(*method));
  std::string const name = cls->GetName(TCIMContext());
  TJson instances = TJson::array();
  for (auto const& instance : view.InstancesOf(name)) instances.push_back(view.PathOf(*instance));
  auto const superClass = cls->GetSuperClass(TCIMContext());
  return {{"class", name},
          {"namespace", view.GetName()},
          {"provider", view.GetProviderName()},
          {"superClass", superClass ? TJson(superClass->GetName(TCIMContext())) : TJson(nullptr)},
          {"properties", properties},
          {"methods", methods},
          {"instances", instances}};
}

// A path names an instance or a class.
template <class TOfInstance, class TOfClass>
auto ForElement(boost::shared_ptr<ICIMElement> const& element, TOfInstance ofInstance, TOfClass ofClass) {
  auto const instance = boost::dynamic_pointer_cast<ICIMInstance const>(element);
  return instance ? ofInstance(*instance) : ofClass(boost::dynamic_pointer_cast<ICIMClass const>(element));
}

std::string ElementAsText(TNamespaceView const& view, boost::shared_ptr<ICIMElement> const& element) {
  return ForElement(
      element, [&](ICIMInstance const& instance) { return InstanceAsText(view, instance); },
      [&](boost::shared_ptr<ICIMClass const> cls) { return ClassAsText(view, cls); });
}

TJson ElementAsJson(TNamespaceView const& view, boost::shared_ptr<ICIMElement> const& element) {
  return ForElement(
      element, [&](ICIMInstance const& instance) { return TInstanceJson(view).Of(instance); },
      [&](boost::shared_ptr<ICIMClass const> cls) { return ClassAsJson(view, cls); });
}

struct TFoundElement {
  bool fIsFound = false;
  std::string fText;                   // the object as it is printed
  TJson fObject;                       // the same for a document; only with --json
  std::string fSampleLabel;            // empty without a sample
  std::vector<std::string> fFailures;  // of the providers
  TJson fFailedPlugIns;

  EExitStatus ExitStatus() const { return !fIsFound ? kExitNothing : fFailures.empty() ? kExitComplete : kExitPartial; }
};

TFoundElement FindElement(TShowArguments const& arguments) {
  TFoundElement search;
  bool const isMof = !arguments.fMofFile.empty();
  auto const sample = SampleIf(arguments.fSample);
  std::vector<TPlugIn> const plugIns = isMof ? std::vector<TPlugIn>() : LoadPlugInsFor(arguments.fPlugIns, sample);
  search.fSampleLabel = sample ? sample->fLabel : "";
  search.fFailures = FailuresOf(plugIns);
  search.fFailedPlugIns = FailedPlugInsAsJson(plugIns);
  for (TNamespaceView const& view : isMof ? std::vector{ViewOfMof(arguments.fMofFile)} : ViewsOf(plugIns)) {
    std::string const failure = FailureOf([&] {
      auto const element = Find(view, arguments.fPath);
      if (!element) return;
      if (arguments.fAsJson)
        search.fObject = ElementAsJson(view, element);
      else
        search.fText = ElementAsText(view, element);
      search.fIsFound = true;
    });
    if (search.fIsFound) break;
    if (!failure.empty()) search.fFailures.push_back(view.GetProviderName() + ": " + failure);
  }
  return search;
}

std::vector<std::string> ReasonsOf(TFoundElement const& search, TShowArguments const& arguments) {
  std::vector<std::string> reasons = search.fFailures;
  if (!search.fIsFound)
    reasons.push_back((arguments.fMofFile.empty() ? "no provider has the" : arguments.fMofFile + " has no") + " object \"" +
                      arguments.fPath + "\"");
  return reasons;
}

std::string AsJson(TFoundElement const& search, std::string const& reason) {
  TJson document = DocumentHead("zep show", search.ExitStatus(), reason, search.fSampleLabel);
  document["failedPlugIns"] = search.fFailedPlugIns;
  if (search.fIsFound) document["object"] = search.fObject;
  return search.fIsFound ? zep::AsText(document) : AsLine(document);
}

int Show(TShowArguments const& arguments) {
  TFoundElement const search = FindElement(arguments);
  std::vector<std::string> const reasons = ReasonsOf(search, arguments);
  if (arguments.fAsJson)
    WriteOutput(AsJson(search, Joined(reasons, "; ")));
  else if (search.fIsFound)
    WriteOutput(search.fText);
  for (std::string const& reason : reasons) std::cerr << "zep: " << Printable(reason) << "\n";
  return search.ExitStatus();
}

}  // namespace

TRun AddShowArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TShowArguments>();
  command.add_option("path", arguments->fPath, "A class, such as CIM_Chassis, or an object path that zep report --json prints")
      ->required();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  auto* const mof = command.add_option("--mof", arguments->fMofFile, "Search this MOF file instead of the providers");
  command.add_flag("--sample", arguments->fSample, "Show objects of the bundled sample, an invented server, labelled SAMPLE")
      ->excludes(mof);
  AddPlugInOptions(command, arguments->fPlugIns);
  command.get_option("--plugin")->excludes(mof);
  command.footer(
      "Exit status: 0 when there is such an object, 2 when there is but a plug-in failed, 1 when there is none,\n"
      "64 for wrong usage.");
  return [arguments] { return Show(*arguments); };
}

}  // namespace NQRVZEP20::zep
