// SPDX-License-Identifier: Apache-2.0

// Calls one operation on plug-ins and prints what comes of it: the results, one a line; what was thrown; what was recorded in
// the log, with its severity. With several arguments, one attempt for each.
//
//   PluginProbe controller [LIBRARY]... | root | nsps | nsps-elsewhere | nscs | services KIND | load-nsp NAME |
//               load-nsc NAME | load-plugins PATH...

#include "IIPMILan.h"
#include "INamespaceConsumer.h"
#include "INamespaceProvider.h"
#include "TLogger.h"
#include "TNamespaceProviderManager.h"
#include "TOSSpecific.h"
#include "TZEPException.h"

#include <dlfcn.h>
#include <unistd.h>

#include <filesystem>
#include <iostream>
#include <memory>

using namespace NQRVZEP20;

namespace {

void Print(std::vector<std::string> const& results) {
  for (std::string const& result : results) std::cout << result << "\n";
}

void PrintWhetherSeen(char const* symbol) {
  std::cout << symbol << (::dlsym(RTLD_DEFAULT, symbol) ? " is seen by all" : " is not seen") << "\n";
}

void LoadProvider(std::string const& baseName) {
  TOSSpecific::LoadNSPLibrary(baseName);
  TNamespaceProviderManager::GetInstance()->EnumerateNamespaceProviders([](boost::shared_ptr<INamespaceProvider> provider) {
    std::cout << "registered: " << provider->GetName(TCIMContext()) << "\n";
    return true;
  });
  PrintWhetherSeen("gFanProviderMark");
}

void LoadConsumer(std::string const& baseName) {
  std::unique_ptr<INamespaceConsumer> const consumer(TOSSpecific::LoadNSCLibrary(baseName));
  std::cout << (consumer ? "a consumer" : "no consumer") << std::endl;
  PrintWhetherSeen("gFanConsumerMark");
  std::cout.flush();
}

void LoadPlugin(std::string const& path) {
  void* const library = TOSSpecific::LoadPluginLibrary(path);
  std::cout << (library == ::dlopen(path.c_str(), RTLD_NOW | RTLD_NOLOAD) ? "loaded" : "another handle") << "\n";
  if (auto const function = reinterpret_cast<int (*)()>(::dlsym(library, "TwiceTheDiskCount"))) std::cout << function() << "\n";
}

// With a library that is put beside the core library first, where one is given.
void AskController(std::string const& client) {
  if (!client.empty()) std::filesystem::copy_file(client, TOSSpecific::GetZEPRootPath() + "/libipmiClient.so");
  Print({"[" + TOSSpecific::GetRemoteMSN("h", "u", "p") + TOSSpecific::GetRemoteMT("h", "u", "p") +
         TOSSpecific::GetRemoteMachineModel("h", "u", "p") + "]"});
  IIPMILan& link = *IIPMILan::Initialize();
  std::cout << (link.IpmilanOpenConnect("h", "u", "p") ? "connected" : "not connected") << "\n";
  link.IpmilanCloseConnect();
}

void PrintThrown(std::string const& operation, std::string const& argument) {
  try {
    if (operation == "controller") AskController(argument);
    if (operation == "root") Print({TOSSpecific::GetZEPRootPath()});
    if (operation == "nsps") Print(TOSSpecific::FindNSPs());
    if (operation == "nsps-elsewhere" && ::chdir("/proc") == 0) Print(TOSSpecific::FindNSPs());
    if (operation == "nscs") Print(TOSSpecific::FindNSCs());
    if (operation == "services") Print(TOSSpecific::FindNSServices(argument));
    if (operation == "load-nsp") LoadProvider(argument);
    if (operation == "load-nsc") LoadConsumer(argument);
    if (operation == "load-plugins") LoadPlugin(argument);
  } catch (TZEPException const& thrown) {
    std::cout << "threw " << thrown.what() << "\n";
  }
}

void PrintLog() {
  for (ILogger::TLogEntry const& entry : TLogger::GetInstance()->GetLog())
    std::cout << "logged " << entry.fSeverity << ": " << entry.fMessage << "\n";
  TLogger::GetInstance()->ClearLog();
}

void PrintWhetherLoaded(std::string const& baseName) {
  std::string const path = TOSSpecific::GetZEPRootPath() + "/lib" + baseName + ".nsc.so";
  std::cout << (::dlopen(path.c_str(), RTLD_NOW | RTLD_NOLOAD) ? "the library is loaded" : "the library is not loaded") << "\n";
}

}  // namespace

int main(int count, char** arguments) {
  std::string const operation = arguments[1];
  int argument = 2;
  do {
    PrintThrown(operation, argument < count ? arguments[argument] : "");
    PrintLog();
  } while (++argument < count);
  if (operation == "load-nsc") PrintWhetherLoaded(arguments[2]);
}
