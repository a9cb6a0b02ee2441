// SPDX-License-Identifier: Apache-2.0

// A front end with a rule of its own: servers of this site need at least 64 GiB of memory.

#include "collect/PlugInsApart.h"
#include "collect/SafeText.h"
#include "collect/findings/Findings.h"

#include <iostream>

using namespace NQRVZEP20;

namespace {

void AskMemory(TRuleRun& run) {
  constexpr std::uint64_t gibibyte = 1ull << 30, least = 64;
  std::uint64_t bytes = 0;
  auto const modules = run.Elements("CIM_PhysicalMemory");  // notes the reason if they cannot be described
  for (TElement const& module : modules) {
    auto const capacity = module.Number("Capacity");
    if (run.Know(module, capacity)) bytes += *capacity.fValue;  // notes the reason if the value is missing
  }
  if (modules.empty() && run.GetNotAsked().empty()) run.NoteNotAsked({"the firmware describes no memory modules", ""});
  if (run.GetNotAsked().empty() && bytes < least * gibibyte)
    run.Add(modules.front(), modules.front().Number("Capacity").fSource, ESeverity::kWarning,
            "the memory of " + std::to_string(bytes / gibibyte) + " GiB is smaller than " + std::to_string(least) + " GiB",
            "Add memory modules.");
}

}  // namespace

int main() {
  std::vector<TPlugIn> const plugIns = LoadPlugInsApart();
  TFindings const findings = MakeFindings(ViewsOf(plugIns), {}, {{"site-memory", "Has the server enough memory?", AskMemory}});
  for (TProblem const& problem : findings.fProblems)
    std::cout << NameOf(problem.fSeverity) << ": " << Printable(problem.fReason) << "\n";
  for (TRuleResult const& rule : findings.fRules) std::cout << rule.fId << ": " << NameOf(rule.fOutcome) << "\n";
}
