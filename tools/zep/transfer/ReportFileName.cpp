// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/ReportFileName.h"

#include <algorithm>
#include <cctype>
#include <ctime>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kLongestHostName = 64;

std::string HostNameIn(TJson const& document) {
  TJson const name = document.value("/identity/hostName/value"_json_pointer, TJson(nullptr));
  return name.is_string() ? name.get<std::string>() : "unknown";
}

std::string Cleaned(std::string host) {
  auto const isRisky = [](unsigned char c) { return std::isalnum(c) == 0 && c != '-'; };
  std::replace_if(host.begin(), host.end(), isRisky, '_');
  return host.substr(0, kLongestHostName);
}

std::string TimeText() {
  std::time_t const now = std::time(nullptr);
  std::tm fields{};
  char text[32];
  std::strftime(text, sizeof text, "%Y%m%dT%H%M%SZ", ::gmtime_r(&now, &fields));
  return text;
}

}  // namespace

std::string ReportFileName(TJson const& document, char const* extension) {
  return "zep-report-" + Cleaned(HostNameIn(document)) + "-" + TimeText() + extension;
}

}  // namespace NQRVZEP20::zep
