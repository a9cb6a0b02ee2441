// SPDX-License-Identifier: Apache-2.0
#include "TRecordWriter.h"

#include "ICIMQualifierDecl.h"
#include "MissingValueClass.h"
#include "TMemoryNamespace.h"

namespace NQRVZEP20 {

namespace {

TRecord MissingRecord(std::string const& path, std::string const& property, TMissing const& why) {
  TRecord record(kMissingValueClass, "");
  record.AddKey(kElementPath, path);
  record.AddKey(kElementProperty, property);
  record.Add(kMissingCode, TFinding<std::string>(why.fCode));
  record.Add(kMissingReason, TFinding<std::string>(why.fReason));
  return record;
}

}  // namespace

TRecordWriter::TRecordWriter(TMemoryNamespace& ns) : fNamespace(ns) {
  fNamespace.CreateQualifierDecl(kValueSource, TMemoryType("string").GetNull(), ICIMQualifierDecl::kScopeProperty,
                                 ICIMQualifierDecl::kFlavorDefault, TCIMContext());
}

void TRecordWriter::Write(TRecord const& record) {
  Declare(record);
  AddInstance(record);
}

void TRecordWriter::Write(TRecord const& shape, std::vector<TRecord> const& records, TMissing const& whyNone) {
  Declare(shape);
  for (TRecord const& record : records) AddInstance(record);
  if (records.empty()) AddMissing(shape.GetClassName(), "", whyNone);
}

void TRecordWriter::Declare(TRecord const& shape) {
  auto builder = fNamespace.DefineClass(shape.GetClassName());
  for (TRecordProperty const& property : shape.GetProperties()) {
    TMemoryType const type(property.fValue.GetType());
    property.fIsKey ? builder.Key(property.fName, type) : builder.Property(property.fName, type);
    if (!property.fSource.empty()) builder.Qualifier(kValueSource, property.fSource);
  }
}

void TRecordWriter::AddInstance(TRecord const& record) {
  TMemoryValues values;
  for (TRecordProperty const& property : record.GetProperties())
    if (!property.fValue.IsNull()) values.emplace_back(property.fName, property.fValue);
  std::string const path = fNamespace.AddInstance(record.GetClassName(), values)->GetPath(TCIMContext()).GetPath();

  for (TRecordProperty const& property : record.GetProperties())
    if (property.fValue.IsNull()) AddMissing(path, property.fName, property.fMissing);
}

void TRecordWriter::AddMissing(std::string const& path, std::string const& property, TMissing const& why) {
  fMissing.push_back(MissingRecord(path, property, why));
}

void TRecordWriter::WriteMissing() {
  Declare(MissingRecord("", "", {}));
  for (TRecord const& record : fMissing) AddInstance(record);
}

}  // namespace NQRVZEP20
