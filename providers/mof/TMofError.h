// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <memory>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// A text that is read, and the name under which errors speak of it.
struct TMofFile {
  std::string fName;
  std::string fText;
};

// A part of a file: what an error speaks of.
struct TMofPlace {
  TMofFile const* fFile = nullptr;
  std::string_view fText = {};  // of fFile->fText
};

inline std::string NameAt(TMofPlace const& place) { return std::string(place.fText); }

// What is wrong with a MOF text, and where: "disks.mof:3:14: expected ";", found "class"". Lines and columns count from 1,
// columns in bytes. The status is kZEPStatusInvalidFormat, or why a file cannot be read or the namespace refuses.
class TMofError : public TZEPException {
public:
  TMofError(TMofPlace const& place, std::string const& what, EZEPStatusCode status = kZEPStatusInvalidFormat);

  // For a file that cannot be read at all.
  TMofError(std::string const& message, EZEPStatusCode status);

  char const* what() const noexcept override { return fMessage->c_str(); }

private:
  std::shared_ptr<std::string const> fMessage;  // shared, so that copying cannot throw
};

}  // namespace NQRVZEP20
