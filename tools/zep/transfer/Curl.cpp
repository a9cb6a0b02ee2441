// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Curl.h"

#include "TOSSpecific.h"

#include <vector>

namespace NQRVZEP20::zep {

namespace {

std::vector<std::string> LibraryNames() {
  std::string const root = TOSSpecific::GetZEPRootPath();
  return {root + "/libcurl.so", root + "/libcurl.so.4", "libcurl.so", "libcurl.so.4", "libcurl.so.3", "libcurl.so.2"};
}

template <class TFunction>
bool Find(void* library, char const* name, TFunction*& function) {
  function = reinterpret_cast<TFunction*>(::dlsym(library, name));
  return function != nullptr;
}

bool FindAll(void* library, TCurl& curl) {
  return Find(library, "curl_global_init", curl.fGlobalInit) && Find(library, "curl_easy_init", curl.fInit) &&
         Find(library, "curl_easy_setopt", curl.fSetOption) && Find(library, "curl_easy_getinfo", curl.fGetInfo) &&
         Find(library, "curl_easy_perform", curl.fPerform) && Find(library, "curl_easy_cleanup", curl.fCleanup) &&
         Find(library, "curl_slist_append", curl.fAppend) && Find(library, "curl_slist_free_all", curl.fFreeAll) &&
         Find(library, "curl_global_cleanup", curl.fGlobalCleanup);
}

}  // namespace

bool Load(TCurl& curl, std::string& failure) {
  for (std::string const& name : LibraryNames()) {
    curl.fLibrary.reset(::dlopen(name.c_str(), RTLD_LAZY));
    if (curl.fLibrary) break;
  }
  if (curl.fLibrary && FindAll(curl.fLibrary.get(), curl)) return true;
  char const* const reason = ::dlerror();
  failure = reason != nullptr ? reason : "no reason given";
  return false;
}

}  // namespace NQRVZEP20::zep
