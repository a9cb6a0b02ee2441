#pragma once

#include "ILogger.h"
#include "TCIMDateTime.h"
#include "ZEPExport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

class INamespaceConsumer;
class TPluginManagerProvider;  // the host's handle for the machine-identification library; only ever handed on

// ".nsp.so", the ending of every namespace provider library.
ZEP_EXPORT extern std::string const kNSPExtension;

// Every service of the operating system that the library uses. Static operations only. Each runs on the caller's thread
// and blocks it until done; none takes a lock. Failures are thrown as TZEPException unless an operation says otherwise.
class ZEP_EXPORT TOSSpecific {
public:
  // ---- Files, directories, paths and environment (TOSSpecificFiles.cpp) ----

  // False for a directory and for what is not there; devices, pipes and sockets count as files. Links are followed.
  static bool FileExists(std::string path);
  static bool DirExists(std::string path);

  // Makes one directory, with permission bits 0777 less the umask, and returns 0. Throws
  // kZEPStatusDirectoryAlreadyExists when something is there (EEXIST), kZEPStatusAccessDenied for EACCES and EROFS, else
  // kZEPStatusFileSystemError.
  static int CreateDir(std::string path);

  // True when "docs/oem_zep_preboot_readme.txt" exists below the working directory: the OEM variant of the collector.
  static bool isOEMBuild();

  // Takes a BIOS identifier out of its brackets: erases everything up to and including the first "[", then the first "]"
  // and everything after it. "-[ABC123-1.05]-" becomes "ABC123-1.05". Always true.
  static bool removeNonAlpaNumeric(std::string& text);

  // Splits a hyphenated identifier, given in both arguments: at the second hyphen where there is one, else at the first.
  // "A-B-C" gives head "A-B" and tail "C"; without a hyphen nothing changes. Always true.
  static bool breakApartVersion(std::string& tail, std::string& head);

  // Splits a list of zero-terminated strings. `separator` ends the first string only. A string whose end lies at or
  // behind `length` - 2 is not taken: pass a length at least two larger than the offset of the last string's zero byte.
  // Reads no byte at or behind `length`.
  static std::vector<std::string> multiStringTok(char* buffer, unsigned long length, char separator);

  // ---- Console, time and host probes (TOSSpecificConsole.cpp) ----

  // Now, as local time to the millisecond. The UTC offset is that of the zone's standard time, plus 60 while daylight
  // saving is in force: 60 also where the zone shifts by half an hour or, as Ireland does in winter, backwards. TZ is
  // looked at on each call.
  static TCIMDateTime GetLocalTime();

  // ---- Plug-ins (TOSSpecificPlugins.cpp) ----
  //
  // A plug-in of kind K ("nsp", "nsc", "pi") with base name N is the file "libN.K.so". Providers and consumers lie beside
  // the core library; collection plug-ins ("pi") one level below a plug-in root. Nothing is remembered between calls, and
  // a loaded library is never unloaded.

  static std::string const kFileSeparator;           // "/"
  static std::string const kDynamicModuleExtension;  // ".so"
  static std::string const kZEPPluginExtension;      // "pi"
  static std::string const kPluginExtension;         // ".pi.so"
  static std::string const kSpecificationExtension;  // ".properties.xml"
  static std::string const kRegistrationExtension;   // ".registration.xml"
  static std::string const libx86IntrAddrFile;       // "/tmp/intr_address.tmp"

  // The directory that holds the loaded core library, without a trailing separator. Throws kZEPStatusFileSystemError when
  // the dynamic linker does not know it, or names the library with more than 511 bytes.
  static std::string GetZEPRootPath();

  // The full paths of the plug-ins of that kind in the subdirectories of `root`, in byte order. A name counts when it
  // holds ".<kind>.so" anywhere. Throws kZEPStatusFileSystemError when `root` or a subdirectory cannot be opened.
  static std::vector<std::string> FindPlugins(std::string root, std::string kind);
  static std::vector<std::string> FindPlugins(std::string root);  // of the kind "pi"

