// SPDX-License-Identifier: Apache-2.0

// The steps of opening a session that both versions share.

#include "platform/ipmi/Opening.h"

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"

#include <string.h>
#include <sys/random.h>

#include <map>

namespace ipmi {
namespace {

// Some controllers have only accounts without a name, or only accounts without a password.
void CheckAccounts(TContact const& contact, TTarget const& target) {
  auto const given = [](std::string const& text) { return text.empty() ? nullptr : text.c_str(); };
  fiid_obj_t const capabilities = contact.fCapabilities.Object();
  if (::ipmi_check_authentication_capabilities_username(given(target.fUser), given(target.fPassword), capabilities) != 1)
    throw TFailure{kIpmiClientUnknownUser};
}

}  // namespace

TTarget::~TTarget() { ::explicit_bzero(fPassword.data(), fPassword.size()); }

std::uint32_t RandomNumber() {
  std::uint32_t number = 0;
  while (number == 0)
    if (::getrandom(&number, sizeof number, 0) != sizeof number) throw TFailure{kIpmiClientFail};
  return number;
}

TContact MakeContact(TLink& link, TWaits const& waits, TClock::time_point deadline) {
  TFields request(tmpl_cmd_get_channel_authentication_capabilities_rq);
  Checked(::fill_cmd_get_channel_authentication_capabilities(IPMI_CHANNEL_NUMBER_CURRENT_CHANNEL, IPMI_PRIVILEGE_LEVEL_ADMIN,
                                                             IPMI_GET_IPMI_V20_EXTENDED_DATA, request.Object()));
  // The query changes nothing on the controller, so each repetition gets its own number, which identifies the one answered.
  TMessage message = MessageOf(IPMI_NET_FN_APP_RQ, 0, request);
  TEnvelope15 envelope;
  std::map<unsigned char, TClock::time_point> sent;
  TReply reply;
  TClock::time_point answered;
  auto const ask = [&] {
    message.fSequence = link.NextSequence();
    sent[message.fSequence] = TClock::now();
    return envelope.Pack(message);
  };
  auto const judge = [&](TPacket const& packet) {
    EVerdict const verdict = envelope.Unpack(packet, reply);
    if (verdict != EVerdict::kAnswer) return verdict;
    message.fSequence = reply.fSequence;
    if (sent.count(reply.fSequence) == 0 || !IsAnswerTo(message, reply)) return EVerdict::kOther;
    answered = TClock::now();
    return EVerdict::kAnswer;
  };
  Exchange(link, {ask, judge}, waits, deadline);
  if (reply.fCompletionCode != IPMI_COMP_CODE_COMMAND_SUCCESS) throw TFailure{kIpmiClientFail};
  return {FieldsOf(tmpl_cmd_get_channel_authentication_capabilities_rs, reply),
          std::chrono::ceil<std::chrono::milliseconds>(answered - sent[reply.fSequence])};
}

std::unique_ptr<IEnvelope> OpenSession(TOpening const& opening, TWay const& way) {
  CheckAccounts(opening.fContact, opening.fTarget);
  return way.fVersion == TWay::kVersion15 ? OpenVersion15(opening) : OpenVersion2(opening, way);
}

void RaisePrivilege(TLink& link, IEnvelope& envelope, TWaits const& waits, TClock::time_point deadline) {
  TFields request(tmpl_cmd_set_session_privilege_level_rq);
  Checked(::fill_cmd_set_session_privilege_level(IPMI_PRIVILEGE_LEVEL_ADMIN, request.Object()));
  TReply const reply = Ask(link, envelope, MessageOf(IPMI_NET_FN_APP_RQ, link.NextSequence(), request), waits, deadline);
  switch (reply.fCompletionCode) {
    case IPMI_COMP_CODE_COMMAND_SUCCESS:
      return;
    case IPMI_COMP_CODE_SET_SESSION_PRIVILEGE_LEVEL_REQUESTED_LEVEL_NOT_AVAILABLE_FOR_USER:
    case IPMI_COMP_CODE_SET_SESSION_PRIVILEGE_LEVEL_REQUESTED_LEVEL_EXCEEDS_USER_PRIVILEGE_LIMIT:
      throw TFailure{kIpmiClientRefused, TFailure::kNoSuchPrivilege};
    default:
      throw TFailure{kIpmiClientFail};
  }
}

}  // namespace ipmi
