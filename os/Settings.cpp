// SPDX-License-Identifier: Apache-2.0
#include "os/Settings.h"

#include "os/SettingLine.h"

#include <algorithm>
#include <functional>
#include <utility>

namespace NQRVZEP20 {
namespace {

std::uint32_t HashOf(std::string_view key) { return static_cast<std::uint32_t>(std::hash<std::string_view>()(key)); }

}  // namespace

void TSettings::Add(std::string text) {
  std::string_view rest = fTexts.emplace_back(std::move(text));
  ResizeTable(fSettings.size() + static_cast<std::size_t>(std::count(rest.begin(), rest.end(), '\n')));
  while (!rest.empty()) {
    std::size_t const end = rest.find('\n');
    TSettingLine const line = ReadSettingLine(rest.substr(0, end));
    rest.remove_prefix(end + 1);
    if (line.IsSetting()) Insert({line.fKey, line.fValue});
  }
}

std::optional<std::string_view> TSettings::ValueOf(std::string_view key) const {
  std::size_t const number = fTable[PlaceOf(HashOf(key), key)].fNumber;
  if (number == 0) return std::nullopt;
  return fSettings[number - 1].fValue;
}

std::vector<std::string> TSettings::Keys() const {
  std::vector<std::string> keys;
  keys.reserve(fSettings.size());
  for (TSetting const& setting : fSettings) keys.emplace_back(setting.fKey);
  std::sort(keys.begin(), keys.end());
  return keys;
}

void TSettings::Insert(TSetting const& setting) {
  std::uint32_t const hash = HashOf(setting.fKey);
  TPlace& place = fTable[PlaceOf(hash, setting.fKey)];
  if (place.fNumber != 0) return;
  fSettings.push_back(setting);
  place = {hash, static_cast<std::uint32_t>(fSettings.size())};
}

// Makes room for that many settings.
void TSettings::ResizeTable(std::size_t settings) {
  std::size_t size = fTable.size();
  while (size < 2 * settings) size *= 2;
  fSettings.reserve(settings);
  std::vector<TPlace> const old = std::exchange(fTable, std::vector<TPlace>(size));
  for (TPlace const& place : old)
    if (place.fNumber != 0) fTable[PlaceOf(place.fHash, fSettings[place.fNumber - 1].fKey)] = place;
}

// The place of a key, or the free one where it belongs.
std::size_t TSettings::PlaceOf(std::uint32_t hash, std::string_view key) const {
  std::size_t const mask = fTable.size() - 1;
  std::size_t at = hash & mask;
  while (fTable[at].fNumber != 0 && (fTable[at].fHash != hash || fSettings[fTable[at].fNumber - 1].fKey != key))
    at = (at + 1) & mask;
  return at;
}

}  // namespace NQRVZEP20
