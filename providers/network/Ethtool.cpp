// SPDX-License-Identifier: Apache-2.0
#include "Ethtool.h"

#include "Link.h"
#include "NetlinkMessages.h"

#include <linux/ethtool.h>
#include <linux/sockios.h>
#include <net/if.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace NQRVZEP20 {

namespace {

TMissing WhyUnknown(char const* what) { return {kMissingNotGiven, std::string("the driver reports ") + what + " as unknown"}; }

TMissing const kTooShort{kMissingUnexpected, "the driver's answer is too short"};

// The structure at the beginning of an answer. Not for a structure that ends in a flexible array: TFinding cannot hold it.
template <class T>
TFinding<T> StructureIn(std::string const& answer) {
  if (answer.size() < sizeof(T)) return kTooShort;
  T structure;
  std::memcpy(&structure, answer.data(), sizeof structure);
  return structure;
}

template <std::size_t N>
TFinding<std::string> TextOf(char const (&field)[N]) {
  std::string const text(TextIn({field, N}));
  if (text.empty() || text == "N/A") return TMissing{kMissingNotGiven, "the driver does not report it"};
  return text;
}

// ---- Link settings ----

// The members of ethtool_link_settings that are read.
struct TSettings {
  std::uint32_t fSpeed;
  std::uint8_t fDuplex, fPort, fAutoNegotiation;
  int fMaskWords;  // of 32 bits; negative in the kernel's first answer
};

TFinding<TSettings> SettingsIn(std::string const& answer) {
  ethtool_link_settings settings;
  if (answer.size() < sizeof settings) return kTooShort;
  std::memcpy(&settings, answer.data(), sizeof settings);
  return TSettings{settings.speed, settings.duplex, settings.port, settings.autoneg, settings.link_mode_masks_nwords};
}

TFinding<std::string> ConnectorFrom(TSettings const& settings) {
  switch (settings.fPort) {
    case PORT_TP:
      return std::string("Twisted Pair");
    case PORT_AUI:
      return std::string("AUI");
    case PORT_MII:
      return std::string("MII");
    case PORT_FIBRE:
      return std::string("FIBRE");
    case PORT_BNC:
      return std::string("BNC");
    case PORT_DA:
      return std::string("Direct Attach Copper");
    case PORT_NONE:
      return std::string("None");
    case PORT_OTHER:
      return std::string("Other");
    default:
      return WhyUnknown("the connector");
  }
}

TFinding<std::uint64_t> SpeedFrom(TSettings const& settings) {
  if (settings.fSpeed == 0 || settings.fSpeed == static_cast<std::uint32_t>(SPEED_UNKNOWN)) return WhyUnknown("the speed");
  return std::uint64_t(settings.fSpeed) * 1'000'000;
}

TFinding<bool> DuplexFrom(TSettings const& settings) {
  if (settings.fDuplex != DUPLEX_HALF && settings.fDuplex != DUPLEX_FULL) return WhyUnknown("the duplex mode");
  return settings.fDuplex == DUPLEX_FULL;
}

// A mask of the three that follow the structure: supported, advertised and of the partner.
TFinding<std::string> MaskIn(std::string const& answer, unsigned number) {
  return SettingsIn(answer).Then([&](TSettings const& settings) -> TFinding<std::string> {
    std::size_t const size = 4 * static_cast<std::size_t>(std::max(settings.fMaskWords, 0));
    std::size_t const begin = sizeof(ethtool_link_settings) + number * size;
    if (size == 0 || answer.size() < begin + size) return WhyUnknown("the link modes");
    return answer.substr(begin, size);
  });
}

TFinding<std::vector<TLinkMode>> ModesIn(std::string const& answer, unsigned number) {
  return MaskIn(answer, number).Then([](std::string const& mask) -> TFinding<std::vector<TLinkMode>> {
    auto modes = LinkModesIn(mask);
    if (modes.empty()) return TMissing{kMissingNotGiven, "the driver reports no link mode"};
    return modes;
  });
}

TFinding<std::vector<std::string>> FeaturesIn(std::string const& answer, unsigned number) {
  return MaskIn(answer, number).Then([](std::string const& mask) -> TFinding<std::vector<std::string>> {
    auto features = LinkFeaturesIn(mask);
    if (features.empty()) return TMissing{kMissingNotGiven, "the driver reports no such feature"};
    return features;
  });
}

// ---- Questions ----

class TSocket {
public:
  TSocket() : fFd(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {}
  TSocket(TSocket const&) = delete;
  TSocket& operator=(TSocket const&) = delete;
  ~TSocket() {
    if (fFd >= 0) ::close(fFd);
  }
  int Get() const { return fFd; }

private:
  int fFd;
};

TMissing WhyRefused(int error) {
  if (error == EPERM && ::geteuid() != 0) return {kMissingNeedsRoot, "ethtool: only root may ask the driver"};
  if (error == EOPNOTSUPP) return {kMissingNotGiven, "ethtool: the driver does not report it"};
  return {kMissingUnreadable, std::string("ethtool: ") + std::strerror(error)};
}

// The structure with which the driver answers. `question`: the same structure with the command.
TFinding<std::string> Ask(TMachineFiles const& files, std::string const& port, char const* name, std::string const& question) {
  return files.Answer("ethtool/" + port + "/" + name, [&]() -> TFinding<std::string> {
    std::string answer = question;
    ifreq request = {};
    if (port.size() >= sizeof request.ifr_name) return WhyRefused(ENODEV);
    port.copy(request.ifr_name, sizeof request.ifr_name - 1);
    request.ifr_data = answer.data();
    TSocket const socket;
    if (::ioctl(socket.Get(), SIOCETHTOOL, &request) != 0) return WhyRefused(errno);
    return answer;
  });
}

// `extra`: the bytes after the structure.
template <class T>
std::string BytesOf(T const& question, std::size_t extra = 0) {
  std::string bytes(sizeof question + extra, '\0');
  std::memcpy(bytes.data(), &question, sizeof question);
  return bytes;
}

template <class T>
T Question(std::uint32_t command) {
  T question = {};
  question.cmd = command;
  return question;
}

}  // namespace

TDriverInfo::TDriverInfo(TFinding<std::string> const& answer) : fDriver(TMissing()), fVersion(TMissing()), fFirmware(TMissing()) {
  auto const info = answer.Then(StructureIn<ethtool_drvinfo>);
  fDriver = info.Then([](ethtool_drvinfo const& of) { return TextOf(of.driver); });
  fVersion = info.Then([](ethtool_drvinfo const& of) { return TextOf(of.version); });
  fFirmware = info.Then([](ethtool_drvinfo const& of) { return TextOf(of.fw_version); });
}

TLinkSettings::TLinkSettings(TFinding<std::string> const& answer)
    : fSpeed(TMissing()),
      fIsFullDuplex(TMissing()),
      fIsAutonegotiating(TMissing()),
      fConnector(TMissing()),
      fSupported(answer.Then([](std::string const& bytes) { return ModesIn(bytes, 0); })),
      fAdvertised(answer.Then([](std::string const& bytes) { return ModesIn(bytes, 1); })),
      fOfPartner(answer.Then([](std::string const& bytes) { return ModesIn(bytes, 2); })),
      fSupportedFeatures(answer.Then([](std::string const& bytes) { return FeaturesIn(bytes, 0); })),
      fAdvertisedFeatures(answer.Then([](std::string const& bytes) { return FeaturesIn(bytes, 1); })) {
  auto const settings = answer.Then(SettingsIn);
  fSpeed = settings.Then(SpeedFrom);
  fIsFullDuplex = settings.Then(DuplexFrom);
  fIsAutonegotiating = settings.Then([](TSettings const& of) { return of.fAutoNegotiation == AUTONEG_ENABLE; });
  fConnector = settings.Then(ConnectorFrom);
}

TWakeOnLan::TWakeOnLan(TFinding<std::string> const& answer) : fIsSupported(TMissing()), fIsEnabled(TMissing()) {
  auto const info = answer.Then(StructureIn<ethtool_wolinfo>);
  fIsSupported = info.Then([](ethtool_wolinfo const& of) { return of.supported != 0; });
  fIsEnabled = info.Then([](ethtool_wolinfo const& of) { return of.wolopts != 0; });
}

TFinding<std::string> PermanentAddressIn(std::string const& answer) {
  ethtool_perm_addr header;
  if (answer.size() < sizeof header) return kTooShort;
  std::memcpy(&header, answer.data(), sizeof header);
  return AddressText(std::string_view(answer).substr(sizeof header, header.size));
}

TFinding<std::string> AskDriverInfo(TMachineFiles const& files, std::string const& port) {
  return Ask(files, port, "drvinfo", BytesOf(Question<ethtool_drvinfo>(ETHTOOL_GDRVINFO)));
}

// The kernel first answers with the size of its masks, as a negative number, and then with the masks of that size.
TFinding<std::string> AskLinkSettings(TMachineFiles const& files, std::string const& port) {
  auto settings = Question<ethtool_link_settings>(ETHTOOL_GLINKSETTINGS);
  if (files.IsThisMachine()) {
    auto const sized = Ask(files, port, "linksettings", BytesOf(settings)).Then(SettingsIn);
    if (!sized) return sized.Why();
    settings.link_mode_masks_nwords = static_cast<std::int8_t>(std::clamp(-sized->fMaskWords, 0, 127));
  }
  return Ask(files, port, "linksettings", BytesOf(settings, 3 * 4 * static_cast<std::size_t>(settings.link_mode_masks_nwords)));
}

TFinding<std::string> AskPermanentAddress(TMachineFiles const& files, std::string const& port) {
  constexpr std::uint32_t kAddressLimit = 32;
  auto question = Question<ethtool_perm_addr>(ETHTOOL_GPERMADDR);
  question.size = kAddressLimit;
  return Ask(files, port, "permaddr", BytesOf(question, kAddressLimit));
}

TFinding<std::string> AskWakeOnLan(TMachineFiles const& files, std::string const& port) {
  return Ask(files, port, "wol", BytesOf(Question<ethtool_wolinfo>(ETHTOOL_GWOL)));
}

}  // namespace NQRVZEP20
