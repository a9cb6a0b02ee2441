// SPDX-License-Identifier: Apache-2.0
#include "TMemoryInstance.h"

#include "Fitting.h"
#include "TMemoryClass.h"
#include "TMemoryPropertyDecl.h"
#include "TZEPException.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

TMemoryInstance::TMemoryInstance(boost::weak_ptr<TMemoryClass> cls, boost::shared_ptr<TMemoryLayout const> layout)
    : fClass(cls), fLayout(layout) {
  fProperties.reserve(fLayout->fDecls.Elements().size());
  for (auto const& decl : fLayout->fDecls.Elements()) fProperties.emplace_back(decl);
}

boost::shared_ptr<ICIMClass> TMemoryInstance::GetClass(TCIMContext const&) const { return boost::shared_ptr<ICIMClass>(fClass); }

boost::shared_ptr<ICIMProperty> TMemoryInstance::GetProperty(std::string const& name, TCIMContext const&) const {
  std::size_t const position = fLayout->fDecls.PositionOf(name);
  return position == fLayout->fDecls.kNone ? boost::shared_ptr<ICIMProperty>() : PropertyAt(position);
}

void TMemoryInstance::EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                          TCIMContext const&) const {
  for (std::size_t position = 0; position < fProperties.size(); ++position)
    if (!callback(PropertyAt(position))) return;
}

TCIMReference TMemoryInstance::GetPath(TCIMContext const& context) const {
  boost::shared_ptr<ICIMClass> const cls = GetClass(context);
  TCIMReference path(cls->GetNamespace(context), context);
  path.SetClass(cls);
  for (std::size_t const key : fLayout->fKeys) {
    TCIMValue const value = fProperties[key].GetValue(context);
    if (!value.IsNull()) path.AddKeyValue(fProperties[key].GetName(context), value);
  }
  return path;
}

void TMemoryInstance::Set(std::string const& name, TCIMValue const& value) {
  TCIMContext const none;
  TMemoryProperty& property = fProperties[PositionOf(name)];
  property.SetValue(FittedTo(property.GetDeclaration(none)->GetDefaultValue(none), value), none);
}

TCIMValue TMemoryInstance::Get(std::string const& name) const { return fProperties[PositionOf(name)].GetValue(TCIMContext()); }

TCIMValue TMemoryInstance::GetReference() const {
  TCIMReference path = GetPath(TCIMContext());
  return TCIMValue(path);
}

void TMemoryInstance::SetCommitted() {
  fIsCommitted = true;
  for (std::size_t const key : fLayout->fKeys) fProperties[key].Fix();
}

void TMemoryInstance::DropReferences() {
  for (TMemoryProperty& property : fProperties) property.DropReference();
}

std::size_t TMemoryInstance::PositionOf(std::string const& name) const {
  std::size_t const position = fLayout->fDecls.PositionOf(name);
  if (position == fLayout->fDecls.kNone) throw TZEPException(kZEPStatusNotFound);
  return position;
}

// Shares the ownership of the instance. The interfaces have no constant property, so the constness is dropped.
boost::shared_ptr<ICIMProperty> TMemoryInstance::PropertyAt(std::size_t position) const {
  return boost::shared_ptr<ICIMProperty>(shared_from_this(), const_cast<TMemoryProperty*>(&fProperties[position]));
}

}  // namespace NQRVZEP20
