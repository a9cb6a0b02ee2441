// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "TZEPStatusCode.h"
#include "core/Log.h"
#include "loaders/SmbiosLibrary.h"
#include "os/MachineIdentity.h"

#include <memory>
#include <new>
#include <optional>
#include <string_view>

namespace NQRVZEP20 {
namespace {

constexpr int kSystemInformation = 1;  // SMBIOS type 1 and its string fields
constexpr std::size_t kProductName = 5;
constexpr std::size_t kSerialNumber = 7;

constexpr int kBiosInformation = 0;  // SMBIOS type 0
constexpr std::size_t kBiosVersion = 5;
constexpr int kBiosStringArea = 100;  // bytes of its string set that are searched

constexpr char const* kNoBiosID = "00";

// Null when there is not enough memory.
std::unique_ptr<char[]> NewClearedBuffer(int size) {
  return std::unique_ptr<char[]>(new (std::nothrow) char[static_cast<std::size_t>(size)]());
}

void LogIdentity(std::string const& productDescription, TMachineIdentity const& identity) {
  LogDebug("GetMachineInfo productDesc");
  LogDebug(productDescription);
  LogDebug("GetMachineInfo machineName");
  LogDebug(identity.fName);
  LogDebug("GetMachineInfo machineType");
  LogDebug(identity.fType);
  LogDebug("GetMachineInfo machineModel");
  LogDebug(identity.fModel);
}

// The status that is logged when the tables cannot be opened.
int OpenStatusOf(TSmbiosTables const& tables) {
  return tables.Library() ? tables.OpenStatus() : static_cast<int>(StatusOf(tables.Library()));
}

bool AreOpen(TSmbiosTables const& tables) {
  if (int const status = OpenStatusOf(tables); status != kZEPStatusOK) {
    LogDebug("getMachineType: Unable to open SMBIOS lib error = ", status);
    return false;
  }
  if (!tables.HasHandle()) {
    LogDebug("Unable to read machine type from SMBIOS. Invalid Handle was encountered.");
    return false;
  }
  return true;
}

struct TStructure {
  std::unique_ptr<char[]> fBuffer;  // null when it could not be read
  int fLength = 0;

  std::string_view Bytes() const { return {fBuffer.get(), static_cast<std::size_t>(fLength)}; }
};

TStructure ReadSystemInformation(TSmbiosTables& tables) {
  constexpr int kBufferSize = 1024;
  TStructure structure{NewClearedBuffer(kBufferSize)};
  if (!structure.fBuffer) {
    LogDebug("Unable to allocate memory to hold machineType");
    return {};
  }
  int const status = tables.GetFirst(kSystemInformation, structure.fBuffer.get(), kBufferSize, structure.fLength);
  if (status != kZEPStatusOK || structure.fLength < 1) {
    LogDebug("Unable to read DMI structure type 1 from SMBIOS");
    return {};
  }
  return structure;
}

enum class EIdentityLog { kTypeOnly, kAll };

TMachineIdentity IdentityIn(std::string_view systemInformation, EIdentityLog logged) {
  TMachineIdentity identity;
  TStructureStrings const strings(systemInformation);
  std::string const productDescription(strings.NamedAt(kProductName).value_or(""));
  ReadProductDescription(productDescription, identity);
  if (logged == EIdentityLog::kAll) LogIdentity(productDescription, identity);
  if (std::optional<std::string_view> const number = strings.NamedAt(kSerialNumber)) identity.fSerialNumber = *number;
  LogDebug("Machine type detected: ", identity.fType);
  return identity;
}

// Reads SMBIOS type 1 for GetMachineType and GetMachineInfo. The messages name GetMachineType in both cases.
TMachineIdentity ReadMachineIdentity(EIdentityLog logged) {
  TSmbiosTables tables(TSmbiosTables::kStaysLoaded);
  if (!AreOpen(tables)) return {};
  TStructure const structure = ReadSystemInformation(tables);
  if (!structure.fBuffer) return {};
  TMachineIdentity const identity = IdentityIn(structure.Bytes(), logged);
  tables.Close();
  LogDebug("getMachineType() completed.");
  return identity;
}

// The messages of a reader of the BIOS version.
struct TBiosVersionMessages {
  std::string_view fUnableToOpen, fRetrieving, fReadFailed, fNoMoreItems;
};

constexpr TBiosVersionMessages kGetBiosIDMessages = {
    "GetBiosID: Unable to open SMBIOS lib error = ",
    "TOSSpecific::GetBiosID - Retrieving first SMBIOS structure",
    "TOSSpecific::GetBiosID - smbios read operation failed! ",
    "TOSSpecific::GetBiosID - read all smbios structures available for type 0",
};

constexpr TBiosVersionMessages kGetMachineTypeFromIDMessages = {
    "getBIOSstructure: Unable to open SMBIOS lib error = ",
    "TOSSpecific::GetMachineTypeFromID - Retrieving first SMBIOS structure",
    "TOSSpecific::GetMachineTypeFromID - smbios read operation failed! ",
    "TOSSpecific::GetMachineTypeFromID - read all smbios structures available for type 0",
};

// The BIOS version in the structure of type 0 in the buffer; empty when it is not in the part that is searched.
std::string BiosVersionIn(char* buffer) {
  std::size_t const formattedLength = static_cast<unsigned char>(buffer[1]);
  if (formattedLength <= kBiosVersion) return {};
  char version[kBiosStringArea] = {};
  TOSSpecific::getBIDString(buffer + formattedLength, version, kBiosStringArea, static_cast<unsigned char>(buffer[kBiosVersion]));
  return CleanBiosVersion(version);
}

// Reads the BIOS version of SMBIOS type 0. The tables stay open while this object lives, because the callers log their result
// before the tables are closed.
class TBiosVersionReader {
public:
  explicit TBiosVersionReader(TBiosVersionMessages const& messages) : fMessages(messages) {
    if (fBuffer) fTables.emplace(TSmbiosTables::kStaysLoaded);  // without memory they are not opened
  }

