// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofError.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

std::string TextOf(TMofPlace const& place) {
  std::string const& text = place.fFile->fText;
  std::size_t const offset = static_cast<std::size_t>(place.fText.data() - text.data());
  auto const end = text.begin() + static_cast<std::ptrdiff_t>(offset);
  std::size_t const lineStart = offset == 0 ? 0 : text.rfind('\n', offset - 1) + 1;  // npos + 1 is 0
  return place.fFile->fName + ":" + std::to_string(std::count(text.begin(), end, '\n') + 1) + ":" +
         std::to_string(offset - lineStart + 1);
}

}  // namespace

TMofError::TMofError(TMofPlace const& place, std::string const& what, EZEPStatusCode status)
    : TMofError(TextOf(place) + ": " + what, status) {}

TMofError::TMofError(std::string const& message, EZEPStatusCode status)
    : TZEPException(status), fMessage(std::make_shared<std::string const>(message)) {}

}  // namespace NQRVZEP20
