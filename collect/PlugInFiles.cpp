// SPDX-License-Identifier: Apache-2.0
#include "collect/PlugInFiles.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "TZEPFailure.h"
#include "collect/process/SharedObject.h"
#include "core/Handles.h"

#include <fcntl.h>
#include <grp.h>
#include <link.h>
#include <pwd.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <list>
#include <map>
#include <set>
#include <system_error>

namespace NQRVZEP20 {

namespace {

namespace fs = std::filesystem;

std::string const kPrefix = "lib";

struct TRuling {
  EPlugInRule fRule = EPlugInRule::kNone;
  std::string fReason = {};
};

std::string TextOfError(int error) { return std::generic_category().message(error); }

bool HasNameOfPlugIn(std::string const& fileName) {
  return fileName.size() > kPrefix.size() + kNSPExtension.size() && fileName.compare(0, kPrefix.size(), kPrefix) == 0 &&
         fileName.compare(fileName.size() - kNSPExtension.size(), std::string::npos, kNSPExtension) == 0;
}

std::string NameOfPlugIn(std::string const& fileName) {
  if (!HasNameOfPlugIn(fileName)) return fileName;
  return fileName.substr(kPrefix.size(), fileName.size() - kPrefix.size() - kNSPExtension.size());
}

// ---- Who may write ----

std::string UserName(uid_t user) {
  passwd const* const entry = ::getpwuid(user);
  return entry != nullptr ? entry->pw_name : std::to_string(user);
}

std::string GroupName(gid_t group) {
  ::group const* const entry = ::getgrgid(group);
  return entry != nullptr ? entry->gr_name : std::to_string(group);
}

// Another user or group may then write, even if the mode of the file grants that only to its group.
bool HasAccessControlList(fs::path const& path) { return ::getxattr(path.c_str(), "system.posix_acl_access", nullptr, 0) >= 0; }

// Such as "the group staff may write /usr/local/lib"; empty when only root and the caller may. A symbolic link is not followed.
std::string WhoElseMayWrite(fs::path const& path) {
  struct stat status {};
  if (::lstat(path.c_str(), &status) != 0) return path.string() + " cannot be checked: " + TextOfError(errno);
  if (status.st_uid != 0 && status.st_uid != ::getuid()) return "the user " + UserName(status.st_uid) + " owns " + path.string();
  if (S_ISLNK(status.st_mode)) return "";  // a link cannot be written, and its mode has no meaning
  if (S_ISDIR(status.st_mode) && (status.st_mode & S_ISVTX) != 0) return "";
  if ((status.st_mode & S_IWOTH) != 0) return "every user may write " + path.string();
  if ((status.st_mode & S_IWGRP) == 0) return "";
  if (status.st_gid != 0) return "the group " + GroupName(status.st_gid) + " may write " + path.string();
  return HasAccessControlList(path) ? "others may write " + path.string() + " by its access control list" : "";
}

// The same for everything on the way to the file: each directory, each symbolic link, and the file itself.
std::string WhoElseMayReplace(fs::path const& file) {
  constexpr int kMostLinks = 40;  // as many as Linux follows
  fs::path const start = fs::absolute(file);
  std::list<fs::path> names(start.begin(), start.end());  // the names that lie ahead; "/" leads back to the root
  int links = 0;
  for (fs::path at; !names.empty();) {
    fs::path const next = (at / names.front()).lexically_normal();  // no link is above it, so that ".." is the directory above
    names.pop_front();
    std::string const who = WhoElseMayWrite(next);
    if (!who.empty()) return who;
    if (fs::is_symlink(fs::symlink_status(next))) {
      if (++links > kMostLinks) return next.string() + " cannot be checked: " + TextOfError(ELOOP);
      fs::path const target = fs::read_symlink(next);
      names.insert(names.begin(), target.begin(), target.end());
    } else {
      at = next;
    }
  }
  return "";
}

// ---- The rules ----

TRuling RuleOfMissing(fs::path const& file, int error) {
  std::error_code noLink;
  fs::path const target = fs::read_symlink(file, noLink);
  if (error == EACCES) return {EPlugInRule::kPermission, "this user may not read it"};
  if (!noLink && error == ENOENT)
    return {EPlugInRule::kMissing, "it is a symbolic link to " + target.string() + ", which does not exist"};
  return {EPlugInRule::kMissing, TextOfError(error)};
}

std::string WordForKind(mode_t mode) {
  if (S_ISDIR(mode)) return "a directory";
  if (S_ISFIFO(mode)) return "a FIFO (named pipe)";
  if (S_ISSOCK(mode)) return "a socket";
  return "a device";
}

TUniqueFd OpenToRead(std::string const& file) {
  return TUniqueFd(::open(file.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
}

TRuling RuleOfPermission(fs::path const& file) {
  TUniqueFd const fd = OpenToRead(file);
  if (!fd && (errno == EACCES || errno == EPERM)) return {EPlugInRule::kPermission, "this user may not read it"};
  if (!fd) return {EPlugInRule::kPermission, TextOfError(errno)};
  return {};
}

TRuling RuleOfFile(fs::path const& file, bool allowWritable) {
  struct stat status {};
  if (::stat(file.c_str(), &status) != 0) return RuleOfMissing(file, errno);
  if (!S_ISREG(status.st_mode)) return {EPlugInRule::kKind, "it is " + WordForKind(status.st_mode)};
  TRuling const permission = RuleOfPermission(file);
  if (permission.fRule != EPlugInRule::kNone || allowWritable || ::geteuid() != 0) return permission;
  std::string const who = WhoElseMayReplace(file);
  if (who.empty()) return {};
  return {EPlugInRule::kWritable, "it would run as root, but " + who};
}

TPlugInFile Installed(fs::path const& file, bool allowWritable) {
  std::string const fileName = file.filename().string();
  bool const hasName = HasNameOfPlugIn(fileName);
  TRuling ruling{EPlugInRule::kName, "its name is not lib<NAME>" + kNSPExtension};
  if (hasName) ruling = RuleOfFile(file, allowWritable);
  return {NameOfPlugIn(fileName), file.string(), ruling.fRule, ruling.fReason, fileName.find(".nsp") != fileName.npos};
}

TPlugInFile Tried(std::string const& name, bool allowWritable) {
  fs::path const file = fs::absolute(name).lexically_normal();
  TRuling const ruling = RuleOfFile(file, allowWritable);
  return {NameOfPlugIn(file.filename().string()), file.string(), ruling.fRule, ruling.fReason};
}

// In the order given. A file that is given twice is in the result once.
std::vector<TPlugInFile> TriedOnes(TPlugInChoice const& choice) {
  std::vector<TPlugInFile> files;
  std::set<std::string> known;
  for (std::string const& name : choice.fFiles) {
    TPlugInFile file = Tried(name, choice.fAllowWritable);
    if (known.insert(file.fFile).second) files.push_back(std::move(file));
  }
  return files;
}

// A file that is passed over anyway keeps its reason.
void Replace(TPlugInFile& file, std::string const& reason) {
  if (!file.IsLoaded()) return;
  file.fRule = EPlugInRule::kReplaced;
  file.fReason = reason;
}

std::vector<fs::path> FilesOfDirectory(std::string const& directory) {
  std::vector<fs::path> files;
  try {
    for (fs::directory_entry const& entry : fs::directory_iterator(directory)) files.push_back(entry.path());
  } catch (fs::filesystem_error const&) {
    throw TZEPException(kZEPStatusFileSystemError);
  }
  std::sort(files.begin(), files.end());
  return files;
}

}  // namespace

std::string NameOf(EPlugInRule rule) {
  static char const* const names[] = {"", "name", "missing", "kind", "permission", "writable", "replaced"};
  return names[static_cast<std::size_t>(rule)];
}

std::string PlugInDirectory() { return fs::path(TOSSpecific::GetZEPRootPath()).lexically_normal().string(); }

std::vector<TPlugInFile> FindPlugIns(TPlugInChoice const& choice) {
  std::vector<TPlugInFile> files = TriedOnes(choice);
  std::map<std::string, std::string> tried;  // the first file of each name
  for (TPlugInFile& file : files)
    if (auto const [first, isFirst] = tried.emplace(file.fName, file.fFile); !isFirst)
      Replace(file, "a plug-in of the same name is tried before it: " + first->second);
  for (fs::path const& path : FilesOfDirectory(PlugInDirectory())) {
    files.push_back(Installed(path, choice.fAllowWritable));
    TPlugInFile& file = files.back();
    if (!file.IsLoaded() || tried.count(file.fName) == 0) continue;
    Replace(file, "a plug-in of the same name is tried in its place");
    file.fIsMeant = false;
  }
  return files;
}

bool IsElfFile(std::string const& file) {
  TUniqueFd const fd = OpenToRead(file);
  char magic[SELFMAG] = {};
  return fd && ::pread(fd.get(), magic, SELFMAG, 0) == SELFMAG && std::memcmp(magic, ELFMAG, SELFMAG) == 0;
}

void LoadLibraryOf(TPlugInFile const& plugIn) {
  std::string const other = WhyOfOtherProcessor(plugIn.fFile);
  if (!other.empty()) throw TZEPFailure(kZEPStatusFileSystemError, other);
  fs::path const file = plugIn.fFile;
  if (file.parent_path() == PlugInDirectory() && HasNameOfPlugIn(file.filename().string()))
    TOSSpecific::LoadNSPLibrary(plugIn.fName);
  else
    TOSSpecific::LoadPluginLibrary(plugIn.fFile);
}

}  // namespace NQRVZEP20
