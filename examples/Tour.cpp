// SPDX-License-Identifier: Apache-2.0

// The program that docs/tour.md shows, with its output.

#include <zepcore.h>

#include <iostream>

using namespace NQRVZEP20;

namespace {

void HoldValues() {
  TCIMValue const slots(16u);  // a uint32
  TCIMValue const name("Fan 1");
  TCIMValue const speeds(TCIMValue::TCIMType::kCIMTypeUint16, 0,
                         {TCIMValue(static_cast<unsigned short>(4200)), TCIMValue(static_cast<unsigned short>(4150))});
  std::cout << slots.GetType().ToString() << " " << slots.ToString() << ", " << slots.ToString(16) << "\n";
  std::cout << name.ToString() << " turns at " << speeds.ToString() << "\n";

  unsigned int const count = slots;  // exactly this type; an unsigned short throws kZEPStatusTypeMismatch
  std::string text = "17";
  TCIMValue const read(TCIMValue::TCIMType::kCIMTypeUint32, text, nullptr);
  std::cout << count << (slots < read ? " is less than " : " is not less than ") << read.ToString() << "\n";
}

void AddTimes() {
  TCIMDateTime const start("20240303090507.000000+060");
  TCIMDateTime const anHourAndAHalf(0, 1, 30, 0, 0);
  std::cout << (start + anHourAndAHalf).ToString() << " is " << anHourAndAHalf.ToUIString() << "later\n";
}

boost::shared_ptr<ICIMNamespace> LoadProvider() {
  TOSSpecific::LoadNSPLibrary("Host");  // libHost.nsp.so, in the directory of libzepcore.so
  return TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Host")->GetNamespace(TCIMContext());
}

void WalkInstances(boost::shared_ptr<ICIMNamespace> const& ns) {
  std::vector<boost::shared_ptr<ICIMInstance>> modules;
  auto const cls = ns->GetClass("CIM_PhysicalMemory", TCIMContext());
  cls->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(modules), TCIMContext());
  for (auto const& module : modules) {
    TCIMValue const capacity = module->GetProperty("Capacity", TCIMContext())->GetValue(TCIMContext());
    std::cout << module->GetPath(TCIMContext()).GetPath() << ": " << (capacity.IsNull() ? "?" : capacity.ToString()) << "\n";
    return;  // the first is enough here
  }
}

void FollowAPath(boost::shared_ptr<ICIMNamespace> const& ns) {
  std::vector<boost::shared_ptr<ICIMInstance>> systems;
  ns->GetClass("QRVSG_ComputerSystem", TCIMContext())
      ->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(systems), TCIMContext());
  std::string const path = systems.at(0)->GetPath(TCIMContext()).GetPath();

  TCIMReference const reference(ns, "root/host:" + path, TCIMContext());  // keys are read only after a namespace prefix
  bool const isTheSame = reference.GetCIMElement(false) == systems[0];
  std::cout << reference.GetClassName() << (isTheSame ? ": the same object\n" : ": another object\n");
}

void PrintIdentity(boost::shared_ptr<ICIMNamespace> const& ns) {
  std::cout << TCIMSchemaHelper::GetMTM(ns) << ", " << TCIMSchemaHelper::GetSerialNumber(ns, TCIMContext()) << "\n";
}

void RunACommand() {
  std::string output;
  int const result = TOSSpecific::SpawnProcess("echo", {"from", "a", "child"}, output, 10);  // at most 10 s of silence
  std::cout << result << ": " << output;
}

void KeepALog() {
  TLogger::SetLogThreshold(ILogger::kLogDebug);
  TRootObject::GetCoreLogger()->SetLogFilename("tour.log");  // for this thread
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogWarning, "the fan turns slowly");
}

void HandleError(boost::shared_ptr<ICIMNamespace> const& ns) {
  try {
    TCIMReference(ns, "root/host:X_Nothing.Id=\"1\"", TCIMContext());
  } catch (TZEPFailure const& failure) {
    std::cout << failure.what() << ": " << failure.Reason() << "\n";
  }
}

}  // namespace

int main() {
  try {
    HoldValues();
    AddTimes();
    auto const ns = LoadProvider();
    WalkInstances(ns);
    FollowAPath(ns);
    PrintIdentity(ns);
    RunACommand();
    KeepALog();
    HandleError(ns);
    return 0;
  } catch (TZEPException const& failure) {
    std::cerr << failure.what() << "\n";
    return 1;
  }
}
