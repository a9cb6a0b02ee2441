// SPDX-License-Identifier: Apache-2.0
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
class TPluginManagerProvider;  // the host's handle for the machine-identification library; opaque here

// ".nsp.so", the file name ending of every namespace provider library.
ZEP_EXPORT extern std::string const kNSPExtension;

// Two flags of the process, initially false, for front ends: setLuz and setZEPParser set them, getLuz and isZEPParser read
// them. The library itself does not use them. Set them once, during start-up.
ZEP_EXPORT extern bool isLuz;
ZEP_EXPORT extern bool isParser;  // whether the process runs as the collector's parser

// The destination of a download.
struct TCurlWriteContext {
  std::string fPath;   // the file to append to; empty when there is none
  std::FILE* fStream;  // open only while a chunk is written
};

// libcurl's write callback for downloads: appends `count` items of `size` bytes to the file of the TCurlWriteContext, which
// it opens and closes for each chunk. Returns the number of items written; 0 when closing the file fails, because the chunk
// may then not be on the disk; 0xFFFFFFFF when there is no context, the path is empty, or the file cannot be opened. Any
// result other than `count` stops libcurl; the data already written stays.
ZEP_EXPORT unsigned long curl_fwrite(void* data, unsigned long size, unsigned long count, void* context);

// One removable medium.
struct TRemovableMedium {
  std::string fDevice;       // "/dev/sdb"
  std::string fDescription;  // a readable name: "Example Virtual Disk"
  std::string fMountPoint;   // "/mnt/key"; empty when mounting failed
};

// All operating system services that the library uses. All functions are static. Each runs on the caller's thread and blocks it
// until done; none takes a lock, except to log and to load libsmbios.so or libipmiClient.so. Failures are thrown as
// TZEPException unless the comment of a function states otherwise.
class ZEP_EXPORT TOSSpecific {
public:
  // ---- Files and directories (TOSSpecificFiles.cpp) ----

  // FileExists is true for anything that exists and is not a directory: devices, pipes and sockets count as files. DirExists
  // is true for directories only. Both follow symbolic links.
  static bool FileExists(std::string path);
  static bool DirExists(std::string path);

  // Creates one directory, with permission bits 0777 minus the umask, and returns 0. Throws kZEPStatusDirectoryAlreadyExists
  // when the path already exists, even as a file (EEXIST), kZEPStatusAccessDenied for EACCES and EROFS, and
  // kZEPStatusFileSystemError for any other failure.
  static int CreateDir(std::string path);

  // The size in bytes. Throws kZEPStatusFileNotFound if FileExists is false or stat fails.
  static long GetFileSize(std::string path);

  // The names, not the paths, of all entries except "." and "..", in the order in which the system lists them. Throws
  // kZEPStatusFileSystemError when the directory cannot be opened.
  static std::vector<std::string> ListDir(std::string path);

  // Runs "find <name>" as SpawnProcess does, with a timeout of 300 seconds, and returns the lines of its output, error
  // messages included. Kept.
  static std::vector<std::string> FindFile(std::string name);

  // Runs "rm -f <path>" through the shell, without quoting the path, which may contain shell patterns. Always returns true.
  // Kept.
  static bool deleteFile(std::string path);

  // Creates or truncates a file (permission bits 0644 minus the umask) and writes `contents` in one write, whose result is
  // ignored. Kept. When the file cannot be opened, logs the reason at debug severity and returns false. Does not throw.
  static bool createFile(std::string path, std::string contents);

  // Opens the stream on the file `path`, which is created or truncated; an open stream is closed first. A failure is logged
  // as an error and throws TZEPFailure: kZEPStatusAccessDenied for EACCES, otherwise kZEPStatusFileSystemError, even if the
  // stream's exception mask makes the stream throw. The mask does not change; after a failure the stream's state is failbit.
  static void OpenOutputFileStream(std::ofstream& stream, std::string path);

  // ---- Copies (TOSSpecificCopy.cpp) ----

  // Copies the contents of a file. A missing destination is created with the source's permission bits minus the umask. An
  // existing destination keeps its own bits and is not truncated: if it is longer than the source, the rest of its old
  // contents remains. A short write is neither completed nor reported. Kept. Any other failure throws
  // kZEPStatusFileSystemError; the part already copied remains.
  static void FileCopy(std::string from, std::string to);

