// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMInstance.h"
#include "LongLong.h"
#include "TCIMValue.h"
#include "TMemoryProperty.h"
#include "TMemoryValues.h"
#include "TNamedList.h"

#include <boost/enable_shared_from_this.hpp>

#include <string>
#include <vector>

namespace NQRVZEP20 {

class TMemoryClass;
class TMemoryPropertyDecl;

// The layout that all instances of a class share: the declarations of all properties, including inherited ones, in the order of
// ICIMInstance::EnumerateProperties; and the positions of the keys.
struct TMemoryLayout {
  TNamedList<TMemoryPropertyDecl const> fDecls;
  std::vector<std::size_t> fKeys;  // positions in fDecls
};

// An instance. Created by TMemoryClass. A property that is in use keeps its instance alive.
class TMemoryInstance : public ICIMInstance, public boost::enable_shared_from_this<TMemoryInstance> {
public:
  TMemoryInstance(boost::weak_ptr<TMemoryClass> cls, boost::shared_ptr<TMemoryLayout const> layout);

  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override;
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                           TCIMContext const& context) const override;
  TCIMReference GetPath(TCIMContext const& context) const override;

  // ---- Filling ----

  // Sets a property. An integer may have any integer type if the declared type can hold the number: 8 fits a uint16. TCIMValue()
  // makes a property of any type NULL. Throws kZEPStatusNotFound for a property that the class does not have, and everything that
  // ICIMProperty::SetValue throws.
  void Set(std::string const& name, TCIMValue const& value);
  template <class T, IfLongLong<T> = 0>
  void Set(std::string const& name, T number) {
    Set(name, FromLongLong(number));
  }

  // The value of a property; throws kZEPStatusNotFound for a property that the class does not have.
  TCIMValue Get(std::string const& name) const;

  // The path as a value for a reference property of another instance.
  TCIMValue GetReference() const;

  // ---- For TMemoryClass, which stores the instance by its keys ----

  bool IsCommitted() const { return fIsCommitted; }
  void SetCommitted();  // after this call its keys cannot change

  // Makes its references NULL: a resolved reference owns the instance that it found, which may be this one.
  void DropReferences();

private:
  std::size_t PositionOf(std::string const& name) const;  // or throws kZEPStatusNotFound
  boost::shared_ptr<ICIMProperty> PropertyAt(std::size_t position) const;

  boost::weak_ptr<TMemoryClass> fClass;
  boost::shared_ptr<TMemoryLayout const> fLayout;
  bool fIsCommitted = false;
  std::vector<TMemoryProperty> fProperties;  // one for each declaration of fLayout; never grows, so their addresses are fixed
};

}  // namespace NQRVZEP20
