// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <memory>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// A source text, and its name in error messages.
struct TMofFile {
  std::string fName;
  std::string fText;
};

// A part of a file, to which an error refers.
struct TMofSpan {
  TMofFile const* fFile = nullptr;
  std::string_view fText = {};  // of fFile->fText
};

inline std::string TextAt(TMofSpan const& span) { return std::string(span.fText); }

// An error in a MOF text, with its position: "disks.mof:3:14: expected ";", found "class"". Lines and columns count from 1,
// columns in bytes. The status is kZEPStatusInvalidFormat, the status for a file that cannot be read, or the status with which
// the namespace refused a declaration.
class TMofError : public TZEPException {
public:
  TMofError(TMofSpan const& span, std::string const& reason, EZEPStatusCode status = kZEPStatusInvalidFormat);

  // For a file that cannot be read; the message is complete.
  TMofError(std::string const& message, EZEPStatusCode status);

  char const* what() const noexcept override { return fMessage->c_str(); }

private:
  std::shared_ptr<std::string const> fMessage;  // shared, so that copying cannot throw
};

}  // namespace NQRVZEP20
