// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <sys/types.h>

#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// A file with passwords, read completely into memory that is overwritten at the end.
class TPrivateFile {
public:
  // Blocks while a pipe has no data. A file that cannot be read to its end, or is longer than 1 MiB, leaves the text empty, with
  // the reason in Error(); after an interrupt (Interrupts.h) that is EINTR.
  explicit TPrivateFile(std::string const& path);

  std::string_view Text() const { return {fText.data(), fText.size()}; }
  int Error() const { return fError; }  // errno; EFBIG for a file that is too long, 0 when it was read
  std::string Reason() const;           // the same as a text

  // Warns on standard error, once for each path, when it is a regular file that every user may read.
  void WarnWhenOthersMayRead() const;

private:
  std::string fPath;
  TSecretBytes fText;
  int fError = 0;
  mode_t fMode = 0;
};

// The name of a file in messages. A name without a file may be a password in the wrong place: the option is named instead.
std::string NameOfPrivateFile(std::string const& path, std::string const& option);

}  // namespace NQRVZEP20::zep
