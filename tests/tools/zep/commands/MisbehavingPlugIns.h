// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/Support.h"
#include "tests/tools/zep/Zep.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdio>
#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// An installation of zep whose plug-ins misbehave, each as its name says (tests/collect/plugins/Misbehaves.cpp).
class TMisbehavingPlugInsTest : public testing::Test {
protected:
  void Add(std::vector<std::string> const& misdeeds) {
    for (std::string const& name : misdeeds) fZep.Add("lib" + name + ".nsp.so", MISBEHAVES);
  }

  TRun Run(std::vector<std::string> const& arguments) const {
    TCall call;
    call.fArguments = arguments;
    call.fEnvironment = Environment();
    return fZep.Run(call);
  }

  std::map<std::string, std::string> Environment() const {
    return {{"ZEP_SMBIOS_TABLE", SamplePath()},
            {"ZEP_HOST_NAME", "db1"},
            {"ZEP_MISDEEDS", fZep.Path("")},
            {"ZEP_TEST_PROVIDER", "odd hard-to-name two-systems"}};
  }

  // The plug-in, or its first provider when that failed.
  static nlohmann::json FailureIn(nlohmann::json const& document, std::string const& name) {
    for (auto const& plugIn : document["plugIns"])
      if (plugIn["name"] == name)
        return plugIn["error"].is_null() && !plugIn["providers"].empty() ? plugIn["providers"][0] : plugIn;
    return {};
  }

  void WaitFor(std::string const& file) const {
    for (int tries = 0; ReadFile(fZep.Path(file)).empty() && tries < 6000; ++tries) ::usleep(10000);
    ASSERT_FALSE(ReadFile(fZep.Path(file)).empty());
  }

  void ExpectNoProcess(std::string const& file) const {
    std::string const id = ReadFile(fZep.Path(file));
    ASSERT_FALSE(id.empty()) << file;
    for (int tries = 0; fs::exists("/proc/" + id) && tries < 6000; ++tries) ::usleep(10000);
    EXPECT_FALSE(fs::exists("/proc/" + id)) << file;
  }

  // The output is lost.
  pid_t StartReport() const {
    pid_t const zep = ::fork();
    if (zep != 0) return zep;
    for (auto const& [name, value] : Environment()) ::setenv(name.c_str(), value.c_str(), 1);
    [[maybe_unused]] bool const isLost = std::freopen("/dev/null", "w", stdout) != nullptr;
    ::execl(fZep.Path("bin/zep").c_str(), "zep", "report", nullptr);
    ::_exit(127);
  }

  TInstallation fZep;
};

}  // namespace NQRVZEP20::zep
