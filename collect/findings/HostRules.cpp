// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

#include <map>
#include <regex>
#include <set>

namespace NQRVZEP20 {

namespace {

// The first property in which the elements differ, as its values, separated by commas; empty if they agree in all. Unknown values
// are not compared.
std::string DifferenceIn(std::vector<TElement> const& elements, std::initializer_list<char const*> properties) {
  for (char const* property : properties) {
    std::set<std::string> values;
    for (TElement const& element : elements)
      if (auto const text = element.Text(property); text.IsKnown()) values.insert(*text.fValue);
    if (values.size() < 2) continue;
    std::string list;
    for (std::string const& value : values) list += (list.empty() ? "" : ", ") + value;
    return property + (": " + list);
  }
  return "";
}

void AskDifferentProcessors(TRuleRun& run) {
  auto const processors = run.Elements("CIM_Processor");
  for (TElement const& processor : processors) run.Know(processor, processor.Text("Stepping"));
  if (std::string const difference = DifferenceIn(processors, {"ElementName", "Stepping"}); !difference.empty())
    run.Add(processors.front(), processors.front().Text("Stepping").fSource, ESeverity::kWarning,
            "the processors are of different kinds (" + difference + ")", "Use processors of the same model and stepping.");

  auto const settings = run.TryElements("ZEP_ProcessorSettings");
  if (std::string const difference = DifferenceIn(settings, {"MicrocodeVersion"}); !difference.empty())
    run.Add(settings.front(), settings.front().Text("MicrocodeVersion").fSource, ESeverity::kWarning,
            "the processors have different microcode (" + difference + ")",
            "Update the firmware of the machine, and the package with the microcode.");
}

// The channel of a module, as its labels name it: "P0 CHANNEL A", "CPU1_CHANNEL_B". Empty if they name none.
std::string ChannelOf(TElement const& module) {
  static std::regex const pattern("(.*CHANNEL[ _]?(?:[A-P]|[0-9]+))(?![A-Z0-9]{2}).*", std::regex::icase);
  for (char const* property : {"BankLabel", "ElementName"}) {
    auto const text = module.Text(property);
    std::smatch match;
    constexpr std::size_t longest = 200;  // no label is longer, and the pattern needs stack for each character
    if (text.IsKnown() && text.fValue->size() <= longest && std::regex_match(*text.fValue, match, pattern)) return match[1];
  }
  return "";
}

void AskDifferentModules(TRuleRun& run) {
  std::map<std::string, std::vector<TElement>> channels;
  auto const modules = run.Elements("CIM_PhysicalMemory");
  bool hasNames = false;
  for (TElement const& module : modules) {
    std::string const channel = ChannelOf(module);
    hasNames = hasNames || !channel.empty();
    if (!channel.empty() && run.Know(module, module.Number("Capacity"))) channels[channel].push_back(module);
  }
  if (!hasNames && modules.size() > 1) run.NoteNotAsked({"the firmware does not name the channels of the modules", ""});
  for (auto const& [channel, members] : channels) {
    std::string const difference = DifferenceIn(members, {"Capacity", "MemoryType", "MaxMemorySpeed"});
    if (!difference.empty())
      run.Add(members.front(), members.front().Number("Capacity").fSource, ESeverity::kWarning,
              "the memory modules of the channel " + channel + " do not match (" + difference + ")",
              "Use modules of the same size, type and speed within a channel.");
  }
}

bool IsVirtual(TRuleRun const& run) {
  for (TElement const& element : run.TryElements("ZEP_Virtualization"))
    if (auto const flag = element.Flag("IsVirtual"); flag.IsKnown() && *flag.fValue) return true;
  return false;
}

// The guest of a hypervisor often cannot see which mitigations its host has.
void AskWeaknesses(TRuleRun& run) {
  constexpr std::uint64_t vulnerable = 4;
  std::string names;
  TElement const* first = nullptr;
  auto const weaknesses = run.Elements("ZEP_ProcessorWeakness");
  for (TElement const& weakness : weaknesses) {
    auto const state = weakness.Number("State");
    if (!run.Know(weakness, state) || *state.fValue != vulnerable) continue;
    if (first == nullptr) first = &weakness;
    names += (names.empty() ? "" : ", ") + weakness.NameIn("Name");
  }
  if (first == nullptr) return;
  bool const isGuest = IsVirtual(run);
  run.Add(*first, first->Number("State").fSource, isGuest ? ESeverity::kInformation : ESeverity::kWarning,
          "the kernel mitigates some weaknesses of the processor incompletely or not at all: " + names,
          isGuest ? "Update the kernel of this guest, and kernel and microcode of its host."
                  : "Update the kernel, the firmware and the package with the microcode; check the kernel command line for "
                    "switched off mitigations.");
}

}  // namespace

std::vector<TRule> HostRules() {
  return {{"processors-differ", "Do the processors differ in model, stepping or microcode?", AskDifferentProcessors},
          {"memory-differs", "Do the memory modules of a channel differ?", AskDifferentModules},
          {"processor-weakness", "Is a weakness of the processor not mitigated?", AskWeaknesses}};
}

}  // namespace NQRVZEP20
