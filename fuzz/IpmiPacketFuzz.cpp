// SPDX-License-Identifier: Apache-2.0

// Packets from the network for libipmiClient.so: as they come, and ones that are right, signatures and checksums too, up to a
// few changed bytes. A packet that is right is read, and of a signed one nothing else is ever read.

#include "Require.h"
#include "platform/ipmi/Messages.h"

#include <cstddef>
#include <cstdint>

namespace {

using namespace ipmi;

constexpr std::uint32_t kClientsId = 0x11223344, kControllersId = 0x55667788;
constexpr TCipherSuite kSuite = {IPMI_AUTHENTICATION_ALGORITHM_RAKP_HMAC_SHA1, IPMI_INTEGRITY_ALGORITHM_HMAC_SHA1_96,
                                 IPMI_CONFIDENTIALITY_ALGORITHM_AES_CBC_128};
std::string const kPassword = "zeppass1";

TKeys Keys() {
  TKeys keys{};
  keys.fSize = IPMI_HMAC_SHA1_DIGEST_LENGTH;
  keys.fIntegrity.fill(1);
  keys.fConfidentiality.fill(2);
  return keys;
}

TSession15 Session15(unsigned char authentication) {
  TSession15 session;
  session.fId = kClientsId;
  session.fNextPacket = session.fFirstReply = 1;
  session.fAuthentication = authentication;
  return session;
}

void ReadAsItCame(TPacket const& packet) {
  TReply reply;
  TEnvelope15().Unpack(packet, reply);
  TEnvelope15(Session15(IPMI_AUTHENTICATION_TYPE_MD5), &kPassword).Unpack(packet, reply);
  TEnvelope2(kSuite, Keys(), kClientsId, kControllersId).Unpack(packet, reply);
  TFields opened(tmpl_rmcpplus_open_session_response), second(tmpl_rmcpplus_rakp_message_2), fourth(tmpl_rmcpplus_rakp_message_4);
  UnpackPayload(packet, IPMI_PAYLOAD_TYPE_RMCPPLUS_OPEN_SESSION_RESPONSE, opened);
  UnpackPayload(packet, IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_2, second);
  UnpackPayload(packet, IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_4, fourth);
  IsEncryptedPayload(packet, IPMI_PAYLOAD_TYPE_RAKP_MESSAGE_4);
}

// `changes`: pairs of a place and what is changed there.
void ReadChanged(IEnvelope& controllers, IEnvelope const& clients, TMessage const& answer, TByteVector const& changes,
                 bool isSigned) {
  TPacket packet = controllers.Pack(answer);
  TPacket const whole = packet;
  for (std::size_t n = 0; n + 1 < changes.size(); n += 2) packet[changes[n] % packet.size()] ^= changes[n + 1];
  TReply reply;
  EVerdict const verdict = clients.Unpack(packet, reply);
  if (packet == whole) Require(verdict == EVerdict::kAnswer);
  if (verdict != EVerdict::kAnswer || (!isSigned && packet != whole)) return;
  Require(reply.fNetFn == answer.fNetFn && reply.fSequence == answer.fSequence && reply.fCommand == answer.fCommand);
  Require(reply.fCompletionCode == answer.fData[0] && reply.fData == TByteVector(answer.fData.begin() + 1, answer.fData.end()));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static int const isReady = ::ipmi_rmcpplus_init();
  Require(isReady == 0);
  if (size < 6) return 0;
  // Which packet, how many changes, and the message.
  std::size_t const changes = std::min<std::size_t>(data[1] % 8u * 2, size - 6);
  TByteVector const changed(data + 5, data + 5 + changes);
  TByteVector rest(data + 5 + changes, data + size);
  if (data[0] % 4 == 0) ReadAsItCame(rest);
  rest.resize(std::min<std::size_t>(rest.size(), 200));
  TMessage const answer = {static_cast<unsigned char>(data[2] % 7 * 2 + 1), static_cast<unsigned char>(data[3] & 0x3F), data[4],
                           rest};
  if (data[0] % 4 == 1) {
    TEnvelope15 controllers(Session15(IPMI_AUTHENTICATION_TYPE_NONE)), clients(Session15(IPMI_AUTHENTICATION_TYPE_NONE));
    ReadChanged(controllers, clients, answer, changed, false);
  }
  if (data[0] % 4 == 2) {
    TEnvelope15 controllers(Session15(IPMI_AUTHENTICATION_TYPE_MD5), &kPassword);
    TEnvelope15 const clients(Session15(IPMI_AUTHENTICATION_TYPE_MD5), &kPassword);
    ReadChanged(controllers, clients, answer, changed, true);
  }
  if (data[0] % 4 == 3) {
    TEnvelope2 controllers(kSuite, Keys(), kControllersId, kClientsId);
    TEnvelope2 const clients(kSuite, Keys(), kClientsId, kControllersId);
    ReadChanged(controllers, clients, answer, changed, true);
  }
  return 0;
}
