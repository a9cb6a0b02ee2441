// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/TConnection.h"

#include "TZEPFailure.h"

#include <poll.h>

namespace NQRVZEP20::zep {

namespace {

bool IsNoConnection(CURLcode code) { return code == CURLE_COULDNT_RESOLVE_HOST || code == CURLE_COULDNT_CONNECT; }

}  // namespace

TConnection::TConnection() {
  TLoadOutcome const& outcome = fCurl.Outcome();
  if (!outcome) {
    bool const isLoaded = outcome.fKind != TLoadOutcome::kNotLoaded;
    throw TZEPFailure(kZEPStatusLibCurlFailure,
                      (isLoaded ? "Error loading curl library: " : "Error opening curl library: ") + outcome.fReason);
  }
  if (fCurl->fGlobalInit(CURL_GLOBAL_ALL) == CURLE_OK) fHandle = fCurl->fInit();
  if (fHandle == nullptr) throw TZEPFailure(kZEPStatusLibCurlFailure, "Error initalizing curl");
  Set(CURLOPT_ERRORBUFFER, fError.data());
  Set(CURLOPT_FTP_USE_EPSV, 0L);
  Set(CURLOPT_PROXY, "");
}

TConnection::~TConnection() {
  fCurl->fCleanup(fHandle);
  for (curl_slist* const list : fLists) fCurl->fFreeAll(list);
  fCurl->fGlobalCleanup();
}

void TConnection::SetCommandsAfter(TCommands const& commands) {
  curl_slist* list = nullptr;
  for (std::string const& command : commands) list = fCurl->fAppend(list, command.c_str());
  fLists.push_back(list);
  Set(CURLOPT_POSTQUOTE, list);
}

CURLcode TConnection::Perform(std::string const& url) {
  fError[0] = '\0';
  Set(CURLOPT_URL, url.c_str());
  fCode = fCurl->fPerform(fHandle);
  return fCode;
}

std::int64_t TConnection::RemoteTime() const {
  curl_off_t time = -1;
  return fCurl->fGetInfo(fHandle, CURLINFO_FILETIME_T, &time) == CURLE_OK ? time : -1;
}

std::int64_t TConnection::BytesToCome() const {
  curl_off_t bytes = -1;
  return fCurl->fGetInfo(fHandle, CURLINFO_CONTENT_LENGTH_DOWNLOAD_T, &bytes) == CURLE_OK ? bytes : -1;
}

bool TConnection::IsLost() const {
  curl_socket_t socket = CURL_SOCKET_BAD;
  fCurl->fGetInfo(fHandle, CURLINFO_ACTIVESOCKET, &socket);
  pollfd end{socket, POLLRDHUP, 0};
  return socket == CURL_SOCKET_BAD || ::poll(&end, 1, 0) > 0;
}

std::string TConnection::ErrorText() const {
  if (!IsNoConnection(fCode)) return fError.data();
  if (!IsDataPortNamed()) return "";
  return "the server answers, but its data port cannot be reached; does a firewall let its passive ports through? (" +
         std::string(fError.data()) + ")";
}

// Whether the last reply of an FTP server was one to PASV or EPSV, which names the port for the data.
bool TConnection::IsDataPortNamed() const {
  constexpr long kPassive = 227, kExtendedPassive = 229;
  long reply = 0;
  fCurl->fGetInfo(fHandle, CURLINFO_RESPONSE_CODE, &reply);
  return reply == kPassive || reply == kExtendedPassive;
}

void TConnection::FailFor(CURLcode code, std::string const& errorText) {
  if (IsNoConnection(code))
    throw TZEPFailure(kZEPStatusConnectionFailed, "Error connecting to Server" + (errorText.empty() ? "" : ": " + errorText));
  throw TZEPFailure(kZEPStatusAccessDenied, "Error performing command: " + errorText);
}

}  // namespace NQRVZEP20::zep
