// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <sys/types.h>

#include <functional>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Sends text from the child to its owner, unbuffered. Throws std::system_error if the owner no longer reads.
using TSend = std::function<void(std::string_view text)>;

// A child process that does one piece of work and sends text to its owner. If the child is still running when the object is
// destroyed, it is killed. Movable; a moved-from object owns no child. The calling process must be single-threaded.
class TChildProcess {
public:
  // `signalOfOrphan`: the signal that is sent to the child if this process dies first. The child exits without running this
  // process's clean-up. If the pipe or process cannot be created, throws std::system_error and leaks nothing.
  TChildProcess(std::function<void(TSend const&)> const& work, int signalOfOrphan);

  // The same for work that returns its text, which is sent at the end. If the work throws, nothing is sent.
  TChildProcess(std::function<std::string()> const& work, int signalOfOrphan);

  ~TChildProcess();
  TChildProcess(TChildProcess&& other) noexcept;
  TChildProcess& operator=(TChildProcess&& other) noexcept;

  pid_t Id() const { return fId; }              // -1 after it has ended
  int Output() const { return fOutput.get(); }  // for poll: readable when the child has sent data or ended

  // Blocks until the child sends data, and appends it to `text`. Returns false at the end of the data.
  bool Read(std::string& text);

  // Blocks until the child has ended. Returns true if its work returned and all data were sent.
  bool End();

  // Kills the child immediately.
  void Kill();

private:
  TUniqueFd fOutput;
  pid_t fId = -1;
};

}  // namespace NQRVZEP20::zep
