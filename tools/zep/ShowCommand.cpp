// zep show: one object or class, by its path.

#include "Commands.h"
#include "ExitStatus.h"
#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "Json.h"
#include "Output.h"
#include "PlugIns.h"
#include "Sample.h"
#include "TCIMReference.h"
#include "TZEPException.h"
#include "Text.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>
#include <set>

namespace NQRVZEP20::zep {

namespace {

struct TArguments {
  std::string fPath;
  bool fAsJson = false;
  bool fSample = false;
};

// The namespace that a path names in front of its class; empty when it names none.
std::string NamespaceOf(std::string const& path) {
  std::size_t const end = path.find_first_of(":\"");
  return end != std::string::npos && path[end] == ':' ? path.substr(0, end) : "";
}

// What the path names in that namespace; empty when there is no such thing.
boost::shared_ptr<ICIMElement> Find(TNamespaceView const& view, std::string const& path) {
  std::string const named = NamespaceOf(path);
  if (!named.empty() && named != view.GetName()) return {};
  try {
    std::string const full = named.empty() ? view.GetName() + ":" + path : path;
    return TCIMReference(view.Get(), full, TCIMContext()).GetCIMElement(false);
  } catch (TZEPException const& failure) {
    EZEPStatusCode const status = failure.GetStatusCode().GetCode();
    if (status != kZEPStatusInvalidReference && status != kZEPStatusNotFound) throw;
    return {};
  }
}

std::string Heading(std::string const& what) {
  return Printable(IsSampleSelected() ? std::string(kSampleLabel) + " " + what : what) + "\n\n";
}

std::string TextOf(TCIMValue const& value) { return value.IsNull() ? "NULL" : value.ToString(); }

std::string InstanceAsText(TNamespaceView const& view, ICIMInstance const& instance) {
  TTable table({24, 10, 42});
  table.Add({"Property", "Type", "Value"});
  instance.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        std::string const name = property->GetName(TCIMContext());
        TCIMValue const value = property->GetValue(TCIMContext());
        std::string const reason = value.IsNull() ? ": " + view.WhyMissing(instance, name).fReason : "";
        table.Add({name, NameOf(value.GetType()), TextOf(value) + reason});
        return true;
      },
      TCIMContext());
  return Heading(view.PathOf(instance)) + table.GetText();
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

std::string ClassAsText(TNamespaceView const& view, boost::shared_ptr<ICIMClass const> cls) {
  auto const lineage = LineageOf(cls);
  std::string const name = cls->GetName(TCIMContext());
  std::string heading = view.GetName() + ":" + name;
  for (std::size_t at = lineage.size() - 1; at-- > 0;) heading += " : " + lineage[at]->GetName(TCIMContext());

  TTable table({24, 10, 5, 35});
  table.Add({"Property", "Type", "Key", "Default"});
  ForEachProperty(*cls, lineage, [&](ICIMPropertyDecl const& property) {
    table.Add({property.GetName(TCIMContext()), NameOf(property.GetType(TCIMContext())),
               property.IsKey(TCIMContext()) ? "key" : "", TextOf(property.GetDefaultValue(TCIMContext()))});
  });

  std::string text = Heading(heading) + table.GetText() + "\nInstances\n";
  auto const instances = view.InstancesOf(name);
  for (auto const& instance : instances) text += Printable(view.PathOf(*instance)) + "\n";
  if (instances.empty()) text += Printable("none: " + view.WhyNoInstance(name).fReason) + "\n";
  return text;
}

TJson ClassAsJson(TNamespaceView const& view, boost::shared_ptr<ICIMClass const> cls) {
  TJson properties = TJson::object();
  ForEachProperty(*cls, LineageOf(cls), [&](ICIMPropertyDecl const& property) {
    properties[property.GetName(TCIMContext())] = {{"type", NameOf(property.GetType(TCIMContext()))},
                                                   {"key", property.IsKey(TCIMContext())},
                                                   {"default", ValueAsJson(property.GetDefaultValue(TCIMContext()))}};
  });
  std::string const name = cls->GetName(TCIMContext());
  TJson instances = TJson::array();
  for (auto const& instance : view.InstancesOf(name)) instances.push_back(view.PathOf(*instance));
  auto const superClass = cls->GetSuperClass(TCIMContext());
  return {{"class", name},
          {"namespace", view.GetName()},
          {"provider", view.GetProviderName()},
          {"superClass", superClass ? TJson(superClass->GetName(TCIMContext())) : TJson(nullptr)},
          {"properties", properties},
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

std::string ElementAsJson(TNamespaceView const& view, boost::shared_ptr<ICIMElement> const& element) {
  TJson document = DocumentHead("zep show");
  document["object"] = ForElement(
      element, [&](ICIMInstance const& instance) { return InstanceAsJson(view, instance); },
      [&](boost::shared_ptr<ICIMClass const> cls) { return ClassAsJson(view, cls); });
  return AsText(document);
}

int Show(TArguments const& arguments) {
  if (arguments.fSample) SelectSample();
  for (TNamespaceView const& view : ViewsOf(LoadPlugIns())) {
    auto const element = Find(view, arguments.fPath);
    if (!element) continue;
    WriteOutput(arguments.fAsJson ? ElementAsJson(view, element) : ElementAsText(view, element));
    return kExitComplete;
  }
  std::cerr << "zep: no provider has the object \"" << Printable(arguments.fPath) << "\"\n";
  return kExitNothing;
}

}  // namespace

TRun AddShowArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command
      .add_option("path", arguments->fPath,
                  "A class, such as CIM_Chassis, or the path of an object as zep report --json prints it")
      ->required();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--sample", arguments->fSample, "Show objects of the bundled table of an invented server, labelled SAMPLE");
  command.footer("Exit status: 0 when there is such an object, 1 when there is none, 64 for wrong usage.");
  return [arguments] { return Show(*arguments); };
}

}  // namespace NQRVZEP20::zep
