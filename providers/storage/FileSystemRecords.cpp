// SPDX-License-Identifier: Apache-2.0
#include "FileSystemRecords.h"

#include "FileSystemUse.h"
#include "ValueNames.h"

#include <string>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TUse = TFinding<TFileSystemUse>;
using TNumber = TFinding<unsigned long>;

// Values of the schema (ValueNames.h).
constexpr unsigned short kPersistent = 2, kTemporary = 3, kExternal = 4;

TMissing NotMounted() { return {kMissingNotApplicable, "the file system is not mounted"}; }

TUse UseOf(TMachineFiles const& files, TFileSystem const& fileSystem) {
  if (fileSystem.fMounts.empty()) return NotMounted();
  std::string const& mountPoint = fileSystem.fMounts[0].fMountPoint;
  if (fileSystem.fIsCovered) return TMissing{kMissingUnreadable, "another file system is mounted over " + mountPoint};
  return UseOf(files, mountPoint);
}

TText RootOf(TFileSystem const& fileSystem) {
  if (fileSystem.fMounts.empty()) return NotMounted();
  return fileSystem.fMounts[0].fMountPoint;
}

bool IsReadOnly(std::string const& options) { return options == "ro" || options.rfind("ro,", 0) == 0; }

TFinding<bool> ReadOnlyOf(TFileSystem const& fileSystem) {
  if (fileSystem.fMounts.empty()) return NotMounted();
  TMount const& mount = fileSystem.fMounts[0];
  return IsReadOnly(mount.fOptions) || IsReadOnly(mount.fSuperOptions);
}

unsigned short PersistenceOf(TFileSystem const& fileSystem) {
  if (fileSystem.fPlace == TFileSystem::kElsewhere) return kExternal;
  return fileSystem.fPlace == TFileSystem::kInMemory && fileSystem.fType != "overlay" ? kTemporary : kPersistent;
}

// A number of statvfs, by the member that holds it.
TNumber NumberOf(TUse const& use, unsigned long TFileSystemUse::*member) {
  return use.Then([&](TFileSystemUse const& values) { return values.*member; });
}

TFinding<unsigned int> SmallNumberOf(TUse const& use, unsigned long TFileSystemUse::*member) {
  return NumberOf(use, member).Then([](unsigned long number) { return static_cast<unsigned int>(number); });
}

// A number of inodes. Some file systems make them as needed.
TNumber InodesOf(TUse const& use, unsigned long TFileSystemUse::*member) {
  return use.Then([&](TFileSystemUse const& values) -> TNumber {
    if (values.fFiles == 0) return TMissing{kMissingNotApplicable, "a file system of this type does not limit its files"};
    return values.*member;
  });
}

TNumber UsedInodesOf(TUse const& use) {
  TNumber const free = InodesOf(use, &TFileSystemUse::fFreeFiles);
  return InodesOf(use, &TFileSystemUse::fFiles).Then([&](unsigned long all) { return all - std::min(all, *free); });
}

void AddKeys(TRecord& record, std::string const& name, TRecord const& system) {
  record.AddKey("CSCreationClassName", system.GetClassName());
  for (TRecordProperty const& property : system.GetProperties())
    if (property.fName == "Name") record.AddKey("CSName", property.fValue);
  record.AddKey("CreationClassName", record.GetClassName());
  record.AddKey("Name", name);
}

// The properties of CIM_FileSystem.
TRecord FileSystemRecord(char const* className, TFileSystem const& fileSystem, TUse const& use, TRecord const& system) {
  TRecord record(className, "/proc/self/mountinfo, udev");
  AddKeys(record, fileSystem.fName, system);
  record.Add("ElementName", fileSystem.fLabel);
  record.Add("Root", RootOf(fileSystem));
  record.Add("FileSystemType", TText(fileSystem.fType));
  record.Add("ReadOnly", ReadOnlyOf(fileSystem));
  record.Add("PersistenceType", TFinding<unsigned short>(PersistenceOf(fileSystem))).Names(kPersistenceTypeNames);
  record.SetSource("statvfs");
  record.Add("BlockSize", NumberOf(use, &TFileSystemUse::fBlockSize)).Unit("byte");
  record.Add("ClusterSize", SmallNumberOf(use, &TFileSystemUse::fFragmentSize)).Unit("byte");
  record.Add("FileSystemSize", NumberOf(use, &TFileSystemUse::fSize)).Unit("byte");
  record.Add("AvailableSpace", NumberOf(use, &TFileSystemUse::fAvailable)).Unit("byte");
  record.Add("MaxFileNameLength", SmallNumberOf(use, &TFileSystemUse::fMaxNameLength));
  record.Add("NumberOfFiles", UsedInodesOf(use));
  return record;
}

}  // namespace

TRecord LocalFileSystemRecord(TMachineFiles const& files, TFileSystem const& fileSystem, TRecord const& system) {
  TUse const use = UseOf(files, fileSystem);
  TRecord record = FileSystemRecord("CIM_UnixLocalFileSystem", fileSystem, use, system);
  record.Add("TotalInodes", InodesOf(use, &TFileSystemUse::fFiles));
  record.Add("FreeInodes", InodesOf(use, &TFileSystemUse::fFreeFiles));
  record
      .Add("FSReservedCapacity",
           use.Then([](TFileSystemUse const& values) { return values.fFree - std::min(values.fFree, values.fAvailable); }))
      .Unit("byte");
  return record;
}

TRecord RemoteFileSystemRecord(TFileSystem const& fileSystem, TRecord const& system) {
  TMissing const notAsked{kMissingUnreadable,
                          "a query would wait until the server or program that provides this file system answers"};
  return FileSystemRecord("CIM_RemoteFileSystem", fileSystem, notAsked, system);
}

TRecord MountRecord(TMount const& mount) {
  TRecord record("ZEP_Mount", "/proc/self/mountinfo", "CIM_SettingData");
  record.AddKey("InstanceID", "ZEP:mount:" + mount.fId);
  record.Add("ElementName", TText(mount.fMountPoint));
  record.Add("MountPoint", TText(mount.fMountPoint));
  record.Add("Source",
             mount.fSource.empty() ? TText(TMissing{kMissingNotGiven, "the mount has no source"}) : TText(mount.fSource));
  record.Add("Directory", TText(mount.fRoot));
  record.Add("Type", TText(mount.fType));
  record.Add("Options", TText(mount.fOptions));
  record.Add("FileSystemOptions", TText(mount.fSuperOptions));
  record.Add("Propagation", TText(mount.fPropagation.empty() ? "private" : mount.fPropagation));
  record.Add("DeviceNumber", TText(mount.fNumber));
  return record;
}

TRecord SwapRecord(TSwap const& swap) {
  constexpr unsigned long kKiB = 1024;
  TRecord record("ZEP_SwapArea", "/proc/swaps", "CIM_EnabledLogicalElement");
  record.AddKey("CreationClassName", "ZEP_SwapArea");
  record.AddKey("Name", TText(swap.fFile));
  record.Add("Type", TText(swap.fType));
  record.Add("Size", TNumber(swap.fSize * kKiB)).Unit("byte");
  record.Add("Used", TNumber(swap.fUsed * kKiB)).Unit("byte");
  record.Add("Priority", TFinding<int>(swap.fPriority));
  return record;
}

}  // namespace NQRVZEP20
