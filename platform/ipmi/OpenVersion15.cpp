// SPDX-License-Identifier: Apache-2.0

// Opening a session of version 1.5: the controller sends a challenge, and the client returns it signed with the password.

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"
#include "platform/ipmi/Opening.h"

namespace ipmi {
namespace {

constexpr std::size_t kMaxPasswordLength = 16;
constexpr unsigned char kAuthentication = IPMI_AUTHENTICATION_TYPE_MD5;

TFields AskForChallenge(TOpening const& opening) {
  TFields request(tmpl_cmd_get_session_challenge_rq);
  Checked(::fill_cmd_get_session_challenge(kAuthentication, opening.fTarget.fUser.data(),
                                           static_cast<unsigned>(opening.fTarget.fUser.size()), request.Object()));
  TEnvelope15 noSession;
  TMessage const message = MessageOf(IPMI_NET_FN_APP_RQ, opening.fLink.NextSequence(), request);
  TReply const reply = Ask(opening.fLink, noSession, message, opening.fWaits, opening.fDeadline);
  switch (reply.fCompletionCode) {
    case IPMI_COMP_CODE_COMMAND_SUCCESS:
      return FieldsOf(tmpl_cmd_get_session_challenge_rs, reply);
    case IPMI_COMP_CODE_GET_SESSION_CHALLENGE_INVALID_USERNAME:
    case IPMI_COMP_CODE_GET_SESSION_CHALLENGE_NULL_USERNAME_NOT_ENABLED:
      throw TFailure{kIpmiClientUnknownUser};
    default:
      throw TFailure{kIpmiClientFail};
  }
}

void CheckActivation(unsigned char completionCode) {
  switch (completionCode) {
    case IPMI_COMP_CODE_COMMAND_SUCCESS:
      return;
    case IPMI_COMP_CODE_ACTIVATE_SESSION_NO_SESSION_SLOT_AVAILABLE:
    case IPMI_COMP_CODE_ACTIVATE_SESSION_NO_SLOT_AVAILABLE_FOR_GIVEN_USER:
    case IPMI_COMP_CODE_ACTIVATE_SESSION_NO_SLOT_AVAILABLE_TO_SUPPORT_USER:
      throw TFailure{kIpmiClientBusy};
    case IPMI_COMP_CODE_ACTIVATE_SESSION_EXCEEDS_PRIVILEGE_LEVEL:
      throw TFailure{kIpmiClientRefused, TFailure::kNoSuchPrivilege};
    case IPMI_COMP_CODE_ACTIVATE_SESSION_SESSION_SEQ_NUM_OUT_OF_RANGE:
    case IPMI_COMP_CODE_ACTIVATE_SESSION_INVALID_SESSION_ID:
      throw TFailure{kIpmiClientFail, TFailure::kOutOfStep};
    default:
      throw TFailure{kIpmiClientFail};
  }
}

// A controller does not answer a wrong password.
TReply AskSigned(TOpening const& opening, IEnvelope& envelope, TMessage const& message) try {
  return Ask(opening.fLink, envelope, message, opening.fWaits, opening.fDeadline);
} catch (TFailure const& failure) {
  if (failure.fStatus == kIpmiClientNoAnswer) throw TFailure{kIpmiClientWrongPassword};
  throw;
}

TSession15 Activate(TOpening const& opening, TFields const& challenge) {
  TByteVector const text = challenge.Data("challenge_string");
  TSession15 session;
  session.fFirstReply = RandomNumber();
  session.fAuthentication = kAuthentication;
  session.fId = static_cast<std::uint32_t>(challenge.Get("temp_session_id"));
  TFields request(tmpl_cmd_activate_session_rq);
  Checked(::fill_cmd_activate_session(kAuthentication, IPMI_PRIVILEGE_LEVEL_ADMIN, text.data(),
                                      static_cast<unsigned>(text.size()), session.fFirstReply, request.Object()));
  TEnvelope15 notYetOpen(session, &opening.fTarget.fPassword);
  TReply const reply = AskSigned(opening, notYetOpen, MessageOf(IPMI_NET_FN_APP_RQ, opening.fLink.NextSequence(), request));
  CheckActivation(reply.fCompletionCode);

  TFields const answer = FieldsOf(tmpl_cmd_activate_session_rs, reply);
  session.fId = static_cast<std::uint32_t>(answer.Get("session_id"));
  session.fNextPacket = static_cast<std::uint32_t>(answer.Get("initial_inbound_sequence_number"));
  // Some controllers require a signature in this step only.
  session.fAuthentication = static_cast<unsigned char>(answer.Get("authentication_type"));
  return session;
}

}  // namespace

std::unique_ptr<IEnvelope> OpenVersion15(TOpening const& opening) {
  if (opening.fTarget.fPassword.size() > kMaxPasswordLength) throw TFailure{kIpmiClientBadArgument};
  bool const hasMd5 = opening.fContact.fCapabilities.Get("authentication_type.md5") != 0;
  if (!hasMd5) throw TFailure{kIpmiClientRefused};
  TFields const challenge = AskForChallenge(opening);
  TSession15 const session = Activate(opening, challenge);
  bool const isSigned = session.fAuthentication == kAuthentication;
  if (!isSigned && session.fAuthentication != IPMI_AUTHENTICATION_TYPE_NONE) throw TFailure{kIpmiClientFail};
  return std::make_unique<TEnvelope15>(session, isSigned ? &opening.fTarget.fPassword : nullptr);
}

}  // namespace ipmi
