// SPDX-License-Identifier: Apache-2.0

// Logs from three destructors at the end of the process and prints which of them ran: that of a thread-local object while the
// main thread still has its logger, that of a static object after this logger is destroyed, and that of a registered provider
// after the logger's statics are destroyed as well. The argument is the log file.

#include "INamespaceProvider.h"
#include "TLogger.h"
#include "TNamespaceProviderManager.h"
#include "TRootObject.h"

#include <unistd.h>
#include <boost/make_shared.hpp>

#include <cstdio>

using namespace NQRVZEP20;

namespace {

void Require(bool condition, char const* what) {
  if (condition) return;
  std::fprintf(stderr, "failed: %s\n", what);
  ::_exit(1);
}

void LogFrom(char const* where) {
  TLogger* const logger = TLogger::GetInstance();
  Require(logger != nullptr, "there is a logger");
  Require(TLogger::GetInstance() == logger, "it stays the same");
  Require(TRootObject::GetCoreLogger() == logger, "the root object hands it out");
  logger->OutputLogEntry(ILogger::kLogStatus, where);
  logger->OutputLogEntry(ILogger::kLogDebug, where);
  std::puts(where);
  std::fflush(stdout);
}

struct TThreadLocal {
  ~TThreadLocal() { LogFrom("a thread-local object"); }
  void Touch() {}
};

struct TStatic {
  ~TStatic() {
    LogFrom("a static object");
    Require(TLogger::GetInstance()->GetLog().back().fMessage == "a static object", "the entry is recorded");
  }
} const gStatic;

class TProvider : public INamespaceProvider {
public:
  ~TProvider() override {
    LogFrom("a registered provider");
    TLogger::GetInstance()->ClearLog();
  }
  std::string const& GetName(TCIMContext const&) const override { return fName; }
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const&) override { return nullptr; }

private:
  std::string fName = "provider";
};

}  // namespace

int main(int, char** arguments) {
  thread_local TThreadLocal threadLocal;
  threadLocal.Touch();
  TNamespaceProviderManager::GetInstance()->RegisterNamespaceProvider(boost::make_shared<TProvider>());
  TLogger::GetInstance()->SetLogFilename(arguments[1]);
}
