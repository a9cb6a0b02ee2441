// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TRecord.h"

#include <vector>

namespace NQRVZEP20 {

class TMemoryNamespace;

// Writes records into a namespace.
//
// Each class is declared flat, without the superclasses that the DMTF gives it. A property tells where its values come from
// in the qualifier ValueSource, and one instance of ZEP_MissingValue tells of each value that is not there:
//   ElementPath      the object path of the instance, or of the class where that has no instance at all
//   ElementProperty  the property; empty for a whole class
//   Code, Reason     why, as TMissing has them
class TNamespaceWriter {
public:
  // Declares the qualifier.
  explicit TNamespaceWriter(TMemoryNamespace& ns);

  // The class of the record, with this one instance.
  void Write(TRecord const& record);

  // The class of which `shape` is an example, with these instances, or with the reason why there are none.
  void Write(TRecord const& shape, std::vector<TRecord> const& records, TMissing const& whyNone);

  // Writes what was missing. The last call.
  void WriteMissing();

private:
  void Declare(TRecord const& shape);
  void AddInstance(TRecord const& record);
  void AddMissing(std::string const& path, std::string const& property, TMissing const& why);

  TMemoryNamespace& fNamespace;
  std::vector<TRecord> fMissing;
};

}  // namespace NQRVZEP20
