// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TMemoryClassBuilder.h"
#include "TMemoryValues.h"
#include "TRecord.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class TMemoryNamespace;

// An association of two instances: the name of the class, and the name and the class of each reference.
struct TAssociation {
  char const* fClassName;
  char const* fFirstName;
  char const* fFirstClass;
  char const* fSecondName;
  char const* fSecondClass;
};

constexpr TAssociation kSystemDevice{"CIM_SystemDevice", "GroupComponent", "CIM_System", "PartComponent", "CIM_LogicalDevice"};

// Writes records into a namespace, with the sources of their values and the reasons for missing values.
//
//   TRecordWriter writer(ns);
//   writer.Write(SystemRecord());
//   writer.Write(DiskRecord(""), diskRecords, TMissing{kMissingNotGiven, "this machine has no disks"});
//   for (TRecord const& disk : diskRecords) writer.Associate(kSystemDevice, system, disk);
//   writer.WriteMissing();
//
// A class of the DMTF schema that SchemaClasses.h lists is declared below its superclasses of the schema, which themselves
// are declared without properties. The properties are declared in the class of the record, except those that a superclass
// with records already declares; write such a superclass before its subclasses. A class that is not listed is declared below
// the superclass that the record names, if any.
//
// The source of a property becomes its qualifier ValueSource, its unit PUnit, the names of its values ValueMap and Values. Each
// missing value becomes an instance of the class ZEP_MissingValue (MissingValueClass.h). TReasonReader reads sources and
// reasons.
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

  // Adds an association of the instances of two records, both of which must have been written: otherwise throws
  // kZEPStatusNotFound. The first call for an association declares its class. The references are its keys.
  // `more`: further properties of the association, the same ones in each call for its class.
  void Associate(TAssociation const& association, TRecord const& first, TRecord const& second);
  void Associate(TAssociation const& association, TRecord const& first, TRecord const& second, TRecord const& more);

  // Records why a property is missing in an instance that was added to the namespace directly. `path` is its object path
  // without the namespace, as ICIMInstance::GetPath(...).GetPath() returns it.
  void AddMissing(std::string const& path, std::string const& property, TMissing const& why);

  // Declares ZEP_MissingValue and adds its instances. Call it once, after everything else.
  void WriteMissing();

private:
  void Declare(TRecord const& shape);
  void AddInstance(TRecord const& record, TMemoryValues values = {});

  TMemoryClassBuilder DefineClass(std::string const& name, std::string superClass);
  void EnsureClass(std::string const& name);
  void DeclareAssociation(TAssociation const& association, TRecord const& more);
  TCIMValue ReferenceTo(TRecord const& record) const;

  TMemoryNamespace& fNamespace;
  std::map<std::string, TMemoryClassBuilder> fWithoutRecords;  // the classes that were declared only for others
  std::vector<TRecord> fMissing;
};

}  // namespace NQRVZEP20
