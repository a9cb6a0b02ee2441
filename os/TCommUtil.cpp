// SPDX-License-Identifier: Apache-2.0
#include "TCommUtil.h"

#include "TOSSpecific.h"
#include "TZEPException.h"

#include <algorithm>

namespace NQRVZEP20 {
namespace {

// Letters, digits, punctuation, blank; tab, newline, vertical tab, form feed, carriage return. The locale does not matter.
bool IsText(char c) { return (c >= ' ' && c <= '~') || (c >= '\t' && c <= '\r'); }

// A directory that another program creates between the check and the attempt is not a failure.
void MakeDirUnlessThere(std::string const& path) {
  if (TOSSpecific::DirExists(path)) return;
  try {
    TOSSpecific::CreateDir(path);
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusDirectoryAlreadyExists || !TOSSpecific::DirExists(path)) throw;
  }
}

}  // namespace

void TCommUtil::SplitPath(std::string const& path, std::vector<std::string>& parts, std::string const& separator,
                          bool keepSeparator) {
  if (path.empty()) return;
  std::size_t start = 0;
  for (std::size_t at; (at = path.find(separator, start)) != std::string::npos;) {
    parts.push_back(path.substr(start, at - start + (keepSeparator ? 1 : 0)));
    start = at + 1;  // one character further, whatever the length of the separator. Kept.
    if (start >= path.size()) return;
  }
  parts.push_back(path.substr(start));
}

void TCommUtil::MkDirHier(std::string const& path) {
  std::vector<std::string> parts;
  SplitPath(path, parts, "/", true);
  std::string prefix;
  for (std::string const& part : parts) {
    prefix += part;
    MakeDirUnlessThere(prefix);
  }
}

std::string TCommUtil::RemoveSpaces(std::string text) {
  text.erase(std::min(text.find('\n'), text.size()));
  text.erase(text.find_last_not_of(' ') + 1);
  text.erase(0, text.find_first_not_of(' '));
  // Done last, so that a blank before the carriage return stays. Kept.
  text.erase(std::min(text.find('\r'), text.size()));
  if (!std::all_of(text.begin(), text.end(), IsText)) return "";
  return text;
}

}  // namespace NQRVZEP20
