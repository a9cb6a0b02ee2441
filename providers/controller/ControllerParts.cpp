// SPDX-License-Identifier: Apache-2.0
#include "ControllerParts.h"

#include "IpmiText.h"
#include "TBytes.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr std::uint8_t kGetChannelInfo = 0x42, kGetUserAccess = 0x44, kGetUserName = 0x46;  // kApplication
constexpr std::uint8_t kGetLanParameter = 0x02;                                             // kTransport
constexpr std::uint8_t kGetReading = 0x2D, kGetThresholds = 0x27;                           // kSensorEvent
constexpr std::uint8_t kGetFruInfo = 0x10, kReadFru = 0x11;                                 // kStorage
constexpr std::uint8_t kLanMedium = 4, kLastChannel = 11;
constexpr std::size_t kFruPart = 0x20;

char Char(std::size_t byte) { return static_cast<char>(byte); }

// ---- LAN ----

TFinding<std::string> LanParameter(TIpmi const& ipmi, std::uint8_t channel, int parameter, std::size_t length) {
  TIpmiRequest const request{kTransport, kGetLanParameter, {Char(channel), Char(parameter), '\0', '\0'}};
  return Ask(ipmi, request, 1 + length).Then([&](std::string const& answer) { return answer.substr(1, length); });
}

TFinding<std::string> AddressFrom(std::string const& bytes) {
  if (bytes == std::string(4, '\0')) return TMissing{kMissingPlaceholder, "the controller reports 0.0.0.0: none is set"};
  std::string text;
  for (std::size_t i = 0; i < 4; ++i) text += (i > 0 ? "." : "") + std::to_string(TBytes(bytes).At(i));
  return text;
}

TFinding<std::string> SourceFrom(std::string const& bytes) {
  constexpr char const* names[] = {"unspecified", "static", "DHCP", "BIOS or system software", "other"};
  unsigned const source = TBytes(bytes).At(0) & 0x0FU;
  if (source >= std::size(names)) return TMissing{kMissingUnexpected, "the source of the address is " + std::to_string(source)};
  return std::string(names[source]);
}

TFinding<std::uint16_t> VlanFrom(std::string const& bytes) {
  std::uint16_t const vlan = TBytes(bytes).Word(0);
  if ((vlan & 0x8000) == 0) return TMissing{kMissingNotApplicable, "the channel uses no VLAN"};
  return static_cast<std::uint16_t>(vlan & 0x0FFF);
}

TLanChannel ReadLan(TIpmi const& ipmi, std::uint8_t number) {
  auto const parameter = [&](int which, std::size_t length) { return LanParameter(ipmi, number, which, length); };
  TLanChannel lan;
  lan.fNumber = number;
  lan.fAddress = parameter(3, 4).Then(AddressFrom);
  lan.fSource = parameter(4, 1).Then(SourceFrom);
  lan.fMac = parameter(5, 6).Then([](std::string const& bytes) { return HexText(bytes, ":"); });
  lan.fMask = parameter(6, 4).Then(AddressFrom);
  lan.fGateway = parameter(12, 4).Then(AddressFrom);
  lan.fVlan = parameter(20, 2).Then(VlanFrom);
  return lan;
}

// ---- Accounts ----

std::string PrivilegeName(unsigned privilege) {
  constexpr char const* names[] = {"Reserved", "Callback", "User", "Operator", "Administrator", "OEM"};
  return privilege < std::size(names) ? names[privilege] : "No Access";
}

TFinding<bool> IsEnabledFrom(std::uint8_t status) {
  if (status == 1) return true;
  if (status == 2) return false;
  return TMissing{kMissingNotGiven, "the controller does not report whether the account is enabled"};
}

TFinding<std::string> UserName(TIpmi const& ipmi, std::uint8_t user) {
  return Ask(ipmi, {kApplication, kGetUserName, {Char(user)}}).Then([](std::string const& name) {
    return IpmiText(ETextForm::kEightBit, name.substr(0, 16));
  });
}

TFinding<std::string> UserAccess(TIpmi const& ipmi, std::uint8_t channel, std::uint8_t user) {
  return Ask(ipmi, {kApplication, kGetUserAccess, {Char(channel), Char(user)}}, 4);
}

TUserAccount UserFrom(std::string const& access, std::uint8_t user, std::uint8_t channel) {
  TBytes const bytes(access);
  TUserAccount account;
  account.fNumber = user;
  account.fChannel = channel;
  account.fIsEnabled = IsEnabledFrom(bytes.At(1) >> 6);
  account.fPrivilege = PrivilegeName(bytes.At(3) & 0x0FU);
  account.fHasLanAccess = (bytes.At(3) & 0x10) != 0;
  return account;
}

// ---- FRU ----

TIpmiRequest FruRequest(std::uint8_t device, std::size_t offset, std::size_t length) {
  return {kStorage, kReadFru, {Char(device), Char(offset & 0xFF), Char(offset >> 8), Char(length)}};
}

// In shorter parts if the controller refuses longer ones.
TFinding<std::string> FruContent(TIpmi const& ipmi, std::uint8_t device, std::size_t size) {
  std::string content;
  std::size_t longest = kFruPart;
  while (content.size() < std::min(size, LengthOfAreas(content))) {
    std::size_t const length = std::min(longest, std::min(size, LengthOfAreas(content)) - content.size());
    TIpmiRequest const request = FruRequest(device, content.size(), length);
    auto const answer = ipmi(request);
    if (RefusesLength(answer) && length > kShortestPart) {
      longest = std::max(length / 2, kShortestPart);
      continue;
    }
    auto const part = DataOf(answer, request, 2);
    if (!part) return part;
    content += part->substr(1, length);
  }
  return content;
}

}  // namespace

