// SPDX-License-Identifier: Apache-2.0

// Repeats operations of the library in random order, on several threads, and measures after each round what is left: memory in
// use, descriptors, threads, children and files. Nothing may grow. Prints a line whenever a minute has passed, and at the end.
//
//   Soak SECONDS [SEED]      exit status 1 if anything has grown since the first rounds

#include "TCIMDateTime.h"
#include "TOSSpecific.h"
#include "TZEPException.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/mof/Mof.h"
#include "tests/os/HostTools.h"

#include <malloc.h>

#include <boost/make_shared.hpp>

#include <chrono>
#include <iostream>
#include <mutex>
#include <random>

namespace {

using namespace NQRVZEP20;
namespace fs = std::filesystem;
using TDirectory = std::string;  // of one thread, with the files "small" and "tree/"

constexpr int kThreads = 4;
constexpr int kOperationsOfARound = 40;
constexpr std::size_t kBuffers = 4096;  // buffers that are kept have the size of a text, which varies
constexpr unsigned kFirstRounds = 5;    // libraries are loaded and buffers are made in these
constexpr unsigned kFewestRounds = 15;  // also on a slow machine

void CopyFiles(TDirectory const& dir) {
  TOSSpecific::DirCopy(dir + "/tree", dir + "/copy", true);
  TOSSpecific::FileCopy(dir + "/small", dir + "/copy/small");
  TOSSpecific::ListDir(dir + "/copy");
  fs::remove_all(dir + "/copy");
}

void ReadFiles(TDirectory const& dir) {
  TOSSpecific::CaptureFile(dir + "/small");
  TOSSpecific::CaptureFileLoader(dir + "/missing", true);
  TOSSpecific::createFile(dir + "/new", "text");
  TOSSpecific::deleteFile(dir + "/new");
}

void FailOnFiles(TDirectory const& dir) {
  try {
    TOSSpecific::CreateDir(dir);
  } catch (TZEPException const&) {
  }
  TOSSpecific::CaptureFile(dir + "/missing");
}

void Spawn(TDirectory const&) {
  TOSSpecific::SpawnProcess("echo", {"words"}, 10);
  TOSSpecific::SpawnProcess("no-such-program", {}, 10);
}

void ReportOnTheSample(TDirectory const&) { TOSSpecific::SpawnProcess(ZEP_PROGRAM, {"report", "--sample", "--json"}, 60); }

void ReadTheClock(TDirectory const&) {
  TCIMDateTime const now = TOSSpecific::GetLocalTime();
  TCIMDateTime(now.ToString()).ToString();
  TOSSpecific::USleep(1);
}

void Identify(TDirectory const&) {
  TOSSpecific::GetMachineInfo("SN");
  TOSSpecific::GetMachineTypeFromID();
  TOSSpecific::IsAdmin();
}

void ReadAndCopyClasses(TDirectory const&) {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/soak");
  ReadMofText(
      "Qualifier Key : boolean = false, Scope(property);\n"
      "class X_Part { [Key] string Name; uint32 Sizes[]; };\n"
      "class X_Disk : X_Part { uint64 Bytes = 512; };\n"
      "instance of X_Disk { Name = \"a\"; Sizes = {1, 2, 3}; };\n",
      "soak.mof", ns);
  WriteMof(*ns);
}

void FailOnMof(TDirectory const&) { ReadMofText("class X {", "soak.mof", boost::make_shared<TMemoryNamespace>("root/soak")); }

void FindPlugIns(TDirectory const&) {
  TOSSpecific::FindNSPs();
  TOSSpecific::GetZEPRootPath();
}

void Download(TDirectory const& dir) {
  static std::mutex one;  // transfers share the state of libcurl
  std::lock_guard<std::mutex> const lock(one);
  TOSSpecific::CurlTransferFile("file://" + dir + "/small", dir + "/fetched", true);
  fs::remove(dir + "/fetched");
}

struct TOperation {
  void (*fRun)(TDirectory const&);
  int fWeight;
};

constexpr TOperation kOperations[] = {{CopyFiles, 4},    {ReadFiles, 4},         {FailOnFiles, 4}, {Spawn, 2},
                                      {ReadTheClock, 4}, {Identify, 4},          {FailOnMof, 4},   {ReadAndCopyClasses, 4},
                                      {FindPlugIns, 4},  {ReportOnTheSample, 1}, {Download, 2}};

// What is left after a round.
struct TLeft {
  std::size_t fBytes;
  int fDescriptors, fThreads, fFiles;
  bool fChildren;

