// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/SettingTexts.h"

#include "collect/redaction/Texts.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace NQRVZEP20 {

namespace {

struct TParameter {
  std::string_view fName;  // also the last words of a longer name: "rd.iscsi.password"; of a password, its end: "vncpassword"
  EMeaning fMeaning;
};

constexpr TParameter kParameters[] = {
    {"hostname", EMeaning::kHost},
    {"fqdn", EMeaning::kHost},
    {"netbiosname", EMeaning::kHost},
    {"servern", EMeaning::kHost},
    {"h", EMeaning::kHost},  // of ds=nocloud
    {"domain", EMeaning::kDomain},
    {"nisdomain", EMeaning::kDomain},
    {"dom", EMeaning::kDomain},
    {"realm", EMeaning::kDomain},
    {"user", EMeaning::kUser},
    {"username", EMeaning::kUser},
    {"login", EMeaning::kUser},
    {"uname", EMeaning::kUser},  // of 9p
    {"password", EMeaning::kPassword},
    {"passwd", EMeaning::kPassword},
    {"pass", EMeaning::kPassword},
    {"password2", EMeaning::kPassword},
    {"pass2", EMeaning::kPassword},
    {"passphrase", EMeaning::kPassword},
    {"pw", EMeaning::kPassword},
    {"psk", EMeaning::kPassword},
    {"apikey", EMeaning::kPassword},
    {"api-key", EMeaning::kPassword},
    {"secret", EMeaning::kPassword},
    {"token", EMeaning::kPassword},
    {"credential", EMeaning::kPassword},
    {"credentials", EMeaning::kPassword},
    {"initiator", EMeaning::kSerial},
    {"target-name", EMeaning::kSerial},
    {"hostnqn", EMeaning::kSerial},
    {"nqn", EMeaning::kSerial},
    {"serialno", EMeaning::kSerial},
    {"serial-number", EMeaning::kSerial},
    {"system-serial", EMeaning::kSerial},
    {"asset-tag", EMeaning::kSerial},
    {"machine-id", EMeaning::kSerial},
    {"instance-id", EMeaning::kSerial},
    {"unique-id", EMeaning::kSerial},
    {"fsid", EMeaning::kSerial},
    {"uuid", EMeaning::kSerial},
    {"partuuid", EMeaning::kSerial},
};

// The kernel treats '-' and '_' alike, and programs of the initial RAM disk separate words by '.' and '/'.
std::string PlainName(std::string_view name) {
  std::string plain = Lower(name);
  for (char& byte : plain)
    if (!IsLetterOrDigit(byte)) byte = '-';
  return plain;
}

bool EndsIn(std::string_view name, TParameter const& parameter) {
  std::string_view const end = parameter.fName;
  if (name.size() < end.size() || name.substr(name.size() - end.size()) != end) return false;
  bool const isWord = name.size() == end.size() || name[name.size() - end.size() - 1] == '-';
  return isWord || parameter.fMeaning == EMeaning::kPassword;
}

std::vector<std::string_view> Split(std::string_view text, std::string_view separators) {
  std::vector<std::string_view> parts;
  for (std::size_t begin = 0; begin <= text.size();) {
    std::size_t const end = std::min(text.find_first_of(separators, begin), text.size());
    parts.push_back(text.substr(begin, end - begin));
    begin = end + 1;
  }
  return parts;
}

bool BeginsWith(std::string_view text, std::string_view begin) { return text.substr(0, begin.size()) == begin; }

// The host before a port or a path: "nas1" of "nas1:2049", "2001:db8::1" of "[2001:db8::1]:2049".
std::string_view HostBefore(std::string_view text) {
  if (BeginsWith(text, "[")) return text.substr(1, std::min(text.find(']'), text.size()) - 1);
  bool const isIPv6 = IsIPv6(text);
  return isIPv6 ? text : text.substr(0, text.find(':'));
}

bool IsName(std::string_view text) {
  constexpr std::string_view marks = ".-_:$;+";
  std::size_t at = 0;
  while (at < text.size()) {
    std::size_t const size = SizeOfWordCharacter(text, at);
    if (size == 0 && marks.find(text[at]) == marks.npos) return false;
    at += std::max<std::size_t>(size, 1);
  }
  return at > 0;
}

class TSettings {
public:
  // "alice:secret@nas1:2049"
  void AddAuthority(std::string_view text) {
    std::size_t const at = text.rfind('@');
    std::string_view const accounts = text.substr(0, at == text.npos ? 0 : at);
    if (accounts.find('/') != accounts.npos) return;
    AddAccounts(accounts);
    std::string_view const host = HostBefore(at == text.npos ? text : text.substr(at + 1));
    if (IsName(host)) Add(EMeaning::kHost, host);
  }

  // Whether the text is the place of something on a server: a URL, "//nas1/share" or "nas1:/export".
  bool AddPlace(std::string_view text) {
    std::size_t const scheme = text.find("://"), path = text.find(":/");
    if (scheme != text.npos) {
      std::string_view const rest = text.substr(scheme + 3);
      AddAuthority(rest.substr(0, rest.find('/')));
    } else if (BeginsWith(text, "//") || BeginsWith(text, "\\\\")) {
      AddAuthority(text.substr(2, text.find_first_of("/\\", 2) - 2));
    } else if (path != text.npos && !BeginsWith(text, "/")) {
      for (std::string_view const server : Split(text.substr(0, path), ",")) AddAuthority(server);
    } else {
      return false;
    }
    return true;
  }