TFinding<std::string> GuidFrom(std::string const& bytes) {
  std::string const digits = HexText(std::string(bytes.rbegin(), bytes.rend()));
  if (digits.find_first_not_of('0') == std::string::npos) return TMissing{kMissingPlaceholder, "the GUID consists of zeros"};
  return digits.substr(0, 8) + "-" + digits.substr(8, 4) + "-" + digits.substr(12, 4) + "-" + digits.substr(16, 4) + "-" +
         digits.substr(20);
}

TFinding<std::vector<TLanChannel>> ReadLanChannels(TIpmi const& ipmi) {
  std::vector<TLanChannel> lans;
  std::vector<TMissing> refusals;  // of channels that do not exist
  for (std::uint8_t channel = 1; channel <= kLastChannel; ++channel) {
    auto const info = Ask(ipmi, {kApplication, kGetChannelInfo, {Char(channel)}}, 2);
    if (!info && info.Why().fCode != kMissingRefused) return info.Why();
    if (!info)
      refusals.push_back(info.Why());
    else if ((TBytes(*info).At(1) & 0x7F) == kLanMedium)
      lans.push_back(ReadLan(ipmi, channel));
  }
  if (refusals.size() == kLastChannel) return refusals.front();
  return lans;
}

TFinding<std::vector<TUserAccount>> ReadUsers(TIpmi const& ipmi, TFinding<std::vector<TLanChannel>> const& lans) {
  if (!lans) return lans.Why();
  if (lans->empty()) return TMissing{kMissingNotGiven, "the controller has no LAN channel, to which accounts would apply"};
  std::uint8_t const channel = lans->front().fNumber;
  std::vector<TUserAccount> users;
  std::uint8_t last = 1;
  for (std::uint8_t user = 1; user <= last; ++user) {
    auto const access = UserAccess(ipmi, channel, user);
    if (!access && (user == 1 || access.Why().fCode != kMissingRefused)) return access.Why();
    if (!access) continue;
    if (user == 1) last = TBytes(*access).At(0) & 0x3F;
    TUserAccount account = UserFrom(*access, user, channel);
    account.fName = UserName(ipmi, user);
    if (account.fName || (account.fIsEnabled && *account.fIsEnabled)) users.push_back(account);
  }
  return users;
}

TSensorState ReadSensor(TIpmi const& ipmi, TSdrSensor const& sensor) {
  TSensorState state{sensor, TMissing{}, TMissing{}, sensor.fThresholds};
  if (sensor.fOwner != kThisController || sensor.fLun != 0) {
    TMissing const why{kMissingNotGiven, "the sensor belongs to another controller or another LUN, which is not queried"};
    state.fRaw = why;
    state.fStates = why;
    return state;
  }
  TIpmiRequest const readingRequest{kSensorEvent, kGetReading, {Char(sensor.fNumber)}};
  auto const reading = Ask(ipmi, readingRequest, 2).Then([](std::string const& answer) -> TFinding<std::string> {
    std::uint8_t const flags = TBytes(answer).At(1);
    if ((flags & 0x20) != 0) return TMissing{kMissingNotGiven, "the controller reports that the reading is unavailable"};
    if ((flags & 0x40) == 0) return TMissing{kMissingNotGiven, "the controller does not scan the sensor"};
    return answer;
  });
  state.fRaw = reading.Then([](std::string const& answer) { return TBytes(answer).At(0); });
  state.fStates = reading.Then([&](std::string const& answer) -> TFinding<std::uint16_t> {
    if (answer.size() < 3) return TMissing{kMissingNotGiven, "the controller's answer has a reading, but no state"};
    std::uint16_t const mask = sensor.fReadingType == kThresholdReading ? 0x3F : 0x7FFF;
    return static_cast<std::uint16_t>(TBytes(answer).Word(2) & mask);
  });
  if (sensor.fReadingType != kThresholdReading || sensor.fThresholds.fValid == 0) return state;
  auto const thresholds = Ask(ipmi, {kSensorEvent, kGetThresholds, {Char(sensor.fNumber)}}, 7);
  if (!thresholds) return state;
  state.fThresholds.fValid = TBytes(*thresholds).At(0) & 0x3F;
  for (std::size_t i = 0; i < TRawThresholds::kCount; ++i) state.fThresholds.fRaw[i] = TBytes(*thresholds).At(1 + i);
  return state;
}

TFinding<std::vector<TFruArea>> ReadFru(TIpmi const& ipmi, std::uint8_t device) {
  auto const info = Ask(ipmi, {kStorage, kGetFruInfo, {Char(device)}}, 3);
  if (!info) return info.Why();
  bool const isInWords = (TBytes(*info).At(2) & 1) != 0;
  if (isInWords) return TMissing{kMissingUnexpected, "the FRU device is addressed by words, which is not supported"};
  return FruContent(ipmi, device, TBytes(*info).Word(0)).Then([](std::string const& content) { return FruAreasFrom(content); });
}

}  // namespace NQRVZEP20
