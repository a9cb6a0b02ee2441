#pragma once

#include "ILogger.h"
#include "TCIMDateTime.h"
#include "TZEPStatusCode.h"
#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>
#include <cstdio>

#include <fstream>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class ICIMNamespace;
class INamespaceConsumer;
class TPluginManagerProvider;  // the host's handle for the machine-identification library; only ever handed on

// ".nsp.so", the ending of every namespace provider library.
ZEP_EXPORT extern std::string const kNSPExtension;

// Two flags of the process, false at the start, for the front ends to set and read (setLuz, setZEPParser); the library
// itself asks for neither. Set them once, at start-up.
ZEP_EXPORT extern bool isLuz;
ZEP_EXPORT extern bool isParser;  // whether the process runs as the collector's parser

// Where a download goes.
struct TCurlWriteContext {
  std::string fPath;   // appended to; empty: nowhere
  std::FILE* fStream;  // open only while a chunk is written
};

// libcurl's write callback for downloads: appends `count` items of `size` bytes to the file of the TCurlWriteContext, which
// it opens for each chunk and closes again, and returns the number of items written; 0 when only closing it shows that the
// chunk did not get to the disk. 0xFFFFFFFF when there is no context, no path, or the file cannot be opened. Any number but
// `count` stops libcurl; what was written stays.
ZEP_EXPORT unsigned long curl_fwrite(void* data, unsigned long size, unsigned long count, void* context);

