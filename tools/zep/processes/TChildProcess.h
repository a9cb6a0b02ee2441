// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/processes/Descriptor.h"

#include <sys/types.h>

#include <functional>
#include <string>

namespace NQRVZEP20::zep {

// A process of its own that does one piece of work and says the text that the work returns. One that still runs when its owner
// goes is killed. Movable; one that was moved from is nothing any more. The caller has one thread.
class TChildProcess {
public:
  // `signalOfOrphan`: what the child is sent when this process dies before it. The child ends without this process's clean-up;
  // work that throws has said nothing. Throws std::system_error, and leaves nothing open, when there is no pipe or no process.
  TChildProcess(std::function<std::string()> const& work, int signalOfOrphan);
  ~TChildProcess();
  TChildProcess(TChildProcess&& other) noexcept;
  TChildProcess& operator=(TChildProcess&& other) noexcept;

  pid_t Id() const { return fId; }              // -1 when it has ended
  int Output() const { return fOutput.Get(); }  // readable when it says something, and at its end

  // Adds what it says now to the text; waits until it says something. False when it has said everything.
  bool Read(std::string& text);

  // Waits until it has ended. True when it came to the end of its work and could say all of it.
  bool End();

  // Ends it at once.
  void Kill();

private:
  TDescriptor fOutput;
  pid_t fId = -1;
};

}  // namespace NQRVZEP20::zep