  void AddParameter(std::string_view name, std::string_view value) {
    if (AddKnown(name, value) || AddBootAddress(name, value) || AddServer(value)) return;
    AddPlace(value);
    for (std::string_view const part : Split(value, ",;")) {
      std::size_t const equals = part.find('=');
      if (equals != part.npos && !AddKnown(part.substr(0, equals), part.substr(equals + 1))) AddPlace(part.substr(equals + 1));
    }
  }

  std::vector<TSetting> Take() { return std::move(fSettings); }

private:
  void Add(EMeaning meaning, std::string_view value) {
    bool const isKnown = !fSettings.empty() && fSettings.back().fMeaning == meaning && fSettings.back().fValue == value;
    if (!value.empty() && !isKnown) fSettings.push_back({meaning, std::string(value)});
  }

  // "alice:secret"; of iSCSI there may be a second account with its password.
  void AddAccounts(std::string_view accounts) {
    EMeaning meaning = EMeaning::kUser;
    for (std::string_view const field : Split(accounts, ":")) {
      Add(meaning, field);
      meaning = meaning == EMeaning::kUser ? EMeaning::kPassword : EMeaning::kUser;
    }
  }

  bool AddKnown(std::string_view name, std::string_view value) {
    constexpr std::string_view luks = "luks-";
    std::string const plain = PlainName(name);
    auto const known =
        std::find_if(std::begin(kParameters), std::end(kParameters), [&](TParameter const& each) { return EndsIn(plain, each); });
    if (known == std::end(kParameters)) return false;
    if (known->fName == "credential") value.remove_prefix(std::min(value.find(':') + 1, value.size()));
    if (BeginsWith(value, luks)) value.remove_prefix(luks.size());
    if (known->fName == "credentials" && value.find(':') != value.npos)
      AddAccounts(value);
    else
      Add(known->fMeaning, value);
    return true;
  }

  // "ip=client:server:gateway:mask:HOST:device", "BOOTIF=01-52-54-00-11-22-01" with the type of the link before the address
  bool AddBootAddress(std::string_view name, std::string_view value) {
    constexpr std::size_t host = 4, linkType = 3;
    auto const fields = Split(value, ":");
    if (name == "ip" && fields.size() > host && IsName(fields[host])) Add(EMeaning::kHost, fields[host]);
    if (name == "BOOTIF" && value.size() > linkType) Add(EMeaning::kAddress, value.substr(linkType));
    return name == "ip" || name == "BOOTIF";
  }

  // "netroot=iscsi:alice:secret@san1::3260:1:iqn.2026-01.example:disk"
  bool AddServer(std::string_view value) {
    constexpr std::array<std::string_view, 4> protocols = {"iscsi:", "nfs:", "nfs4:", "nbd:"};
    auto const protocol =
        std::find_if(protocols.begin(), protocols.end(), [&](std::string_view each) { return BeginsWith(value, each); });
    if (protocol == protocols.end() || BeginsWith(value.substr(protocol->size()), "//")) return false;
    AddAuthority(value.substr(protocol->size()));
    return true;
  }

  std::vector<TSetting> fSettings;
};

// The parameters, which are separated by spaces outside of double quotes, without the quotes.
std::vector<std::string> ParametersOf(std::string_view line) {
  std::vector<std::string> parameters(1);
  bool isQuoted = false;
  for (char const byte : line) {
    if (byte == '"') isQuoted = !isQuoted;
    bool const isSpace = byte == ' ' || byte == '\t' || byte == '\n';
    if (isSpace && !isQuoted) parameters.emplace_back();
    if (byte != '"' && (!isSpace || isQuoted)) parameters.back() += byte;
  }
  return parameters;
}

void AddAssignment(TSettings& settings, std::string_view text) {
  std::size_t const equals = text.find('=');
  if (equals != text.npos) settings.AddParameter(text.substr(0, equals), text.substr(equals + 1));
}

// The options of ceph, where the name is that of an account. Those of cgroup have the name of a hierarchy, and no secret.
bool AreOfCeph(std::vector<std::string_view> const& options) {
  return std::any_of(options.begin(), options.end(), [](std::string_view option) { return BeginsWith(option, "secret="); });
}

}  // namespace

std::vector<TSetting> SettingsInSource(std::string_view source) {
  TSettings settings;
  bool const isPlace = settings.AddPlace(source);
  bool const hasServer = source.find_first_of(":@") != source.npos && !BeginsWith(source, "/");
  if (!isPlace && hasServer) settings.AddAuthority(source);
  return settings.Take();
}

std::vector<TSetting> SettingsInOptions(std::string_view options) {
  constexpr std::string_view name = "name=";
  TSettings settings;
  auto const all = Split(options, ",");
  bool const areOfCeph = AreOfCeph(all);
  for (std::string_view const option : all)
    if (areOfCeph && BeginsWith(option, name))
      settings.AddParameter("username", option.substr(name.size()));
    else
      AddAssignment(settings, option);
  return settings.Take();
}

std::vector<TSetting> SettingsInCommandLine(std::string_view line) {
  TSettings settings;
  for (std::string const& parameter : ParametersOf(line)) AddAssignment(settings, parameter);
  return settings.Take();
}

std::string HostIn(std::string_view text) {
  std::size_t const scheme = text.find("://");
  std::string_view host = scheme == text.npos ? text : text.substr(scheme + 3);
  host = host.substr(0, host.find_first_of("/%"));
  if (scheme != text.npos) host = host.substr(host.rfind('@') + 1);
  if (BeginsWith(host, "[")) return std::string(host.substr(1, host.find(']') - 1));
  bool const hasPort = std::count(host.begin(), host.end(), ':') == 1;
  return std::string(hasPort ? host.substr(0, host.find(':')) : host);
}

}  // namespace NQRVZEP20
