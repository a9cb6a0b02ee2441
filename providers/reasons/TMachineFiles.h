// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TFinding.h"

#include <charconv>
#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <type_traits>
#include <vector>

namespace NQRVZEP20 {

class TMachineCopy;

// The files that describe a machine, such as those below /sys and /proc. They are read below a root directory: "/" for the
// machine itself, or a directory with the recorded files of another machine.
//
// Paths are absolute, as on the described machine: "/sys/class/net". Symbolic links are followed within the root, so that a
// recording cannot lead to a file outside it. Only regular files are read: a device or a FIFO is reported as unreadable. Every
// operation asks the file system anew and blocks as long as it does. A plain value; several threads may use the same object.
//
// While a machine is being recorded (zep record), each operation first copies what it reads below another root, and then reads
// the copy, so that the recording has by construction all that was read. A file that was read to its end is not read again.
class TMachineFiles {
public:
  // The root that the environment variable ZEP_ROOT names, or "/". If ZEP_RECORD_FROM names a root, too, the machine below that
  // one is recorded below ZEP_ROOT.
  static TMachineFiles OfThisProcess();

  // `root`: a directory, with or without a slash at the end.
  explicit TMachineFiles(std::string root);

  // Whether queries are answered by this machine, also while it is being recorded.
  bool IsThisMachine() const;

  // Whether what is read is being recorded: then a provider must not use what it keeps between its runs.
  bool IsBeingRecorded() const { return fCopy != nullptr; }

  // The path in the file system of this process, for a library that opens the file itself. It follows links without regard to
  // the root.
  std::string Outside(std::string const& path) const;

  // The content. Missing if the file does not exist, cannot be opened or read, is not a regular file, or is longer than
  // `limit` bytes.
  TFinding<std::string> Content(std::string const& path, std::size_t limit = std::size_t(1) << 20) const;

  // The `length` bytes from `offset`; fewer if the file ends before. No others are read, because some files of sysfs are slow:
  // each word of a PCI configuration space is a query of the device. Missing like Content, but a file may be longer.
  TFinding<std::string> Bytes(std::string const& path, std::size_t offset, std::size_t length) const;

  // The first line, without blanks at either end. Missing like Content, and if the line is empty.
  TFinding<std::string> Line(std::string const& path) const;

  // The number in the first line: decimal digits after an optional minus sign, or hexadecimal digits after "0x". Missing like
  // Line, and if the line is not a number of type T.
  template <class T>
  TFinding<T> Number(std::string const& path) const {
    return Line(path).Then([&](std::string const& text) { return NumberFrom<T>(text, path); });
  }

  // The names in a directory, without "." and "..", with numbers in numeric order: eth2 before eth10. None if the directory
  // does not exist or cannot be read.
  std::vector<std::string> Names(std::string const& directory) const;

  // Whether the path exists, as a file of any kind.
  bool Exists(std::string const& path) const;

  // The path without symbolic links and without the root. Missing if the path does not exist.
  TFinding<std::string> RealPath(std::string const& path) const;

  // The last name of the real path: "e1000e" for the link /sys/class/net/eth0/device/driver. Missing like RealPath.
  TFinding<std::string> RealName(std::string const& path) const;

  // The answer to a query that is not made by reading a file, such as a system call or the output of a program. On this machine
  // it is the result of `ask`, which is also recorded below the directory that ZEP_RECORD_ANSWERS names, if set;
  // otherwise it is the content of the recorded file /zep-answers/`name`, of at most 16 MiB. A missing answer is recorded with
  // its reason by zep record, but not below ZEP_RECORD_ANSWERS.
  TFinding<std::string> Answer(std::string const& name, std::function<TFinding<std::string>()> const& ask) const;

  // Whether the answer to the query is recorded, or the reason why it is missing. Always false on this machine.
  bool HasAnswer(std::string const& name) const;

private:
  template <class T>
  static TFinding<T> NumberFrom(std::string const& text, std::string const& path) {
    bool const isHex = text.compare(0, 2, "0x") == 0;
    char const* const end = text.data() + text.size();
    T number{};
    auto const [stop, error] = [&] {
      if constexpr (std::is_integral_v<T>)
        return std::from_chars(text.data() + (isHex ? 2 : 0), end, number, isHex ? 16 : 10);
      else
        return std::from_chars(text.data(), end, number);
    }();
    if (error == std::errc() && stop == end) return number;
    return TMissing{kMissingUnexpected, path + " contains \"" + text + "\", which is not a number in the expected range"};
  }

  std::string fRoot;                             // without a slash at the end; empty for "/"
  std::shared_ptr<TMachineFiles const> fSource;  // the machine that is being recorded, and its copy; null if none is
  std::shared_ptr<TMachineCopy const> fCopy;
};

// Whether a front end describes a sample instead of this machine, which the environment variable ZEP_SAMPLE says. A sample
// consists of SMBIOS tables. A provider that reads none leaves its namespace empty then, since its facts would be those of this
// machine.
bool IsSampleDescribed();

}  // namespace NQRVZEP20
