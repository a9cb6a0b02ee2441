// SPDX-License-Identifier: Apache-2.0

// Runs one operation of the host services while the preloaded tests/faults makes one of its calls fail. Prints the result, the
// log entries, and the resources that are left.
//
//   FaultyOperation OPERATION       in a directory of files that the test prepared

#include "TCommUtil.h"
#include "TConfig.h"
#include "TOSSpecific.h"
#include "tests/os/HostTools.h"
#include "tests/os/curl/StandInCurl.h"

#include <dlfcn.h>
#include <fcntl.h>

#include <cstdlib>
#include <functional>
#include <iostream>
#include <map>
#include <new>

namespace {

using namespace NQRVZEP20;

bool gLargeAllocationsFail = false;

std::string Joined(std::vector<std::string> const& texts) {
  std::string all;
  for (std::string const& text : texts) all += (all.empty() ? "" : ",") + text;
  return all;
}

// The preparation, the call that is run while faults are armed, and the inspection after it.
struct TOperation {
  std::function<std::string()> fCall;
  std::function<std::string()> fLook = [] { return ""; };
  std::function<void()> fPrepare = [] {};
};

std::string const kChild = Child("PrintsArguments");

std::string Spawn() {
  std::string output;
  int const result = TOSSpecific::SpawnProcess(kChild, {}, output, -1);
  return std::to_string(result) + " " + output;
}

std::string SpawnWithEnvironment() {
  std::string output;
  int const result = TOSSpecific::SpawnProcess(kChild, {}, kChild, {"A=1"}, output, -1);
  return std::to_string(result) + " " + output;
}

std::string CaptureViaProgram() {
  std::string contents = "old";
  TOSSpecific::CapFileViaProc(kChild, {}, "small", contents);
  return contents;
}

std::string Copy(std::string const& from) {
  TOSSpecific::FileCopy(from, "copy");
  return "copied";
}

std::string MakeTree() {
  TCommUtil::MkDirHier("tree/below/new");
  return "made";
}

std::string OpenStream() {
  std::ofstream stream;
  TOSSpecific::OpenOutputFileStream(stream, "new");
  return "opened";
}

std::string Edit() {
  TOSSpecific::LaunchTextEditor("d/" + std::string(40, 'n'));
  return "done";
}

void WriteLongConfiguration() {
  std::string text;
  for (int i = 0; i < 2000; ++i) text += "key" + std::to_string(i) + "=value\n";
  WriteFile("zep.cfg", text);
}

void ReadConfigurationOfB() {
  std::string const text = ReadFile("zep.cfg");
  WriteFile("zep.cfg", "b=1");
  TConfig::GetInstance();
  WriteFile("zep.cfg", text);
}

std::string ReadConfigurationAgain() {
  TConfig::GetInstance()->parseConfigFile();
  return Joined(TConfig::GetInstance()->listKeys());
}

std::string KeysWithoutMemory() {
  gLargeAllocationsFail = true;  // that of the stream's buffer
  TConfig* const config = TConfig::GetInstance();
  gLargeAllocationsFail = false;
  return Joined(config->listKeys());
}

// Makes a pseudo terminal standard input, where these keys were typed.
void Type(std::string const& keys) {
  int const keyboard = ::posix_openpt(O_RDWR | O_NOCTTY);
  if (::grantpt(keyboard) != 0 || ::unlockpt(keyboard) != 0) ::abort();
  int const terminal = ::open(::ptsname(keyboard), O_RDWR | O_NOCTTY);
  if (::dup2(terminal, 0) != 0 || ::write(keyboard, keys.data(), keys.size()) != static_cast<ssize_t>(keys.size())) ::abort();
}

TCurlRecord gCurl;

void UseStandInCurl() {
  void* const library = ::dlopen(ZEP_CURL_DIR "/whole/libcurl.so", RTLD_LAZY);  // is "libcurl.so" from now on
  reinterpret_cast<TUseRecord*>(::dlsym(library, "StandInUse"))(&gCurl);
  gCurl.fChunks = {"first ", "second"};
}

std::string Transfer(std::string const& file, bool download) {
  TOSSpecific::CurlTransferFile("ftp://h/f", file, download);
  return "transferred";
}

std::string YesOrNo(bool value) { return value ? "true" : "false"; }

std::map<std::string, TOperation> const kOperations = {
    {"SpawnProcess", {Spawn}},
    {"SpawnProcessWithEnvironment", {SpawnWithEnvironment}},
    {"CapFileViaProc", {CaptureViaProgram}},
    {"CaptureFile", {[] { return TOSSpecific::CaptureFile("small"); }}},
    {"CaptureFileOfSeveralReads", {[] { return std::to_string(TOSSpecific::CaptureFile("large").size()); }}},
    {"CaptureFileLoader", {[] { return TOSSpecific::CaptureFileLoader("small", true); }}},
    {"LaunchTextEditor", {Edit}},
    {"GetFileSize", {[] { return std::to_string(TOSSpecific::GetFileSize("small")); }}},
    {"FileCopy", {[] { return Copy("small"); }, [] { return ReadFile("copy"); }}},
    {"FileCopyOfALargeFile",
     {[] { return Copy("large"); }, [] { return ReadFile("copy") == ReadFile("large") ? "all" : "not all"; }}},
    {"DirCopy",
     {[] { return std::to_string(TOSSpecific::DirCopy("tree", "copy", true)); }, [] { return ReadFile("copy/below/file"); }}},
    {"MkDirHier", {MakeTree, [] { return TOSSpecific::DirExists("tree/below/new/") ? "there" : "missing"; }}},
    {"ListDir", {[] { return Joined(TOSSpecific::ListDir("tree/below")); }}},
    {"FindFile", {[] { return Joined(TOSSpecific::FindFile("tree/below/file")); }}},
    {"deleteFile",
     {[] { return YesOrNo(TOSSpecific::deleteFile("small")); },
      [] { return TOSSpecific::FileExists("small") ? "there" : "gone"; }}},
    {"createFile", {[] { return YesOrNo(TOSSpecific::createFile("new", "text")); }, [] { return ReadFile("new"); }}},
    {"OpenOutputFileStream", {OpenStream}},
    {"GetCurrentDir", {[] { return YesOrNo(!TOSSpecific::GetCurrentDir().empty()); }}},
    {"PutEnvironment", {[] { return YesOrNo(TOSSpecific::PutEnvironment("ZEP_TEST", "x")); }}},
    {"IsKeyWaiting", {[] { return YesOrNo(TOSSpecific::IsKeyWaiting()); }, [] { return ""; }, [] { Type(""); }}},
    {"GetKeyboardChar", {[] { return std::to_string(TOSSpecific::GetKeyboardChar()); }, [] { return ""; }, [] { Type("k\n"); }}},
    {"USleep", {[] { return std::to_string(TOSSpecific::USleep(1)); }}},
    {"LaunchCommandShell", {[] { return std::to_string(TOSSpecific::LaunchCommandShell()); }}},
    {"Upload", {[] { return Transfer("small", false); }, [] { return gCurl.fUploaded; }, UseStandInCurl}},
    {"UploadOfSeveralReads",
     {[] { return Transfer("large", false); }, [] { return std::to_string(gCurl.fUploaded.size()) + " bytes"; }, UseStandInCurl}},
    {"Download", {[] { return Transfer("new", true); }, [] { return ReadFile("new"); }, UseStandInCurl}},
    {"TConfig", {[] { return Joined(TConfig::GetInstance()->listKeys()); }}},
    {"TConfigOfSeveralReads",
     {[] { return std::to_string(TConfig::GetInstance()->listKeys().size()); }, [] { return ""; }, WriteLongConfiguration}},
    {"TConfigReadAgain", {ReadConfigurationAgain, [] { return ""; }, ReadConfigurationOfB}},
    {"TConfigWithoutMemory", {KeysWithoutMemory}},
};

template <class TFunction>
TFunction* Preloaded(char const* name) {
  return reinterpret_cast<TFunction*>(::dlsym(RTLD_DEFAULT, name));
}

}  // namespace

