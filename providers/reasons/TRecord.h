// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "TFinding.h"

#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// One property of an instance: its value or the reason why it is missing, and the source.
struct TRecordProperty {
  std::string fName;
  TCIMValue fValue;  // NULL when it is missing, but always of the property's type
  bool fIsKey;
  std::string fSource;  // empty when the provider itself chose the value
  TMissing fMissing;    // only when the value is NULL
};

// An instance to be written to a namespace by TRecordWriter: its properties in the order in which they were added, each with a
// value or a reason.
//
//   TRecord record("X_Disk", "sysfs");
//   record.AddKey("Name", "sda");
//   record.Add("Model", ReadLine("/sys/block/sda/device/model"));
//
// The records of one class must have the same properties in the same order, because the class can be declared from any of them.
// A plain value: copies are deep.
class TRecord {
public:
  // `source`: where the values come from, in human-readable form, such as "sysfs" or "SMBIOS type 17".
  TRecord(std::string className, std::string source) : fClassName(std::move(className)), fSource(std::move(source)) {}

  // Sets the source of the properties that are added afterwards.
  void SetSource(std::string source) { fSource = std::move(source); }

  // A key property whose value the provider itself chooses, so that it has no source.
  void AddKey(std::string name, TCIMValue value) { fProperties.push_back({std::move(name), std::move(value), true, "", {}}); }

  // A key property whose value comes from the source.
  template <class T>
  void AddKey(std::string name, TFinding<T> const& finding) {
    Add(std::move(name), finding);
    fProperties.back().fIsKey = true;
  }

  // A key property that repeats a key of another instance, such as the name of the system that a disk belongs to. It has no
  // source of its own: the source of the other instance applies.
  template <class T>
  void AddPropagatedKey(std::string name, TFinding<T> const& finding) {
    AddKey(std::move(name), finding);
    fProperties.back().fSource.clear();
  }

  // Any other property. Its type is the CIM type of T, even if the value is missing.
  template <class T>
  void Add(std::string name, TFinding<T> const& finding) {
    if (finding)
      fProperties.push_back({std::move(name), ValueOf(*finding), false, fSource, {}});
    else
      fProperties.push_back({std::move(name), TCIMValue(ValueOf(T()).GetType(), 0), false, fSource, finding.Why()});
  }

  std::string const& GetClassName() const { return fClassName; }
  std::vector<TRecordProperty> const& GetProperties() const { return fProperties; }

private:
  // The constructors of TCIMValue are ambiguous for long long and unsigned long long.
  template <class T>
  static TCIMValue ValueOf(T const& value) {
    if constexpr (std::is_same_v<T, long long>)
      return TCIMValue(static_cast<long>(value));
    else if constexpr (std::is_same_v<T, unsigned long long>)
      return TCIMValue(static_cast<unsigned long>(value));
    else
      return TCIMValue(value);
  }

  std::string fClassName;
  std::string fSource;
  std::vector<TRecordProperty> fProperties;
};

}  // namespace NQRVZEP20
