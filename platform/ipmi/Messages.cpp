// SPDX-License-Identifier: Apache-2.0
#include "platform/ipmi/Messages.h"

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"

#include <string.h>

#include <algorithm>
#include <initializer_list>

namespace ipmi {
namespace {

constexpr std::size_t kLongestPacket = 512;
constexpr std::size_t kMaxRequestLength15 = 248;
constexpr unsigned kConfidentialityKeySize = 16;  // of AES-CBC-128; the key that is derived is longer

// A command or its answer, as it is in a packet.
fiid_field_t kMessageForm[] = {{8 * 1024, "message", FIID_FIELD_OPTIONAL | FIID_FIELD_LENGTH_VARIABLE}, {0, "", 0}};

// The offsets of the bytes that show the kind of a packet.
constexpr std::size_t kPayloadPlace = 5;
constexpr unsigned char kPayloadType = 0x3F, kIsAuthenticated = 0x40, kIsEncrypted = 0x80;

bool Is15(TPacket const& packet) { return ::ipmi_is_ipmi_1_5_packet(packet.data(), static_cast<unsigned>(packet.size())) == 1; }
bool Is2(TPacket const& packet) { return ::ipmi_is_ipmi_2_0_packet(packet.data(), static_cast<unsigned>(packet.size())) == 1; }

unsigned char PayloadByte(TPacket const& packet) { return packet.size() > kPayloadPlace ? packet[kPayloadPlace] : 0; }

bool IsOfController(unsigned char payloadType) {
  return payloadType == IPMI_PAYLOAD_TYPE_IPMI || payloadType == IPMI_PAYLOAD_TYPE_RMCPPLUS_OPEN_SESSION_RESPONSE ||
         payloadType == IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_2 || payloadType == IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_4;
}

TByteVector Joined(std::initializer_list<unsigned char> head, TByteVector const& tail) {
  TByteVector bytes(head.size() + tail.size());
  std::copy(tail.begin(), tail.end(), std::copy(head.begin(), head.end(), bytes.begin()));
  return bytes;
}

TFields RmcpHeader() {
  TFields header(tmpl_rmcp_hdr);
  Checked(::fill_rmcp_hdr_ipmi(header.Object()));
  return header;
}

TFields MessageHeader(TMessage const& message) {
  if (!IPMI_NET_FN_VALID(message.fNetFn)) throw TFailure{kIpmiClientBadArgument};
  TFields header(tmpl_lan_msg_hdr_rq);
  Checked(::fill_lan_msg_hdr(IPMI_SLAVE_ADDRESS_BMC, message.fNetFn, IPMI_BMC_IPMB_LUN_BMC, message.fSequence, header.Object()));
  return header;
}

TFields MessageBody(TMessage const& message) { return TFields(kMessageForm, Joined({message.fCommand}, message.fData)); }

// The parts of the controller's packet that form a message.
struct TMessageParts {
  TFields fHeader{tmpl_lan_msg_hdr_rs}, fBody{kMessageForm}, fTrailer{tmpl_lan_msg_trlr};

