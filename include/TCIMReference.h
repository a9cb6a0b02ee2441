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

// A CIM object path in parsed form: the namespace it lives in, the class, and the key bindings.
//
// The namespace is held weakly: a reference never keeps one alive. Copies are deep and share only the class and the
// resolved element. Keys can be added only once a class is set, and the class can be changed only while there are no
// keys; what comes in the wrong order throws kZEPStatusInvalidOpSequence. Exceptions of the namespace pass through unless
// said otherwise. A reference that was moved from can be assigned to or destroyed; any other use is a failed assertion.
// Not synchronised.
class ZEP_EXPORT TCIMReference {
public:
  // An empty reference on that namespace. `context` is handed to the namespace whenever a class is looked up by name.
  TCIMReference(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);

  // The same, followed by SetPath(path).
  TCIMReference(boost::shared_ptr<ICIMNamespace> ns, std::string const& path, TCIMContext context);

  TCIMReference(TCIMReference const& other);
  TCIMReference(TCIMReference&& other) noexcept;
  TCIMReference& operator=(TCIMReference const& other);
  TCIMReference& operator=(TCIMReference&& other) noexcept;
  ~TCIMReference();

  // ---- Paths ----

  // `X_Disk.Id="5",Name="a\"b"`: the class name and the keys in byte order of their names. The namespace is not printed. A
  // backslash stands before each quote and backslash of a value, but the path of a reference value is printed raw.
  std::string GetPath() const;

  // Reads a path into a reference that has a live namespace, no class and no keys. Keys are read only behind a namespace
  // prefix (`ns:X_Disk.Id="5"`), which is dropped; without one the whole text is a class name. Malformed paths, unknown
  // classes and keys, and references nested more than 100 deep are logged as errors and throw kZEPStatusInvalidReference;
  // what was read before stays set. A key that comes twice keeps its first value.
  void SetPath(std::string const& path);

  // ---- Parts ----

  boost::shared_ptr<ICIMNamespace> GetNamespace() const;  // empty once the namespace is gone
  void SetNamespace(boost::shared_ptr<ICIMNamespace> ns);

  // A label of the caller's: nothing reads it, and neither parsing nor printing touches it.
  std::string GetNameSpaceName() const;
  void SetNameSpaceName(std::string name);

  boost::shared_ptr<ICIMClass> GetClass() const;  // empty until set
  void SetClass(boost::shared_ptr<ICIMClass> cls);
  std::string GetClassName() const;  // a reference without class is a failed assertion

  // Sets the class that the namespace knows by that name. Throws boost::bad_weak_ptr when the namespace is gone, and
  // kZEPStatusNotFound, as the namespace does, when there is no such class.
  void SetClassName(std::string const& name);

  // Binds a key. Throws kZEPStatusTypeMismatch, after an error in the log, when the value's type is not the declared one,
  // and kZEPStatusNotFound when the class has no such property. The first binding of a name wins: another is dropped
  // without a word.
  void AddKeyValue(std::string const& name, TCIMValue const& value);

  // Calls back with each (name, value) in byte order of the names until a call returns false.
  void EnumerateKeyBindings(boost::function<bool(std::pair<std::string, TCIMValue>)> callback) const;

  void SetContext(TCIMContext context);
  void Clear();  // empties namespace, class, keys and the resolved element

  // ---- Resolving ----

  // The class when `classOnly` or when there are no keys; otherwise the instance that the class's namespace knows under
  // this path, which is asked for once and then remembered. Throws kZEPStatusNotFound when there is no such instance.
  boost::shared_ptr<ICIMElement> GetCIMElement(bool classOnly) const;

  // ---- Comparison. Equal: the same class object and equal keys. Order: by keys within one class object, else by the two
  //      class objects, in an arbitrary but stable order. ----

  bool operator==(TCIMReference const& other) const;
  bool operator<(TCIMReference const& other) const;

  TCIMReferenceImpl* GetBody() const { return fBody.get(); }  // owned by this reference

private:
  TCIMReferenceImpl& Body() const {
    BOOST_ASSERT(fBody != nullptr);
    return *fBody;
  }
  void BindBody() noexcept;  // tells the body whose it is now

  std::unique_ptr<TCIMReferenceImpl> fBody;  // null only in a reference that was moved from
};

}  // namespace NQRVZEP20
