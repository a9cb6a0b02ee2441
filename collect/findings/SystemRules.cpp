// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

#include <iterator>

namespace NQRVZEP20 {

namespace {

void AskClock(TRuleRun& run) {
  for (TElement const& state : run.Elements("ZEP_RunningState")) {
    auto const isSynchronized = state.Flag("ClockSynchronized");
    auto const uptime = state.Number("Uptime");
    if (uptime.IsKnown() && *uptime.fValue < 60 * run.Thresholds().fClockGraceMinutes) {
      run.NoteNotAsked({"the system started " + std::to_string(*uptime.fValue / 60) + " minutes ago", state.Path()});
      continue;
    }
    if (run.Know(state, isSynchronized) && !*isSynchronized.fValue)
      run.Add(state, isSynchronized.fSource, ESeverity::kWarning, "the clock is not synchronised",
              "Install or repair a time service, such as systemd-timesyncd or chrony, and check that it reaches its servers.");
  }
}

// The taints that show a fault, by their bits. The others, such as a module from outside the kernel's tree, are by intention.
struct TTaint {
  unsigned fBit;
  ESeverity fSeverity;
  char const* fReason;
};
constexpr TTaint kTaints[] = {
    {4, ESeverity::kError, "a processor has reported a machine check exception since the start"},
    {5, ESeverity::kError, "the kernel has found a bad page of memory since the start"},
    {7, ESeverity::kError, "the kernel has had an internal error (OOPS or BUG) since the start"},
    {9, ESeverity::kInformation, "the kernel has issued a warning about its own state since the start"},
    {14, ESeverity::kWarning, "a processor has been locked up in the kernel since the start"},
};

void AskTaint(TRuleRun& run) {
  for (TElement const& state : run.Elements("ZEP_RunningState")) {
    auto const taint = state.Number("Taint");
    if (!run.Know(state, taint)) continue;
    for (TTaint const& row : kTaints)
      if (*taint.fValue >> row.fBit & 1)
        run.Add(state, taint.fSource, row.fSeverity, row.fReason,
                "Look in the kernel's log (journalctl -k) for the message; restart the machine after the cause is mended.");
  }
}

void AskFailedUnits(TRuleRun& run) {
  constexpr std::size_t most = 5;  // that the reason names
  for (TElement const& state : run.Elements("ZEP_RunningState")) {
    auto const units = state.Texts("FailedUnits");
    if (!run.Know(state, units) || units.fValue->empty()) continue;
    std::string names;
    for (std::size_t i = 0; i < units.fValue->size() && i < most; ++i) names += (i == 0 ? "" : ", ") + (*units.fValue)[i];
    if (units.fValue->size() > most) names += " and " + std::to_string(units.fValue->size() - most) + " more";
    run.Add(state, units.fSource, ESeverity::kWarning, "units of systemd have failed: " + names,
            "Look for the reason with systemctl status " + units.fValue->front() + ".");
  }
}

}  // namespace

std::vector<TRule> SystemRules() {
  return {{"clock-synchronized", "Is the clock synchronised?", AskClock},
          {"kernel-taint", "Has the kernel met a fault since the start?", AskTaint},
          {"failed-units", "Has a unit of systemd failed?", AskFailedUnits}};
}

}  // namespace NQRVZEP20
