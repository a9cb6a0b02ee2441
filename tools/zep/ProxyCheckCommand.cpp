// zep proxy-check: whether a web proxy lets a request through.

#include "Commands.h"
#include "Failure.h"
#include "Output.h"
#include "TOSSpecific.h"
#include "TScratchDirectory.h"
#include "Text.h"
#include "Transfer.h"

#include <CLI/CLI.hpp>

#include <filesystem>
#include <fstream>
#include <iostream>
#include <memory>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

struct TArguments {
  std::string fProxy;
  bool fAsJson = false;
  TTransferOptions fOptions;
};

std::string FirstLineOf(std::string const& text) {
  constexpr std::size_t kLongest = 200;
  return Printable(text.substr(0, std::min(kLongest, text.find_first_of("\r\n"))));
}

// The title of a web page, such as that of a proxy's refusal; else its first line.
std::string AnswerIn(std::string const& page) {
  if (page.empty()) return "nothing came back";
  std::string const start = "<title>";
  std::size_t const title = page.find(start), end = page.find("</title>");
  if (title == page.npos || end == page.npos || end < title) return "what came back begins with: " + FirstLineOf(page);
  return "what came back is entitled: " + FirstLineOf(page.substr(title + start.size(), end - title - start.size()));
}

// Something may come back from the proxy itself: its refusal, or that it cannot reach the page. So the page has to be the one.
TOutcome Check(TRemote const& proxy, TTransferOptions const& options) {
  TScratchDirectory const scratch("zep-proxy-check");  // the library writes the page into the working directory
  std::string const pageFile = scratch.Path("content.html");
  TWatch const watch{pageFile, false, proxy.fPassword, options.fStallSeconds, {}};
  TOutcome outcome = RunWatched(
      [&] {
        std::filesystem::current_path(scratch.Path());
        return TOSSpecific::CheckProxySetting(proxy.fHost, proxy.fPort, UserAndPasswordOf(proxy), 0);
      },
      watch);
  if (outcome.fExit != kExitComplete) return outcome;
  std::ostringstream page;
  page << std::ifstream(pageFile).rdbuf();
  if (page.str().find(ZEP_PROXY_CHECK_TEXT) != std::string::npos) return outcome;
  return {kZEPStatusAccessDenied, kExitNothing, "the page did not come through; " + AnswerIn(page.str())};
}

int Tell(std::string const& proxy, TOutcome const& outcome, bool asJson, bool quiet) {
  bool const works = outcome.fExit == kExitComplete;
  if (asJson) {
    TJson document = DocumentHead("zep proxy-check", outcome.fExit, outcome.fReason);
    document["proxy"] = proxy;
    document["works"] = works;
    WriteOutput(AsText(document));
  } else if (works && !quiet) {
    WriteOutput("The proxy " + proxy + " lets requests through.\n");
  }
  if (!works) std::cerr << "zep: proxy " << proxy << ": " << outcome.fReason << "\n";
  return outcome.fExit;
}

int ProxyCheck(TArguments const& arguments) {
  TRemote proxy = RemoteOf(arguments.fProxy, "http");
  if (proxy.fScheme != "http" || !proxy.fPath.empty()) throw TWrongUsage("a proxy is [USER@]HOST:PORT");
  if (proxy.fPort.empty()) throw TWrongUsage("the port of the proxy is missing");
  FindPassword(proxy, arguments.fOptions.fNetrc);
  return Tell(Printable(proxy.fHost + ":" + proxy.fPort), Check(proxy, arguments.fOptions), arguments.fAsJson,
              arguments.fOptions.fQuiet);
}

}  // namespace

TRun AddProxyCheckArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command.add_option("proxy", arguments->fProxy, "[USER@]HOST:PORT")->required();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  AddTransferOptions(command, arguments->fOptions);
  command.footer(
      "A web page is fetched through the proxy; the check is passed when it is that page which comes back.\n"
      "The password comes from netrc or from a prompt.\n"
      "Exit status: 0 when the page came back, 1 when something else did, 64 for wrong usage, 68 when the proxy is unknown or\n"
      "does not answer, 69 without libcurl, 75 when nothing moved for too long.");
  return [arguments] { return ProxyCheck(*arguments); };
}

}  // namespace NQRVZEP20::zep
