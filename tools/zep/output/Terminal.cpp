// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <charconv>
#include <cstdlib>
#include <limits>
#include <string>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kUsualWidth = 80, kLeastWidth = 20, kMostWidth = 1000;

std::string Variable(char const* name) {
  char const* const value = std::getenv(name);
  return value != nullptr ? value : "";
}

bool IsDumb() { return Variable("TERM") == "dumb"; }

ELayout LayoutOf(int fd) {
  if (::isatty(fd) == 0) return ELayout::kFile;
  return IsDumb() ? ELayout::kPlain : ELayout::kTerminal;
}

std::size_t WidthOfTerminal() {
  if (std::size_t const columns = ColumnsFrom(Variable("COLUMNS"))) return columns;
  winsize size{};
  bool const isKnown = ::ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col >= kLeastWidth;
  return isKnown ? size.ws_col : kUsualWidth;
}

}  // namespace

ELayout OutputLayout() { return LayoutOf(STDOUT_FILENO); }

ELayout ErrorsLayout() { return LayoutOf(STDERR_FILENO); }

std::size_t OutputWidth() {
  switch (OutputLayout()) {
    case ELayout::kTerminal:
      return WidthOfTerminal();
    case ELayout::kPlain:
      return std::numeric_limits<std::size_t>::max();
    default:
      return kUsualWidth;
  }
}

bool CanRedrawErrors() { return ErrorsLayout() == ELayout::kTerminal; }

std::size_t ColumnsFrom(std::string_view text) {
  std::size_t columns = 0;
  char const* const end = text.data() + text.size();
  auto const [stop, error] = std::from_chars(text.data(), end, columns);
  bool const isNumber = error == std::errc() && stop == end;
  return isNumber && columns >= kLeastWidth && columns <= kMostWidth ? columns : 0;
}

}  // namespace NQRVZEP20::zep
