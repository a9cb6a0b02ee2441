// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// What SMBIOS type 1 tells of a machine. Every field begins as what is given when it cannot be read.
struct TMachineIdentity {
  std::string type = "0000";
  std::string name = "Unknown";
  std::string model = "Unknown";
  std::string serialNumber = "Unknown";
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

// Takes type, name and model out of a product description, "Server Q100 -[1234AB7]-" or a bare "1234AB7". It is cut at
// its first "-", wherever that stands: the name is all in front of it (with the blank), the type the 4 characters from 2
// behind it on, the model the 3 behind these. A type or model that is not there in full stays as it was, and so does
// everything of a description in neither form.
void ReadProductDescription(std::string_view description, TMachineIdentity& identity);

// A BIOS version out of its brackets and up to its build: "-[ABC123-1.10]-" gives "ABC123".
std::string CleanBiosVersion(std::string version);

// The machine type of the first row of kMachineTypeTable whose prefix is anywhere in the build number.
std::optional<std::string> MachineTypeOfBuild(std::string_view buildNumber);

}  // namespace NQRVZEP20