  // Copies the files of a directory, following symbolic links, and with `recursive` also its subdirectories. `to` is created
  // when it is missing, but its parents are not. An entry for which stat fails, such as a dangling symbolic link, is
  // skipped. Kept. Returns the result of closing the source directory, 0. Throws kZEPStatusFileSystemError when a directory
  // cannot be opened; exceptions of CreateDir and FileCopy pass through. The files already copied remain.
  static int DirCopy(std::string from, std::string to, bool recursive);

  // ---- Paths and environment (TOSSpecificEnvironment.cpp) ----

  // The working directory. Throws kZEPStatusFail when it cannot be determined or its path is longer than 1023 bytes.
  static std::string GetCurrentDir();

  // The value of an environment variable. When the variable is not set, logs that at debug severity and returns an empty
  // string. Does not throw.
  static std::string GetEnvironment(std::string name);

  // Sets an environment variable, replacing any earlier value. When setenv fails, for example for an invalid name, logs that
  // at debug severity and returns false. Does not throw. Do not call it while another thread reads the environment.
  static bool PutEnvironment(std::string name, std::string value);

  // Joins `base` and `path`; returns `path` alone when it is absolute or `base` is empty. One trailing "/" is removed from
  // `path` first, so the path "/" becomes empty and is treated as relative. Kept.
  static std::string RelocateRelativePath(std::string base, std::string path);

  // True for the OEM variant of the collector: the file "docs/oem_zep_preboot_readme.txt" exists in the working directory.
  static bool isOEMBuild();

  // ---- Texts (TOSSpecificText.cpp) ----

  // Reduces a BIOS identifier to the text in its brackets: erases everything up to and including the first "[", then the
  // first "]" and everything after it. "-[ABC123-1.05]-" becomes "ABC123-1.05". Always returns true. Kept.
  static bool removeNonAlpaNumeric(std::string& text);

  // Splits a hyphenated identifier, which the caller passes in both arguments, at its second hyphen, or at the first if
  // there is only one. "A-B-C" gives the head "A-B" and the tail "C"; without a hyphen nothing changes. Always returns true.
  // Kept.
  static bool breakApartVersion(std::string& tail, std::string& head);

  // Splits a list of zero-terminated strings. `separator` ends the first string only; a zero byte ends each later one. A
  // string whose end is at offset `length` - 2 or later is dropped. Kept. To get all strings, pass a `length` at least 3
  // larger than the offset of the last string's zero byte. Reads no byte at or after the offset `length`.
  static std::vector<std::string> multiStringTok(char* buffer, unsigned long length, char separator);

  // ---- Keyboard (TOSSpecificKeyboard.cpp) ----

  // Whether standard input has data to read, such as a key press; also true when select fails. Kept. Never blocks. Echo, line
  // buffering and signal keys of the terminal are disabled during the call. Do not call it from two threads at once.
  static bool IsKeyWaiting();

  // Blocks until one character can be read from standard input and returns it, or EOF at the end of the input and on error.
  // The character is not echoed and Enter is not needed. It is read directly from the descriptor: data that std::cin or stdin
  // has already buffered is not seen. Do not call it from two threads at once.
  static int GetKeyboardChar();

  // ---- Console, time and host probes (TOSSpecificConsole.cpp) ----

  // The current local time, to the millisecond. The UTC offset is that of the zone's standard time, plus 60 minutes while
  // daylight saving is in force. It is therefore wrong in a zone that shifts by another amount, such as 30 minutes, or -60 in
  // Ireland's winter. Kept. TZ is read on each call.
  static TCIMDateTime GetLocalTime();

  // Sleeps for `milliseconds`, despite its name. Kept. Returns 0, or -1 when a signal ended the sleep early.
  static int USleep(unsigned int milliseconds);

  // Whether the real user ID is root's.
  static bool IsAdmin();

  // 0 on the control domain of a Xen host, 1 on a guest domain, 2 when /proc/xen/capabilities does not exist. When the file
  // exists but cannot be read, the exceptions of CaptureFile pass through.
  static int GetRunningTypeOnXen();

  // Runs the command "sh" with system(), waits until it exits, and returns the result of system().
  static int LaunchCommandShell();

  // Copies `argc` to `newArgc` and `argv` to `newArgv`; nothing is expanded on this platform.
  static void ExpandCommandLineWildcards(int argc, char** argv, int* newArgc, char*** newArgv);

  static void setLuz(bool value);
  static bool getLuz();
  static void setZEPParser(bool value);
  static bool isZEPParser();

