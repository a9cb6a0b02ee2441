// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The record of a device in the database of udev: its properties and the symbolic links to its node.
//
// A plain value: copies are deep.
class TUdevRecord {
public:
  // A record that is missing for that reason.
  explicit TUdevRecord(TMissing why) : fWhy(std::move(why)) {}

  // `text`: a file of /run/udev/data, with lines such as "E:ID_SERIAL=X" and "S:disk/by-id/X". Lines of other kinds, and any that
  // are malformed, are ignored.
  static TUdevRecord From(std::string const& text);

  // `text`: the output of blkid -o udev, whose lines are the same properties without "E:". There are no links. An
  // empty text is a missing record.
  static TUdevRecord FromBlkid(std::string const& text);

  // The record of the block device with that number, "8:1".
  static TUdevRecord Of(TMachineFiles const& files, TFinding<std::string> const& number);

  // Whether udev, or blkid in its place, knows the device.
  bool Exists() const { return fWhy.fCode.empty(); }

  // A property, without outer blanks. Missing if the record is, or has no such property, or an empty one.
  TFinding<std::string> Value(std::string const& name) const;

  // A property that udev wrote with escapes (\x20), such as ID_MODEL_ENC, without them.
  TFinding<std::string> DecodedValue(std::string const& name) const;

  // The links, as paths below /dev, in the order of their names. Missing if there are none.
  TFinding<std::vector<std::string>> Links() const;

private:
  std::map<std::string, std::string> fValues;
  std::vector<std::string> fLinks;
  TMissing fWhy;  // empty for a record that exists
  std::string fOrigin = "the udev database";
};

}  // namespace NQRVZEP20
