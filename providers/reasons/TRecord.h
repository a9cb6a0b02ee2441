// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CIMTypes.h"
#include "TCIMValue.h"
#include "TFinding.h"

#include <cstddef>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// A value of an enumerated property and its name: an entry of the qualifiers ValueMap and Values. The value may be a range, as
// in ValueMap: "16..31".
struct TValueName {
  char const* fValue;
  char const* fName;
};

// One property of an instance: its value or the reason why it is missing, and the source.
struct TRecordProperty {
  std::string fName;
  TCIMValue fValue;  // NULL when it is missing, but always of the property's type
  bool fIsKey = false;
  std::string fSource = {};            // empty when the provider itself chose the value
  TMissing fMissing = {};              // only when the value is NULL
  char const* fUnit = "";              // empty unless the value has a unit
  TValueName const* fNames = nullptr;  // of the values of an enumerated property
  std::size_t fNameCount = 0;

  // Sets the unit, in the form of the qualifier PUnit: "byte", "hertz * 10^6". The text is not copied.
  TRecordProperty& Unit(char const* unit) {
    fUnit = unit;
    return *this;
  }

  // Sets the names of the values of an enumerated property. The table is not copied.
  template <std::size_t N>
  TRecordProperty& Names(TValueName const (&names)[N]) {
    fNames = names;
    fNameCount = N;
    return *this;
  }
};

// An instance to be written to a namespace by TRecordWriter: its properties in the order in which they were added, each with a
// value or a reason.
//
//   TRecord record("X_Disk", "sysfs");
//   record.AddKey("Name", "sda");
//   record.Add("Model", files.Line("/sys/block/sda/device/model"));
//   record.Add("Capacity", CapacityOf("sda")).Unit("byte");
//   record.Add("State", StateOf("sda")).Names(kStates);
//
// Each function that adds a property returns it, for its unit or the names of its values; the returned property is valid until
// the next one is added.
//
// The records of one class must have the same properties in the same order, because the class can be declared from any of them.
// A plain value: copies are deep.
class TRecord {
public:
  // `source`: where the values come from, in human-readable form, such as "sysfs" or "SMBIOS type 17".
  // `superClass`: only for a class that is not part of the DMTF schema; see TRecordWriter.
  TRecord(std::string className, std::string source, std::string superClass = "")
      : fClassName(std::move(className)), fSuperClass(std::move(superClass)), fSource(std::move(source)) {}

  // Sets the source of the properties that are added afterwards.
  void SetSource(std::string source) { fSource = std::move(source); }

  // A key property whose value the provider itself chooses, so that it has no source.
  TRecordProperty& AddKey(std::string name, TCIMValue value) {
    fProperties.push_back({std::move(name), std::move(value), true});
    return fProperties.back();
  }

  // A key property whose value comes from the source.
  template <class T>
  TRecordProperty& AddKey(std::string name, TFinding<T> const& finding) {
    Add(std::move(name), finding);
    fProperties.back().fIsKey = true;
    return fProperties.back();
  }

  // A key property that repeats a key of another instance, such as the name of the system that a disk belongs to. It has no
  // source of its own: the source of the other instance applies.
  template <class T>
  TRecordProperty& AddPropagatedKey(std::string name, TFinding<T> const& finding) {
    AddKey(std::move(name), finding);
    fProperties.back().fSource.clear();
    return fProperties.back();
  }

  // Any other property. Its type is the CIM type of T, even if the value is missing; a vector becomes an array.
  template <class T>
  TRecordProperty& Add(std::string name, TFinding<T> const& finding) {
    if (finding)
      fProperties.push_back({std::move(name), ValueOf(*finding), false, fSource});
    else
      fProperties.push_back({std::move(name), TCIMValue(ValueOf(T()).GetType(), 0), false, fSource, finding.Why()});
    return fProperties.back();
  }

  // The value itself, for a property that the provider chooses. It has no source.
  TRecordProperty& AddOwn(std::string name, TCIMValue value) {
    fProperties.push_back({std::move(name), std::move(value)});
    return fProperties.back();
  }

  std::string const& GetClassName() const { return fClassName; }
  std::string const& GetSuperClass() const { return fSuperClass; }  // empty unless the constructor got one
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

  // An array of the elements' type, even without elements.
  template <class T>
  static TCIMValue ValueOf(std::vector<T> const& elements) {
    std::vector<TCIMValue> values;
    for (T const& element : elements) values.push_back(ValueOf(element));
    return TCIMValue(ArrayOf(ValueOf(T()).GetType()), 0, values);
  }

  std::string fClassName;
  std::string fSuperClass;
  std::string fSource;
  std::vector<TRecordProperty> fProperties;
};

}  // namespace NQRVZEP20