  // ---- Processes (TOSSpecificProcess.cpp) ----
  //
  // The standard output and standard error of a child go to one pipe. The caller's thread reads it until the last process
  // that has it open closes it. The child inherits everything else: standard input, every open descriptor that is not marked
  // close-on-exec, working directory, signal mask and ignored signals. Each pipe is marked close-on-exec, so a child that
  // another thread starts cannot keep it open. The cost of starting a child does not depend on the caller's memory size;
  // pthread_atfork handlers are not run. Kept. Several threads may run children at the same time; a stack of 32 KiB is
  // enough.
  //
  // `timeout` is the longest silence allowed between two chunks of output, in seconds; it does not limit the total run
  // time. -1 waits forever. A child that writes nothing for longer is neither killed nor waited for. Kept.
  //
  // Output is appended as it arrives. A zero byte discards the rest of the chunk (at most 4095 bytes) that contains it.
  // Kept.
  //
  // The result is 0 if the child exited with status 0, and -1 in every other case, including when the program could not be
  // executed. The exit code itself is not returned. Kept. A select or waitpid that is interrupted by a signal is not retried.
  // When the pipe's read end is a descriptor that select cannot watch (1024 and above), nothing is run and the result is -1.
  // When no process can be created, an error is logged and a TZEPFailure with kZEPStatusFail is thrown.

  // Runs the file `path` with `argv0` as its name, the arguments `args`, and exactly the environment `env` (entries
  // "NAME=value").
  static int SpawnProcess(std::string const& path, std::vector<std::string> const& args, std::string const& argv0,
                          std::vector<std::string> const& env, std::string& output, int timeout);

  // Runs `program`, which is searched for in PATH, in the caller's environment.
  static int SpawnProcess(std::string program, std::vector<std::string> args, std::string& output, int timeout);

  // The same, but returns the output, regardless of the result.
  static std::string SpawnProcess(std::string program, std::vector<std::string> args, int timeout);

  // The same with a command line, which is split at every single blank: two blanks in a row, or one at the end, give an
  // empty argument. Quotes have no special meaning. Kept.
  static std::string SpawnProcess(std::string commandLine, int timeout);

  // ---- Captured files (TOSSpecificCapture.cpp) ----

  // Runs a program that writes the file `fileName`, and reads that file into `contents`. The timeout is 300 seconds; the
  // output and the result of the program are ignored. Kept. Does not throw: a failure to read the file or to start a process
  // is logged as an error and leaves `contents` empty.
  static void CapFileViaProc(std::string program, std::vector<std::string> args, std::string fileName, std::string& contents);

  // The complete contents of a file, which are also logged at debug severity. If the file cannot be opened, logs an error and
  // throws a TZEPFailure with kZEPStatusFileNotFound; a failed read is handled as in GetFileContents.
  static std::string CaptureFile(std::string path);

  // The complete contents of a file. A file that cannot be opened is logged in two lines at debug severity and gives an empty
  // string. `logContents` and a failed read are handled as in GetFileContents.
  static std::string CaptureFileLoader(std::string path, bool logContents);

  // Everything from the current position of `fd` to the end of the file, zero bytes included. The descriptor stays open.
  // `path` is only used in messages. With `logContents` the contents are logged at debug severity. A failed read is logged at
  // status severity and throws a TZEPFailure with kZEPStatusFileSystemError.
  static std::string GetFileContents(int fd, std::string path, bool logContents);

  // Copies the file into the working directory, or to "/" when that cannot be determined, and opens the copy in vi: the name
  // is given as a shell pattern, the last 35 characters of the path between two "*". A shorter path throws std::out_of_range
  // after the copy. Paths are not quoted for the shell. Kept.
  static void LaunchTextEditor(std::string path);

  // ---- Plug-ins (TOSSpecificPlugins.cpp) ----
  //
  // A plug-in of kind K ("nsp", "nsc", "pi") with base name N is the file "libN.K.so". Providers ("nsp") and consumers
  // ("nsc") are in the directory of the core library; collection plug-ins ("pi") are in the subdirectories of a plug-in
  // root. Nothing is cached between calls, and a loaded library is never unloaded.

  static std::string const kFileSeparator;           // "/"
  static std::string const kDynamicModuleExtension;  // ".so"
  static std::string const kZEPPluginExtension;      // "pi"
  static std::string const kPluginExtension;         // ".pi.so"
  static std::string const kSpecificationExtension;  // ".properties.xml"
  static std::string const kRegistrationExtension;   // ".registration.xml"
  static std::string const libx86IntrAddrFile;       // "/tmp/intr_address.tmp"

