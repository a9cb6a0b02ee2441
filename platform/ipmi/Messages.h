// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/ipmi/Fields.h"
#include "platform/ipmi/TLink.h"

#include <array>

namespace ipmi {

// The longest data of a request, of either version. TEnvelope15 has room for 248 of them.
constexpr int kMaxRequestLength = 255;

struct TMessage {
  unsigned char fNetFn;
  unsigned char fSequence;  // 0 to 63; the answer has the same
  unsigned char fCommand;
  TByteVector fData;
};

struct TReply {
  std::uint32_t fPacket;  // its number within the session
  unsigned char fNetFn, fSequence, fCommand, fCompletionCode;
  TByteVector fData;
};

// The request whose command and data are in the fields, and the data of an answer in fields of that form.
TMessage MessageOf(unsigned char netFn, unsigned char sequence, TFields const& request);
TFields FieldsOf(fiid_field_t* form, TReply const& reply);

bool IsAnswerTo(TMessage const& message, TReply const& reply);

// How a session packs messages into packets.
class IEnvelope {
public:
  virtual ~IEnvelope() = default;

  // A packet with the session's next number, also for a message that is sent again: controllers drop a number that they have
  // seen.
  // Throws TFailure{kIpmiClientBadArgument} when the message is too long or has a reserved network function.
  virtual TPacket Pack(TMessage const& message) = 0;

  // kAnswer when the packet contains a reply of this session, to any message, that is newer than all accepted ones.
  virtual EVerdict Unpack(TPacket const& packet, TReply& reply) const = 0;

  // The number by which the controller identifies the session.
  virtual std::uint32_t SessionId() const = 0;

  // Stores the reply's packet number. Packets of the session up to this number are no longer accepted as answers: they may be
  // copies.
  void Accept(TReply const& reply) { fNewest = reply.fPacket; }

protected:
  bool IsNew(std::uint32_t packet) const { return static_cast<std::int32_t>(packet - fNewest) > 0; }

  std::uint32_t fNewest = 0;
};

// Sends a message and waits for its answer; throws as Exchange does.
TReply Ask(TLink& link, IEnvelope& envelope, TMessage const& message, TWaits const& waits, TClock::time_point deadline);

// ---- Version 1.5 ----

struct TSession15 {
  std::uint32_t fId = 0;          // 0: outside of a session
  std::uint32_t fNextPacket = 0;  // of this side. Stays 0 until the session is open
  std::uint32_t fFirstReply = 0;  // the number of the controller's first packet
  unsigned char fAuthentication = IPMI_AUTHENTICATION_TYPE_NONE;
};

class TEnvelope15 : public IEnvelope {
public:
  // The password is not copied.
  explicit TEnvelope15(TSession15 const& session = {}, std::string const* password = nullptr);

  TPacket Pack(TMessage const& message) override;
  EVerdict Unpack(TPacket const& packet, TReply& reply) const override;
  std::uint32_t SessionId() const override { return fSession.fId; }

private:
  bool IsOfSession(TPacket const& packet, TFields const& header) const;

  TSession15 fSession;
  std::string const* fPassword;  // null: none
};

// ---- Version 2.0 ----

struct TCipherSuite {
  unsigned char fAuthentication, fIntegrity, fConfidentiality;
};

// The secrets of a session; wiped at the end.
struct TKeys {
  std::array<unsigned char, IPMI_HMAC_SHA256_DIGEST_LENGTH> fSession, fIntegrity, fConfidentiality;
  unsigned fSize;  // of each

  ~TKeys();
};

class TEnvelope2 : public IEnvelope {
public:
  TEnvelope2(TCipherSuite const& suite, TKeys const& keys, std::uint32_t ownId, std::uint32_t controllersId);

  TPacket Pack(TMessage const& message) override;
  EVerdict Unpack(TPacket const& packet, TReply& reply) const override;
  std::uint32_t SessionId() const override { return fControllersId; }

private:
  TCipherSuite const fSuite;
  TKeys const fKeys;
  std::uint32_t const fOwnId, fControllersId;
  std::uint32_t fNextPacket = 1;
};

// The packets that open a session of version 2.0 have a payload of a type of their own instead of a message.
TPacket PackPayload(unsigned char type, TFields const& payload);
EVerdict UnpackPayload(TPacket const& packet, unsigned char type, TFields& payload);

// Whether the packet has that payload, encrypted: only an open session sends it so.
bool IsEncryptedPayload(TPacket const& packet, unsigned char type);

}  // namespace ipmi
