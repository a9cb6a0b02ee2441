// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugInsApart.h"
#include "tools/zep/output/Terminal.h"

#include <set>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

// The plug-ins at work, with stage and seconds, on the terminal of standard error: one line that is written over and over and
// removed at the end; with TERM=dumb a line for each plug-in and stage. Nothing is written when standard error is not a terminal,
// nor about a stage that takes less than half a second.
class TPlugInProgress {
public:
  TPlugInProgress() : TPlugInProgress(ErrorsLayout()) {}
  explicit TPlugInProgress(ELayout layout) : fLayout(layout) {}

  void Show(std::vector<TPlugInAtWork> const& atWork) { Write(TextFor(atWork)); }

  // What Show writes next.
  std::string TextFor(std::vector<TPlugInAtWork> const& atWork);

private:
  static void Write(std::string const& text);
  std::string LinesFor(std::vector<TPlugInAtWork> const& slow);

  ELayout const fLayout;
  bool fHasLine = false;                                   // on a terminal
  std::set<std::pair<std::string, std::string>> fWritten;  // plug-ins and stages, with TERM=dumb
};

}  // namespace NQRVZEP20::zep
