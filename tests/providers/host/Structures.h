// SPDX-License-Identifier: Apache-2.0
#pragma once

// SMBIOS structures for the tests of the host provider.

#include "providers/host/TSmbiosStructure.h"
#include "providers/reasons/TRecord.h"
#include "tests/SmbiosTables.h"

#include <algorithm>

namespace NQRVZEP20 {

// Makes a structure. Offsets count from the header, as in the standard.
class TStructureMaker {
public:
  // `size`: of header and formatted area. A field that is not set is 0.
  TStructureMaker(int type, std::size_t size) : fType(type), fFields(size - 4, '\0') {}

  TStructureMaker& Byte(std::size_t offset, unsigned number) { return Put(offset, number, 1); }
  TStructureMaker& Word(std::size_t offset, unsigned number) { return Put(offset, number, 2); }
  TStructureMaker& DWord(std::size_t offset, unsigned number) { return Put(offset, number, 4); }
  TStructureMaker& Bytes(std::size_t offset, std::string const& bytes) {
    fFields.replace(offset - 4, bytes.size(), bytes);
    return *this;
  }

  // A string field: adds a string to the set and refers to it.
  TStructureMaker& Text(std::size_t offset, std::string const& text) {
    fStrings.push_back(text);
    return Byte(offset, static_cast<unsigned>(fStrings.size()));
  }

  std::string Table() const { return Structure(fType, fFields, fStrings); }
  TSmbiosStructure Make() const {
    std::string const bytes = Table();
    return TSmbiosStructure(std::vector<unsigned char>(bytes.begin(), bytes.end()));
  }

private:
  TStructureMaker& Put(std::size_t offset, unsigned number, int size) { return Bytes(offset, LittleEndian(number, size)); }

  int fType;
  std::string fFields;
  std::vector<std::string> fStrings;
};

// A property of a record as "type value", or "type NULL code: reason".
inline std::string PropertyOf(TRecord const& record, std::string const& name) {
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fName == name) {
      std::string const type = property.fValue.GetType().ToString();
      if (property.fValue.IsNull()) return type + " NULL " + property.fMissing.fCode + ": " + property.fMissing.fReason;
      return type + " " + property.fValue.ToString();
    }
  return "no such property";
}

}  // namespace NQRVZEP20
