// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"

#include <boost/weak_ptr.hpp>

#include <cstddef>
#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// The implementation of a TCIMReference. TCIMReference documents every operation and forwards it to this class.
class ZEP_EXPORT TCIMReferenceImpl {
public:
  TCIMReferenceImpl(TCIMReference& owner, boost::shared_ptr<ICIMNamespace> ns, TCIMContext context);
  TCIMReferenceImpl(TCIMReference& owner, TCIMReferenceImpl const& other);  // a copy that belongs to `owner`
  ~TCIMReferenceImpl();
  TCIMReferenceImpl(TCIMReferenceImpl const&) = delete;
  TCIMReferenceImpl& operator=(TCIMReferenceImpl const&) = delete;

  void SetOwner(TCIMReference& owner) noexcept { fOwner = owner; }

  // Parses `path` into `target`, starting at `pos`, and advances `pos` past the text that was parsed. If `pos` is not 0, it
  // is the position of the opening quote of a reference that is a key value in an enclosing path; parsing then stops at the
  // closing quote or at the end of the path. A missing closing quote is not detected.
  static void ParsePath(TCIMReferenceImpl& target, std::string const& path, std::size_t& pos);
  static void ParsePath(TCIMReference& target, std::string const& path, std::size_t& pos) {
    ParsePath(*target.GetBody(), path, pos);
  }

  std::string GetPath() const;
  void SetPath(std::string const& path);

  boost::shared_ptr<ICIMNamespace> GetNamespace() const { return fNamespace.lock(); }
  void SetNamespace(boost::shared_ptr<ICIMNamespace> ns) { fNamespace = ns; }
  std::string GetNameSpaceName() const { return fNamespaceName; }
  void SetNameSpaceName(std::string name) { fNamespaceName = std::move(name); }

  boost::shared_ptr<ICIMClass> GetClass() const { return fClass; }
  void SetClass(boost::shared_ptr<ICIMClass> cls);
  std::string GetClassName() const;
  void SetClassName(std::string const& name);

  void AddKeyValue(std::string const& name, TCIMValue const& value);
  void EnumerateKeyBindings(boost::function<bool(std::pair<std::string, TCIMValue>)> callback) const;

  void SetContext(TCIMContext context) { fContext = std::move(context); }
  void Clear();

  boost::shared_ptr<ICIMElement> GetCIMElement(bool classOnly);

  bool operator==(TCIMReferenceImpl const& other) const;
  bool operator<(TCIMReferenceImpl const& other) const;

private:
  using TKeyBindings = std::vector<std::pair<std::string, TCIMValue>>;

  void AddKey(std::string&& name, TCIMValue&& value);
  void LookUpClass(ICIMNamespace const& ns, std::string const& name);

  // The steps of ParsePath.
  void ReadClass(ICIMNamespace const& ns, std::string const& path, std::size_t begin, std::size_t end);
  std::size_t ReadKeyBinding(boost::shared_ptr<ICIMNamespace> const& ns, std::string const& path, std::size_t pos);
  boost::shared_ptr<ICIMPropertyDecl const> ReadDeclaration(std::string const& path, std::string const& name) const;
  TCIMValue ReadReference(boost::shared_ptr<ICIMNamespace> const& ns, std::string const& path, std::size_t& pos) const;

  // The first two are what comparisons read.
  boost::shared_ptr<ICIMClass> fClass;           // empty until set; fixed while there are keys
  TKeyBindings fKeys;                            // by name, in byte order
  std::reference_wrapper<TCIMReference> fOwner;  // passed to the namespace when the instance is looked up
  boost::weak_ptr<ICIMNamespace> fNamespace;
  TCIMContext fContext;                     // passed to the namespace when a class is looked up
  boost::shared_ptr<ICIMElement> fElement;  // the instance, once found; never looked up again
  std::string fNamespaceName;               // the caller's label; unrelated to fNamespace
  int fDepth = 0;                           // the number of paths being read that enclose this one
};

}  // namespace NQRVZEP20
