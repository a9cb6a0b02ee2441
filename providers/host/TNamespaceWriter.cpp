#include "TNamespaceWriter.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"

namespace NQRVZEP20 {

namespace {

constexpr char const* kKey = "Key";
constexpr char const* kValueSource = "ValueSource";
constexpr char const* kMissingValue = "ZEP_MissingValue";

TCIMContext const kNoContext;

TCIMValue NullString() { return TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0); }

void SetProperty(ICIMInstance const& instance, std::string const& name, TCIMValue const& value) {
  instance.GetProperty(name, kNoContext)->SetValue(value, kNoContext);
}

}  // namespace

TNamespaceWriter::TNamespaceWriter(boost::shared_ptr<ICIMNamespace> ns) : fNamespace(ns) {
  fNamespace->CreateQualifierDecl(kKey, false, ICIMQualifierDecl::kScopeProperty | ICIMQualifierDecl::kScopeReference,
                                  ICIMQualifierDecl::kFlavorToSubclass, kNoContext);
  fNamespace->CreateQualifierDecl(kValueSource, NullString(), ICIMQualifierDecl::kScopeProperty,
                                  ICIMQualifierDecl::kFlavorDefault, kNoContext);

  TRecord shape(kMissingValue, "");
  shape.AddKey("ElementPath", NullString());
  shape.AddKey("ElementProperty", NullString());
  shape.Add("Code", TFinding<std::string>(TMissing()));
  shape.Add("Reason", TFinding<std::string>(TMissing()));
  fMissingValues = Declare(shape);
}

void TNamespaceWriter::Write(TRecord const& record) { AddInstance(Declare(record), record); }

void TNamespaceWriter::Write(TRecord const& shape, std::vector<TRecord> const& records, TMissing const& whyNone) {
  auto const cls = Declare(shape);
  for (TRecord const& record : records) AddInstance(cls, record);
  if (records.empty()) AddMissing(shape.GetClassName(), "", whyNone);
}

boost::shared_ptr<ICIMClass> TNamespaceWriter::Declare(TRecord const& shape) {
  auto const cls = fNamespace->CreateClass(boost::shared_ptr<ICIMClass>(), shape.GetClassName(), kNoContext);
  cls->BeginDeclarations(kNoContext);
  for (TRecordProperty const& property : shape.GetProperties()) {
    auto const declaration = cls->AddPropertyDecl(property.fName, TCIMValue(property.fValue.GetType(), 0), kNoContext);
    auto const qualify = [&](char const* name, TCIMValue const& value) {
      auto const qualifier = fNamespace->GetQualifierDecl(name, kNoContext);
      declaration->AddQualifier(qualifier, value, qualifier->GetFlavor(kNoContext), kNoContext);
    };
    if (property.fIsKey) qualify(kKey, true);
    if (!property.fSource.empty()) qualify(kValueSource, property.fSource);
  }
  cls->EndDeclarations(kNoContext);
  return cls;
}

void TNamespaceWriter::AddInstance(boost::shared_ptr<ICIMClass> cls, TRecord const& record) {
  auto const instance = cls->CreateInstance(kNoContext);
  for (TRecordProperty const& property : record.GetProperties())
    if (!property.fValue.IsNull()) SetProperty(*instance, property.fName, property.fValue);
  cls->CommitInstance(instance, kNoContext);

  std::string const path = instance->GetPath(kNoContext).GetPath();
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fValue.IsNull()) AddMissing(path, property.fName, property.fMissing);
}

void TNamespaceWriter::AddMissing(std::string const& path, std::string const& property, TMissing const& why) {
  auto const instance = fMissingValues->CreateInstance(kNoContext);
  SetProperty(*instance, "ElementPath", path);
  SetProperty(*instance, "ElementProperty", property);
  SetProperty(*instance, "Code", why.fCode);
  SetProperty(*instance, "Reason", why.fReason);
  fMissingValues->CommitInstance(instance, kNoContext);
}

}  // namespace NQRVZEP20