  // The base names of the libraries of that kind in the root path, in directory order: every non-directory whose name
  // holds ".<kind>", less its first three and last seven characters, whatever these are (a shorter name gives an empty
  // base name). Throws kZEPStatusFileSystemError when the root path cannot be opened.
  static std::vector<std::string> FindNSServices(std::string kind);
  static std::vector<std::string> FindNSPs();  // of the kind "nsp"
  static std::vector<std::string> FindNSCs();  // of the kind "nsc"

  // The companion document of a plug-in file: the path up to ".<kind>.so", without the first "lib" of the whole path
  // (which may lie in a directory name; kept), and the document's ending. For the kind "cmpi" no "lib" is taken out.
  // Throws kZEPStatusFail when the path holds no ".<kind>.so" or no "lib", std::out_of_range when that "lib" lies behind
  // the part that is kept.
  static std::string BuildRegistrationPath(std::string pluginPath, std::string kind);
  static std::string BuildSpecificationPath(std::string pluginPath, std::string kind);
  static std::string BuildSpecificationPath(std::string pluginPath);  // of the kind "pi"

  // Loads a plug-in, all its symbols resolved at once and visible to what is loaded later, and returns the dynamic
  // linker's handle. A failure is logged as an error with the linker's reason and throws kZEPStatusFileSystemError.
  static void* LoadPluginLibrary(std::string path);

  // Loads "<root path>/lib<baseName>.nsp.so". The provider registers itself from its own start-up code. Fails as above.
  static void LoadNSPLibrary(std::string baseName);

  // Loads "<root path>/lib<baseName>.nsc.so" and makes the consumer with its function <baseName>_CreateINamespaceConsumer;
  // the caller owns it. Fails as above; a missing function is logged as an error and throws kZEPStatusNotFound, and the
  // library stays loaded.
  static INamespaceConsumer* LoadNSCLibrary(std::string baseName);

  // ---- Machine identification (TOSSpecificMachine.cpp) ----
  //
  // Read from SMBIOS, afresh by each call, through the platform library libsmbios.so, which is loaded when first needed.
  // What cannot be read is the operation's default, with the reason in the log at debug severity; nothing throws.
  //
  // The product description "Server Q100 -[1234AB7]-" is cut at its first "-", wherever that stands: the name is "Server
  // Q100 " with its blank, the type "1234", the model "AB7". A bare "1234AB7" gives the type alone. A type or model that
  // is not there in full is not given in part.

  // One field of SMBIOS type 1 by key, which is case-sensitive: "type" (machine type, else "0000"), "name" (else
  // "Unknown"), "model" (else "Unknown"), "SN" (serial number, else "Unknown"). Any other key: "error param of
  // GetMachineInfo".
  static std::string GetMachineInfo(std::string key);
  static std::string GetMachineSN();
  static std::string GetMachineModel();
  static std::string GetMachineName();
  static std::string GetOperatingSystemName();  // the machine name, not the operating system's. Kept.
  static std::string GetMachineType();          // 4 characters, else "0000"

  // The machine type that the BIOS build prefix stands for, else what GetMachineType gives.
  static std::string GetMachineTypeFromID();

  // The first two characters of the BIOS version of SMBIOS type 0, taken out of its brackets; "00" when there are no two.
  static std::string GetBiosID();

  // Copies string `number` (1 is the first) of an SMBIOS string set of `length` bytes into `output`, which has room for
  // it and was cleared by the caller: for number 1 without, for later ones with its zero byte. 1 when found, 0 otherwise.
  // The empty string that closes the set is none of its strings. Reads no byte behind `length`.
  static int getBIDString(char* stringSet, char* output, int length, int number);

  // ---- Log (TOSSpecificLog.cpp) ----

  // Where a formatted line goes when a logger has a stream but no file name. Does nothing on this platform.
  static void OutputLogString(std::string line);

  // Logs "TOSSpecific debug output: " + text at debug severity.
  static void DebugOut(std::string text);

  // Hands one line to the system log, under the identity "YBNQ": severity 0 as LOG_ERR, 1 as LOG_WARNING, any other as
  // LOG_NOTICE. The last argument is not used.
  static void LogSELEvent(char const* text, ILogger::EZEPLogSeverity severity, int unused);
};

}  // namespace NQRVZEP20
