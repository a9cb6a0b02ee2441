// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <sys/types.h>

#include <functional>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Sends a text from the child to its owner at once. Throws std::system_error when the owner no longer reads.
using TSend = std::function<void(std::string_view text)>;

// A child process that does one piece of work and sends text to its owner. A child that still runs when its owner is destroyed
// is killed. Movable; an object that was moved from owns no child. The caller has a single thread.
class TChildProcess {
public:
  // `signalOfOrphan`: the signal that the child gets when this process dies first. The child ends without this process's
  // clean-up. Throws std::system_error, and leaves nothing open, when there is no pipe or no process.
  TChildProcess(std::function<void(TSend const&)> const& work, int signalOfOrphan);

  // The same for work that sends one text at its end. Work that throws sends nothing.
  TChildProcess(std::function<std::string()> const& work, int signalOfOrphan);

  ~TChildProcess();
  TChildProcess(TChildProcess&& other) noexcept;
  TChildProcess& operator=(TChildProcess&& other) noexcept;

  pid_t Id() const { return fId; }              // -1 after it has ended
  int Output() const { return fOutput.get(); }  // readable when it has sent something, and at its end

  // Waits until the child sends something, and appends it to the text. False when there is nothing more to come.
  bool Read(std::string& text);

  // Waits until the child has ended. True when its work returned and everything was sent.
  bool End();

  // Ends the child at once.
  void Kill();

private:
  TUniqueFd fOutput;
  pid_t fId = -1;
};

}  // namespace NQRVZEP20::zep
