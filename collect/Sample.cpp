// SPDX-License-Identifier: Apache-2.0
#include "collect/Sample.h"

#include <cstdlib>
#include <new>

namespace NQRVZEP20 {

namespace {

constexpr char const* kTableVariable = "ZEP_SMBIOS_TABLE";
constexpr char const* kNameVariable = "ZEP_HOST_NAME";
constexpr char const* kSampleVariable = "ZEP_SAMPLE";
constexpr char const* kFromFile = " (file)";  // how the host provider marks values that it reads from a table file

// Throws when there is no memory for it: without the variable, the providers would describe this machine.
void Set(char const* variable, std::string const& value) {
  if (::setenv(variable, value.c_str(), 1) != 0) throw std::bad_alloc();
}

}  // namespace

void SetForProviders(TSample const& sample) {
  Set(kTableVariable, sample.fTableFile);
  Set(kNameVariable, sample.fHostName);
  Set(kSampleVariable, sample.fLabel);
}

std::string NamedTableFile() {
  char const* const file = std::getenv(kTableVariable);
  return file != nullptr ? file : "";
}

std::string LabelledSource(std::string const& source, std::string const& label) {
  if (label.empty()) return source;
  if (source == kNameVariable) return label;
  if (std::size_t const at = source.find(kFromFile); at != std::string::npos) return label + ", " + source.substr(0, at);
  return source + " (not of the sample)";
}

}  // namespace NQRVZEP20
