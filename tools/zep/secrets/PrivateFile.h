// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <sys/types.h>

#include <cstddef>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// The contents of a file with passwords or other secrets, in memory that is overwritten by the destructor.
class TPrivateFile {
public:
  // Reads the complete file; blocks while a pipe has no data. If the file cannot be read to its end or is longer than
  // `mostBytes`, the text is empty and Error() returns the reason, which is EINTR after an interrupt (Interrupts.h).
  explicit TPrivateFile(std::string const& path, std::size_t mostBytes = 1 << 20);

  std::string_view Text() const { return {fText.data(), fText.size()}; }
  int Error() const { return fError; }  // an errno value; EFBIG for a file that is too long, 0 on success
  std::string Reason() const;           // the same in words

  // Why a regular file is not private, with the remedy: it belongs to another user than the caller, or other users have rights to
  // it. Empty for a private file, and for a pipe.
  std::string WhyNotPrivate() const;

  // Prints a warning to standard error, once per path, if it is a regular file that every user may read.
  void WarnWhenOthersMayRead(std::string const& secrets = "the passwords") const;

private:
  std::string fPath;
  std::size_t fMostBytes;
  TSecretBytes fText;
  int fError = 0;
  mode_t fMode = 0;
  uid_t fOwner = 0;
};

// The name of a file for use in messages. If no such file exists, the name may be a password in the wrong place, so the option
// is named instead.
std::string NameOfPrivateFile(std::string const& path, std::string const& option);

}  // namespace NQRVZEP20::zep
