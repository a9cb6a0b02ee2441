// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/controller/Inventory.h"

#include "INamespaceProvider.h"
#include "TNamespaceProviderManager.h"
#include "collect/FailureOf.h"
#include "collect/PlugInFiles.h"
#include "collect/answer/NamespaceBytes.h"
#include "collect/answer/TReceivedNamespace.h"
#include "collect/findings/TElement.h"
#include "loaders/IpmiLibrary.h"
#include "platform/include/controllerPlugIn.h"
#include "tools/zep/output/Text.h"

#include <algorithm>
#include <cstdlib>
#include <future>
#include <iostream>
#include <optional>
#include <thread>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kProvider = "Controller";
constexpr char kEndOfReason = '\0';  // of the reason, which precedes the namespace

// Of the session: when to stop, and whether a command was not answered by then.
std::chrono::steady_clock::time_point gEnd;
bool gIsWaiting = false;
bool gIsUsed = false;  // whether the plug-in has sent a command over the session

// The library waits for an answer as long as it likes, so that it does so in a thread of its own.
std::optional<TIpmiAnswer> AnswerInTime(TIpmiCommand const& command) {
  std::packaged_task<TIpmiAnswer()> task([command] { return AskIpmiController(command); });
  auto answer = task.get_future();
  std::thread(std::move(task)).detach();
  gIsWaiting = answer.wait_until(gEnd) != std::future_status::ready;
  return gIsWaiting ? std::nullopt : std::optional(answer.get());
}

unsigned SendCommand(unsigned char netFn, unsigned char command, unsigned char const* data, unsigned dataLength,
                     unsigned char* answer) {
  gIsUsed = true;
  if (gIsWaiting) return 0;
  auto const reply = AnswerInTime({netFn, command, {data, data + dataLength}});
  if (!reply || !reply->fIsAnswered) return 0;
  answer[0] = reply->fCompletionCode;
  std::copy(reply->fData.begin(), reply->fData.end(), answer + 1);
  return static_cast<unsigned>(1 + reply->fData.size());
}

// The line is overwritten by the next one, and by that of the result.
void ShowProgress(char const* step, unsigned long done, unsigned long all) {
  std::cerr << "\r\x1b[Kzep: " << step << ": " << done << " of " << all << (done == all ? "\r\x1b[K" : "") << std::flush;
}

TPlugInFile FindPlugIn() {
  for (TPlugInFile const& file : FindPlugIns())
    if (file.fName == kProvider && file.fRule != EPlugInRule::kReplaced) return file;
  return {kProvider, "", EPlugInRule::kMissing, "it is not installed; install the package libzepcore-ipmi"};
}

boost::shared_ptr<ICIMNamespace> ReadController(std::string const& host, TInventoryLimits const& limits) {
  TPlugInFile const plugIn = FindPlugIn();
  if (!plugIn.IsLoaded()) throw std::runtime_error("libController.nsp.so: " + plugIn.fReason);
  ::setenv("ZEP_HOST_NAME", host.c_str(), 1);  // the provider names the machine after it
  LoadLibraryOf(plugIn);
  gEnd = std::chrono::steady_clock::now() + limits.fTime;
  TZepController const controller = {host.c_str(), SendCommand, limits.fShowsProgress ? ShowProgress : nullptr,
                                     static_cast<unsigned>(limits.fTime.count())};
  TCIMContext const context = {{kZepControllerEntry, TCIMValue(reinterpret_cast<unsigned long>(&controller))}};
  auto const ns = TNamespaceProviderManager::GetInstance()->GetNamespaceProvider(kProvider)->GetNamespace(context);
  bool const hadTime = std::chrono::steady_clock::now() < gEnd;
  if (!gIsUsed && hadTime) throw std::runtime_error("libController.nsp.so did not use the session; install the version of zep");
  return ns;
}

// The lists that were not read to their ends, or why there is no controller in the namespace.
std::string WhyNotAll(TNamespaceView const& view) {
  auto const controllers = view.InstancesOf("ZEP_ManagementController");
  if (controllers.empty()) return "the controller was not read: " + view.WhyNoInstance("ZEP_ManagementController").fReason;
  auto const unread = TElement(view, controllers.front()).Texts("UnreadParts");
  return unread.IsKnown() && !unread.fValue->empty() ? "not read to the end: " + Joined(*unread.fValue, "; ") : "";
}

}  // namespace

TInventoryLimits TInventoryLimits::After(std::chrono::steady_clock::duration passed) const {
  auto const left = fTime - std::chrono::ceil<std::chrono::milliseconds>(passed);
  return {std::max(left, std::chrono::milliseconds(0)), fShowsProgress};
}

bool SendInventory(std::string const& host, TInventoryLimits const& limits, TSend const& send) {
  boost::shared_ptr<ICIMNamespace> ns;
  std::string const failure = FailureOf([&] { ns = ReadController(host, limits); });
  send(failure + kEndOfReason);
  if (ns) WriteNamespace(*ns, send);
  return !gIsWaiting;
}

TInventory InventoryFrom(std::string sent) {
  std::size_t const end = sent.find(kEndOfReason);
  if (end == std::string::npos) return {nullptr, "the process ended before it had read the inventory"};
  if (end > 0) return {nullptr, sent.substr(0, end)};
  TInventory inventory;
  std::string const failure = FailureOf([&] {
    auto const ns = TReceivedNamespace::From(sent.substr(end + 1));
    inventory.fView = std::make_shared<TNamespaceView const>(kProvider, ns);
    inventory.fWhyNotAll = WhyNotAll(*inventory.fView);
  });
  return failure.empty() ? inventory : TInventory{nullptr, failure};
}

}  // namespace NQRVZEP20::zep