  bool HasGrownSince(TLeft const& first) const {
    return fBytes > first.fBytes + kBuffers || fDescriptors > first.fDescriptors || fThreads > first.fThreads ||
           fFiles > first.fFiles || fChildren;
  }
};

template <class TIterator>
int CountOf(std::string const& directory) {
  return static_cast<int>(std::distance(TIterator(directory), TIterator()));
}

TLeft Measure(std::string const& directory) {
  TLogger::GetInstance()->ClearLog();
  return {::mallinfo2().uordblks, OpenDescriptors(), CountOf<fs::directory_iterator>("/proc/self/task"),
          CountOf<fs::recursive_directory_iterator>(directory), HasChildren()};
}

void Print(char const* when, long operations, TLeft const& left) {
  std::cout << when << ": " << operations << " operations, " << left.fBytes << " bytes, " << left.fDescriptors << " descriptors, "
            << left.fThreads << " threads, " << left.fFiles << " files, " << (left.fChildren ? "children" : "no children")
            << std::endl;
}

void RunOnOneThread(TDirectory const& dir, unsigned seed) {
  std::vector<int> weights;
  for (TOperation const& operation : kOperations) weights.push_back(operation.fWeight);
  std::discrete_distribution<std::size_t> choice(weights.begin(), weights.end());
  std::mt19937 random(seed);
  for (int n = 0; n < kOperationsOfARound; ++n) try {
      kOperations[choice(random)].fRun(dir);
    } catch (std::exception const&) {  // some are to fail
    }
}

void RunRound(std::string const& directory, unsigned seed) {
  std::vector<std::thread> threads;
  for (int n = 0; n < kThreads; ++n)
    threads.emplace_back(RunOnOneThread, directory + "/" + std::to_string(n), seed * kThreads + n);
  for (std::thread& thread : threads) thread.join();
}

void Prepare(std::string const& directory) {
  for (int n = 0; n < kThreads; ++n) {
    std::string const dir = directory + "/" + std::to_string(n);
    fs::create_directories(dir + "/tree/below");
    WriteFile(dir + "/small", "0123456789");
    WriteFile(dir + "/tree/below/file", "text");
    for (TOperation const& operation : kOperations) try {
        operation.fRun(dir);
      } catch (std::exception const&) {
      }
  }
}

}  // namespace

int main(int count, char** arguments) {
  using TClock = std::chrono::steady_clock;
  if (count < 2) return 64;
  auto const end = TClock::now() + std::chrono::seconds(std::stol(arguments[1]));
  unsigned const seed = count > 2 ? static_cast<unsigned>(std::stoul(arguments[2])) : std::random_device()();
  std::cout << "seed " << seed << std::endl;
  ::mallopt(M_ARENA_MAX, 1);  // so that the bytes in use do not depend on the order of the threads
  ::mallopt(M_MXFAST, 0);
  TLogger::SetLogThreshold(ILogger::kLogDebug);

  TTempDir const dir;
  Prepare(dir.Path());
  unsigned round = 0;
  for (; round < kFirstRounds; ++round) RunRound(dir.Path(), seed + round);
  TLeft const first = Measure(dir.Path());
  Print("first", long{round} * kThreads * kOperationsOfARound, first);
  TLeft last = first;
  for (auto shown = TClock::now(); TClock::now() < end || round < kFewestRounds; ++round) {
    RunRound(dir.Path(), seed + round);
    last = Measure(dir.Path());
    if (TClock::now() - shown < std::chrono::minutes(1)) continue;
    shown = TClock::now();
    Print("now", long{round} * kThreads * kOperationsOfARound, last);
  }
  Print("last", long{round} * kThreads * kOperationsOfARound, last);
  if (last.HasGrownSince(first)) std::cout << "what is left has grown" << std::endl;
  return last.HasGrownSince(first) ? 1 : 0;
}
