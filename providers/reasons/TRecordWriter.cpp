// SPDX-License-Identifier: Apache-2.0
#include "TRecordWriter.h"

#include "ICIMClass.h"
#include "ICIMQualifierDecl.h"
#include "MissingValueClass.h"
#include "SchemaClasses.h"
#include "TCIMReference.h"
#include "TMemoryClass.h"
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

bool IsInherited(TMemoryClassBuilder const& builder, std::string const& property) {
  auto const superClass = builder.Class()->SuperClass();
  return superClass && superClass->FindPropertyDecl(property);
}

void DeclareProperty(TMemoryClassBuilder& builder, TRecordProperty const& property) {
  TMemoryType const type(property.fValue.GetType());
  property.fIsKey ? builder.Key(property.fName, type) : builder.Property(property.fName, type);
  if (!property.fSource.empty()) builder.Qualifier(kValueSource, property.fSource);
  if (*property.fUnit != '\0') builder.Qualifier("PUnit", property.fUnit);
  if (property.fNameCount == 0) return;
  std::vector<std::string> values, names;
  for (std::size_t i = 0; i < property.fNameCount; ++i) {
    values.emplace_back(property.fNames[i].fValue);
    names.emplace_back(property.fNames[i].fName);
  }
  builder.ValueMap(values, names);
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
  auto builder = DefineClass(shape.GetClassName(), shape.GetSuperClass());
  for (TRecordProperty const& property : shape.GetProperties())
    if (!IsInherited(builder, property.fName)) DeclareProperty(builder, property);
}

TMemoryClassBuilder TRecordWriter::DefineClass(std::string const& name, std::string superClass) {
  auto const declared = fWithoutRecords.find(name);
  if (declared != fWithoutRecords.end()) return fWithoutRecords.extract(declared).mapped();

  TSchemaClass const* const schemaClass = FindSchemaClass(name);
  if (schemaClass != nullptr) superClass = schemaClass->fSuperClass;
  if (!superClass.empty()) EnsureClass(superClass);
  auto builder = fNamespace.DefineClass(name, superClass);
  if (schemaClass != nullptr && schemaClass->IsAbstract()) builder.Abstract();
  if (schemaClass != nullptr && schemaClass->IsAssociation()) builder.Association();
  return builder;
}

void TRecordWriter::EnsureClass(std::string const& name) {
  if (!fNamespace.HasClass(name)) fWithoutRecords.emplace(name, DefineClass(name, ""));
}

// `values`: further values of the instance.
void TRecordWriter::AddInstance(TRecord const& record, TMemoryValues values) {
  for (TRecordProperty const& property : record.GetProperties())
    if (!property.fValue.IsNull()) values.emplace_back(property.fName, property.fValue);
  std::string const path = fNamespace.AddInstance(record.GetClassName(), values)->GetPath(TCIMContext()).GetPath();

  for (TRecordProperty const& property : record.GetProperties())
    if (property.fValue.IsNull()) AddMissing(path, property.fName, property.fMissing);
}

void TRecordWriter::Associate(TAssociation const& association, TRecord const& first, TRecord const& second) {
  Associate(association, first, second, TRecord(association.fClassName, ""));
}

void TRecordWriter::Associate(TAssociation const& association, TRecord const& first, TRecord const& second, TRecord const& more) {
  if (!fNamespace.HasClass(association.fClassName) || fWithoutRecords.count(association.fClassName) > 0)
    DeclareAssociation(association, more);
  AddInstance(more, {{association.fFirstName, ReferenceTo(first)}, {association.fSecondName, ReferenceTo(second)}});
}

void TRecordWriter::DeclareAssociation(TAssociation const& association, TRecord const& more) {
  EnsureClass(association.fFirstClass);
  EnsureClass(association.fSecondClass);
  auto builder = DefineClass(association.fClassName, "");
  builder.KeyReference(association.fFirstName, association.fFirstClass)
      .KeyReference(association.fSecondName, association.fSecondClass);
  for (TRecordProperty const& property : more.GetProperties()) DeclareProperty(builder, property);
}

TCIMValue TRecordWriter::ReferenceTo(TRecord const& record) const {
  TCIMReference path(fNamespace.shared_from_this(), TCIMContext());
  path.SetClassName(record.GetClassName());
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fIsKey && !property.fValue.IsNull()) path.AddKeyValue(property.fName, property.fValue);
  path.GetCIMElement(false);  // throws if there is no such instance
  return TCIMValue(path);
}

void TRecordWriter::AddMissing(std::string const& path, std::string const& property, TMissing const& why) {
  fMissing.push_back(MissingRecord(path, property, why));
}

void TRecordWriter::WriteMissing() {
  Declare(MissingRecord("", "", {}));
  for (TRecord const& record : fMissing) AddInstance(record);
}

}  // namespace NQRVZEP20
