// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// As long as it lives, commands that the library runs through system() are written down instead of run.
class TFakeShell {
public:
  // The results of the commands; a command that is not listed returns `otherwise`.
  explicit TFakeShell(std::map<std::string, int> results, int otherwise = 0);
  ~TFakeShell();
  TFakeShell(TFakeShell const&) = delete;
  TFakeShell& operator=(TFakeShell const&) = delete;

  std::vector<std::string> const& Commands() const { return fCommands; }

  int Run(std::string const& command);

private:
  std::map<std::string, int> fResults;
  int fOtherwise;
  std::vector<std::string> fCommands;
};

// As long as it lives, ioctl answers the requests for SCSI addresses of disks and generic nodes from the contents of the
// node, which is a file: "host channel target lun" for a disk, "generic host channel target lun" for a generic node. Other
// contents fail; "disk without host" fails the second request only.
class TFakeScsi {
public:
  TFakeScsi();
  ~TFakeScsi();
  TFakeScsi(TFakeScsi const&) = delete;
  TFakeScsi& operator=(TFakeScsi const&) = delete;
};

// While it lives, time passes a thousand times faster for select, and the requested seconds are recorded.
class TFastSelect {
public:
  TFastSelect();
  ~TFastSelect();
  TFastSelect(TFastSelect const&) = delete;
  TFastSelect& operator=(TFastSelect const&) = delete;

  std::vector<long> const& Seconds() const { return fSeconds; }
  void Add(long seconds) { fSeconds.push_back(seconds); }

private:
  std::vector<long> fSeconds;
};

}  // namespace NQRVZEP20
