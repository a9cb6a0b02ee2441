// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/TConnection.h"

#include "TZEPFailure.h"

#include <poll.h>

namespace NQRVZEP20::zep {

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
  return fCurl->fPerform(fHandle);
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

void TConnection::FailFor(CURLcode code, std::string const& errorText) {
  if (code == CURLE_COULDNT_RESOLVE_HOST || code == CURLE_COULDNT_CONNECT)
    throw TZEPFailure(kZEPStatusConnectionFailed, "Error connecting to Server");
  throw TZEPFailure(kZEPStatusAccessDenied, "Error performing command: " + errorText);
}

}  // namespace NQRVZEP20::zep