[[gnu::noinline]] void* operator new(std::size_t size) {
  void* const memory = gLargeAllocationsFail && size >= 8000 ? nullptr : std::malloc(size);
  if (memory == nullptr) throw std::bad_alloc();
  return memory;
}
[[gnu::noinline]] void operator delete(void* memory) noexcept { std::free(memory); }
[[gnu::noinline]] void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

int main(int, char** arguments) {
  ::unsetenv("LD_PRELOAD");  // not for the children
  TOperation const& operation = kOperations.at(arguments[1]);
  TLogCapture const log;
  operation.fPrepare();
  int const descriptors = OpenDescriptors();

  std::string result;
  Preloaded<void()>("ArmFaults")();
  try {
    result = operation.fCall();
  } catch (std::exception const& thrown) {
    result = std::string("threw ") + thrown.what();
  }
  bool const fired = Preloaded<bool()>("DisarmFaults")();

  std::string const seen = operation.fLook();
  std::cout << result << (seen.empty() ? "" : ", ") << seen << "\n";
  for (std::string const& entry : log.Entries()) std::cout << entry.substr(0, 500) << "\n";
  if (OpenDescriptors() != descriptors) std::cout << "descriptors left\n";
  if (HasChildren()) std::cout << "a child left\n";
  std::cout << (fired ? "fault\n" : "") << "calls\n" << Preloaded<char const*()>("CallsOfFaults")() << std::flush;
}
