// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Listing.h"

#include <cstring>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

// The text after the eight fields that precede the name; empty when there are fewer.
std::string NameIn(std::string const& line) {
  constexpr int kFieldsBeforeName = 8;
  std::size_t at = 0;
  for (int n = 0; n < kFieldsBeforeName && at != line.npos; ++n) at = line.find(' ', line.find_first_not_of(' ', at));
  return at == line.npos ? "" : line.substr(at + 1);
}

bool IsName(std::string const& listed, char type, std::string const& name) {
  return listed == name || (type == 'l' && listed.rfind(name + " -> ", 0) == 0);
}

int ModeOf(std::string const& permissions) {
  int mode = 0;
  for (char const c : permissions) mode = mode * 2 + (std::strchr("rwxst", c) != nullptr ? 1 : 0);
  return mode;
}

}  // namespace

TListedEntry EntryIn(std::string const& listing, std::string const& name) {
  constexpr std::size_t kTypeAndPermissions = 10;
  std::istringstream lines(listing);
  for (std::string line; std::getline(lines, line);)
    if (line.size() > kTypeAndPermissions && IsName(NameIn(line), line[0], name))
      return {line[0], ModeOf(line.substr(1, kTypeAndPermissions - 1))};
  return {};
}

}  // namespace NQRVZEP20::zep
