// SPDX-License-Identifier: Apache-2.0
#include "collect/process/PlugInChild.h"

#include "TLogger.h"
#include "TRootObject.h"
#include "collect/PlugInFiles.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/NamespaceBytes.h"
#include "collect/process/Costs.h"
#include "collect/process/Descriptors.h"
#include "collect/process/EStage.h"
#include "collect/process/Messages.h"
#include "collect/process/SharedObject.h"
#include "collect/process/TWatchedRegistry.h"
#include "collect/process/TimedFailure.h"
#include "collect/process/Traces.h"

#include <fcntl.h>
#include <stdlib.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/uio.h>
#include <unistd.h>
#include <boost/make_shared.hpp>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <exception>
#include <fstream>
#include <iostream>
#include <map>
#include <mutex>
#include <optional>
#include <stdexcept>
#include <utility>

namespace NQRVZEP20 {

namespace {

// ---- Messages. Of the process alone: a copy of it that the plug-in forks sends nothing. ----

int gAnswer = -1;
pid_t gProcess = 0;
std::recursive_mutex gSending;  // threads of the plug-in may end the process

bool IsCopy() { return ::getpid() != gProcess; }

// A plug-in that closed the descriptor is waited for no longer: its owner sees that the pipe is closed, and ends this process.
void WriteWhole(std::string_view bytes) {
  while (!bytes.empty()) {
    ssize_t const count = ::write(gAnswer, bytes.data(), bytes.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0)
      for (;;) ::pause();
    bytes.remove_prefix(static_cast<std::size_t>(count));
  }
}

// At once, because each write wakes the owner; without a copy, because memory may be exhausted.
void WriteBoth(std::string_view head, std::string_view text) {
  iovec const both[] = {{const_cast<char*>(head.data()), head.size()}, {const_cast<char*>(text.data()), text.size()}};
  ssize_t const count = ::writev(gAnswer, both, 2);
  std::size_t const written = count < 0 ? 0 : static_cast<std::size_t>(count);
  std::size_t const ofHead = std::min(written, head.size());
  WriteWhole(head.substr(ofHead));
  WriteWhole(text.substr(written - ofHead));
}

void Send(EMessage kind, std::string_view text) {
  if (IsCopy()) ::_exit(0);  // it returned from the plug-in's code
  std::lock_guard const lock(gSending);
  while (text.size() > kLongestMessage && kind == EMessage::kBytes) {
    Send(kind, text.substr(0, kLongestMessage));
    text.remove_prefix(kLongestMessage);
  }
  std::string_view const sent = text.substr(0, kLongestMessage);
  WriteBoth(HeadOf(kind, sent.size()), sent);
}

void SendTime(EMessage kind, double milliseconds) { Send(kind, std::to_string(std::llround(milliseconds * 1000))); }

void SendStage(EStage stage) { Send(EMessage::kStage, std::string(1, static_cast<char>(stage))); }

void FlushWords() {
  std::cout.flush();
  std::cerr.flush();
  std::fflush(stdout);
}

// ---- The ways in which a plug-in can end the process ----

void OnExit(int status, void*) {
  if (IsCopy()) ::_exit(status);
  FlushWords();
  Send(EMessage::kExits, std::to_string(status));
  ::_exit(status);
}

// For an exception that nothing can catch: of a static constructor, a thread or a function that is declared not to throw.
[[noreturn]] void OnTerminate() {
  if (IsCopy()) ::_exit(1);
  auto const thrown = std::current_exception();
  TTimedFailure failure;
  if (thrown) failure = TimedFailureOf([&] { std::rethrow_exception(thrown); });
  FlushWords();
  Send(EMessage::kFatal, thrown ? failure.MessageAndReason() : kCalledTerminate);
  ::_exit(1);
}

// ---- Setting up ----

// High enough that a plug-in does not get its number by chance, and that loops that close the usual descriptors end before it.
int MoveUp(int fd) {
  constexpr rlim_t kHigh = 1000, kMargin = 16;
  rlimit limit{};
  ::getrlimit(RLIMIT_NOFILE, &limit);
  int const high = static_cast<int>(std::min(kHigh, limit.rlim_cur > kMargin ? limit.rlim_cur - kMargin : 0));
  int const moved = ::fcntl(fd, F_DUPFD_CLOEXEC, high);
  return moved >= 0 ? moved : fd;
}

// The log of this thread goes to the pipe. Without /proc it goes nowhere.
void RedirectLog(int fd) {
  FailureOf([&] { TRootObject::GetCoreLogger()->SetLogFilename("/proc/self/fd/" + std::to_string(fd)); });
  ::close(fd);
}

// With a limit of one byte, the kernel neither writes a file nor passes a dump to a program, which it does with a limit of zero
// (core(5)). The process remains one that a debugger can attach to, unless that limit cannot be had.
void WriteNoCoreDump() {
  rlimit const one{1, 1};
  if (::setrlimit(RLIMIT_CORE, &one) != 0) ::prctl(PR_SET_DUMPABLE, 0);
}

// When memory is short, the system ends this process rather than the owner.
void BeTheFirstWithoutMemory() {
  TUniqueFd const score(::open("/proc/self/oom_score_adj", O_WRONLY | O_CLOEXEC));
  if (score) [[maybe_unused]]
    ssize_t const written = ::write(score.get(), "500", 3);
}

void LimitMemory(std::uint64_t bytes) {
  if (bytes == 0) return;
  std::uint64_t pages = 0;
  std::ifstream("/proc/self/statm") >> pages;
  rlim_t const most = pages * static_cast<std::uint64_t>(::sysconf(_SC_PAGESIZE)) + bytes;
  rlimit const limit{most, most};
  ::setrlimit(RLIMIT_AS, &limit);
}

void SetUp(TChildSetup const& setup) {
  gProcess = ::getpid();
  CloseAllBut({setup.fAnswer, setup.fWords, setup.fLog});
  MakeNull(STDIN_FILENO);
  ::dup2(setup.fWords, STDOUT_FILENO);
  ::dup2(setup.fWords, STDERR_FILENO);
  gAnswer = MoveUp(setup.fAnswer);
  CloseAllBut({gAnswer, setup.fLog});
  RedirectLog(setup.fLog);
  std::setvbuf(stdout, nullptr, _IOLBF, 0);  // words that a plug-in prints before it crashes are not lost
  WriteNoCoreDump();
  BeTheFirstWithoutMemory();
  LimitMemory(setup.fMemoryBytes);
  std::set_terminate(OnTerminate);
  ::on_exit(OnExit, nullptr);
}

// ---- Load and fill ----

boost::shared_ptr<TWatchedRegistry> WatchRegistry() {
  auto const registry = boost::make_shared<TWatchedRegistry>(TNamespaceProviderManager::GetInstance(),
                                                             TWatchedRegistry::TEvents{[] { SendStage(EStage::kRegistration); },
                                                                                       [](std::string const& name) {
                                                                                         Send(EMessage::kRegistered, name);
                                                                                         SendStage(EStage::kConstruction);
                                                                                       },
                                                                                       [](std::string const& name) {
                                                                                         Send(EMessage::kTaken, name);
                                                                                         SendStage(EStage::kConstruction);
                                                                                       }});
  TNamespaceProviderManager::fgInstance = registry;
  return registry;
}

// Whether the dynamic linker refused the library. An exception of the plug-in itself mostly ends in OnTerminate, because dlopen
// is declared not to throw.
bool IsOfLinker(TTimedFailure const& failure) {
  return !failure.fReason.empty() && failure.fMessage == TZEPStatusCode(kZEPStatusFileSystemError).TranslateStatusCode();
}

// Does the step; if it is to be measured, sends the growth of the memory.
template <class TStep>
TTimedFailure MeasuredFailureOf(bool isMeasured, TStep step) {
  std::optional<TMemoryMeter> memory;
  if (isMeasured) memory.emplace();
  TTimedFailure const failure = TimedFailureOf(step);
  if (memory) Send(EMessage::kCost, BytesOf({"", 0, 0, memory->PeakBytes()}));
  return failure;
}

void SendUndefinedSymbols(std::string const& message, std::string const& file) {
  std::vector<std::string> symbols = UndefinedSymbols(message, file);
  symbols.resize(std::min<std::size_t>(symbols.size(), kMostUndefinedSymbols));
  for (std::string const& symbol : symbols) Send(EMessage::kUndefined, symbol);
}

void Load(TChildSetup const& setup) {
  SendStage(EStage::kOpen);
  bool const runsItsCode = CanBeMapped(setup.fFile);
  if (runsItsCode) SendStage(EStage::kConstruction);
  TTimedFailure const failure = MeasuredFailureOf(setup.fMeasures, [&] { LoadLibraryOf({setup.fName, setup.fFile}); });
  bool const isOfLinker = IsOfLinker(failure);
  if (isOfLinker) SendStage(EStage::kOpen);
  if (isOfLinker) SendUndefinedSymbols(failure.fReason, setup.fFile);
  if (!failure.fMessage.empty()) Send(EMessage::kFailed, isOfLinker ? failure.fReason : failure.MessageAndReason());
  SendTime(EMessage::kLoaded, failure.fMilliseconds);
}

void Serialise(ICIMNamespace const& ns, bool isMeasured) {
  bool isFirst = true;
  auto const send = [&isFirst](std::string_view bytes) {
    Send(EMessage::kBytes, bytes);
    if (std::exchange(isFirst, false)) Send(EMessage::kClasses, "");
  };
  if (!isMeasured) return WriteNamespace(ns, send);
  TClassMeter meter;
  WriteNamespace(ns, send, [&](std::string const& className) { meter.Note(className); });
  for (TClassCost const& cost : meter.Finish()) Send(EMessage::kCost, BytesOf(cost));
}

void Fill(std::string const& name, INamespaceProvider& provider, bool isMeasured) {
  Send(EMessage::kFilling, name);
  boost::shared_ptr<ICIMNamespace> ns;
  TTimedFailure failure = MeasuredFailureOf(isMeasured, [&] {
    ns = provider.GetNamespace(TCIMContext());
    if (!ns) throw std::runtime_error(kHasNoNamespace);
  });
  double const milliseconds = failure.fMilliseconds;
  if (failure.fMessage.empty()) failure = TimedFailureOf([&] { Serialise(*ns, isMeasured); });
  if (failure.fMessage.empty())
    SendTime(EMessage::kFilled, milliseconds);
  else
    Send(EMessage::kFailed, failure.MessageAndReason());
}

void SendTraces(std::map<int, std::string> const& openBefore) {
  TTraces const traces = TracesSince(openBefore);
  for (std::string const& descriptor : traces.fDescriptors) Send(EMessage::kLeftOpen, descriptor);
  for (std::string const& process : traces.fProcesses) Send(EMessage::kLeftRunning, process);
  Send(EMessage::kTraced, "");
}

bool LogsDebug() { return TLogger::GetInstance()->GetLogThreshold() >= ILogger::kLogDebug; }

}  // namespace

void RunPlugIn(TChildSetup const& setup) noexcept {
  SetUp(setup);
  bool const loggedDebug = LogsDebug();
  auto const openBefore = setup.fMeasures ? OpenDescriptors() : std::map<int, std::string>();
  auto const registry = WatchRegistry();
  Load(setup);
  for (auto const& [name, provider] : registry->NewProviders()) Fill(name, *provider, setup.fMeasures);
  if (LogsDebug() && !loggedDebug) Send(EMessage::kLogsDebug, "");
  if (setup.fMeasures) SendTraces(openBefore);
  FlushWords();
  Send(EMessage::kDone, "");
  ::_exit(0);
}

}  // namespace NQRVZEP20
