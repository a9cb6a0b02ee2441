// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/controller/Controller.h"

#include "IIPMILan.h"
#include "TOSSpecific.h"
#include "tools/zep/controller/ControllerSession.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <arpa/inet.h>

#include <algorithm>
#include <cctype>
#include <chrono>
#include <cstdio>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

using TClock = std::chrono::steady_clock;

constexpr char kEnd = '\0';  // of each field that the child process sends

// One part of the identity, as the controller's FRU data hold it.
class TField {
public:
  // The text ends at its first zero byte.
  TField(char const* name, std::string const& text) : fName(name), fText(text.substr(0, text.find('\0'))) {}

  std::string GetName() const { return fName; }

  // Unwritten memory holds only 0xFF.
  bool IsNotProgrammed() const { return !fText.empty() && fText.find_first_not_of('\xff') == std::string::npos; }
  bool IsKnown() const { return !GetValue().empty() && fText != "N/A"; }

  // Without the blanks and the unwritten memory at the end.
  std::string GetValue() const { return fText.substr(0, fText.find_last_not_of(" \xff") + 1); }

private:
  char const* fName;
  std::string fText;
};

// Why some fields are unknown; empty when all are known.
std::string WhyNotAll(std::vector<TField> const& fields) {
  std::string notProgrammed;
  bool isOtherMissing = false;
  for (TField const& field : fields) {
    if (field.IsNotProgrammed()) notProgrammed += (notProgrammed.empty() ? "" : ", ") + field.GetName();
    isOtherMissing = isOtherMissing || (!field.IsKnown() && !field.IsNotProgrammed());
  }
  if (notProgrammed.empty()) return isOtherMissing ? "the controller did not report everything" : "";
  return "not programmed in the controller's FRU data (0xFF): " + notProgrammed +
         (isOtherMissing ? "; the controller did not report the rest" : "");
}

std::string WithoutASession(TClock::time_point start, std::string const& why) {
  char seconds[32];
  std::snprintf(seconds, sizeof seconds, "%.1f s", std::chrono::duration<double>(TClock::now() - start).count());
  return std::string(3, kEnd) + "no session with the controller after " + seconds + ": " + why + kEnd;
}

// The next field; empty when the text does not hold its end.
std::string TakeField(std::string& sent) {
  std::size_t const end = sent.find(kEnd);
  if (end == sent.npos) return "";
  std::string field = sent.substr(0, end);
  sent.erase(0, end + 1);
  return field;
}

// A host without a session has no inventory, for the reason that the identity has already.
void AddInventoryTo(TRemoteIdentity& identity, std::string const& sent) {
  identity.fInventory = InventoryFrom(sent);
  std::string const& why = identity.fInventory->fWhyNotAll;
  if (!why.empty() && (!sent.empty() || identity.fError.empty()))
    identity.fError += (identity.fError.empty() ? "" : "; ") + ("inventory: " + why);
}

std::string OrUnknown(std::string const& field) { return field.empty() ? "unknown" : field; }

}  // namespace

bool IsHostName(std::string const& host) {
  auto const isOfName = [](unsigned char c) { return std::isalnum(c) != 0 || c == '-' || c == '.' || c == '_'; };
  if (!host.empty() && std::all_of(host.begin(), host.end(), isOfName)) return true;
  std::size_t const zone = host.find('%');  // "fe80::1%eth0"
  bool const isZone =
      zone == host.npos ||
      (zone + 1 < host.size() && std::all_of(host.begin() + static_cast<std::ptrdiff_t>(zone) + 1, host.end(), isOfName));
  in6_addr address;
  return isZone && ::inet_pton(AF_INET6, host.substr(0, zone).c_str(), &address) == 1;
}

void QueryController(std::string const& host, TAccount const& account, TInventoryLimits const* inventory, TSend const& send) {
  if (!IsHostName(host)) return send(std::string(3, kEnd) + kNoHostName + kEnd);
  auto const start = TClock::now();
  std::string const why = WhyNoSession(host, account);
  if (!why.empty()) return send(WithoutASession(start, why));
  std::string const password = account.fPassword.ForLibrary();
  std::string const type = TOSSpecific::GetRemoteMT(host, account.fUser, password);
  if (type.empty()) return send(WithoutASession(start, "the session could not be reopened"));
  std::vector<TField> fields;
  auto const add = [&](char const* name, std::string const& text) {
    TField const& field = fields.emplace_back(name, text);
    send((field.IsKnown() ? field.GetValue() : "") + kEnd);
  };
  add("machine type", type);
  add("model", TOSSpecific::GetRemoteMachineModel(host, account.fUser, password));
  add("serial number", TOSSpecific::GetRemoteMSN(host, account.fUser, password));
  send(WhyNotAll(fields) + kEnd);
  if (inventory != nullptr && !SendInventory(host, inventory->After(TClock::now() - start), send)) return;
  IIPMILan::GetInstance()->IpmilanCloseConnect();
}

TRemoteIdentity IdentityFrom(std::string const& host, std::string const& sent, bool isComplete, bool hasInventory) {
  TRemoteIdentity identity;
  identity.fHost = host;
  std::string rest = sent;
  for (std::string* field : {&identity.fType, &identity.fModel, &identity.fSerialNumber, &identity.fError})
    *field = TakeField(rest);
  if (hasInventory) AddInventoryTo(identity, rest);
  if (!isComplete) identity.fError = "the process that queried the controller exited before it had finished";
  return identity;
}

bool IsComplete(TRemoteIdentity const& identity) { return identity.fError.empty(); }

bool IsNothing(TRemoteIdentity const& identity) {
  if (identity.fInventory && identity.fInventory->fView) return false;
  return identity.fType.empty() && identity.fModel.empty() && identity.fSerialNumber.empty();
}

EExitStatus StatusOf(TRemoteIdentity const& identity) {
  if (IsComplete(identity)) return kExitComplete;
  return IsNothing(identity) ? kExitNothing : kExitPartial;
}

TJson AsJson(TRemoteIdentity const& identity, TThresholds const& thresholds) {
  TJson document = DocumentHead("zep remote", StatusOf(identity), identity.fError);
  document["host"] = identity.fHost;
  document["type"] = OrNull(identity.fType);
  document["model"] = OrNull(identity.fModel);
  document["serialNumber"] = OrNull(identity.fSerialNumber);
  if (!identity.fError.empty()) document["error"] = identity.fError;  // the same reason, under the name of earlier versions
  if (identity.fInventory) AddInventory(document, *identity.fInventory, thresholds);
  return document;
}

std::string AsText(TRemoteIdentity const& identity, TThresholds const& thresholds) {
  TTable table({15, 61});
  table.Add({"Remote server", MessageWithoutSecrets(identity.fHost)});
  table.Add({"Machine type", OrUnknown(identity.fType)});
  table.Add({"Model", OrUnknown(identity.fModel)});
  table.Add({"Serial number", OrUnknown(identity.fSerialNumber)});
  return table.GetText() + (identity.fInventory ? InventoryAsText(*identity.fInventory, thresholds) : "");
}

}  // namespace NQRVZEP20::zep
