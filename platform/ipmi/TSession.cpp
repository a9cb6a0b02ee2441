// SPDX-License-Identifier: Apache-2.0
#include "platform/ipmi/TSession.h"

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"

#include <algorithm>
#include <exception>

namespace ipmi {
namespace {

constexpr std::size_t kMaxUserLength = 16, kMaxPasswordLength = 20;

// Some controllers refuse a session of version 2.0 when a privilege is named, and some when none is.
constexpr TWay kWays[] = {
    {TWay::kVersion2, 3, false},  {TWay::kVersion2, 3, true},  //
    {TWay::kVersion2, 17, false}, {TWay::kVersion2, 17, true}, {TWay::kVersion15, 0, true},
};
constexpr int kNumberOfWays = sizeof kWays / sizeof *kWays;
constexpr int kMostAttempts = 3;  // of opening a session in one way

// The next way worth trying after a failure, or kNumberOfWays. Silence and a refused account do not depend on the way, so no
// other way is tried after them.
int WayAfter(int way, TFailure::ECause cause) {
  TWay const& failed = kWays[way];
  auto const isWorthTrying = [&](TWay const& next) {
    if (failed.fVersion == TWay::kVersion15) return false;
    if (cause == TFailure::kNoVersion2) return next.fVersion == TWay::kVersion15;
    if (cause == TFailure::kNoSuchCipherSuite) return next.fCipherSuite != failed.fCipherSuite;
    if (cause == TFailure::kNoSuchPrivilege)
      return next.fCipherSuite == failed.fCipherSuite && next.fNamesPrivilege != failed.fNamesPrivilege;
    return false;
  };
  return static_cast<int>(std::find_if(kWays + way + 1, kWays + kNumberOfWays, isWorthTrying) - kWays);
}

// Opens the session. A copy of a packet may make another attempt necessary.
std::unique_ptr<IEnvelope> OpenInStep(TOpening const& opening, TWay const& way) {
  for (int attempt = 1;; ++attempt) try {
      return OpenSession(opening, way);
    } catch (TFailure const& failure) {
      if (failure.fCause != TFailure::kOutOfStep || attempt == kMostAttempts) throw;
    }
}

}  // namespace

TSession::TSession(TTarget const& target, TTimes const& times) : fTarget(target), fTimes(times) {
  if (fTarget.fUser.size() > kMaxUserLength || fTarget.fPassword.size() > kMaxPasswordLength)
    throw TFailure{kIpmiClientBadArgument};
}

TSession::~TSession() { Close(); }

TWaits TSession::Lengthened(TWaits const& waits) const {
  TWaits lengthened = waits;
  for (auto& wait : lengthened) wait = std::max(wait, fContactTime + fTimes.fBeyondContact);
  return lengthened;
}

// Finds the address of the host at which its controller answers.
TContact TSession::Reach(TClock::time_point deadline) {
  std::vector<TAddress> const addresses = AddressesOf(fTarget.fHost, fTarget.fPort);
  for (std::size_t n = 0;; ++n) try {
      fLink = std::make_unique<TLink>(addresses[n]);
      return MakeContact(*fLink, fTimes.fContact, deadline);
    } catch (TFailure const& failure) {
      bool const isDeadEnd = failure.fStatus == kIpmiClientUnreachable || failure.fStatus == kIpmiClientNoAnswer;
      if (!isDeadEnd || n + 1 == addresses.size()) throw;
    }
}

void TSession::Open() {
  TClock::time_point const deadline = TClock::now() + fTimes.fWholeOpening;
  fEnvelope.reset();
  TContact const contact = Reach(deadline);
  fContactTime = contact.fAnswerTime;
  TOpening const opening = {*fLink, fTarget, contact, Lengthened(fTimes.fStep), deadline};
  for (int way = fWayThatWorked;;) try {
      fEnvelope = OpenInStep(opening, kWays[way]);
      RaisePrivilege(*fLink, *fEnvelope, opening.fWaits, deadline);
      fWayThatWorked = way;
      fLastAnswer = TClock::now();
      return;
    } catch (TFailure const& failure) {
      Close(deadline);
      way = WayAfter(way, failure.fCause);
      if (way == kNumberOfWays) throw;
    }
}

TReply TSession::Send(unsigned char netFn, unsigned char command, TByteVector const& request) try {
  if (fEnvelope && IsIdle()) Close();
  if (!fEnvelope) Open();
  TClock::time_point const deadline = TClock::now() + fTimes.fWholeCommand;
  TReply const reply = AskInSession(netFn, command, request, deadline);
  if (reply.fCompletionCode != IPMI_COMP_CODE_INSUFFICIENT_PRIVILEGE_LEVEL) return reply;

  // The command was not carried out. With some controllers, a late copy of a packet of the opening takes away the privilege.
  try {
    RaisePrivilege(*fLink, *fEnvelope, Lengthened(fTimes.fStep), deadline);
  } catch (TFailure const& failure) {
    if (failure.fStatus != kIpmiClientRefused) throw;
    return reply;
  }
  return AskInSession(netFn, command, request, deadline);
} catch (TFailure const& failure) {
  if (failure.fStatus == kIpmiClientBadArgument) throw;
  if (failure.fStatus != kIpmiClientNoAnswer) Close();  // a controller that answers still has the session open
  fEnvelope.reset();
  throw;
}

TReply TSession::AskInSession(unsigned char netFn, unsigned char command, TByteVector const& request,
                              TClock::time_point deadline) {
  TMessage const message = {netFn, fLink->NextSequence(), command, request};
  TReply reply = Ask(*fLink, *fEnvelope, message, Lengthened(fTimes.fCommand), deadline);
  if (reply.fData.size() > kIpmiClientResponseSize) throw TFailure{kIpmiClientFail};
  fLastAnswer = TClock::now();
  return reply;
}

// A controller that does not answer closes the idle session after a while.
void TSession::Close(TClock::time_point deadline) noexcept try {
  if (!fEnvelope) return;
  std::unique_ptr<IEnvelope> const envelope = std::move(fEnvelope);
  TFields request(tmpl_cmd_close_session_rq);
  Checked(::fill_cmd_close_session(envelope->SessionId(), nullptr, request.Object()));
  Ask(*fLink, *envelope, MessageOf(IPMI_NET_FN_APP_RQ, fLink->NextSequence(), request), fTimes.fClose, deadline);
} catch (TFailure const&) {
} catch (std::exception const&) {
}

}  // namespace ipmi
