// SPDX-License-Identifier: Apache-2.0
#include "os/MachineIdentity.h"

#include "TOSSpecific.h"
#include "os/MachineTypeTable.h"

#include <algorithm>

namespace NQRVZEP20 {
namespace {

unsigned char ByteAt(std::string_view bytes, std::size_t offset) { return static_cast<unsigned char>(bytes[offset]); }

std::vector<std::string> SplitStringSet(std::string_view set) {
  std::string spared(set);
  spared.push_back('\0');  // multiStringTok needs one more byte after the set to return the last string
  std::vector<std::string> strings = TOSSpecific::multiStringTok(spared.data(), spared.size(), '\0');
  strings.erase(std::find(strings.begin(), strings.end(), ""), strings.end());  // an empty string ends the set
  return strings;
}

// Assigns the `count` characters from `start` on, if there are that many.
void AssignWhole(std::string& field, std::string_view text, std::size_t start, std::size_t count) {
  if (start + count <= text.size()) field = text.substr(start, count);
}

}  // namespace

TStructureStrings::TStructureStrings(std::string_view structure) {
  if (structure.size() < 2) return;
  fFormattedArea = structure.substr(0, ByteAt(structure, 1));
  fStrings = SplitStringSet(structure.substr(fFormattedArea.size()));
}

std::optional<std::string_view> TStructureStrings::NamedAt(std::size_t offset) const {
  if (offset >= fFormattedArea.size()) return std::nullopt;
  std::size_t const number = ByteAt(fFormattedArea, offset);
  if (number == 0 || number > fStrings.size()) return std::nullopt;
  return fStrings[number - 1];
}

void ReadProductDescription(std::string_view description, TMachineIdentity& identity) {
  std::size_t const dash = description.find('-');
  if (dash != description.npos) {
    identity.fName = description.substr(0, dash);
    AssignWhole(identity.fType, description, dash + 2, 4);
    AssignWhole(identity.fModel, description, dash + 6, 3);
  } else if (description.size() == 7) {
    identity.fType = description.substr(0, 4);
  }
}

std::string CleanBiosVersion(std::string version) {
  TOSSpecific::removeNonAlpaNumeric(version);
  if (version.size() <= 1) return version;
  std::string tail = version;
  TOSSpecific::breakApartVersion(tail, version);
  return version;
}

std::optional<std::string> MachineTypeOfBuild(std::string_view buildNumber) {
  for (TMachineTypeRow const& row : kMachineTypeTable)
    if (buildNumber.find(row.fBuildPrefix) != buildNumber.npos) return std::string(row.fMachineType);
  return std::nullopt;
}

}  // namespace NQRVZEP20
