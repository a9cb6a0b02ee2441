#include "PacFile.h"

#include "TOSSpecific.h"

// The limits to plain HTTP are set as every libcurl knows them; newer ones have another way as well.
#define CURL_DISABLE_DEPRECATION
#include <curl/curl.h>
#include <dlfcn.h>
#include <strings.h>

#include <array>
#include <cstring>
#include <memory>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kMostBytes = 1 << 20;

// The functions of libcurl that are used; libcurl.so is loaded, never linked.
struct TCurl {
  std::unique_ptr<void, int (*)(void*)> fLibrary{nullptr, ::dlclose};
  decltype(curl_global_init)* fGlobalInit = nullptr;
  decltype(curl_easy_init)* fInit = nullptr;
  decltype(curl_easy_setopt)* fSetOption = nullptr;
  decltype(curl_easy_perform)* fPerform = nullptr;
  decltype(curl_easy_cleanup)* fCleanup = nullptr;
  decltype(curl_global_cleanup)* fGlobalCleanup = nullptr;
};

std::vector<std::string> LibraryNames() {
  std::string const root = TOSSpecific::GetZEPRootPath();
  return {root + "/libcurl.so", root + "/libcurl.so.4", "libcurl.so", "libcurl.so.4", "libcurl.so.3", "libcurl.so.2"};
}

template <class TFunction>
bool Find(void* library, char const* name, TFunction*& function) {
  function = reinterpret_cast<TFunction*>(::dlsym(library, name));
  return function != nullptr;
}

// False, with the loader's reason, when there is no libcurl that can be used.
bool Load(TCurl& curl, std::string& failure) {
  for (std::string const& name : LibraryNames()) {
    curl.fLibrary.reset(::dlopen(name.c_str(), RTLD_LAZY));
    if (curl.fLibrary) break;
  }
  void* const library = curl.fLibrary.get();
  bool const isWhole = library != nullptr && Find(library, "curl_global_init", curl.fGlobalInit) &&
                       Find(library, "curl_easy_init", curl.fInit) && Find(library, "curl_easy_setopt", curl.fSetOption) &&
                       Find(library, "curl_easy_perform", curl.fPerform) && Find(library, "curl_easy_cleanup", curl.fCleanup) &&
                       Find(library, "curl_global_cleanup", curl.fGlobalCleanup);
  if (isWhole) return true;
  char const* const reason = ::dlerror();
  failure = std::string("libcurl cannot be loaded: ") + (reason != nullptr ? reason : "no reason given") +
            (library == nullptr ? "; install the package libcurl4" : "");
  return false;
}

// libcurl's write callback. What is too long is refused, which ends the transfer.
std::size_t Append(char const* bytes, std::size_t size, std::size_t count, void* text) {
  std::string& all = *static_cast<std::string*>(text);
  if (all.size() + size * count > kMostBytes) return 0;
  all.append(bytes, size * count);
  return size * count;
}

// Empty, or why the file could not be had.
std::string Transfer(TCurl const& curl, std::string const& url, std::string& text) {
  std::unique_ptr<CURL, decltype(curl_easy_cleanup)*> const transfer(curl.fInit(), curl.fCleanup);
  if (!transfer) return "libcurl does not start";
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
  curl.fSetOption(handle, CURLOPT_WRITEDATA, &text);
  CURLcode const code = curl.fPerform(handle);
  if (code == CURLE_OK) return "";
  return error[0] != '\0' ? error.data() : "libcurl ends with code " + std::to_string(code);
}

bool IsPlainHttp(std::string const& url) { return ::strncasecmp(url.c_str(), "http://", 7) == 0; }

}  // namespace

TPacFile FetchPacFile(std::string const& url) {
  TPacFile file;
  if (!IsPlainHttp(url)) {
    file.fFailure = "only files of plain HTTP are fetched";
    return file;
  }
  TCurl curl;
  if (!Load(curl, file.fFailure)) return file;
  if (curl.fGlobalInit(CURL_GLOBAL_ALL) != CURLE_OK) {
    file.fFailure = "libcurl does not start";
    return file;
  }
  file.fFailure = Transfer(curl, url, file.fText);
  curl.fGlobalCleanup();
  return file;
}

}  // namespace NQRVZEP20::zep
