// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <boost/assert.hpp>
#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>

#include <memory>
#include <string>
#include <utility>

namespace NQRVZEP20 {

class ICIMClass;
class ICIMElement;
class ICIMNamespace;
class TCIMReferenceImpl;

// A parsed CIM object path: a namespace, a class and the key bindings.
//
// The namespace is held by a weak pointer: a reference never keeps it alive. Copies are deep and share only the class and the
// resolved element. Keys can be added only after a class has been set, and the class can be changed only while there are no
// keys; any other order throws kZEPStatusInvalidOpSequence. Exceptions thrown by the namespace pass through unless a comment
// states otherwise. A moved-from reference can only be assigned to or destroyed; any other use is a failed assertion. Not
// synchronised.
class ZEP_EXPORT TCIMReference {
public:
  // Creates a reference in the namespace `ns`, without a class and keys. `context` is passed to the namespace whenever a
  // class is looked up by name.
  TCIMReference(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);

  // The same, followed by SetPath(path).
  TCIMReference(boost::shared_ptr<ICIMNamespace> ns, std::string const& path, TCIMContext context);

  TCIMReference(TCIMReference const& other);
  TCIMReference(TCIMReference&& other) noexcept;
  TCIMReference& operator=(TCIMReference const& other);
  TCIMReference& operator=(TCIMReference&& other) noexcept;
  ~TCIMReference();

  // ---- Paths ----

  // Returns the class name and the keys, in byte order of their names, such as `X_Disk.Id="5",Name="a\"b"`. The namespace is
  // not included. Each quote and backslash in a value is escaped with a backslash, but the path of a reference value is not
  // escaped. Kept.
  std::string GetPath() const;

  // Parses a path. The reference must have a namespace that still exists, no class and no keys; otherwise throws
  // kZEPStatusInvalidOpSequence. Keys are parsed only after a namespace prefix (`ns:X_Disk.Id="5"`), which is not stored;
  // without a prefix the complete string is taken as a class name. Kept. Malformed paths, unknown classes and keys, and
  // references nested more than 100 deep are logged as errors and throw kZEPStatusInvalidReference; the parts parsed before
  // the error stay set. If a key occurs twice, its first value is used.
  void SetPath(std::string const& path);

  // ---- Parts ----

  boost::shared_ptr<ICIMNamespace> GetNamespace() const;  // empty after the namespace has been destroyed
  void SetNamespace(boost::shared_ptr<ICIMNamespace> ns);

  // A label for the caller's own use: the library only stores it. Neither parsing nor printing uses it.
  std::string GetNameSpaceName() const;
  void SetNameSpaceName(std::string name);

  boost::shared_ptr<ICIMClass> GetClass() const;  // empty until set
  void SetClass(boost::shared_ptr<ICIMClass> cls);
  std::string GetClassName() const;  // a failed assertion when no class is set

  // Looks up the class in the namespace and sets it. Throws boost::bad_weak_ptr if the namespace has been destroyed; the
  // namespace throws kZEPStatusNotFound if it has no such class.
  void SetClassName(std::string const& name);

  // Adds the value of a key. Logs an error and throws kZEPStatusTypeMismatch when the type of the value is not the declared
  // type; throws kZEPStatusNotFound if the class has no such property. Only the first value for a name is used: a later one
  // is silently ignored. Kept.
  void AddKeyValue(std::string const& name, TCIMValue const& value);

  // Calls `callback` with the name and value of each key, in byte order of the names, until a call returns false.
  void EnumerateKeyBindings(boost::function<bool(std::pair<std::string, TCIMValue>)> callback) const;

  void SetContext(TCIMContext context);
  void Clear();  // removes namespace, class, keys and the resolved element

  // ---- Resolving ----

  // Returns the class when `classOnly` is true or there are no keys; otherwise the instance that this path names in the
  // namespace of the class. Once the instance has been found, it is stored and not looked up again. Throws kZEPStatusNotFound
  // if there is none.
  boost::shared_ptr<ICIMElement> GetCIMElement(bool classOnly) const;

  // ---- Comparison. Two references are equal when they have the same class object and equal keys. References with the same
  //      class object are ordered by their keys, others by their class objects, in an arbitrary but stable order. ----

  bool operator==(TCIMReference const& other) const;
  bool operator<(TCIMReference const& other) const;

  TCIMReferenceImpl* GetBody() const { return fBody.get(); }  // owned by this reference

private:
  TCIMReferenceImpl& Body() const {
    BOOST_ASSERT(fBody != nullptr);
    return *fBody;
  }
  void BindBody() noexcept;  // makes this reference the owner of its body

  std::unique_ptr<TCIMReferenceImpl> fBody;  // null only in a reference that was moved from
};

}  // namespace NQRVZEP20
