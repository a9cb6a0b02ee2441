// SPDX-License-Identifier: Apache-2.0

// A provider plug-in with the fault that its own file name states: libThrows.nsp.so throws while it fills its namespace. Copy it
// under the names that are compared below. Under any other name it has no fault.

#include "TMemoryNamespace.h"
#include "TMemoryProvider.h"
#include "TNamespaceProviderManager.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <boost/make_shared.hpp>

#include <csignal>
#include <cstdio>
#include <ctime>
#include <limits>
#include <map>
#include <stdexcept>
#include <vector>

using namespace NQRVZEP20;

namespace {

// "Throws" for libThrows.nsp.so; otherwise the file name.
std::string OwnName() {
  Dl_info info{};
  ::dladdr(reinterpret_cast<void*>(&OwnName), &info);
  std::string const path = info.dli_fname, file = path.substr(path.rfind('/') + 1);
  return file.compare(0, 3, "lib") == 0 ? file.substr(3, file.find('.') - 3) : file;
}

void LeaveProcess() {
  if (::fork() != 0) return;
  for (;;) ::pause();
}

// Its parent has ended.
void LeaveOrphan() {
  pid_t const parent = ::fork();
  if (parent != 0) {
    ::waitpid(parent, nullptr, 0);
    return;
  }
  LeaveProcess();
  ::_exit(0);
}

void FillMemory() {
  static std::vector<std::vector<char>> pieces;
  for (;;) pieces.emplace_back(1024 * 1024, 'x');
}

// Declares a class with the key Id, and adds an instance.
void AddThing(TMemoryNamespace& ns, TMemoryValues const& values, char const* typeOfText = "string") {
  ns.DefineClass("X_Thing").Key("Id", "string").Property("Text", typeOfText);
  ns.AddInstance("X_Thing", values);
}

using TFill = void (*)(TMemoryNamespace& ns);

std::map<std::string, TFill> const kFills = {
    {"Throws", [](TMemoryNamespace&) { throw std::runtime_error("no disk"); }},
    {"Crashes", [](TMemoryNamespace&) { ::raise(SIGSEGV); }},
    {"Exits", [](TMemoryNamespace&) { ::_exit(3); }},
    {"Hangs",
     [](TMemoryNamespace&) {
       for (;;) ::pause();
     }},
    {"FillsMemory", [](TMemoryNamespace&) { FillMemory(); }},
    {"KeyDiffers",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", std::to_string(::getpid())}});
     }},
    {"TimeIsKey",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", std::to_string(::time(nullptr))}});
     }},
    {"ClassDiffers", [](TMemoryNamespace& ns) { ns.DefineClass("X_Of" + std::to_string(::getpid())); }},
    {"TypeDiffers",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", "1"}}, ::access("second-time", F_OK) == 0 ? "uint16" : "string");
       ::close(::open("second-time", O_CREAT | O_WRONLY | O_CLOEXEC, 0600));
     }},
    {"ValueDiffers",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", "1"}, {"Text", std::to_string(::getpid())}});
     }},
    {"FailsLater",
     [](TMemoryNamespace& ns) {
       if (::access("second-time", F_OK) == 0) throw std::runtime_error("no more");
       ::close(::open("second-time", O_CREAT | O_WRONLY | O_CLOEXEC, 0600));
       AddThing(ns, {{"Id", "1"}});
     }},
    {"HasNoKey",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("X_Plain").Property("Text", "string");
       ns.AddInstance("X_Plain", {{"Text", "one"}});
     }},
    {"HasNullKey",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("X_Thing").Key("Id", "string").Key("Other", "string");
       ns.AddInstance("X_Thing", {{"Id", "1"}});
     }},
    {"HasOnePath",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("X_Thing").Key("Id", "string").Key("Size", "real64");
       ns.AddInstance("X_Thing", {{"Id", "1"}, {"Size", 0.12345671}});
       ns.AddInstance("X_Thing", {{"Id", "1"}, {"Size", 0.12345672}});
     }},
    {"HasBytes",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", "1"}, {"Text", "a\xff"}});
     }},
    {"HasZero",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", std::string("a\0b", 3)}});
     }},
    {"HasBytesInAList",
     [](TMemoryNamespace& ns) {
       std::vector<TCIMValue> const texts = {"a", "\xff"};
       AddThing(ns, {{"Id", "1"}, {"Text", TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0, texts)}}, "string[]");
     }},
    {"HasBytesInAQualifier",
     [](TMemoryNamespace& ns) { ns.DefineClass("X_Thing").Description("a\xff").Key("Id", "string").Description("b\xff"); }},
    {"HasBytesInADefault",
     [](TMemoryNamespace& ns) { ns.DefineClass("X_Thing").Key("Id", "string").Property("Text", "string", TCIMValue("a\xff")); }},
    {"HasBytesInAStatic",
     [](TMemoryNamespace& ns) { ns.DefineClass("X_Thing").Key("Id", "string").Static("Text", "string", TCIMValue("a\xff")); }},
    {"HasBytesInAMethod",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("X_Thing").Key("Id", "string").Method("Stop", "uint32").In("Reason", "string").Description("a\xff");
     }},
    {"IsInfinite",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", "1"}, {"Text", std::numeric_limits<double>::infinity()}}, "real64");
     }},
    {"IsLong",
     [](TMemoryNamespace& ns) {
       AddThing(ns, {{"Id", "1"}, {"Text", 1.23456789}}, "real64");
     }},
    {"HasWrongType",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("CIM_Thing").Key("Id", "string").Property("State", "string").Property("Added", "string");
       ns.AddInstance("CIM_Thing", {{"Id", "1"}});
     }},
    {"HasWrongKey",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("CIM_Thing").Key("State", "uint16");
       ns.AddInstance("CIM_Thing", {{"State", 1}});
     }},
    {"HasWrongSuperClass",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("CIM_Other").Key("Id", "string");
       ns.DefineClass("CIM_Thing", "CIM_Other");
     }},
    {"IsAbstract",
     [](TMemoryNamespace& ns) {
       ns.DefineClass("CIM_Element").Key("Id", "string");
       ns.AddInstance("CIM_Element", {{"Id", "1"}});
     }},
    {"LeavesDescriptor", [](TMemoryNamespace&) { ::open("/dev/null", O_RDONLY | O_CLOEXEC); }},
    {"LeavesProcess", [](TMemoryNamespace&) { LeaveProcess(); }},
    {"LeavesOrphan", [](TMemoryNamespace&) { LeaveOrphan(); }},
    {"Prints", [](TMemoryNamespace&) { std::printf("found %d disks\nand more\n", 3); }},
};

void Fill(TMemoryNamespace& ns) {
  auto const fill = kFills.find(OwnName());
  if (fill != kFills.end())
    fill->second(ns);
  else
    AddThing(ns, {{"Id", "1"}, {"Text", "one"}});
}

std::string NameOfNamespace() {
  if (OwnName() == "HasUnnamedNamespace") return "";
  return OwnName() == "HasBytesInNamespace" ? "root/\xff" : "root/faulty";
}

void Register(std::string const& name) {
  TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(
      boost::make_shared<TMemoryProvider>(name, NameOfNamespace(), Fill));
}

std::string NameToRegister() {
  if (OwnName() == "RegistersHost") return "Host";
  if (OwnName() == "RegistersUnnamed") return "";
  return OwnName() == "RegistersAnother" ? "Another" : OwnName();
}

struct TRegistration {
  TRegistration() {
    if (OwnName() == "LoadThrows") throw std::runtime_error("no disk today");
    if (OwnName() == "RegistersNothing") return;
    Register(NameToRegister());
    if (OwnName() == "RegistersTwice") Register(OwnName());
  }
} const gRegistration;

}  // namespace