  // The cleaned version; empty when the read failed. Nothing when the tables cannot be opened or have no such structure.
  std::optional<std::string> Read() {
    int const openStatus = fTables ? OpenStatusOf(*fTables) : static_cast<int>(kZEPStatusOutOfMemory);
    if (openStatus != kZEPStatusOK) {
      LogDebug(fMessages.fUnableToOpen, openStatus);
      return std::nullopt;
    }

    LogDebug(fMessages.fRetrieving);
    int length = 0;
    int const status = fTables->GetFirst(kBiosInformation, fBuffer.get(), kBufferSize, length);
    if (status == kZEPStatusFail) {
      LogDebug(fMessages.fReadFailed);
      return std::string();
    }
    if (status == kZEPStatusNoMoreItems) {
      LogDebug(fMessages.fNoMoreItems);
      return std::nullopt;
    }
    return BiosVersionIn(fBuffer.get());
  }

private:
  static constexpr int kBufferSize = 4096;

  TBiosVersionMessages const& fMessages;
  std::unique_ptr<char[]> const fBuffer = NewClearedBuffer(kBufferSize);
  std::optional<TSmbiosTables> fTables;
};

std::string LowerCase(std::string text) {
  for (char& c : text)
    if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
  return text;
}

}  // namespace

std::string TOSSpecific::GetMachineInfo(std::string key) {
  LogDebug("getMachineInfo() entered.");
  TMachineIdentity const identity = ReadMachineIdentity(EIdentityLog::kAll);
  if (key == "type") return identity.fType;
  if (key == "name") return identity.fName;
  if (key == "model") return identity.fModel;
  if (key == "SN") return identity.fSerialNumber;
  return "error param of GetMachineInfo";
}

std::string TOSSpecific::GetMachineSN() { return GetMachineInfo("SN"); }

std::string TOSSpecific::GetMachineModel() { return GetMachineInfo("model"); }

std::string TOSSpecific::GetMachineName() { return GetMachineInfo("name"); }

// The machine's name, not that of its operating system. Kept.
std::string TOSSpecific::GetOperatingSystemName() { return GetMachineName(); }

std::string TOSSpecific::GetMachineType() {
  LogDebug("getMachineType() entered.");
  return ReadMachineIdentity(EIdentityLog::kTypeOnly).fType;
}

std::string TOSSpecific::GetMachineTypeFromID() {
  std::string const type = GetMachineType();
  TBiosVersionReader bios(kGetMachineTypeFromIDMessages);
  if (std::optional<std::string> const version = bios.Read()) {
    std::string const buildNumber = LowerCase(*version);
    LogDebug("TOSSpecific::GetMachineTypeFromID - buildNumber is ", buildNumber);
    if (std::optional<std::string> const typeOfBuild = MachineTypeOfBuild(buildNumber)) {
      LogDebug("Get machineType from Bios ID().\nmachineType=", *typeOfBuild, "\tBios ID =", *version);
      return *typeOfBuild;
    }
  }
  LogDebug("Failed in getting machineType from Bios ID.\nGet machineType from GetMachineType().\nmachineType=", type);
  return type;
}

std::string TOSSpecific::GetBiosID() {
  TBiosVersionReader bios(kGetBiosIDMessages);
  std::optional<std::string> const version = bios.Read();
  if (!version) return kNoBiosID;
  std::string const biosID = version->empty() ? kNoBiosID : version->substr(0, 2);
  LogDebug("TOSSpecific::GetBiosID - biosID = ", biosID);
  return biosID;
}

int TOSSpecific::getBIDString(char* stringSet, char* output, int length, int number) {
  if (length < 1) return 0;
  std::string_view rest(stringSet, static_cast<std::size_t>(length));
  // The empty string that ends the set, and zeros after it, are not strings of the set.
  std::size_t const last = rest.find_last_not_of('\0');
  if (last == rest.npos) return 0;
  rest = rest.substr(0, last + 2);
  for (int n = 1; n <= number; ++n) {
    std::size_t const end = rest.find('\0');
    if (end == rest.npos) return 0;
    if (n == number) {
      rest.copy(output, n == 1 ? end : end + 1);
      return 1;
    }
    rest.remove_prefix(end + 1);
  }
  return 0;
}

}  // namespace NQRVZEP20
