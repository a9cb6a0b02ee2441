// SPDX-License-Identifier: Apache-2.0

// zep proxy-check: whether a web proxy lets a request through.

#include "TZEPFailure.h"
#include "os/ProxyCheck.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/TScratchDirectory.h"
#include "tools/zep/secrets/Secrets.h"
#include "tools/zep/transfer/Transfer.h"
#include "tools/zep/transfer/Unreachable.h"

#include <CLI/CLI.hpp>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TProxyCheckArguments {
  std::string fProxy;
  bool fAsJson = false;
  std::uint64_t fMostBytes = 1 << 20;
  TTransferOptions fOptions;
};

// Hides passwords before it cuts the text, because the cut might split one.
std::string FirstLineOf(std::string const& whole) {
  constexpr std::size_t kLongest = 200;
  std::string const text = WithoutSecrets(whole);
  return Printable(text.substr(0, std::min(kLongest, text.find_first_of("\r\n"))));
}

// The title of a web page, such as a proxy's refusal; otherwise its first line.
std::string AnswerIn(std::string const& page) {
  if (page.empty()) return "the returned page is empty";
  std::string const start = "<title>";
  std::size_t const title = page.find(start), end = page.find("</title>");
  if (title == page.npos || end == page.npos || end < title) return "the returned text begins with: " + FirstLineOf(page);
  return "the title of the returned page is: " + FirstLineOf(page.substr(title + start.size(), end - title - start.size()));
}

// Reads the file in pieces, because it may be large.
bool HoldsText(std::string const& file, std::string const& text) {
  std::ifstream stream(file, std::ios::binary);
  std::string piece, chunk(65536, '\0');
  while (stream.read(chunk.data(), static_cast<std::streamsize>(chunk.size())), stream.gcount() > 0) {
    piece.append(chunk, 0, static_cast<std::size_t>(stream.gcount()));
    if (piece.find(text) != piece.npos) return true;
    piece.erase(0, piece.size() - std::min(piece.size(), text.size() - 1));  // the end may be the beginning of the text
  }
  return false;
}

std::string BeginningOf(std::string const& file) {
  std::string text(65536, '\0');
  std::ifstream stream(file, std::ios::binary);
  stream.read(text.data(), static_cast<std::streamsize>(text.size()));
  text.resize(static_cast<std::size_t>(stream.gcount()));
  return text;
}

bool IsCutAt(std::string const& file, std::uint64_t mostBytes) {
  std::error_code absent;
  return mostBytes > 0 && std::filesystem::file_size(file, absent) >= mostBytes && !absent;
}

// Fetches the page into the working directory. libcurl would go past the proxy for the hosts in these variables.
TZEPStatusCode FetchPage(TRemote const& proxy) {
  for (char const* const name : {"no_proxy", "NO_PROXY"}) ::unsetenv(name);
  TProxyAnswer const answer = CheckProxy(proxy.fHost, proxy.fPort, UserAndPasswordOf(proxy));
  if (answer.fStatus == kZEPStatusOK) return kZEPStatusOK;
  throw TZEPFailure(answer.fStatus, answer.fReason.empty() ? "libcurl reports no reason" : answer.fReason);
}

bool HasContent(std::string const& file) {
  std::error_code absent;
  return std::filesystem::file_size(file, absent) > 0 && !absent;
}

// Replaces the message of libcurl, which names no remedy, or the message about a stall.
void ExplainNoConnection(TOutcome& outcome, TRemote const& proxy) {
  constexpr int kProbeSeconds = 3;
  std::string const why = WhyUnreachable(proxy.fHost, proxy.fPort, kProbeSeconds);
  if (PendingInterrupt() != 0)
    outcome = Interrupted();
  else if (!why.empty())
    outcome = {kZEPStatusConnectionFailed, kExitNoConnection, Printable(why)};
}

// The proxy may return a page of its own, such as a refusal, so the page is searched for its text.
TOutcome Check(TRemote const& proxy, TProxyCheckArguments const& arguments) {
  TScratchDirectory const scratch("zep-proxy-check");  // the library writes the page into the working directory
  std::string const pageFile = scratch.Path("content.html");
  TWatch const watch{pageFile, nullptr, arguments.fOptions.fStallSeconds, arguments.fMostBytes, {}};
  TOutcome outcome = RunWatched(
      [&] {
        std::filesystem::current_path(scratch.Path());
        return FetchPage(proxy);
      },
      watch);
  bool const isCut = outcome.fExit == kExitNothing && IsCutAt(pageFile, arguments.fMostBytes);
  bool const isSilent = outcome.fExit == kExitStalled && !HasContent(pageFile);
  if (outcome.fExit == kExitNoConnection || isSilent) ExplainNoConnection(outcome, proxy);
  if (outcome.fExit != kExitComplete && !isCut) return outcome;
  if (HoldsText(pageFile, ZEP_PROXY_CHECK_TEXT)) return {};
  std::string const size = isCut ? ", and is larger than " + ExactSizeText(arguments.fMostBytes) + " (--max-page)" : "";
  return {kZEPStatusAccessDenied, kExitNothing, "the expected page was not returned; " + AnswerIn(BeginningOf(pageFile)) + size};
}

// The final outcome: the interrupt, if there is one.
TOutcome Decided(TOutcome const& outcome) { return IsInterruptedAtLast() ? Interrupted() : outcome; }

int Tell(std::string const& proxy, TOutcome const& outcome, bool asJson, bool quiet) {
  bool const works = outcome.fExit == kExitComplete;
  if (asJson) {
    TJson document = DocumentHead("zep proxy-check", outcome.fExit, outcome.fReason);
    document["proxy"] = proxy;
    document["works"] = works;
    WriteOutput(AsText(document));
  } else if (works && !quiet) {
    WriteMessage("The proxy " + proxy + " lets requests through.\n");
  }
  if (!works) std::cerr << "zep: proxy " << proxy << ": " << outcome.fReason << "\n";
  return outcome.fExit;
}

int ProxyCheck(TProxyCheckArguments const& arguments) {
  TRemote proxy = RemoteOf(arguments.fProxy, "http");
  if (proxy.fScheme != "http" || !proxy.fPath.empty()) throw TWrongUsage("a proxy is [USER@]HOST:PORT");
  if (proxy.fPort.empty()) throw TWrongUsage("the port of the proxy is missing");
  FindPassword(proxy, arguments.fOptions.fNetrc);
  HideLogin(proxy.fUser, proxy.fPassword.View());
  TInterruptGuard const guard;
  return Tell(Printable(proxy.fHost + ":" + proxy.fPort), Decided(Check(proxy, arguments)), arguments.fAsJson,
              arguments.fOptions.fQuiet);
}

}  // namespace

TRun AddProxyCheckArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TProxyCheckArguments>();
  command.add_option("proxy", arguments->fProxy, "[USER@]HOST:PORT")->required();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  AddSizeOption(command, "--max-page", arguments->fMostBytes,
                "The size limit for the page, such as 500K or 2M (default 1M); 0: no limit");
  AddTransferOptions(command, arguments->fOptions);
  command.footer(
      "Fetches a web page through the proxy and checks that the returned page contains the expected text. The password comes\n"
      "from the argument (which other users may see in the list of processes), from netrc, or from a prompt.\n"
      "Exit status: 0 when the expected page was returned, 1 when it was not, 64 for wrong usage, 68 when the proxy is\n"
      "unknown or does not answer, 69 when libcurl is missing, 75 when no data arrived for the seconds of --stall.");
  return [arguments] { return ProxyCheck(*arguments); };
}

}  // namespace NQRVZEP20::zep