  // The directory of the loaded core library (the root path), without a trailing separator. Throws kZEPStatusFileSystemError
  // when the dynamic linker cannot report the library's path, or the path is longer than 511 bytes.
  static std::string GetZEPRootPath();

  // The full paths of the plug-ins of that kind in the subdirectories of `root`, in byte order. A file is a plug-in when its
  // name contains ".<kind>.so" anywhere. Throws kZEPStatusFileSystemError when `root` or a subdirectory cannot be opened.
  static std::vector<std::string> FindPlugins(std::string root, std::string kind);
  static std::vector<std::string> FindPlugins(std::string root);  // of the kind "pi"

  // The base names of the libraries of that kind in the root path, in directory order. A library is any entry that is not a
  // directory and whose name contains ".<kind>". Its base name is the name without its first three and last seven characters,
  // regardless of what they are; a name of at most ten characters gives an empty base name. Kept. Throws
  // kZEPStatusFileSystemError when the root path cannot be opened.
  static std::vector<std::string> FindNSServices(std::string kind);
  static std::vector<std::string> FindNSPs();  // of the kind "nsp"
  static std::vector<std::string> FindNSCs();  // of the kind "nsc"

  // The path of a document that belongs to a plug-in file: the plug-in's path up to ".<kind>.so", without the first "lib" in
  // the path, even one in a directory name, followed by the document's ending. Kept. For the kind "cmpi" no "lib" is removed.
  // Throws kZEPStatusFail when the path contains no ".<kind>.so" or no "lib", and std::out_of_range when the first "lib" is
  // after ".<kind>.so".
  static std::string BuildRegistrationPath(std::string pluginPath, std::string kind);
  static std::string BuildSpecificationPath(std::string pluginPath, std::string kind);
  static std::string BuildSpecificationPath(std::string pluginPath);  // of the kind "pi"

  // Loads a plug-in and returns the dynamic linker's handle. All symbols are resolved immediately and are visible to
  // libraries that are loaded later. A failure is logged as an error and throws TZEPFailure (kZEPStatusFileSystemError) with
  // the linker's reason.
  static void* LoadPluginLibrary(std::string path);

  // Loads "<root path>/lib<baseName>.nsp.so". The provider registers itself while it is loaded. Fails as LoadPluginLibrary
  // does.
  static void LoadNSPLibrary(std::string baseName);

  // Loads "<root path>/lib<baseName>.nsc.so" and returns the consumer that its function <baseName>_CreateINamespaceConsumer
  // creates; the caller owns the consumer. Fails as LoadPluginLibrary does; if the function is missing, logs an error and
  // throws a TZEPFailure with kZEPStatusNotFound, and the library stays loaded.
  static INamespaceConsumer* LoadNSCLibrary(std::string baseName);

  // ---- Machine identification (TOSSpecificMachine.cpp) ----
  //
  // Each call reads SMBIOS again, through the platform library libsmbios.so, which is loaded on first use. If a string cannot
  // be read, the function returns its default and logs the reason at debug severity; none of these functions throws.
  //
  // The product description is split at its first "-", wherever that is. Kept. "Server Q100 -[1234AB7]-" gives the name
  // "Server Q100 " with its trailing blank, the type "1234" and the model "AB7". "1234AB7" alone gives only the type. An
  // incomplete type or model is treated as missing.

  // One field of SMBIOS structure type 1. `key` is case-sensitive: "type" (the machine type; default "0000"), "name",
  // "model" or "SN" (the serial number; default of these three "Unknown"). Any other key gives "error param of
  // GetMachineInfo".
  static std::string GetMachineInfo(std::string key);
  static std::string GetMachineSN();
  static std::string GetMachineModel();
  static std::string GetMachineName();
  static std::string GetOperatingSystemName();  // returns the machine name. Kept.
  static std::string GetMachineType();          // 4 characters; default "0000"

  // The machine type to which the BIOS build prefix belongs; for an unknown prefix, the result of GetMachineType.
  static std::string GetMachineTypeFromID();

  // The first two characters, or the only one, of the BIOS version in SMBIOS structure type 0, without its brackets. "00"
  // when the version is empty or cannot be read.
  static std::string GetBiosID();

