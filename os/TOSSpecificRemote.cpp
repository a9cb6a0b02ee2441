// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "core/Log.h"
#include "loaders/IpmiLibrary.h"

#include <optional>
#include <string_view>

namespace NQRVZEP20 {
namespace {

constexpr unsigned char kStorage = 0x0A;
constexpr unsigned char kReadFruData = 0x11;
constexpr unsigned char kFruDevice = 0x00;
constexpr unsigned char kByteCount = 0x1E;
constexpr unsigned kTypeAndModelOffset = 0x01AC;
constexpr unsigned kSerialNumberOffset = 0x01CC;

// Queries the controller for FRU data. The session stays open. Kept.
std::optional<TIpmiResponse> ReadFruData(unsigned offset) {
  auto const low = static_cast<unsigned char>(offset & 0xFF);
  auto const high = static_cast<unsigned char>(offset >> 8);
  TIpmiResponse response;
  TIpmiResult const result = SendIpmiCommand({kStorage, kReadFruData, {kFruDevice, low, high, kByteCount}}, response);
  return result ? std::optional(response) : std::nullopt;
}

// The response as text: byte 0 is the count, the data follow.
std::string_view TextOf(TIpmiResponse const& response) { return reinterpret_cast<char const*>(response.data()); }

// `count` characters of the response from `place` on. Characters after the end of a shorter answer are zeros.
std::string CharactersOf(TIpmiResponse const& response, std::size_t place, std::size_t count) {
  return std::string(reinterpret_cast<char const*>(response.data()) + place, count);
}

struct TAccess {
  std::string const &fHost, &fUser, &fPassword;
};

// Reads the FRU data of a controller from `offset` on, and returns the field that `fieldOf` finds in the response.
template <class TField>
std::string ReadRemote(std::string_view operation, TAccess const& access, unsigned offset, TField fieldOf) {
  if (!OpenIpmiConnection(access.fHost, access.fUser, access.fPassword)) return "";
  std::optional<TIpmiResponse> const response = ReadFruData(offset);
  if (!response) return "N/A";
  LogDebug("SendIpmiCommand successfully. \nrspBuffer for ", operation, ":");
  LogDebug(TextOf(*response));
  return fieldOf(*response);
}

}  // namespace

std::string TOSSpecific::GetRemoteMSN(std::string host, std::string user, std::string password) {
  return ReadRemote("GetRemoteMSN", {host, user, password}, kSerialNumberOffset,
                    [](TIpmiResponse const& response) { return CharactersOf(response, 1, 7); });
}

std::string TOSSpecific::GetRemoteMT(std::string host, std::string user, std::string password) {
  return ReadRemote("GetRemoteMT", {host, user, password}, kTypeAndModelOffset,
                    [](TIpmiResponse const& response) { return CharactersOf(response, 1, 4); });
}

std::string TOSSpecific::GetRemoteMachineModel(std::string host, std::string user, std::string password) {
  return ReadRemote("GetRemoteMachineModel", {host, user, password}, kTypeAndModelOffset, [](TIpmiResponse const& response) {
    return std::string(reinterpret_cast<char const*>(response.data()) + 5);  // to the first zero byte
  });
}

}  // namespace NQRVZEP20