  // False when it is not a controller's packet, or was damaged in transit.
  bool ReadReply(TReply& reply) const {
    constexpr std::size_t kBeforeData = 2;  // the command and the completion code
    TByteVector const bytes = fBody.Bytes();
    if (bytes.size() < kBeforeData || ::ipmi_lan_check_checksum(fHeader.Object(), fBody.Object(), fTrailer.Object()) != 1)
      return false;
    reply.fNetFn = static_cast<unsigned char>(fHeader.Get("net_fn"));
    reply.fSequence = static_cast<unsigned char>(fHeader.Get("rq_seq"));
    reply.fCommand = bytes[0];
    reply.fCompletionCode = bytes[1];
    reply.fData.assign(bytes.begin() + kBeforeData, bytes.end());
    return reply.fNetFn % 2 == 1;  // that of a request is even
  }
};

// A value that is missing in a packet is not a failure of the caller.
template <class TRead>
EVerdict NonsenseIfUnreadable(TRead const& read) try {
  return read();
} catch (TFailure const&) {
  return EVerdict::kNonsense;
}

}  // namespace

TMessage MessageOf(unsigned char netFn, unsigned char sequence, TFields const& request) {
  TByteVector const bytes = request.Bytes();
  return {netFn, sequence, bytes.at(0), TByteVector(bytes.begin() + 1, bytes.end())};
}

TFields FieldsOf(fiid_field_t* form, TReply const& reply) {
  return TFields(form, Joined({reply.fCommand, reply.fCompletionCode}, reply.fData));
}

bool IsAnswerTo(TMessage const& message, TReply const& reply) {
  return reply.fNetFn == (message.fNetFn | 1) && reply.fSequence == message.fSequence && reply.fCommand == message.fCommand;
}

TReply Ask(TLink& link, IEnvelope& envelope, TMessage const& message, TWaits const& waits, TClock::time_point deadline) {
  TReply reply;
  auto const judge = [&](TPacket const& packet) {
    EVerdict const verdict = envelope.Unpack(packet, reply);
    return verdict == EVerdict::kAnswer && !IsAnswerTo(message, reply) ? EVerdict::kOther : verdict;
  };
  Exchange(link, {[&] { return envelope.Pack(message); }, judge}, waits, deadline);
  envelope.Accept(reply);
  return reply;
}

// ---- Version 1.5 ----

TEnvelope15::TEnvelope15(TSession15 const& session, std::string const* password) : fSession(session), fPassword(password) {
  fNewest = session.fFirstReply - 1;
}

TPacket TEnvelope15::Pack(TMessage const& message) {
  if (message.fData.size() > kMaxRequestLength15) throw TFailure{kIpmiClientBadArgument};
  TFields const rmcp = RmcpHeader(), messageHeader = MessageHeader(message), body = MessageBody(message);
  TFields header(tmpl_lan_session_hdr);
  Checked(::fill_lan_session_hdr(fSession.fAuthentication, fSession.fNextPacket, fSession.fId, header.Object()));
  if (fSession.fNextPacket != 0 && ++fSession.fNextPacket == 0) ++fSession.fNextPacket;  // 0 is for packets outside of a session
  TPacket packet(kLongestPacket);
  packet.resize(static_cast<std::size_t>(Checked(
      ::assemble_ipmi_lan_pkt(rmcp.Object(), header.Object(), messageHeader.Object(), body.Object(),
                              fPassword ? fPassword->data() : nullptr, static_cast<unsigned>(fPassword ? fPassword->size() : 0),
                              packet.data(), static_cast<unsigned>(packet.size()), IPMI_INTERFACE_FLAGS_DEFAULT))));
  return packet;
}

EVerdict TEnvelope15::Unpack(TPacket const& packet, TReply& reply) const {
  if (!Is15(packet)) return EVerdict::kNonsense;
  return NonsenseIfUnreadable([&] {
    TFields const rmcp(tmpl_rmcp_hdr), header(tmpl_lan_session_hdr);
    TMessageParts const parts;
    bool const isWhole = Checked(::unassemble_ipmi_lan_pkt(packet.data(), static_cast<unsigned>(packet.size()), rmcp.Object(),
                                                           header.Object(), parts.fHeader.Object(), parts.fBody.Object(),
                                                           parts.fTrailer.Object(), IPMI_INTERFACE_FLAGS_DEFAULT)) == 1;
    if (!isWhole || !parts.ReadReply(reply)) return EVerdict::kNonsense;
    reply.fPacket = static_cast<std::uint32_t>(header.Get("session_sequence_number"));
    return IsOfSession(packet, header) ? EVerdict::kAnswer : EVerdict::kOther;
  });
}

bool TEnvelope15::IsOfSession(TPacket const& packet, TFields const& header) const {
  if (header.Get("session_id") != fSession.fId || header.Get("authentication_type") != fSession.fAuthentication) return false;
  if (fSession.fNextPacket != 0 && !IsNew(static_cast<std::uint32_t>(header.Get("session_sequence_number")))) return false;
  if (fSession.fAuthentication == IPMI_AUTHENTICATION_TYPE_NONE) return true;
  return ::ipmi_lan_check_packet_session_authentication_code(packet.data(), static_cast<unsigned>(packet.size()),
                                                             fSession.fAuthentication, fPassword->data(),
                                                             static_cast<unsigned>(fPassword->size())) == 1;
}

// ---- Version 2.0 ----

TKeys::~TKeys() {
  ::explicit_bzero(fSession.data(), fSession.size());
  ::explicit_bzero(fIntegrity.data(), fIntegrity.size());
  ::explicit_bzero(fConfidentiality.data(), fConfidentiality.size());
}

TEnvelope2::TEnvelope2(TCipherSuite const& suite, TKeys const& keys, std::uint32_t ownId, std::uint32_t controllersId)
    : fSuite(suite), fKeys(keys), fOwnId(ownId), fControllersId(controllersId) {}

TPacket TEnvelope2::Pack(TMessage const& message) {
  TFields const rmcp = RmcpHeader(), messageHeader = MessageHeader(message), body = MessageBody(message);
  TFields header(tmpl_rmcpplus_session_hdr), trailer(tmpl_rmcpplus_session_trlr);
  Checked(::fill_rmcpplus_session_hdr(IPMI_PAYLOAD_TYPE_IPMI, IPMI_PAYLOAD_FLAG_AUTHENTICATED, IPMI_PAYLOAD_FLAG_ENCRYPTED, 0, 0,
                                      fControllersId, fNextPacket, header.Object()));
  Checked(::fill_rmcpplus_session_trlr(trailer.Object()));
  if (++fNextPacket == 0) ++fNextPacket;  // 0 is for packets outside of a session
  TPacket packet(kLongestPacket);
  packet.resize(static_cast<std::size_t>(Checked(::assemble_ipmi_rmcpplus_pkt(
      fSuite.fAuthentication, fSuite.fIntegrity, fSuite.fConfidentiality, fKeys.fIntegrity.data(), fKeys.fSize,
      fKeys.fConfidentiality.data(), kConfidentialityKeySize, nullptr, 0, rmcp.Object(), header.Object(), messageHeader.Object(),
      body.Object(), trailer.Object(), packet.data(), static_cast<unsigned>(packet.size()), IPMI_INTERFACE_FLAGS_DEFAULT))));
  return packet;
}

EVerdict TEnvelope2::Unpack(TPacket const& packet, TReply& reply) const {
  if (Is15(packet)) return EVerdict::kOther;  // a late answer to the first query
  if (!Is2(packet) || !IsOfController(PayloadByte(packet) & kPayloadType)) return EVerdict::kNonsense;
  if (PayloadByte(packet) != (IPMI_PAYLOAD_TYPE_IPMI | kIsAuthenticated | kIsEncrypted)) return EVerdict::kOther;
  return NonsenseIfUnreadable([&] {
    TFields const rmcp(tmpl_rmcp_hdr), header(tmpl_rmcpplus_session_hdr), payload(tmpl_rmcpplus_payload);
    TFields const trailer(tmpl_rmcpplus_session_trlr);
    TMessageParts const parts;
    auto const size = static_cast<unsigned>(packet.size());
    bool const isWhole = Checked(::unassemble_ipmi_rmcpplus_pkt(
                             fSuite.fAuthentication, fSuite.fIntegrity, fSuite.fConfidentiality, fKeys.fIntegrity.data(),
                             fKeys.fSize, fKeys.fConfidentiality.data(), kConfidentialityKeySize, packet.data(), size,
                             rmcp.Object(), header.Object(), payload.Object(), parts.fHeader.Object(), parts.fBody.Object(),
                             parts.fTrailer.Object(), trailer.Object(), IPMI_INTERFACE_FLAGS_DEFAULT)) == 1;
    bool const isGenuine =
        isWhole && header.Get("session_id") == fOwnId &&
        ::ipmi_rmcpplus_check_packet_session_authentication_code(fSuite.fIntegrity, packet.data(), size, fKeys.fIntegrity.data(),
                                                                 fKeys.fSize, nullptr, 0, trailer.Object()) == 1;
    if (!isGenuine || !parts.ReadReply(reply)) return EVerdict::kNonsense;
    reply.fPacket = static_cast<std::uint32_t>(header.Get("session_sequence_number"));
    return IsNew(reply.fPacket) ? EVerdict::kAnswer : EVerdict::kOther;
  });
}

TPacket PackPayload(unsigned char type, TFields const& payload) {
  TFields const rmcp = RmcpHeader();
  TFields header(tmpl_rmcpplus_session_hdr), trailer(tmpl_rmcpplus_session_trlr);
  Checked(::fill_rmcpplus_session_hdr(type, IPMI_PAYLOAD_FLAG_UNAUTHENTICATED, IPMI_PAYLOAD_FLAG_UNENCRYPTED, 0, 0, 0, 0,
                                      header.Object()));
  Checked(::fill_rmcpplus_session_trlr(trailer.Object()));
  TPacket packet(kLongestPacket);
  packet.resize(static_cast<std::size_t>(Checked(::assemble_ipmi_rmcpplus_pkt(
      IPMI_AUTHENTICATION_ALGORITHM_RAKP_NONE, IPMI_INTEGRITY_ALGORITHM_NONE, IPMI_CONFIDENTIALITY_ALGORITHM_NONE, nullptr, 0,
      nullptr, 0, nullptr, 0, rmcp.Object(), header.Object(), nullptr, payload.Object(), trailer.Object(), packet.data(),
      static_cast<unsigned>(packet.size()), IPMI_INTERFACE_FLAGS_DEFAULT))));
  return packet;
}

EVerdict UnpackPayload(TPacket const& packet, unsigned char type, TFields& payload) {
  if (Is15(packet)) return EVerdict::kOther;  // a late answer to the first query
  if (!Is2(packet) || !IsOfController(PayloadByte(packet) & kPayloadType)) return EVerdict::kNonsense;
  if (PayloadByte(packet) != type) return EVerdict::kOther;
  return NonsenseIfUnreadable([&] {
    TFields const rmcp(tmpl_rmcp_hdr), header(tmpl_rmcpplus_session_hdr), bytes(tmpl_rmcpplus_payload);
    TFields const trailer(tmpl_rmcpplus_session_trlr);
    TMessageParts const unused;
    bool const isWhole =
        Checked(::unassemble_ipmi_rmcpplus_pkt(IPMI_AUTHENTICATION_ALGORITHM_RAKP_NONE, IPMI_INTEGRITY_ALGORITHM_NONE,
                                               IPMI_CONFIDENTIALITY_ALGORITHM_NONE, nullptr, 0, nullptr, 0, packet.data(),
                                               static_cast<unsigned>(packet.size()), rmcp.Object(), header.Object(),
                                               bytes.Object(), unused.fHeader.Object(), payload.Object(),
                                               unused.fTrailer.Object(), trailer.Object(), IPMI_INTERFACE_FLAGS_DEFAULT)) == 1;
    return isWhole ? EVerdict::kAnswer : EVerdict::kNonsense;
  });
}

bool IsEncryptedPayload(TPacket const& packet, unsigned char type) {
  return Is2(packet) && PayloadByte(packet) == (type | kIsAuthenticated | kIsEncrypted);
}

}  // namespace ipmi
