// SPDX-License-Identifier: Apache-2.0
#include "Resolvers.h"

#include <algorithm>
#include <sstream>

namespace NQRVZEP20 {

namespace {

using TTexts = TFinding<std::vector<std::string>>;

constexpr char const* kFile = "/etc/resolv.conf";
constexpr char const* kFileOfResolved = "/run/systemd/resolve/resolv.conf";
constexpr std::size_t kServerLimit = 100;

constexpr TValueName kInfoFormats[] = {{"3", "IPv4 Address"}, {"4", "IPv6 Address"}};
constexpr TValueName kAccessContexts[] = {{"1", "Other"}, {"2", "Default Gateway"}, {"3", "DNS Server"}};

std::vector<std::string> WordsOf(std::istringstream& line) {
  std::vector<std::string> words;
  for (std::string word; line >> word;) words.push_back(word);
  return words;
}

bool Contains(std::vector<std::string> const& words, std::string const& word) {
  return std::find(words.begin(), words.end(), word) != words.end();
}

bool IsStub(TResolvers const& resolvers) {
  return resolvers.fServers.size() == 1 && (resolvers.fServers[0] == "127.0.0.53" || resolvers.fServers[0] == "127.0.0.54");
}

TFinding<TResolvers> ReadFile(TMachineFiles const& files, char const* file) {
  return files.Content(file).Then([&](std::string const& content) {
    TResolvers resolvers = ResolversIn(content);
    resolvers.fFile = file;
    return resolvers;
  });
}

}  // namespace

TResolvers ResolversIn(std::string const& content) {
  TResolvers resolvers;
  std::istringstream lines(content);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream words(line.substr(0, line.find_first_of("#;")));
    std::string keyword, server;
    words >> keyword;
    if (keyword == "nameserver" && words >> server && !Contains(resolvers.fServers, server) &&
        resolvers.fServers.size() < kServerLimit)
      resolvers.fServers.push_back(server);
    if (keyword == "search" || keyword == "domain") resolvers.fSearchDomains = WordsOf(words);
    if (keyword == "options")
      for (std::string& option : WordsOf(words)) resolvers.fOptions.push_back(std::move(option));
  }
  return resolvers;
}

TFinding<TResolvers> ResolversOf(TMachineFiles const& files) {
  auto const resolvers = ReadFile(files, kFile);
  if (!resolvers || !IsStub(*resolvers)) return resolvers;
  auto const ofResolved = ReadFile(files, kFileOfResolved);
  return ofResolved && !ofResolved->fServers.empty() ? ofResolved : resolvers;
}

std::vector<TRemoteHost> GatewaysOf(TRoutes const& routes) {
  std::vector<TRemoteHost> gateways;
  for (TRoute const& route : routes.fAll) {
    if (!route.fGateway) continue;
    auto const known = std::find_if(gateways.begin(), gateways.end(),
                                    [&](TRemoteHost const& gateway) { return gateway.fAddress == *route.fGateway; });
    auto const kind = route.IsDefault() ? TRemoteHost::kDefaultGateway : TRemoteHost::kGateway;
    if (known == gateways.end())
      gateways.push_back({*route.fGateway, kind});
    else if (route.IsDefault())
      known->fKind = kind;
  }
  return gateways;
}

TRecord RemoteHostRecord(TRemoteHost const& host, std::string const& source, TComputerSystem const& system) {
  bool const isIPv6 = host.fAddress.find(':') != std::string::npos;
  bool const isResolver = host.fKind == TRemoteHost::kResolver;
  std::uint16_t const context = isResolver ? 3 : host.fKind == TRemoteHost::kDefaultGateway ? 2 : 1;
  TRecord record("CIM_RemoteServiceAccessPoint", source);
  system.AddHostedKeys(record, (isResolver ? "resolver " : "gateway ") + host.fAddress);
  record.Add("AccessInfo", TFinding<std::string>(host.fAddress));
  record.Add("InfoFormat", TFinding<std::uint16_t>(std::uint16_t(isIPv6 ? 4 : 3))).Names(kInfoFormats);
  record.Add("AccessContext", TFinding<std::uint16_t>(context)).Names(kAccessContexts);
  return record;
}

TRecord DnsRecord(TResolvers const& resolvers) {
  TRecord record("ZEP_DNSSettingData", resolvers.fFile, "CIM_DNSSettingData");
  record.AddKey("InstanceID", "resolv.conf");
  record.AddOwn("ElementName", "name resolution");
  record.Add("DNSServerAddresses", TTexts(resolvers.fServers));
  record.Add("SearchDomains", TTexts(resolvers.fSearchDomains));
  record.Add("ResolverOptions", TTexts(resolvers.fOptions));
  return record;
}

}  // namespace NQRVZEP20
