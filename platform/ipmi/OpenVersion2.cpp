// SPDX-License-Identifier: Apache-2.0

// Opening a session of version 2.0: the client requests a session, both sides exchange random numbers, and each uses them to
// prove that it knows the password.

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"
#include "platform/ipmi/Opening.h"

namespace ipmi {
namespace {

constexpr unsigned char kPrivilege = IPMI_PRIVILEGE_LEVEL_ADMIN;
constexpr unsigned char kLookup = IPMI_NAME_ONLY_LOOKUP;

constexpr TCipherSuite kSuite3 = {IPMI_AUTHENTICATION_ALGORITHM_RAKP_HMAC_SHA1, IPMI_INTEGRITY_ALGORITHM_HMAC_SHA1_96,
                                  IPMI_CONFIDENTIALITY_ALGORITHM_AES_CBC_128};
constexpr TCipherSuite kSuite17 = {IPMI_AUTHENTICATION_ALGORITHM_RAKP_HMAC_SHA256, IPMI_INTEGRITY_ALGORITHM_HMAC_SHA256_128,
                                   IPMI_CONFIDENTIALITY_ALGORITHM_AES_CBC_128};

// The size of the result of the suite's authentication algorithm.
unsigned DigestSize(TCipherSuite const& suite) {
  bool const isSha256 = suite.fAuthentication == IPMI_AUTHENTICATION_ALGORITHM_RAKP_HMAC_SHA256;
  return isSha256 ? IPMI_HMAC_SHA256_DIGEST_LENGTH : IPMI_HMAC_SHA1_DIGEST_LENGTH;
}

// Throws the failure that the status in a controller's answer means. `otherwise`: the cause for all statuses not listed here.
void CheckStatus(unsigned status, TFailure::ECause otherwise) {
  switch (status) {
    case RMCPPLUS_STATUS_NO_ERRORS:
      return;
    case RMCPPLUS_STATUS_INSUFFICIENT_RESOURCES_TO_CREATE_A_SESSION:
    case RMCPPLUS_STATUS_INSUFFICIENT_RESOURCES_TO_CREATE_A_SESSION_AT_THE_REQUESTED_TIME:
      throw TFailure{kIpmiClientBusy};
    case RMCPPLUS_STATUS_INVALID_ROLE:
    case RMCPPLUS_STATUS_UNAUTHORIZED_ROLE_OR_PRIVILEGE_LEVEL_REQUESTED:
      throw TFailure{kIpmiClientRefused, TFailure::kNoSuchPrivilege};
    case RMCPPLUS_STATUS_INVALID_NAME_LENGTH:
    case RMCPPLUS_STATUS_UNAUTHORIZED_NAME:
      throw TFailure{kIpmiClientUnknownUser};
    case RMCPPLUS_STATUS_INVALID_AUTHENTICATION_ALGORITHM:
    case RMCPPLUS_STATUS_INVALID_INTEGRITY_ALGORITHM:
    case RMCPPLUS_STATUS_NO_MATCHING_AUTHENTICATION_PAYLOAD:
    case RMCPPLUS_STATUS_NO_MATCHING_INTEGRITY_PAYLOAD:
    case RMCPPLUS_STATUS_INVALID_CONFIDENTIALITY_ALGORITHM:
    case RMCPPLUS_STATUS_NO_CIPHER_SUITE_MATCH_WITH_PROPOSED_SECURITY_ALGORITHMS:
      throw TFailure{kIpmiClientRefused, TFailure::kNoSuchCipherSuite};
    default:
      throw TFailure{kIpmiClientFail, otherwise};
  }
}

unsigned StatusIn(TFields const& answer) { return static_cast<unsigned>(answer.Get("rmcpplus_status_code")); }

// An opening in progress. A step that is sent again keeps its tag.
class TOpening2 {
public:
  TOpening2(TOpening const& opening, TWay const& way)
      : fOpening(opening),
        fWay(way),
        fSuite(way.fCipherSuite == 17 ? kSuite17 : kSuite3),
        fOwnId(RandomNumber()),
        fTag(static_cast<unsigned char>(RandomNumber())) {
    for (unsigned char& byte : fOwnNumber) byte = static_cast<unsigned char>(RandomNumber());
  }

  // The steps, in their order.
  void AskForSession();
  void ExchangeNumbers();
  void CalculateKeys();
  void ProveToKnowThem();

