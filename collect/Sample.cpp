// SPDX-License-Identifier: Apache-2.0
#include "collect/Sample.h"

#include <cstdlib>

namespace NQRVZEP20 {

namespace {

constexpr char const* kTableVariable = "ZEP_SMBIOS_TABLE";
constexpr char const* kNameVariable = "ZEP_HOST_NAME";
constexpr char const* kSampleVariable = "ZEP_SAMPLE";
constexpr char const* kFromFile = " (file)";  // how the host provider marks values that it reads from a table file

}  // namespace

void SetForProviders(TSample const& sample) {
  ::setenv(kTableVariable, sample.fTableFile.c_str(), 1);
  ::setenv(kNameVariable, sample.fHostName.c_str(), 1);
  ::setenv(kSampleVariable, sample.fLabel.c_str(), 1);
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
