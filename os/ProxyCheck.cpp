// SPDX-License-Identifier: Apache-2.0
#include "os/ProxyCheck.h"

#include "core/Log.h"
#include "os/WriteContext.h"

#include <cstdlib>

namespace NQRVZEP20 {
namespace {

constexpr TCurlMessages kProxyMessages = {
    "TOSSpecific|CheckProxySetting: Error opening curl library: ", "TOSSpecific|CheckProxySetting: Error loading curl library: ",
    "TOSSpecific|CheckProxySetting: Error initalizing curl",
    "TOSSpecific|CheckProxySetting: Error configuring curl error buffer"};

EZEPStatusCode StatusOf(CURLcode result) {
  if (result == CURLE_OK) return kZEPStatusOK;
  bool const isConnectionFailure = result == CURLE_COULDNT_RESOLVE_PROXY || result == CURLE_COULDNT_CONNECT;
  return isConnectionFailure ? kZEPStatusConnectionFailed : kZEPStatusAccessDenied;
}

}  // namespace

TProxyAnswer CheckProxy(std::string const& proxy, std::string const& port, std::string const& userAndPassword) {
  TCurlWriteContext page{"./content.html", nullptr};
  TCurl curl(kProxyMessages);
  curl.Set(CURLOPT_PROXY, proxy.c_str(), "TOSSpecific|CheckProxySetting: Error setting proxyIp");
  curl.Set(CURLOPT_PROXYPORT, std::atol(port.c_str()), "TOSSpecific|CheckProxySetting: Error setting proxyPort");
  curl.Set(CURLOPT_URL, ZEP_PROXY_CHECK_PAGE, "TOSSpecific|CheckProxySetting: Error setting URL");
  SetWriteContext(curl, page);  // its message names CurlTransferFile. Kept.
  curl.Set(CURLOPT_PROXYUSERPWD, userAndPassword.c_str(), "TOSSpecific|CheckProxySetting: Error setting userId & passwd");

  CURLcode const result = curl.Perform();
  if (result == CURLE_OK) return {kZEPStatusOK, ""};
  std::string const reason = curl.ErrorText();
  LogError("TOSSpecific|CheckProxySetting: curl_easy_perform FAILed;", reason);
  return {StatusOf(result), reason};
}

}  // namespace NQRVZEP20
