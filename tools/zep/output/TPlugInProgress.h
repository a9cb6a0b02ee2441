// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugInsApart.h"
#include "tools/zep/output/Terminal.h"

#include <set>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

// Shows the running plug-ins, with their stages and elapsed seconds, on standard error if it is a terminal: in one line that is
// overwritten repeatedly and removed at the end, or with TERM=dumb in a line per plug-in and stage. Stages that take less than
// half a second are not shown, and nothing is written while this process is in the background.
class TPlugInProgress {
public:
  TPlugInProgress() : TPlugInProgress(ErrorsLayout()) {}
  explicit TPlugInProgress(ELayout layout) : fLayout(layout) {}

  void Show(std::vector<TPlugInAtWork> const& atWork);

  // The text that Show would write next.
  std::string TextFor(std::vector<TPlugInAtWork> const& atWork);

private:
  static void Write(std::string const& text);
  std::string LinesFor(std::vector<TPlugInAtWork> const& slow);

  ELayout const fLayout;
  bool fHasLine = false;                                   // whether the terminal shows a line
  std::set<std::pair<std::string, std::string>> fWritten;  // with TERM=dumb: the plug-ins and stages already written
};

}  // namespace NQRVZEP20::zep
