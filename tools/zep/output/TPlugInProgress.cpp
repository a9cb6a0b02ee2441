// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/TPlugInProgress.h"

#include "tools/zep/output/Text.h"

#include <unistd.h>

#include <cstdio>
#include <iostream>

namespace NQRVZEP20::zep {

namespace {

constexpr double kSlowSeconds = 0.5;
constexpr std::size_t kMostCharacters = 79;  // fits every terminal

bool IsInBackground() {
  pid_t const group = ::tcgetpgrp(STDERR_FILENO);
  return group >= 0 && group != ::getpgrp();
}

std::string PhraseOf(TPlugInAtWork const& plugIn) {
  char seconds[32];
  std::snprintf(seconds, sizeof seconds, "%.1f s", plugIn.fSeconds);
  return Printable(plugIn.fName) + ": " + plugIn.fStage + ", " + seconds;
}

}  // namespace

// A process in the background would be stopped by SIGTTOU on a terminal that is set so (stty tostop).
void TPlugInProgress::Show(std::vector<TPlugInAtWork> const& atWork) {
  if (!IsInBackground()) Write(TextFor(atWork));
}

std::string TPlugInProgress::TextFor(std::vector<TPlugInAtWork> const& atWork) {
  std::vector<TPlugInAtWork> slow;
  for (TPlugInAtWork const& plugIn : atWork)
    if (plugIn.fSeconds >= kSlowSeconds) slow.push_back(plugIn);
  if (fLayout == ELayout::kFile) return "";
  if (fLayout == ELayout::kPlain) return LinesFor(slow);

  std::vector<std::string> phrases;
  for (TPlugInAtWork const& plugIn : slow) phrases.push_back(PhraseOf(plugIn));
  if (phrases.empty() && !fHasLine) return "";
  fHasLine = !phrases.empty();
  return "\r\x1b[K" + Wrapped(Joined(phrases, "; "), kMostCharacters).front();
}

std::string TPlugInProgress::LinesFor(std::vector<TPlugInAtWork> const& slow) {
  std::string text;
  for (TPlugInAtWork const& plugIn : slow)
    if (fWritten.emplace(plugIn.fName, plugIn.fStage).second) text += PhraseOf(plugIn) + "\n";
  return text;
}

void TPlugInProgress::Write(std::string const& text) {
  if (!text.empty()) std::cerr << text << std::flush;
}

}  // namespace NQRVZEP20::zep
