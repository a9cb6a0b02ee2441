// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Watched.h"

#include "TZEPFailure.h"
#include "tests/Support.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/secrets/Secrets.h"
#include "tools/zep/transfer/TransferState.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <iostream>

namespace NQRVZEP20::zep {
namespace {

std::function<TZEPStatusCode()> Thrown(EZEPStatusCode status, char const* reason) {
  return [=]() -> TZEPStatusCode { throw TZEPFailure(status, reason); };
}

TEST(RunWatchedTest, OutcomeIsTheFailureThatTheTransferThrows) {
  struct TRow {
    std::function<TZEPStatusCode()> fTransfer;
    EExitStatus fExit;
    char const* fReason;
  };
  TRow const rows[] = {
      {[] { return kZEPStatusOK; }, kExitComplete, ""},
      {Thrown(kZEPStatusConnectionFailed, "Error connecting to Server"), kExitNoConnection, "Error connecting to Server"},
      {Thrown(kZEPStatusLibCurlFailure, "Error initalizing curl"), kExitNoLibrary, "Error initalizing curl"},
      {Thrown(kZEPStatusLibCurlFailure, "Error opening curl library: x"), kExitNoLibrary,
       "Error opening curl library: x; install the package libcurl4"},
      {Thrown(kZEPStatusAccessDenied, "Error performing command: a\x1b[1m topsecret b"), kExitNothing,
       "Error performing command: a\\x1b[1m *** b"},
      {Thrown(kZEPStatusFail, "of another kind: x"), kExitNothing, "of another kind: x"},
      {[]() -> TZEPStatusCode { throw std::runtime_error("no luck"); }, kExitNothing, "no luck"},
      {[]() -> TZEPStatusCode {
         TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogError, "a line of the log is not a reason");
         throw TZEPException(kZEPStatusFileSystemError);
       },
       kExitNothing, "kZEPStatusFileSystemError"},
      {[] { return kZEPStatusConnectionFailed; }, kExitNoConnection, "kZEPStatusConnectionFailed"},
      {[]() -> TZEPStatusCode {
         ::raise(SIGKILL);
         return kZEPStatusOK;
       },
       kExitNothing, "the process of the transfer ended without a result"},
  };
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogError, "an error before the transfer");
  Hide("topsecret");
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fReason);
    TOutcome const outcome = RunWatched(row.fTransfer, TWatch());
    EXPECT_EQ(outcome.fExit, row.fExit);
    EXPECT_EQ(outcome.fReason, row.fReason);
  }
}

TEST(RunWatchedTest, EmptyReasonOfLibcurlIsReported) {
  TOutcome const outcome = RunWatched(Thrown(kZEPStatusAccessDenied, "Error performing command: "), {});
  EXPECT_EQ(outcome.fReason, "Error performing command: libcurl reports no reason");
}

TEST(RunWatchedTest, TheTransferReadsNoInputAndPrintsNothing) {
  testing::internal::CaptureStdout();
  TOutcome const outcome = RunWatched(
      [] {
        char byte;
        std::puts("printed");
        std::fflush(stdout);
        return ::read(STDIN_FILENO, &byte, 1) == 0 ? kZEPStatusOK : kZEPStatusFail;
      },
      TWatch());
  EXPECT_EQ(outcome.fExit, kExitComplete);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

// On the size of a file, or on a number that the process shares.
TEST(RunWatchedTest, MovementIsSeen) {
  TTempDir const dir;
  TSharedTransferState const state;
  for (bool const isFile : {true, false}) {
    SCOPED_TRACE(isFile);
    WriteFile(dir.Path("f"), std::string(1000, 'x'));
    std::uint64_t seen = 0;
    TWatch watch;
    watch.fFile = dir.Path("f");
    if (!isFile) watch.fMoved = &state->fMoved;
    watch.fStallSeconds = 2;
    watch.fShowProgress = [&seen](std::uint64_t bytes) { seen = bytes; };
    // Six steps of half a second: longer than the stall that is allowed.
    TOutcome const outcome = RunWatched(
        [&] {
          int const file = ::open(watch.fFile.c_str(), O_WRONLY | O_APPEND);
          char const bytes[100] = "";
          for (int steps = 0; steps < 6; ++steps, ::usleep(500000)) {
            if (!isFile)
              state->fMoved += sizeof bytes;
            else if (::write(file, bytes, sizeof bytes) != sizeof bytes)
              return kZEPStatusFail;
          }
          return kZEPStatusOK;
        },
        watch);
    EXPECT_EQ(outcome.fExit, kExitComplete);
    EXPECT_EQ(seen, isFile ? 1600u : 600u);
  }
}

TEST(RunWatchedTest, AFileHasASizeLimit) {
  TTempDir const dir;
  TWatch watch;
  watch.fFile = dir.Path("f");
  watch.fMostBytes = 1000;
  TOutcome const outcome = RunWatched(
      [&] {
        int const file = ::open(watch.fFile.c_str(), O_WRONLY | O_CREAT, 0600);
        char const bytes[600] = "";
        bool const isFirst = ::write(file, bytes, sizeof bytes) == sizeof bytes;
        bool const isSecond = ::write(file, bytes, sizeof bytes) == sizeof bytes;
        return isFirst && !isSecond ? kZEPStatusOK : kZEPStatusFail;
      },
      watch);
  EXPECT_EQ(outcome.fExit, kExitComplete);
  EXPECT_EQ(std::filesystem::file_size(watch.fFile), 1000u);
}

TEST(RunWatchedTest, AnInterruptEndsTheTransfer) {
  EXPECT_EXIT(
      {
        TInterruptGuard const guard;
        TOutcome const outcome = RunWatched(
            [] {
              ::kill(::getppid(), SIGTERM);
              ::sleep(60);
              return kZEPStatusOK;
            },
            TWatch());
        bool const isLeft = ::waitpid(-1, nullptr, WNOHANG) != -1;
        std::cerr << outcome.fExit << " " << outcome.fReason << (isLeft ? ", a child is left" : "") << std::endl;
      },
      testing::KilledBySignal(SIGTERM), "^143 interrupted\n$");
}

TEST(RunWatchedTest, AStandstillEndsTheTransfer) {
  TTempDir const dir;
  TWatch watch;
  watch.fFile = dir.Path("f");
  watch.fStallSeconds = 1;
  auto const start = std::chrono::steady_clock::now();
  TOutcome const outcome = RunWatched(
      [&] {
        ::sleep(60);
        return kZEPStatusOK;
      },
      watch);
  EXPECT_EQ(outcome.fExit, kExitStalled);
  EXPECT_EQ(outcome.fReason, "no progress for 1 s");
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(30));
  EXPECT_EQ(::waitpid(-1, nullptr, WNOHANG), -1) << "no child is left";
}

}  // namespace
}  // namespace NQRVZEP20::zep
