// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

class TMemoryNamespace;

// Writes records into a namespace, with the sources of their values and the reasons for missing values.
//
//   TRecordWriter writer(ns);
//   writer.Write(SystemRecord());
//   writer.Write(DiskRecord(""), diskRecords, TMissing{kMissingNotGiven, "this machine has no disks"});
//   writer.WriteMissing();
//
// Each class is declared without a superclass. The source of a property becomes its qualifier ValueSource, and each missing
// value becomes an instance of the class ZEP_MissingValue (MissingValueClass.h). TReasonReader reads both.
//
// The writer keeps a reference to the namespace. Every operation throws what the namespace throws (TMemoryNamespace.h), such as
// kZEPStatusAlreadyExists for a class that is already declared. Use it from one thread at a time.
class TRecordWriter {
public:
  // Declares the qualifier ValueSource.
  explicit TRecordWriter(TMemoryNamespace& ns);

  // Declares the class of the record and adds this one instance.
  void Write(TRecord const& record);

  // Declares the class from `shape`, whose values are ignored, and adds an instance for each record. If there are no records,
  // `whyNone` is recorded as the reason why the class has no instance.
  void Write(TRecord const& shape, std::vector<TRecord> const& records, TMissing const& whyNone);

  // Records why a property is missing in an instance that was added to the namespace directly. `path` is its object path
  // without the namespace, as ICIMInstance::GetPath(...).GetPath() returns it.
  void AddMissing(std::string const& path, std::string const& property, TMissing const& why);

  // Declares ZEP_MissingValue and adds its instances. Call it once, after everything else.
  void WriteMissing();

private:
  void Declare(TRecord const& shape);
  void AddInstance(TRecord const& record);

  TMemoryNamespace& fNamespace;
  std::vector<TRecord> fMissing;
};

}  // namespace NQRVZEP20
