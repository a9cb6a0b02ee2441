// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMInstance.h"
#include "TCIMValue.h"
#include "TMemoryProperty.h"
#include "TNamedList.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

class TMemoryClass;
class TMemoryPropertyDecl;

// Property values by name, as an instance is filled with them: {{"Id", 5u}, {"Name", "sda"}}.
using TMemoryValues = std::vector<std::pair<std::string, TCIMValue>>;

// What all instances of a class have in common: the declarations of all their properties, inherited ones included, in the
// order of ICIMInstance::EnumerateProperties; and which of them are keys.
struct TMemoryLayout {
  TNamedList<TMemoryPropertyDecl const> fDecls;
  std::vector<std::size_t> fKeys;  // positions in fDecls
};

// An instance. Made by TMemoryClass.
class TMemoryInstance : public ICIMInstance {
public:
  TMemoryInstance(boost::weak_ptr<TMemoryClass> cls, boost::shared_ptr<TMemoryLayout const> layout);

  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override;
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                           TCIMContext const& context) const override;
  TCIMReference GetPath(TCIMContext const& context) const override;

  // ---- Filling ----

  // Sets a property. An integer may be given in any integer type that the declared one can stand in for: 8 does for a
  // uint16. TCIMValue() makes the property NULL, whatever its type. Throws kZEPStatusNotFound for a name that the class
  // does not have, and what ICIMProperty::SetValue throws.
  void Set(std::string const& name, TCIMValue const& value);

  // The value of a property; throws kZEPStatusNotFound for a name that the class does not have.
  TCIMValue Get(std::string const& name) const;

  // The path as a value, which a reference property of another instance takes.
  TCIMValue GetReference() const;

  // ---- For TMemoryClass, which files the instance ----

  bool IsCommitted() const { return fIsCommitted; }
  void SetCommitted();  // its keys are fixed from now on

  // Makes its references NULL: a reference that was resolved owns the instance that it found, and that may be this one.
  void DropReferences();

private:
  TMemoryProperty& PropertyOf(std::string const& name) const;  // or throws kZEPStatusNotFound

  boost::weak_ptr<TMemoryClass> fClass;
  boost::shared_ptr<TMemoryLayout const> fLayout;
  bool fIsCommitted = false;
  std::vector<boost::shared_ptr<TMemoryProperty>> fProperties;  // one for each declaration of fLayout
};

}  // namespace NQRVZEP20
