// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "LongLong.h"
#include "TCIMValue.h"
#include "TMemoryType.h"

#include <boost/shared_ptr.hpp>

#include <string>
#include <vector>

namespace NQRVZEP20 {

class ICIMMethodDecl;
class ICIMNamedElement;
class ICIMNamespace;
class TMemoryClass;

// Describes a class in the order of a schema. TMemoryNamespace::DefineClass returns a builder, and so does every operation. A
// qualifier belongs to the element described last: the class, a property, a method or a parameter.
//
//   ns->DefineClass("X_Disk", "X_Device")
//       .Description("A disk of this machine.")
//       .Property("State", "uint16").ValueMap({"0", "1"}, {"Unknown", "Ready"})
//       .Method("Reset", "uint32").In("Force", "boolean").Out("Log", "string[]");
//
// A refusal is logged as an error and throws a TZEPFailure whose reason names the refused element. Earlier descriptions remain.
class TMemoryClassBuilder {
public:
  explicit TMemoryClassBuilder(boost::shared_ptr<TMemoryClass> cls);

  // ---- Properties. A default value follows the rules of TMemoryInstance::Set. ----

  TMemoryClassBuilder& Property(std::string const& name, TMemoryType const& type, TCIMValue const& defaultValue = TCIMValue());
  template <class T, IfLongLong<T> = 0>
  TMemoryClassBuilder& Property(std::string const& name, TMemoryType const& type, T defaultValue) {
    return Property(name, type, FromLongLong(defaultValue));
  }
  TMemoryClassBuilder& Key(std::string const& name, TMemoryType const& type);

  // A property that refers to instances of that class, which must exist.
  TMemoryClassBuilder& Reference(std::string const& name, std::string const& className);
  TMemoryClassBuilder& KeyReference(std::string const& name, std::string const& className);

  // A property whose value belongs to the class.
  TMemoryClassBuilder& Static(std::string const& name, TMemoryType const& type, TCIMValue const& value);
  template <class T, IfLongLong<T> = 0>
  TMemoryClassBuilder& Static(std::string const& name, TMemoryType const& type, T value) {
    return Static(name, type, FromLongLong(value));
  }

  // ---- Methods, and the parameters of the method described last. An in-out parameter is an In with the qualifier Out. ----

  TMemoryClassBuilder& Method(std::string const& name, TMemoryType const& returnType);
  TMemoryClassBuilder& In(std::string const& name, TMemoryType const& type);
  TMemoryClassBuilder& Out(std::string const& name, TMemoryType const& type);

  // ---- Qualifiers ----

  TMemoryClassBuilder& Abstract();
  TMemoryClassBuilder& Association();
  TMemoryClassBuilder& Description(std::string const& text);
  TMemoryClassBuilder& Override();  // for a property that a superclass declares, too

  // The values of an enumeration, and a name for each.
  TMemoryClassBuilder& ValueMap(std::vector<std::string> const& values, std::vector<std::string> const& words);

  // Any qualifier that the namespace declares, with its declared flavor. An integer may be given in any integer type.
  TMemoryClassBuilder& Qualifier(std::string const& name, TCIMValue const& value);
  template <class T, IfLongLong<T> = 0>
  TMemoryClassBuilder& Qualifier(std::string const& name, T value) {
    return Qualifier(name, FromLongLong(value));
  }

  boost::shared_ptr<TMemoryClass> Class() const { return fClass; }

private:
  TMemoryClassBuilder& Parameter(std::string const& name, TMemoryType const& type);
  std::string ClassName() const;

  boost::shared_ptr<TMemoryClass> fClass;
  boost::shared_ptr<ICIMMethodDecl> fMethod;     // the method described last; empty before the first
  boost::shared_ptr<ICIMNamedElement> fElement;  // the element described last
};

}  // namespace NQRVZEP20