  // Copies string `number` (1 is the first) of an SMBIOS string set of `length` bytes to `output`. The caller provides
  // `output`, large enough for the string and filled with zeros: the zero byte of the first string is not copied. Returns 1
  // when the string was found, otherwise 0. The empty string that ends the set is not a string of the set. Reads no byte at
  // or after the offset `length`.
  static int getBIDString(char* stringSet, char* output, int length, int number);

  // ---- Remote identity (TOSSpecificRemote.cpp) ----
  //
  // The identity of a remote server, read from the FRU data of its management controller with IPMI over LAN (UDP port 623)
  // through the platform library libipmiClient.so: serial number (GetRemoteMSN), machine type (GetRemoteMT) and model. Each
  // call opens a session, which replaces the one that was open, and leaves it open. Kept. The result is empty if no session
  // can be opened, and "N/A" if the query fails. Otherwise a serial number always has 7 characters and a machine type 4;
  // missing characters are zero bytes. Do not call these operations from two threads at once.
  static std::string GetRemoteMSN(std::string host, std::string user, std::string password);
  static std::string GetRemoteMT(std::string host, std::string user, std::string password);
  static std::string GetRemoteMachineModel(std::string host, std::string user, std::string password);

  // ---- File transfer (TOSSpecificTransfer.cpp) ----
  //
  // Each call loads libcurl and unloads it again. It tries libcurl.so and libcurl.so.4 in the directory of the core library,
  // then libcurl.so, libcurl.so.4, .3 and .2 on the dynamic linker's search path. Do not make two calls at the same time:
  // they share libcurl's global state.
  //
  // URLs are used unchanged: the caller writes a blank as "%20". The user name and password are part of the URL. FTP uses
  // plain passive mode (PASV). No proxy is used, not even one from the environment. There is no timeout: a server that stops
  // responding blocks the caller. Kept.

  // Uploads the file to the URL or, with `download`, downloads the URL into the file. The missing directories of the URL are
  // created on the server; a download from an FTP server creates them, too. Kept.
  //
  // When the local file of a download already exists, the operation asks on standard output whether to overwrite it, until it
  // reads "y", "Y", "n" or "N" from standard input. After "n" or "N", at the end of the input, or if the file cannot be
  // deleted, it returns without a transfer and without an error. An empty download leaves no file. If a download fails, the
  // part received so far remains. Kept.
  //
  // Every failure is logged as an error and throws a TZEPFailure whose reason is that of the log line: with
  // kZEPStatusLibCurlFailure if libcurl cannot be loaded or initialised, or the file to upload cannot be opened; with
  // kZEPStatusConnectionFailed if the host is unknown or cannot be connected to; with kZEPStatusAccessDenied for any other
  // failure of the transfer, including a full local disk and a file to upload that cannot be read to its end (a directory, a
  // failing disk). The part of an upload that was sent before a failure stays on the server.
  static void CurlTransferFile(std::string url, std::string localFile, bool download);

  // Upload the file to ftp://host/name or sftp://host/name. When the environment variable ZEP_ISBOOTABLE is exactly "yes",
  // the name is placed below "hostline/toqrv/vantor/fdr_upload/".
  static void FTPFile(std::string host, std::string localFile, std::string remoteName);
  static void sFTPFile(std::string host, std::string localFile, std::string remoteName);

  // Download ftp://host/name or sftp://host/name into the file.
  static void FTPFileFromQRV(std::string host, std::string localFile, std::string remoteName);
  static void sFTPFileFromQRV(std::string host, std::string localFile, std::string remoteName);

  // Prints "Remote file name = name.xml.gz" on standard output and uploads to ftp://host/name.xml.gz.
  static void UserFTPFile(std::string host, std::string localFile, std::string name);

  // Fetches a web page through the proxy and appends it to ./content.html. The page is set when the library is built.
  // `userAndPassword` is "user:password"; the last argument is not used. Returns kZEPStatusOK when a response was received,
  // even if it is the proxy's refusal: examine the file. Kept. A failing fetch is logged as an error and returns
  // kZEPStatusConnectionFailed when the proxy is unknown or cannot be connected to, otherwise kZEPStatusAccessDenied. When
  // libcurl cannot be loaded or set up, logs an error and throws a TZEPFailure with kZEPStatusLibCurlFailure.
  static TZEPStatusCode CheckProxySetting(std::string proxy, std::string port, std::string userAndPassword, long unused);

