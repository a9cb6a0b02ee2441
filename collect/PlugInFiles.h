// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The rules by which a file is passed over, which means that it is not loaded as a plug-in.
enum class EPlugInRule {
  kNone,        // the file is loaded
  kName,        // its name is not lib<NAME>.nsp.so
  kMissing,     // it does not exist, or is a symbolic link to nothing
  kKind,        // it is not a regular file, but for example a directory or a FIFO
  kPermission,  // this process may not read it
  kWritable,    // this process runs as root, and other users may replace the file
  kReplaced     // a plug-in of the same name is tried in its place, or before it
};

// For programs: "name", "missing", "kind", "permission", "writable" and "replaced"; empty for kNone.
std::string NameOf(EPlugInRule rule);

// A file that may be a plug-in.
struct TPlugInFile {
  std::string fName;  // of the plug-in: "Host" for libHost.nsp.so; the complete file name when that has another form
  std::string fFile;  // its path
  EPlugInRule fRule = EPlugInRule::kNone;
  std::string fReason = {};  // why it is passed over; empty when it is not

  // Whether the file was meant to be a plug-in, so that passing it over is a failure: its name contains ".nsp", or the caller
  // named it. An ordinary library beside the plug-ins was not.
  bool fIsMeant = true;

  bool IsLoaded() const { return fRule == EPlugInRule::kNone; }
};

struct TPlugInChoice {
  // Plug-ins to try without installing them, with any file name. One with the name of an installed plug-in takes its place; of
  // several with one name, the first one is loaded. A file that is given twice counts once.
  std::vector<std::string> fFiles = {};

  // Whether root also loads plug-ins that others may replace: the file, or a directory or symbolic link on the way to it, belongs
  // to a user other than root and the caller; or the file or a directory has permissions to write for its group (unless that is
  // root's), for everyone, or by an access control list. A directory with the sticky bit, such as /tmp, protects its entries.
  bool fAllowWritable = false;
};

// The directory that is searched for plug-ins: that of libzepcore.so.
std::string PlugInDirectory();

// Every file in the directory of plug-ins, in the order of the names, after the tried ones in the order given. Opens the files,
// but loads none. Throws TZEPException (kZEPStatusFileSystemError and others) when the directory cannot be read.
std::vector<TPlugInFile> FindPlugIns(TPlugInChoice const& choice = {});

// Whether the file begins as every ELF file does, and hence every shared library. False when it cannot be read.
bool IsElfFile(std::string const& file);

// Loads the library of the plug-in into this process, as TOSSpecific::LoadNSPLibrary and LoadPluginLibrary do, with their
// exceptions. The reason of a file for another type of processor is that (WhyOfOtherProcessor in process/SharedObject.h).
void LoadLibraryOf(TPlugInFile const& plugIn);

}  // namespace NQRVZEP20
