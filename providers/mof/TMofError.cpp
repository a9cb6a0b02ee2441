// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofError.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

std::string PositionOf(TMofSpan const& span) {
  std::string const& text = span.fFile->fText;
  auto const offset = static_cast<std::size_t>(span.fText.data() - text.data());
  auto const end = text.begin() + static_cast<std::ptrdiff_t>(offset);
  std::size_t const lineStart = offset == 0 ? 0 : text.rfind('\n', offset - 1) + 1;  // npos + 1 is 0
  return span.fFile->fName + ":" + std::to_string(std::count(text.begin(), end, '\n') + 1) + ":" +
         std::to_string(offset - lineStart + 1);
}

}  // namespace

TMofError::TMofError(TMofSpan const& span, std::string const& reason, EZEPStatusCode status)
    : TMofError(PositionOf(span) + ": " + reason, status) {}

TMofError::TMofError(std::string const& message, EZEPStatusCode status)
    : TZEPException(status), fMessage(std::make_shared<std::string const>(message)) {}

}  // namespace NQRVZEP20