  // Returns 0 when the host name can be resolved and 1 when it cannot, despite the operation's name. Kept. The result is
  // logged at debug severity. The second argument is not used.
  static int DetectHostnameAvailable(std::string hostName, std::string unused);

  // ---- Removable media and devices (TOSSpecificMedia.cpp) ----
  //
  // The commands "mount" and "umount", run through the shell, mount and unmount devices. Names are inserted into the command
  // line without quoting: check every name before passing it. Kept.

  // Mounts a device or, if that fails, its first partition (the device's name followed by "1"). Returns the mount point:
  // "/mnt/floppy" for exactly "/dev/floppy", "/dev/fd0" and "/dev/fd1", "/mnt/key" for any other device. When a device is
  // already mounted there, even another one, nothing is mounted and the mount point is returned. Kept. The mount point must
  // exist. Throws kZEPStatusFileSystemError when neither device nor partition can be mounted; the command's error message is
  // discarded.
  static std::string MountDevice(std::string device);

  // Unmounts `mountPoint`; the device is ignored. Kept. Throws kZEPStatusFileSystemError when the command fails.
  static void UnmountDevice(std::string device, std::string mountPoint);

  // Appends to `devices` the device files of the virtual devices that the management controller presents to this host, as the
  // program "hwinfo" reports them. `kind` is 0 for disks, 1 for CD-ROMs, 2 for keyboards, 3 for mice; for any other kind
  // nothing is run. An alias in parentheses after a name ("/dev/sdc (/dev/sg3)") is removed; with `keepWhole` it stays,
  // except for CD-ROMs. Kept. Nothing is appended if hwinfo is missing. If it is silent for 300 seconds, only its output up
  // to then is used.
  static void getxBMCVirtualDevices(int kind, std::vector<std::string>& devices, bool keepWhole);

  // Finds the USB disks among the instances of the namespace's class QRVSG_SCSIDevice and mounts each as MountDevice does;
  // creates /mnt/key when it is missing. Returns the disks in the order of the instances. If the machine has a floppy drive,
  // it is returned as the last medium, with the mount point "/mnt/floppy", but is not mounted.
  //
  // A disk is an instance whose DeviceType is "Direct Access Device". Its DeviceID is its SCSI address, written
  // "host:channel:target:lun" as Linux does, or a generic SCSI node such as "/dev/sg2", which is queried for its address. Its
  // device is the node among /dev/sda to /dev/sdz that has this address. It is a USB disk when sysfs shows a USB device above
  // it and the kernel's list of USB devices contains that device or cannot be read. A disk that is not in sysfs is a USB disk
  // if the list contains the word "USB" anywhere. The description consists of VendorID and ProductID.
  //
  // All disks share one mount point: only the first disk that can be mounted is mounted, and the disks after it are returned
  // with the same mount point. Kept. Nodes that cannot be queried, instances without a node and failures to mount are logged
  // at debug severity. Exceptions thrown by the namespace pass through, such as kZEPStatusNotFound when it does not have the
  // class QRVSG_SCSIDevice.
  static std::vector<TRemovableMedium> EnumerateRemovableMedia(boost::shared_ptr<ICIMNamespace> ns);

  // ---- Log (TOSSpecificLog.cpp) ----

  // The logger calls this with a formatted line when it has a stream but no file name. Does nothing on this platform.
  static void OutputLogString(std::string line);

  // Logs "TOSSpecific debug output: " + text at debug severity.
  static void DebugOut(std::string text);

  // Writes one line to the system log, under the identity "YBNQ": severity kLogError as LOG_ERR, kLogWarning as LOG_WARNING,
  // any other as LOG_NOTICE. The last argument is not used.
  static void LogSELEvent(char const* text, ILogger::EZEPLogSeverity severity, int unused);

  // Marks the start of a debug session: creates or truncates the file "<path><machine type><local time>.log", such as
  // "/tmp/zep_123420240303-090507.log" for the `path` "/tmp/zep_". A null `path` means "/var/log/QRV_Support/zep_", in the
  // OEM variant "/var/log/OEM_Support/zep_". The complete path is truncated to 255 bytes. Nothing is written to the file, and
  // a failure to create it is not reported. Kept. Then, if `level` is 0 to 4, sets the logger's threshold to it and returns
  // true; any other level leaves the threshold unchanged and returns false.
  static bool SetDebugLevel(int level, char* path);
};

}  // namespace NQRVZEP20
