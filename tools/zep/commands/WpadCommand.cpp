// SPDX-License-Identifier: Apache-2.0

// zep wpad: the address of the proxy configuration file, as the DHCP server of the local network names it.

#include "AutoProxyDiscovery.h"
#include "TOSSpecific.h"
#include "proxy/WpadQuery.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Terminal.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/transfer/Transfer.h"
#include "tools/zep/wpad/DhcpClients.h"
#include "tools/zep/wpad/PacFile.h"
#include "tools/zep/wpad/ProxySearch.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <memory>
#include <optional>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

struct TWpadArguments {
  bool fAsJson = false;
  bool fIsConfirmed = false;
  bool fKeepsClients = false;
  bool fFetches = false;
  std::uint64_t fMostBytes = 1 << 20;  // of the file
};

struct TFindings {
  TSearch fSearch;
  bool fStoppedClients = false;
  std::optional<TPacFile> fPacFile;  // with --fetch, when there is a URL

  bool IsComplete() const { return !fSearch.fUrl.empty() && (!fPacFile || fPacFile->fFailure.empty()); }
  EExitStatus ExitStatus() const { return fSearch.fUrl.empty() ? kExitNothing : IsComplete() ? kExitComplete : kExitPartial; }
};

// ---- Before the start ----

std::vector<std::string> LinesOf(std::string const& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

void AnnounceStop(std::vector<std::string> const& clients) {
  std::cerr << "This stops the DHCP clients of this machine: every process with \"dhclient\" in its line of \"ps -e\".\n";
  for (std::string const& line : clients) std::cerr << "  " << Printable(line) << "\n";
  if (clients.empty()) std::cerr << "  (none is running)\n";
}

bool IsConfirmed() {
  std::cerr << "Continue? [y/N] " << std::flush;
  std::string answer;
  std::getline(std::cin, answer);
  return answer == "y" || answer == "Y" || answer == "yes";
}

// ---- The countdown ----

// Shown on standard error, only on a terminal, and erased at the end.
class TCountdown {
public:
  ~TCountdown() {
    if (fWidth > 0) std::cerr << '\r' << std::string(fWidth, ' ') << '\r' << std::flush;
  }
  void Show(TQuery const& query, int secondsLeft) {
    if (!CanRedrawErrors()) return;
    std::string text = "Waiting for a reply to " + query.fAddress + ": " + std::to_string(secondsLeft) + " s left";
    text.resize(std::max(text.size(), fWidth), ' ');
    fWidth = text.size();
    std::cerr << '\r' << text << std::flush;
  }

private:
  std::size_t fWidth = 0;
};

// ---- Output ----

std::string NameOf(TQuery const& query) {
  if (query.fInterface.empty()) return "IPv6";
  return query.fInterface + (query.fIsUp ? "" : ", down") + (query.fIsPromiscuous ? ", promiscuous" : "");
}

std::string ReplyOf(TQuery const& query) {
  if (query.fReply) {
    TReply const& reply = *query.fReply;
    return std::to_string(reply.fSize) + " bytes from " + reply.fSender + " after " + std::to_string(reply.fMilliseconds) +
           " ms, " + (query.fUrl.empty() ? "without a URL" : "with the URL");
  }
  return query.fFailure.empty() ? "none within " + std::to_string(kWpadReplySeconds * query.fSent) + " s" : query.fFailure;
}

std::string MessagesOf(TQuery const& query) {
  if (query.fSent == 0) return "nothing";
  return std::to_string(query.fSent) + " x " + std::to_string(AutoProxyDiscovery::kMessageSize) + " bytes";
}

// The lines of a file from the network, made safe for a terminal.
std::string PrintableLines(std::string const& text) {
  std::string printable;
  for (std::string line : LinesOf(text)) {
    if (!line.empty() && line.back() == '\r') line.pop_back();
    for (std::size_t tab; (tab = line.find('\t')) != std::string::npos;) line.replace(tab, 1, "    ");
    printable += Printable(line) + "\n";
  }
  return printable;
}

std::string AsText(TFindings const& findings) {
  std::string text;
  if (!findings.fSearch.fUrl.empty()) text += Printable(findings.fSearch.fUrl) + "\n";
  if (!findings.fSearch.fQueries.empty()) {
    TTable table({16, 16, 14, 28});
    table.Add({"Interface", "Address", "Sent", "Reply"});
    for (TQuery const& query : findings.fSearch.fQueries)
      table.Add({NameOf(query), query.fAddress, MessagesOf(query), ReplyOf(query)});
    text += (text.empty() ? "" : "\n") + table.GetText();
  }
  if (findings.fPacFile && findings.fPacFile->fFailure.empty()) text += "\n" + PrintableLines(findings.fPacFile->fText);
  return text;
}

// Why the result is incomplete; empty when it is complete.
std::string WhyIncomplete(TFindings const& findings) {
  if (findings.fPacFile && !findings.fPacFile->fFailure.empty())
    return "the file was not fetched: " + findings.fPacFile->fFailure;
  if (!findings.fSearch.fUrl.empty()) return "";
  if (findings.fSearch.fQueries.empty()) return "no interface has a name that begins with \"eth\"";
  return findings.fSearch.fFailure.empty() ? "no server returned a proxy configuration URL" : findings.fSearch.fFailure;
}

TJson QueryAsJson(TQuery const& query) {
  TJson json = {{"interface", OrNull(query.fInterface)}};
  json["up"] = query.fInterface.empty() ? TJson(nullptr) : TJson(query.fIsUp);
  json["promiscuous"] = query.fInterface.empty() ? TJson(nullptr) : TJson(query.fIsPromiscuous);
  json["address"] = OrNull(query.fAddress);
  json["hardwareAddress"] = OrNull(query.fHardwareAddress);
  json["sent"] = query.fSent;
  json["reply"] = nullptr;
  if (query.fReply)
    json["reply"] = {{"bytes", query.fReply->fSize},
                     {"from", query.fReply->fSender},
                     {"milliseconds", query.fReply->fMilliseconds},
                     {"url", OrNull(query.fUrl)}};
  json["failure"] = OrNull(query.fFailure);
  return json;
}

std::string AsJson(TFindings const& findings) {
  TJson document = DocumentHead("zep wpad", findings.ExitStatus(), WhyIncomplete(findings));
  document["status"] = NameOf(findings.ExitStatus());
  document["url"] = OrNull(findings.fSearch.fUrl);
  document["stoppedClients"] = findings.fStoppedClients;
  document["messageBytes"] = AutoProxyDiscovery::kMessageSize;
  document["interfaces"] = TJson::array();
  for (TQuery const& query : findings.fSearch.fQueries) document["interfaces"].push_back(QueryAsJson(query));
  document["failure"] = OrNull(findings.fSearch.fFailure);
  if (findings.fPacFile) {
    bool const isThere = findings.fPacFile->fFailure.empty();
    document["file"] = {{"text", isThere ? TJson(findings.fPacFile->fText) : TJson(nullptr)},
                        {"failure", OrNull(findings.fPacFile->fFailure)}};
  }
  return zep::AsText(document);
}

// ---- The steps ----

// Returns false, and leaves the clients alone, when the user does not confirm. Throws std::runtime_error when a process that is
// not a DHCP client would be ended: the library reads the same list again.
bool StopClients(bool isConfirmed) {
  std::vector<std::string> const clients = DhcpClientLines();
  AnnounceStop(clients);
  std::string const why = WhyNotToBeEnded(clients);
  if (!why.empty()) throw std::runtime_error(why);
  if (!isConfirmed && !IsConfirmed()) return false;
  // Checked again, because the user may have taken a while to answer.
  std::string const whyNow = WhyNotToBeEnded(DhcpClientLines());
  if (!whyNow.empty()) throw std::runtime_error(whyNow);
  AutoProxyDiscovery::wpadPreconfig();
  return true;
}

TSearch Search() {
  if (IsPortTaken()) std::cerr << "zep: another program is using port 68; trying again for up to 30 s\n";
  TCountdown countdown;
  return SearchProxy([&](TQuery const& query, int secondsLeft) { countdown.Show(query, secondsLeft); });
}

void Tell(TFindings const& findings, bool asJson) {
  WriteOutput(asJson ? AsJson(findings) : AsText(findings));
  std::string const missing = WhyIncomplete(findings);
  if (!missing.empty()) std::cerr << "zep: " << Printable(missing) << "\n";
}

int Wpad(TWpadArguments const& arguments) {
  std::string const whyNot = WhyNoListening();
  if (!whyNot.empty()) throw std::runtime_error(whyNot);
  if (!arguments.fKeepsClients && !StopClients(arguments.fIsConfirmed))
    throw std::runtime_error("nothing was done; --yes confirms, and --no-stop keeps the DHCP clients running");
  TFindings findings{Search(), !arguments.fKeepsClients, {}};
  std::string const& url = findings.fSearch.fUrl;
  if (arguments.fFetches && !url.empty()) findings.fPacFile = FetchPacFile(url, arguments.fMostBytes);
  Tell(findings, arguments.fAsJson);
  return findings.ExitStatus();
}

}  // namespace

TRun AddWpadArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TWpadArguments>();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--fetch", arguments->fFetches, "Also fetch the file, over plain HTTP with libcurl, and print it");
  AddSizeOption(command, "--max-file", arguments->fMostBytes,
                "The size limit for the file, such as 500K or 2M (default 1M); 0: no limit");
  auto* const yes = command.add_flag("--yes", arguments->fIsConfirmed, "Stop the DHCP clients without confirmation");
  command
      .add_flag("--no-stop", arguments->fKeepsClients,
                "Keep the DHCP clients running; while one of them uses port 68, no answer can be received")
      ->excludes(yes);
  command.footer(
      "Queries the DHCP server, by a broadcast for each interface whose name begins with \"eth\", for the URL of the proxy\n"
      "configuration file (option 252), and prints it. Only root may listen for the answer, and only one program at a time:\n"
      "the running DHCP clients are stopped first. An unanswered query takes 18 seconds: three attempts of six.\n"
      "Exit status: 0 when a URL was found (with --fetch, the file as well), 2 when the file was not fetched, 1 when no URL\n"
      "was found, 64 for wrong usage.");
  return [arguments] { return Wpad(*arguments); };
}

}  // namespace NQRVZEP20::zep