// One medium that can be taken out of the machine.
struct TRemovableMedium {
  std::string fDevice;       // "/dev/sdb"
  std::string fDescription;  // for people: "Example Virtual Disk"
  std::string fMountPoint;   // "/mnt/key"; empty when it could not be mounted
};

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

  // The size in bytes. Throws kZEPStatusFileNotFound when it is not a file that can be asked.
  static long GetFileSize(std::string path);

  // Copies the contents of a file. A destination that is not there is made with the source's permission bits less the
  // umask; one that is there keeps its own bits and is not truncated: behind a shorter source its old tail stays. Throws
  // kZEPStatusFileSystemError for any failure, and leaves what was copied until then.
  static void FileCopy(std::string from, std::string to);

  // Copies the files of a directory, following links, with their directories when `recursive` is set. `to` is made when
  // it is not there, its parents are not. An entry that is gone or a link to nothing is passed over. Returns what closing
  // the source directory returned, 0. Throws kZEPStatusFileSystemError when a directory cannot be opened, and what
  // CreateDir and FileCopy throw; what was copied until then stays.
  static int DirCopy(std::string from, std::string to, bool recursive);

  // The names, not paths, of all entries but "." and "..", in the order of the system. Throws kZEPStatusFileSystemError
  // when the directory cannot be opened.
  static std::vector<std::string> ListDir(std::string path);

  // The lines that the command "find" prints for `name`, its complaints among them. As SpawnProcess, with 300 seconds of
  // silence allowed.
  static std::vector<std::string> FindFile(std::string name);

  // Runs "rm -f <path>" through the shell, without quotes: the path may hold shell patterns. Always true.
  static bool deleteFile(std::string path);

  // Makes or truncates a file (bits 0644 less the umask) and writes `contents` into it in one write, whose result nobody
  // asks for. False, with the reason in the log at debug severity, when it cannot be opened. Does not throw.
  static bool createFile(std::string path, std::string contents);

  // Opens the stream on `path`, made or truncated; a stream that is open is closed first. A failure is logged as an error
  // and throws kZEPStatusAccessDenied for EACCES, else kZEPStatusFileSystemError, also where the stream itself is set to
  // throw; its mask stays as it was, and its state is then failbit.
  static void OpenOutputFileStream(std::ofstream& stream, std::string path);

  // The working directory. Throws kZEPStatusFail when there is none or its path is longer than 1023 bytes.
  static std::string GetCurrentDir();

  // An environment variable; empty, with a line in the log, when it is not set. Does not throw.
  static std::string GetEnvironment(std::string name);

  // Sets an environment variable, in place of an earlier value. False, with a line in the log, when the name will not do.
  // Does not throw. Not to be called while another thread reads the environment.
  static bool PutEnvironment(std::string name, std::string value);

  // `path` below `base`, or `path` itself when it is absolute or `base` is empty; in each case without its own trailing
  // separator, of which one is taken off. The path "/" is empty then, and so counts as relative.
  static std::string RelocateRelativePath(std::string base, std::string path);

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

  // Whether a key waits on standard input; also true when asking fails. Never blocks. The local modes of the terminal
  // (echo, waiting for Enter, signals from keys) are off while it asks. Not from two threads at once.
  static bool IsKeyWaiting();

  // Waits for one character on standard input, not echoed and without Enter, and returns it, or EOF. It is read past
  // stdio: what std::cin or stdin has buffered is not seen. Not from two threads at once.
  static int GetKeyboardChar();

  // Sleeps that many milliseconds, whatever the name says. Returns 0, or -1 when a signal ended the sleep early.
  static int USleep(unsigned int milliseconds);

  // Whether the real user is root.
  static bool IsAdmin();

  // 0 on the control domain of a Xen host, 1 on a guest domain, 2 where /proc/xen/capabilities does not exist. Throws as
  // CaptureFile when it exists but cannot be read.
  static int GetRunningTypeOnXen();

  // Runs "sh" and waits for its end. Returns what system() returned.
  static int LaunchCommandShell();

  // Hands both arguments on unchanged; nothing is expanded on this platform.
  static void ExpandCommandLineWildcards(int argc, char** argv, int* newArgc, char*** newArgv);

  static void setLuz(bool value);
  static bool getLuz();
  static void setZEPParser(bool value);
  static bool isZEPParser();

  // ---- Processes and captured output (TOSSpecificProcess.cpp) ----
  //
  // A child gets its standard output and standard error joined into one pipe, which the caller's thread reads until the
  // last process that holds it closes it. It inherits everything else: standard input, every open descriptor that is not
  // marked close-on-exec, working directory, signal mask and ignored signals. The pipes of children that other threads
  // start are marked so: no child holds up another one's end. Its start costs the same however much memory the caller
  // holds; fork handlers are not run. Several threads may run children at once; a stack of 32 KiB will do.
  //
  // `timeout` is the longest silence allowed between two chunks of output, in seconds, not a limit on the run; -1 waits
  // for ever. A child that is silent for longer is left alone: neither ended nor waited for.
  //
  // Output is appended as it comes. A zero byte cuts off the rest of the chunk (at most 4095 bytes) in which it came.
  //
  // The result is 0 when the child ran to its end and exited with 0, and -1 in every other case: its own exit code is not
  // passed on, also not that of a program that could not be executed (255). Nothing is retried when a signal interrupts
  // it; a read end that select cannot watch (descriptor 1024 and above) counts as a failure of select, and nothing is run
  // then. When no process could be made, an error is logged and kZEPStatusFail thrown.

  // Runs `path` with exactly that environment ("NAME=value"), `argv0` as its name and then `args`.
  static int SpawnProcess(std::string const& path, std::vector<std::string> const& args, std::string const& argv0,
                          std::vector<std::string> const& env, std::string& output, int timeout);

  // Runs `program`, searched on PATH, in the caller's environment.
  static int SpawnProcess(std::string program, std::vector<std::string> args, std::string& output, int timeout);

  // The same; returns the output, whatever became of the child.
  static std::string SpawnProcess(std::string program, std::vector<std::string> args, int timeout);

  // The same with a command line that is cut at every single blank: two in a row make an empty argument, one at the end
  // as well. Quotes mean nothing.
  static std::string SpawnProcess(std::string commandLine, int timeout);

  // Runs a program that leaves a file behind (300 seconds of silence allowed, its output thrown away) and reads that file
  // into `contents`. Does not throw: a failure is logged as an error and leaves `contents` empty.
  static void CapFileViaProc(std::string program, std::vector<std::string> args, std::string fileName, std::string& contents);

  // The whole file. One that cannot be opened is logged as an error and throws kZEPStatusFileNotFound; for a failing read
  // see GetFileContents.
  static std::string CaptureFile(std::string path);

  // The whole file; empty, with two lines in the log at debug severity, when it cannot be opened. `logContents`, and a
  // failing read: see GetFileContents.
  static std::string CaptureFileLoader(std::string path, bool logContents);

  // What the descriptor has from its position to its end, zero bytes included. It stays open. `path` is for messages;
  // with `logContents` the whole text goes into the log at debug severity. A failing read is logged at status severity
  // and throws kZEPStatusFileSystemError.
  static std::string GetFileContents(int fd, std::string path, bool logContents);

  // Copies the file into the working directory ("/" when there is none) and opens the copy in vi, by a pattern of the
  // last 35 characters of its path. A shorter path throws std::out_of_range after the copy. Paths are not quoted for the
  // shell.
  static void LaunchTextEditor(std::string path);

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

  // The first two characters of the BIOS version of SMBIOS type 0, taken out of its brackets, or its only one; "00" when
  // it has none or cannot be read.
  static std::string GetBiosID();

  // Copies string `number` (1 is the first) of an SMBIOS string set of `length` bytes into `output`, which has room for
  // it and was cleared by the caller: for number 1 without, for later ones with its zero byte. 1 when found, 0 otherwise.
  // The empty string that closes the set is none of its strings. Reads no byte behind `length`.
  static int getBIDString(char* stringSet, char* output, int length, int number);

  // The identity of a remote server, read from the FRU data of its management controller over IPMI on the LAN (port 623)
  // through the platform library libipmiClient.so. Each call opens a session of its own, in place of the one that was
  // open, and leaves it open. Empty when no session could be opened, "N/A" when the controller could not be asked. Not
  // from two threads at once. Serial number and type always have 7 and 4 characters; where the answer was shorter, zeros.
  static std::string GetRemoteMSN(std::string host, std::string user, std::string password);
  static std::string GetRemoteMT(std::string host, std::string user, std::string password);
  static std::string GetRemoteMachineModel(std::string host, std::string user, std::string password);

  // Marks the start of a debug session: makes or truncates the file "<path><machine type><local time>.log", such as
  // "/tmp/zep_123420240303-090507.log", where a null `path` stands for "/var/log/QRV_Support/zep_" (in the OEM variant
  // "/var/log/OEM_Support/zep_"). The whole path is cut off after 255 bytes. Nothing is written to the file, and a failure
  // to make it goes unnoticed. Then sets the logger's threshold to a `level` of 0 to 4 and returns true; any other level
  // changes nothing and returns false.
  static bool SetDebugLevel(int level, char* path);

  // ---- File transfer (TOSSpecificTransfer.cpp) ----
  //
  // By libcurl, which each call loads afresh and unloads again: the file libcurl.so or libcurl.so.4 beside the core library,
  // else by the loader's search libcurl.so, .4, .3 or .2. No call while another one runs: libcurl's global state is one.
  //
  // URLs are used as they are: blanks and the like are to be written as "%20". A user and a password stand in the URL.
  // FTP uses plain passive mode (PASV); no proxy is used, none from the environment either. There is no time-out: a server
  // that stops in the middle keeps the caller waiting.

  // Uploads the file to the URL, making missing directories there, or downloads the URL into the file.
  //
  // When a download finds the local file, it asks on standard output whether to overwrite it, until standard input says "y"
  // or "n" in either case. For "n" (and at the end of the input), and for "y" when the file cannot be deleted, it returns
  // without a transfer and without an error. An empty download leaves no file. What arrived of a broken one stays.
  //
  // Every failure is logged as an error. Throws kZEPStatusLibCurlFailure when libcurl cannot be had or set up, or the file to
  // be uploaded cannot be opened; kZEPStatusConnectionFailed when the host is unknown or nobody answers there;
  // kZEPStatusAccessDenied for any other failure of the transfer, a full local disk included, and when the file to be uploaded
  // cannot be read to its end (a directory, a failing disk): what was read until then stays on the server, as it does when an
  // upload breaks off.
  static void CurlTransferFile(std::string url, std::string localFile, bool download);

  // Uploads to ftp://host/name or sftp://host/name; when the environment variable ZEP_ISBOOTABLE is "yes", below
  // "hostline/toqrv/vantor/fdr_upload/" there.
  static void FTPFile(std::string host, std::string localFile, std::string remoteName);
  static void sFTPFile(std::string host, std::string localFile, std::string remoteName);

  // Downloads ftp://host/name or sftp://host/name.
  static void FTPFileFromQRV(std::string host, std::string localFile, std::string remoteName);
  static void sFTPFileFromQRV(std::string host, std::string localFile, std::string remoteName);

  // Uploads to ftp://host/name.xml.gz, after saying "Remote file name = name.xml.gz" on standard output.
  static void UserFTPFile(std::string host, std::string localFile, std::string name);

  // Fetches a web page, chosen when the library is built, through the proxy and appends it to ./content.html.
  // `userAndPassword` is "user:password"; the last argument is not used. Returns kZEPStatusOK when something came back, which
  // may be the proxy's own refusal: look at the file. A failing fetch is logged as an error and returns
  // kZEPStatusConnectionFailed when the proxy is unknown or nobody answers there, else kZEPStatusAccessDenied. Throws
  // kZEPStatusLibCurlFailure, with an error in the log, when libcurl cannot be had or set up.
  static TZEPStatusCode CheckProxySetting(std::string proxy, std::string port, std::string userAndPassword, long unused);

  // 0 when the system knows an address of the host, 1 when not, whatever the name says; with a line in the log at debug
  // severity. The second argument is not used.
  static int DetectHostnameAvailable(std::string hostName, std::string unused);

  // ---- Removable media and devices (TOSSpecificMedia.cpp) ----
  //
  // Devices are mounted and unmounted by the system's own commands, run through the shell. Names are put into the command
  // line as they are, without quotes: hand on none that was not checked.

  // Mounts a device, or else its first partition (the name with a "1" behind it), and returns the mount point: "/mnt/floppy"
  // for exactly "/dev/floppy", "/dev/fd0" and "/dev/fd1", "/mnt/key" for any other. When anything is mounted there already,
  // that stays and nothing is mounted: the mount point then need not be the device's. Throws kZEPStatusFileSystemError when
  // neither can be mounted; why, the command keeps to itself. The mount point must exist.
  static std::string MountDevice(std::string device);

  // Unmounts what is mounted at `mountPoint`; the device is not looked at. Throws kZEPStatusFileSystemError when the command
  // fails.
  static void UnmountDevice(std::string device, std::string mountPoint);

  // Appends the device files of the virtual devices that the management controller shows to this host, as the program
  // "hwinfo" tells them: `kind` is 0 for disks, 1 for CD-ROMs, 2 for keyboards, 3 for mice; for any other nothing is run. An
  // alias in parentheses behind a name is kept with `keepWhole` ("/dev/sdc (/dev/sg3)"), except for CD-ROMs, and cut off
  // without. Nothing is appended when hwinfo is missing; 300 seconds of silence are allowed to it.
  static void getxBMCVirtualDevices(int kind, std::vector<std::string>& devices, bool keepWhole);

  // Finds the USB disks among the instances of the namespace's class QRVSG_SCSIDevice, mounts each as MountDevice does, and
  // adds the floppy drive, unmounted, when the machine has one. In the order of the instances.
  //
  // A disk is an instance whose DeviceType is "Direct Access Device". Its DeviceID is its SCSI address as Linux writes it,
  // "host:channel:target:lun", or a generic SCSI node, "/dev/sg2", which is asked for it; a node /dev/sda to /dev/sdz of the
  // same address is its device. It is a USB disk when the kernel's list of USB devices holds the one that sysfs shows above
  // it. The description is VendorID and ProductID.
  //
  // All disks share the one mount point: of several only the first is mounted, the others get the same mount point. Nodes
  // that cannot be asked, instances without a node and failures to mount are logged at debug severity. What the namespace
  // throws is passed on: kZEPStatusNotFound when it has no such class.
  static std::vector<TRemovableMedium> EnumerateRemovableMedia(boost::shared_ptr<ICIMNamespace> ns);

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