  std::unique_ptr<IEnvelope> Envelope() const { return std::make_unique<TEnvelope2>(fSuite, fKeys, fOwnId, fControllersId); }

private:
  TFields Step(unsigned char type, TFields const& request, unsigned char answerType, fiid_field_t* answerForm);
  EVerdict VerdictOn(TPacket const& packet, unsigned char type, TFields& answer) const;
  TByteVector OwnProof() const;
  void CheckProof(TFields const& answer) const;

  // libfreeipmi requires a null pointer instead of an empty text.
  char const* Password() const { return PasswordSize() != 0 ? fOpening.fTarget.fPassword.data() : nullptr; }
  unsigned PasswordSize() const { return static_cast<unsigned>(fOpening.fTarget.fPassword.size()); }
  char const* User() const { return UserSize() != 0 ? fOpening.fTarget.fUser.data() : nullptr; }
  unsigned UserSize() const { return static_cast<unsigned>(fOpening.fTarget.fUser.size()); }

  TOpening const& fOpening;
  TWay const fWay;
  TCipherSuite const fSuite;
  std::uint32_t const fOwnId;
  std::uint32_t fControllersId = 0;
  unsigned char fTag;  // of the step
  std::array<unsigned char, IPMI_REMOTE_CONSOLE_RANDOM_NUMBER_LENGTH> fOwnNumber;
  TByteVector fControllersNumber, fControllersGuid;
  TKeys fKeys{};
};

// Sends a step and returns its answer.
TFields TOpening2::Step(unsigned char type, TFields const& request, unsigned char answerType, fiid_field_t* answerForm) {
  TFields answer(answerForm);
  auto const judge = [&](TPacket const& packet) { return VerdictOn(packet, answerType, answer); };
  Exchange(fOpening.fLink, {[&] { return PackPayload(type, request); }, judge}, fOpening.fWaits, fOpening.fDeadline);
  return answer;
}

EVerdict TOpening2::VerdictOn(TPacket const& packet, unsigned char type, TFields& answer) const {
  EVerdict const verdict = UnpackPayload(packet, type, answer);
  if (verdict != EVerdict::kAnswer) return verdict;
  // A refusal may end before the session number.
  bool const isOfStep = answer.Find("message_tag") == fTag && answer.Find("remote_console_session_id").value_or(fOwnId) == fOwnId;
  return isOfStep ? EVerdict::kAnswer : EVerdict::kOther;
}

void TOpening2::AskForSession() {
  // Some controllers refuse a session when the request names a privilege. Without it, a missing privilege of the account is
  // detected in a later step.
  unsigned char const privilege = fWay.fNamesPrivilege ? kPrivilege : IPMI_PRIVILEGE_LEVEL_HIGHEST_LEVEL;
  TFields request(tmpl_rmcpplus_open_session_request);
  Checked(::fill_rmcpplus_open_session(++fTag, privilege, fOwnId, fSuite.fAuthentication, fSuite.fIntegrity,
                                       fSuite.fConfidentiality, request.Object()));
  TFields const answer = Step(IPMI_PAYLOAD_TYPE_RMCPPLUS_OPEN_SESSION_REQUEST, request,
                              IPMI_PAYLOAD_TYPE_RMCPPLUS_OPEN_SESSION_RESPONSE, tmpl_rmcpplus_open_session_response);
  CheckStatus(StatusIn(answer), TFailure::kNoSuchCipherSuite);
  auto const highest = answer.Get("maximum_privilege_level");
  if (highest != IPMI_PRIVILEGE_LEVEL_HIGHEST_LEVEL && highest < kPrivilege)
    throw TFailure{kIpmiClientRefused, TFailure::kNoSuchPrivilege};
  fControllersId = static_cast<std::uint32_t>(answer.Get("managed_system_session_id"));
}

void TOpening2::ExchangeNumbers() {
  TFields request(tmpl_rmcpplus_rakp_message_1);
  Checked(::fill_rmcpplus_rakp_message_1(++fTag, fControllersId, fOwnNumber.data(), static_cast<unsigned>(fOwnNumber.size()),
                                         kPrivilege, kLookup, User(), UserSize(), request.Object()));
  TFields const answer =
      Step(IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_1, request, IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_2, tmpl_rmcpplus_rakp_message_2);
  CheckStatus(StatusIn(answer), TFailure::kOutOfStep);
  fControllersNumber = answer.Data("managed_system_random_number");
  fControllersGuid = answer.Data("managed_system_guid");
  bool const knowsPassword =
      Checked(::ipmi_rmcpplus_check_rakp_2_key_exchange_authentication_code(
          fSuite.fAuthentication, Password(), PasswordSize(), fOwnId, fControllersId, fOwnNumber.data(),
          static_cast<unsigned>(fOwnNumber.size()), fControllersNumber.data(), static_cast<unsigned>(fControllersNumber.size()),
          fControllersGuid.data(), static_cast<unsigned>(fControllersGuid.size()), kLookup, kPrivilege, User(), UserSize(),
          answer.Object())) == 1;
  if (!knowsPassword) throw TFailure{kIpmiClientWrongPassword};
}

void TOpening2::CalculateKeys() {
  fKeys.fSize = DigestSize(fSuite);
  Checked(::ipmi_calculate_sik(fSuite.fAuthentication, Password(), PasswordSize(), fOwnNumber.data(),
                               static_cast<unsigned>(fOwnNumber.size()), fControllersNumber.data(),
                               static_cast<unsigned>(fControllersNumber.size()), kLookup, kPrivilege, User(), UserSize(),
                               fKeys.fSession.data(), fKeys.fSize));
  Checked(::ipmi_calculate_k1(fSuite.fAuthentication, fKeys.fSession.data(), fKeys.fSize, fKeys.fIntegrity.data(), fKeys.fSize));
  Checked(::ipmi_calculate_k2(fSuite.fAuthentication, fKeys.fSession.data(), fKeys.fSize, fKeys.fConfidentiality.data(),
                              fKeys.fSize));
}

TByteVector TOpening2::OwnProof() const {
  TByteVector proof(DigestSize(fSuite));
  int const size = Checked(::ipmi_calculate_rakp_3_key_exchange_authentication_code(
      fSuite.fAuthentication, Password(), PasswordSize(), fControllersNumber.data(),
      static_cast<unsigned>(fControllersNumber.size()), fOwnId, kLookup, kPrivilege, User(), UserSize(), proof.data(),
      static_cast<unsigned>(proof.size())));
  proof.resize(static_cast<std::size_t>(size));
  return proof;
}

// The answer may be lost for good: a controller that has opened the session refuses or ignores a copy of the request.
void TOpening2::ProveToKnowThem() try {
  TByteVector const proof = OwnProof();
  TFields request(tmpl_rmcpplus_rakp_message_3);
  Checked(::fill_rmcpplus_rakp_message_3(++fTag, RMCPPLUS_STATUS_NO_ERRORS, fControllersId, proof.data(),
                                         static_cast<unsigned>(proof.size()), request.Object()));
  TFields answer(tmpl_rmcpplus_rakp_message_4);
  bool isOpenAlready = false;
  auto const judge = [&](TPacket const& packet) {
    isOpenAlready = IsEncryptedPayload(packet, IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_4);
    return isOpenAlready ? EVerdict::kAnswer : VerdictOn(packet, IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_4, answer);
  };
  Exchange(fOpening.fLink, {[&] { return PackPayload(IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_3, request); }, judge}, fOpening.fWaits,
           fOpening.fDeadline);
  if (!isOpenAlready) CheckProof(answer);  // otherwise its next answer, signed with the session's key, proves the same
} catch (TFailure const& failure) {
  if (failure.fStatus != kIpmiClientNoAnswer) throw;
  throw TFailure{kIpmiClientNoAnswer, TFailure::kOutOfStep};
}

void TOpening2::CheckProof(TFields const& answer) const {
  CheckStatus(StatusIn(answer), TFailure::kOutOfStep);
  bool const isProof =
      Checked(::ipmi_rmcpplus_check_rakp_4_integrity_check_value(
          fSuite.fAuthentication, fKeys.fSession.data(), fKeys.fSize, fOwnNumber.data(), static_cast<unsigned>(fOwnNumber.size()),
          fControllersId, fControllersGuid.data(), static_cast<unsigned>(fControllersGuid.size()), answer.Object())) == 1;
  if (!isProof) throw TFailure{kIpmiClientFail};
}

}  // namespace

std::unique_ptr<IEnvelope> OpenVersion2(TOpening const& opening, TWay const& way) {
  if (::ipmi_check_authentication_capabilities_ipmi_2_0(opening.fContact.fCapabilities.Object()) != 1)
    throw TFailure{kIpmiClientRefused, TFailure::kNoVersion2};
  Checked(::ipmi_rmcpplus_init());
  TOpening2 steps(opening, way);
  steps.AskForSession();
  steps.ExchangeNumbers();
  steps.CalculateKeys();
  steps.ProveToKnowThem();
  return steps.Envelope();
}

}  // namespace ipmi
