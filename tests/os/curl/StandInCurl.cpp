// SPDX-License-Identifier: Apache-2.0

// A stand-in for libcurl. Its six functions record their calls in the test's record. Without a record it prints the name of its
// own file.

#include "tests/os/curl/StandInCurl.h"

#include <curl/curl.h>
#include <dlfcn.h>
#include <sys/stat.h>

#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <map>

extern "C" void ZepFunctionThatNobodyHas();

namespace {

NQRVZEP20::TCurlRecord* gRecord = nullptr;
char* gErrorBuffer = nullptr;
std::FILE* gUpload = nullptr;
unsigned long (*gWrite)(void*, unsigned long, unsigned long, void*) = nullptr;
void* gWriteContext = nullptr;
int gHandle;

void Note(std::string const& call) {
  if (gRecord != nullptr) gRecord->fCalls.push_back(call);
}

long SizeOf(std::string const& path) {
  struct stat status;
  return ::stat(path.c_str(), &status) == 0 ? status.st_size : -1;
}

// Option numbers are fixed by libcurl's binary interface: from 0 on for numbers, 10000 pointers, 20000 functions.
std::map<int, char const*> const kNames = {
    {46, "UPLOAD"},       {59, "PROXYPORT"},      {85, "FTP_USE_EPSV"},    {110, "FTP_CREATE_MISSING_DIRS"},
    {10001, "WRITEDATA"}, {10002, "URL"},         {10004, "PROXY"},        {10006, "PROXYUSERPWD"},
    {10009, "READDATA"},  {10010, "ERRORBUFFER"}, {20011, "WRITEFUNCTION"}};

std::string TextOf(int option, std::va_list& arguments) {
  if (option < 10000) return std::to_string(va_arg(arguments, long));
  if (option == 20011) {
    gWrite = va_arg(arguments, unsigned long (*)(void*, unsigned long, unsigned long, void*));
    return "function";
  }
  char* const pointer = va_arg(arguments, char*);
  if (option == 10010) {
    gErrorBuffer = pointer;
    return "buffer";
  }
  if (option == 10001) {
    gWriteContext = pointer;
    return "context";
  }
  if (option == 10009) {
    gUpload = reinterpret_cast<std::FILE*>(pointer);
    return "stream";
  }
  return std::string("'") + pointer + "'";
}

// False when one was refused.
bool WriteChunks() {
  for (std::string& chunk : gRecord->fChunks) {
    unsigned long const written = gWrite(chunk.data(), 1, chunk.size(), gWriteContext);
    std::string const& file = gRecord->fFileToWatch;
    Note("write " + std::to_string(written) + (file.empty() ? "" : " file " + std::to_string(SizeOf(file))));
    if (written != chunk.size()) return false;
  }
  return true;
}

void ReadUpload() {
  char chunk[1000];
  while (std::size_t const got = std::fread(chunk, 1, sizeof chunk, gUpload)) gRecord->fUploaded.append(chunk, got);
}

// When the library goes, which is when the last who opened it closes it.
struct TFarewell {
  ~TFarewell() { Note("unload"); }
} gFarewell;

}  // namespace

extern "C" {

// Loads only where functions are bound when they are first called.
void StandInCallsWhatNobodyHas() { ZepFunctionThatNobodyHas(); }

void StandInUse(NQRVZEP20::TCurlRecord* record) { gRecord = record; }

CURLcode curl_global_init(long flags) {
  if (gRecord == nullptr) {
    Dl_info info{};
    ::dladdr(reinterpret_cast<void*>(&StandInUse), &info);
    std::printf("%s\n", info.dli_fname);
  }
  Note("global_init " + std::to_string(flags));
  return CURLE_OK;
}

CURL* curl_easy_init() {
  Note("easy_init");
  return gRecord != nullptr && gRecord->fGivesNoHandle ? nullptr : &gHandle;
}

// In brackets, because it is a macro as well.
CURLcode(curl_easy_setopt)(CURL* handle, CURLoption option, ...) {
  std::va_list arguments;
  va_start(arguments, option);
  auto const name = kNames.find(option);
  if (handle != &gHandle || name == kNames.end()) {
    Note("setopt of a strange handle or option " + std::to_string(option));
  } else {
    Note(std::string("setopt ") + name->second + " " + TextOf(option, arguments));
  }
  va_end(arguments);
  return gRecord != nullptr && gRecord->fRefusedOption == option ? CURLE_UNKNOWN_OPTION : CURLE_OK;
}

CURLcode curl_easy_perform(CURL* handle) {
  Note(handle == &gHandle ? "perform" : "perform of a strange handle");
  if (gRecord == nullptr) return CURLE_OK;
  gRecord->fErrorTextAtStart = gErrorBuffer;
  if (gUpload != nullptr) ReadUpload();
  if (gWrite != nullptr && !WriteChunks()) return CURLE_WRITE_ERROR;
  if (!gRecord->fErrorText.empty()) std::strcpy(gErrorBuffer, gRecord->fErrorText.c_str());
  return static_cast<CURLcode>(gRecord->fResult);
}

void curl_easy_cleanup(CURL* handle) { Note(handle == &gHandle ? "easy_cleanup" : "easy_cleanup of a strange handle"); }

void curl_global_cleanup() { Note("global_cleanup"); }

}  // extern "C"
