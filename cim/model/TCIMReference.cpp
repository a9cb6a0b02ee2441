// SPDX-License-Identifier: Apache-2.0
#include "TCIMReference.h"

#include "TCIMReferenceImpl.h"

namespace NQRVZEP20 {

TCIMReference::TCIMReference(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context)
    : fBody(std::make_unique<TCIMReferenceImpl>(*this, std::move(ns), std::move(context))) {}

TCIMReference::TCIMReference(boost::shared_ptr<ICIMNamespace> ns, std::string const& path, TCIMContext context)
    : TCIMReference(std::move(ns), std::move(context)) {
  SetPath(path);
}

TCIMReference::TCIMReference(TCIMReference const& other) : fBody(std::make_unique<TCIMReferenceImpl>(*this, other.Body())) {}

TCIMReference::TCIMReference(TCIMReference&& other) noexcept : fBody(std::move(other.fBody)) { BindBody(); }

TCIMReference& TCIMReference::operator=(TCIMReference const& other) {
  fBody = std::make_unique<TCIMReferenceImpl>(*this, other.Body());
  return *this;
}

TCIMReference& TCIMReference::operator=(TCIMReference&& other) noexcept {
  fBody = std::move(other.fBody);
  BindBody();
  return *this;
}

TCIMReference::~TCIMReference() = default;

std::string TCIMReference::GetPath() const { return Body().GetPath(); }
void TCIMReference::SetPath(std::string const& path) { Body().SetPath(path); }

boost::shared_ptr<ICIMNamespace> TCIMReference::GetNamespace() const { return Body().GetNamespace(); }
void TCIMReference::SetNamespace(boost::shared_ptr<ICIMNamespace> ns) { Body().SetNamespace(std::move(ns)); }
std::string TCIMReference::GetNameSpaceName() const { return Body().GetNameSpaceName(); }
void TCIMReference::SetNameSpaceName(std::string name) { Body().SetNameSpaceName(std::move(name)); }

boost::shared_ptr<ICIMClass> TCIMReference::GetClass() const { return Body().GetClass(); }
void TCIMReference::SetClass(boost::shared_ptr<ICIMClass> cls) { Body().SetClass(std::move(cls)); }
std::string TCIMReference::GetClassName() const { return Body().GetClassName(); }
void TCIMReference::SetClassName(std::string const& name) { Body().SetClassName(name); }

void TCIMReference::AddKeyValue(std::string const& name, TCIMValue const& value) { Body().AddKeyValue(name, value); }

void TCIMReference::EnumerateKeyBindings(boost::function<bool(std::pair<std::string, TCIMValue>)> callback) const {
  Body().EnumerateKeyBindings(std::move(callback));
}

void TCIMReference::SetContext(TCIMContext context) { Body().SetContext(std::move(context)); }
void TCIMReference::Clear() { Body().Clear(); }

boost::shared_ptr<ICIMElement> TCIMReference::GetCIMElement(bool classOnly) const { return Body().GetCIMElement(classOnly); }

bool TCIMReference::operator==(TCIMReference const& other) const { return Body() == other.Body(); }
bool TCIMReference::operator<(TCIMReference const& other) const { return Body() < other.Body(); }

void TCIMReference::BindBody() noexcept {
  if (fBody) fBody->SetOwner(*this);
}

}  // namespace NQRVZEP20
