// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The identity of a machine, from SMBIOS type 1. Each field starts as the text for an unreadable value.
struct TMachineIdentity {
  std::string fType = "0000";
  std::string fName = "Unknown";
  std::string fModel = "Unknown";
  std::string fSerialNumber = "Unknown";
};

// The strings of one SMBIOS structure, given from its first byte to the end of its string set.
class TStructureStrings {
public:
  explicit TStructureStrings(std::string_view structure);

  // The string whose number (1 is the first) the byte at `offset` holds. Nothing when that byte is not in the formatted
  // area, and for a number of 0 or past the last string. It lies in this object.
  std::optional<std::string_view> NamedAt(std::size_t offset) const;

private:
  std::string_view fFormattedArea;
  std::vector<std::string> fStrings;
};

// Reads type, name and model from a product description, "Server Q100 -[1234AB7]-" or a bare "1234AB7". The description is
// split at its first "-", wherever that is: the name is the text before it (with the blank), the type the 4 characters that
// start 2 after it, the model the next 3. An incomplete type or model does not change the field, and a description in neither
// form changes nothing.
void ReadProductDescription(std::string_view description, TMachineIdentity& identity);

// The BIOS version without its brackets, up to the build: "-[ABC123-1.10]-" gives "ABC123".
std::string CleanBiosVersion(std::string version);

// The machine type in the first row of kMachineTypeTable whose prefix occurs anywhere in the build number.
std::optional<std::string> MachineTypeOfBuild(std::string_view buildNumber);

}  // namespace NQRVZEP20
