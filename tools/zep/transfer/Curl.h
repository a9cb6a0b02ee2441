// SPDX-License-Identifier: Apache-2.0
#pragma once

// The limits to plain HTTP are set as every libcurl knows them; newer ones have another way as well.
#define CURL_DISABLE_DEPRECATION
#include <curl/curl.h>
#include <dlfcn.h>

#include <memory>
#include <string>

namespace NQRVZEP20::zep {

// The functions of libcurl that are used; libcurl.so is loaded, never linked.
struct TCurl {
  std::unique_ptr<void, int (*)(void*)> fLibrary{nullptr, ::dlclose};
  decltype(curl_global_init)* fGlobalInit = nullptr;
  decltype(curl_easy_init)* fInit = nullptr;
  decltype(curl_easy_setopt)* fSetOption = nullptr;
  decltype(curl_easy_getinfo)* fGetInfo = nullptr;
  decltype(curl_easy_perform)* fPerform = nullptr;
  decltype(curl_easy_cleanup)* fCleanup = nullptr;
  decltype(curl_slist_append)* fAppend = nullptr;
  decltype(curl_slist_free_all)* fFreeAll = nullptr;
  decltype(curl_global_cleanup)* fGlobalCleanup = nullptr;
};

// False, with the loader's reason, when there is no libcurl that can be used. It is found where the library finds its own;
// fLibrary stays null when there is none at all.
bool Load(TCurl& curl, std::string& failure);

}  // namespace NQRVZEP20::zep
