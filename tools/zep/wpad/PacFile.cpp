// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/wpad/PacFile.h"

#include "loaders/CurlLibrary.h"
#include "tools/zep/output/Text.h"

#include <strings.h>

#include <array>
#include <cstring>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

// The text received so far, and whether it became too long.
struct TPage {
  std::string& fText;
  std::uint64_t fMostBytes;  // 0: any number
  bool fIsTooLong = false;
};

// libcurl's write callback. A text that is too long is refused, which ends the transfer.
std::size_t Append(char const* bytes, std::size_t size, std::size_t count, void* context) {
  TPage& page = *static_cast<TPage*>(context);
  page.fIsTooLong = page.fMostBytes > 0 && page.fText.size() + size * count > page.fMostBytes;
  if (page.fIsTooLong) return 0;
  page.fText.append(bytes, size * count);
  return size * count;
}

// Why the file could not be fetched; empty when it was.
std::string Transfer(TCurlFunctions const& curl, std::string const& url, std::uint64_t mostBytes, std::string& text) {
  std::unique_ptr<CURL, decltype(curl_easy_cleanup)*> const transfer(curl.fInit(), curl.fCleanup);
  if (!transfer) return "libcurl cannot be initialised";
  std::array<char, CURL_ERROR_SIZE> error{};
  CURL* const handle = transfer.get();
  curl.fSetOption(handle, CURLOPT_ERRORBUFFER, error.data());
  curl.fSetOption(handle, CURLOPT_URL, url.c_str());
  curl.fSetOption(handle, CURLOPT_PROTOCOLS, long{CURLPROTO_HTTP});
  curl.fSetOption(handle, CURLOPT_REDIR_PROTOCOLS, long{CURLPROTO_HTTP});
  curl.fSetOption(handle, CURLOPT_FOLLOWLOCATION, 1L);
  curl.fSetOption(handle, CURLOPT_MAXREDIRS, 5L);
  curl.fSetOption(handle, CURLOPT_NOPROXY, "*");
  curl.fSetOption(handle, CURLOPT_FAILONERROR, 1L);
  curl.fSetOption(handle, CURLOPT_CONNECTTIMEOUT, 10L);
  curl.fSetOption(handle, CURLOPT_TIMEOUT, 30L);
  curl.fSetOption(handle, CURLOPT_NOSIGNAL, 1L);
  curl.fSetOption(handle, CURLOPT_WRITEFUNCTION, &Append);
  TPage page{text, mostBytes};
  curl.fSetOption(handle, CURLOPT_WRITEDATA, &page);
  CURLcode const code = curl.fPerform(handle);
  if (code == CURLE_OK) return "";
  if (page.fIsTooLong) return "it is larger than " + ExactSizeText(mostBytes) + "; --max-file allows more";
  return error[0] != '\0' ? error.data() : "libcurl failed with code " + std::to_string(code);
}

bool IsPlainHttp(std::string const& url) { return ::strncasecmp(url.c_str(), "http://", 7) == 0; }

}  // namespace

TPacFile FetchPacFile(std::string const& url, std::uint64_t mostBytes) {
  TPacFile file;
  if (!IsPlainHttp(url)) {
    file.fFailure = "only plain HTTP (http://) is supported";
    return file;
  }
  TLoadedLibrary<TCurlFunctions> const curl;
  if (TLoadOutcome const& outcome = curl.Outcome(); !outcome) {
    bool const isInstalled = outcome.fKind != TLoadOutcome::kNotLoaded;
    file.fFailure = "libcurl cannot be loaded: " + outcome.fReason + (isInstalled ? "" : "; install the package libcurl4");
    return file;
  }
  if (curl->fGlobalInit(CURL_GLOBAL_ALL) != CURLE_OK) {
    file.fFailure = "libcurl cannot be initialised";
    return file;
  }
  file.fFailure = Transfer(*curl, url, mostBytes, file.fText);
  curl->fGlobalCleanup();
  return file;
}

}  // namespace NQRVZEP20::zep
