// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Finding.h"
#include "TCIMValue.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// One property of an instance: a value, NULL where there is none, and where it comes from.
struct TRecordProperty {
  std::string fName;
  TCIMValue fValue;  // of the property's type, NULL or not
  bool fIsKey;
  std::string fSource;  // empty for what the provider itself says, such as key values
  TMissing fMissing;    // why the value is NULL
};

// The name that the machine goes by, and where it comes from.
struct TSystemName {
  TSystemName(std::string name, std::string source) : fName(std::move(name)), fSource(std::move(source)) {}
  TSystemName(TFinding<std::string> name, std::string source) : fName(std::move(name)), fSource(std::move(source)) {}

  TFinding<std::string> fName;
  std::string fSource;
};

// One instance in the making: what a piece of the machine says of itself, in the vocabulary of one CIM class. Every record
// of a class has the same properties in the same order, so that any of them can declare the class.
class TRecord {
public:
  TRecord(std::string className, std::string source) : fClassName(std::move(className)), fSource(std::move(source)) {}

  // Where the values that are added from now on come from.
  void SetSource(std::string source) { fSource = std::move(source); }

  // A key property whose value the provider itself chooses.
  void AddKey(std::string name, TCIMValue value) { fProperties.push_back({std::move(name), std::move(value), true, "", {}}); }

  // A key property whose value comes from the source.
  template <class T>
  void AddKey(std::string name, TFinding<T> const& finding) {
    Add(std::move(name), finding);
    fProperties.back().fIsKey = true;
  }

  // A key property that repeats the name of the system that the piece belongs to.
  void AddKey(std::string name, TSystemName const& system) {
    AddKey(std::move(name), system.fName);
    fProperties.back().fSource.clear();
  }

  template <class T>
  void Add(std::string name, TFinding<T> const& finding) {
    if (finding)
      fProperties.push_back({std::move(name), TCIMValue(*finding), false, fSource, {}});
    else
      fProperties.push_back({std::move(name), TCIMValue(TCIMValue(T()).GetType(), 0), false, fSource, finding.Why()});
  }

  std::string const& GetClassName() const { return fClassName; }
  std::vector<TRecordProperty> const& GetProperties() const { return fProperties; }

private:
  std::string fClassName;
  std::string fSource;
  std::vector<TRecordProperty> fProperties;
};

}  // namespace NQRVZEP20
