// SPDX-License-Identifier: Apache-2.0

// A provider plug-in. The words in the environment variable ZEP_TEST_PROVIDER name its behaviours.

#include "ICIMClass.h"
#include "TLogger.h"
#include "TNamespaceProviderManager.h"
#include "TZEPException.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/memory/TMemoryProvider.h"

#include <boost/make_shared.hpp>

#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <limits>
#include <sstream>

namespace NQRVZEP20 {

namespace {

bool Does(std::string const& behaviour) {
  char const* chosen = std::getenv("ZEP_TEST_PROVIDER");
  std::istringstream words(chosen != nullptr ? chosen : "");
  for (std::string word; words >> word;)
    if (word == behaviour) return true;
  return false;
}

void AddSystem(TMemoryNamespace& ns, char const* name) {
  ns.AddInstance("QRVSG_ComputerSystem", {{"Name", name}, {"ProductName", "1234AB7"}, {"SerialNumber", "KQ12345"}});
}

void AddSystems(TMemoryNamespace& ns) {
  ns.DefineClass("QRVSG_ComputerSystem")
      .Key("Name", "string")
      .Property("ProductName", "string")
      .Property("SerialNumber", "string");
  AddSystem(ns, "one");
  if (Does("two-systems")) AddSystem(ns, "two");
}

// Values of every kind, and texts that could confuse a terminal or a JSON reader.
void AddOddities(TMemoryNamespace& ns) {
  ns.DefineClass("X_Base").Key("Id", "string").Property("Inherited", "uint8");
  ns.DefineClass("X_Odd", "X_Base")
      .Property("Text", "string")
      .Property("Bytes", "string")
      .Property("Flag", "boolean")
      .Property("Large", "uint64")
      .Property("Small", "sint64")
      .Property("Half", "real32")
      .Property("Infinite", "real64")
      .Property("When", "datetime")
      .Property("List", "string[]")
      .Property("Numbers", "uint8[4]")
      .Property("Nothing", "uint16");
  ns.DefineClass("X_Link").Key("Id", "string").Reference("Target", "X_Base");
  std::vector<TCIMValue> const texts = {"a", "b, c"};
  std::vector<TCIMValue> const numbers = {static_cast<unsigned char>(1), static_cast<unsigned char>(255)};
  auto const odd = ns.AddInstance("X_Odd", {{"Id", "quote \" and \\ and \x1b[31m"},
                                            {"Inherited", static_cast<unsigned char>(7)},
                                            {"Text", "\x1b]0;title\x07 \xe2\x80\xae reversed"},
                                            {"Bytes", "\xff\xfe not UTF-8"},
                                            {"Flag", true},
                                            {"Large", std::numeric_limits<unsigned long>::max()},
                                            {"Small", std::numeric_limits<long>::min()},
                                            {"Half", 0.5f},
                                            {"Infinite", std::numeric_limits<double>::infinity()},
                                            {"When", TCIMDateTime("20070315143000.000000+060")},
                                            {"List", TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0, texts)},
                                            {"Numbers", TCIMValue(TCIMValue::TCIMType::kCIMTypeUint8, 4, numbers)}});
  ns.AddInstance("X_Link", {{"Id", "1"}, {"Target", odd->GetReference()}});
}

// Instances whose paths are the same as that of the class, or contain bytes that are not UTF-8.
void AddHardToName(TMemoryNamespace& ns) {
  ns.DefineClass("X_Note").Key("Id", "string").Property("Text", "string");
  ns.DefineClass("X_LateNote", "X_Note");
  ns.DefineClass("X_Plain").Property("Text", "string");
  ns.AddInstance("X_Note", {{"Text", "first"}});
  ns.AddInstance("X_Note", {{"Id", "1"}, {"Text", "with a key"}});
  ns.AddInstance("X_LateNote", {{"Text", "of a subclass"}});
  ns.AddInstance("X_Note", {{"Text", "second"}});
  ns.AddInstance("X_Plain", {{"Text", "plain"}});

  ns.DefineClass("X_Bytes").Key("Id", "string").Property("Text", "string");
  ns.DefineClass("X_ToBytes").Key("Id", "string").Reference("Target", "X_Bytes");
  for (char const* id : {"\xff", "\xfe", "\\xff", "\xef\xbf\xbd", "\xc3\xa9 \xc3", "\x1b \xff\""})
    ns.AddInstance("X_Bytes", {{"Id", id}, {"Text", "text of " + std::string(id)}});
  ns.AddInstance("X_Bytes", {{"Id", std::string("a\0b", 3)}});
  ns.AddInstance("X_ToBytes", {{"Id", "1"}, {"Target", ns.AddInstance("X_Bytes", {{"Id", "\xfd"}})->GetReference()}});
}

void AddRefused(TMemoryNamespace& ns) {
  ns.DefineClass("X_Refused").Key("Id", "string").Property("Kind", "uint16");
  ns.AddInstance("X_Refused", {{"Id", "1"}, {"Kind", "not a number"}});
}

void Fill(TMemoryNamespace& ns) {
  if (Does("prints")) std::printf("noise while filling\n");
  if (Does("throws")) throw TZEPException(kZEPStatusAccessDenied);
  if (Does("throws-a-number")) throw 5;
  if (Does("two-systems") || Does("one-system")) AddSystems(ns);
  if (Does("is-refused")) AddRefused(ns);
  if (Does("logs-debug")) TLogger::SetLogThreshold(ILogger::kLogDebug);
  if (Does("hard-to-name")) AddHardToName(ns);
  if (Does("odd")) AddOddities(ns);
}

// Fails on every request for a class by name, and on every enumeration of the classes.
class TFailingNamespace : public TMemoryNamespace {
public:
  using TMemoryNamespace::TMemoryNamespace;
  boost::shared_ptr<ICIMClass> GetClass(std::string const& name, TCIMContext const& context) const override {
    if (name == "ZEP_MissingValue" && !Does("fails-at-once")) return TMemoryNamespace::GetClass(name, context);
    throw TZEPException(kZEPStatusFail);
  }
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)>, TCIMContext const&) const override { throw 5; }
};

class TOwnProvider : public INamespaceProvider {
public:
  std::string const& GetName(TCIMContext const&) const override { return fName; }
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const&) override {
    if (Does("no-namespace")) return {};
    return fNamespace;
  }

private:
  std::string const fName = "Test";
  boost::shared_ptr<ICIMNamespace> const fNamespace = boost::make_shared<TFailingNamespace>("root/failing");
};

boost::shared_ptr<INamespaceProvider> MakeProvider() {
  if (Does("no-namespace") || Does("fails-at-once") || Does("fails-later")) return boost::make_shared<TOwnProvider>();
  return boost::make_shared<TMemoryProvider>(Does("calls-itself-host") ? "Host" : "Test", "root/test", Fill);
}

struct TRegistration {
  TRegistration() {
    if (Does("prints")) std::cout << "noise while loading" << std::endl;
    if (Does("is-silent")) return;
    TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(MakeProvider());
  }
} const gRegistration;

}  // namespace

}  // namespace NQRVZEP20
