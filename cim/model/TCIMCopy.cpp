// SPDX-License-Identifier: Apache-2.0
#include "TCIMCopy.h"

#include "Answers.h"
#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"

#include <vector>

boost::recursive_mutex copyInstMutex;

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;

constexpr bool kPlainClasses = false, kAssociations = true;

// The class of that name. A namespace may answer an unknown name with an empty pointer, too.
boost::shared_ptr<ICIMClass> ClassIn(ICIMNamespace const& dst, std::string const& name) {
  return Required(dst.GetClass(name, TCIMContext()), "class", name);
}

boost::shared_ptr<ICIMClass> SuperClassIn(ICIMNamespace const& dst, ICIMClass const& cls) {
  if (cls.IsRootClass(TCIMContext())) return boost::shared_ptr<ICIMClass>();
  return ClassIn(dst, cls.GetSuperClass(TCIMContext())->GetName(TCIMContext()));
}

void EndDeclarationsQuietly(ICIMClass& cls) noexcept {
  try {
    cls.EndDeclarations(TCIMContext());
  } catch (...) {  // another exception is on its way
  }
}

// Calls BeginDeclarations and EndDeclarations on the class; the latter also when an exception ends the copy.
void CopyPropertyDecls(ICIMClass const& cls, boost::shared_ptr<ICIMClass> copy, boost::shared_ptr<ICIMNamespace> dst) {
  copy->BeginDeclarations(TCIMContext());
  try {
    cls.EnumeratePropertyDecls(TCopyPropertyDecl(dst, copy), TCIMContext());
  } catch (...) {
    EndDeclarationsQuietly(*copy);
    throw;
  }
  copy->EndDeclarations(TCIMContext());
}

// The class of the same name; empty when the value refers to none.
boost::shared_ptr<ICIMClass> ReferencedClassIn(boost::shared_ptr<ICIMNamespace> dst, TCIMValue const& reference) {
  boost::shared_ptr<ICIMClass> const source = reference.GetReferencedClass();
  return source ? ClassIn(*dst, source->GetName(TCIMContext())) : source;
}

TCIMValue CopyReference(TCIMValue const& v, boost::shared_ptr<ICIMNamespace> dst) {
  TCIMValue copy(TType::kCIMTypeReference, 0);
  copy.SetReferencedClass(ReferencedClassIn(dst, v));
  if (v.IsNull()) return copy;

  TCIMReference const source = v;
  TCIMReference path(dst, TCIMContext());
  path.SetClass(copy.GetReferencedClass());
  source.EnumerateKeyBindings(TCopyReferenceKeys(dst, path));
  copy.Set(path);
  return copy;
}

TCIMValue CopyReferences(TCIMValue const& v, boost::shared_ptr<ICIMNamespace> dst) {
  std::vector<TCIMValue> copies;
  for (TCIMValue const& element : v.operator std::vector<TCIMValue>&()) copies.push_back(TCIMCopy::CopyValue(element, dst));
  return TCIMValue(TType::kCIMTypeReference, v.GetMaxArraySize(), copies);
}

bool IsArrayOfReferences(TCIMValue const& v) {
  return v.GetType() == (TType::kCIMTypeReference | TType::kCIMTypeArrayFlag) && !v.IsNull();
}

}  // namespace

void TCIMCopy::CopyClasses(boost::shared_ptr<ICIMNamespace> src, boost::shared_ptr<ICIMNamespace> dst, bool noProductInstances) {
  src->EnumerateQualifierDecls(TCopyQualifierDecls(dst), TCIMContext());
  src->EnumerateClasses(TCopyClassTree(dst, kPlainClasses, noProductInstances), TCIMContext());
  src->EnumerateClasses(TCopyClassTree(dst, kAssociations, noProductInstances), TCIMContext());
}

void TCIMCopy::CopyClass(boost::shared_ptr<ICIMClass> cls, boost::shared_ptr<ICIMNamespace> dst) {
  boost::shared_ptr<ICIMClass> const superClass = SuperClassIn(*dst, *cls);
  std::string const name = cls->GetName(TCIMContext());
  boost::shared_ptr<ICIMClass> const copy = Required(dst->CreateClass(superClass, name, TCIMContext()), "class", name);
  cls->EnumerateQualifiers(TCopyQualifier(dst, copy), TCIMContext());
  CopyPropertyDecls(*cls, copy, dst);
  cls->EnumerateStaticProperties(TCopyStaticProperty(dst, copy), TCIMContext());
  cls->EnumerateMethodDecls(TCopyMethodDecl(dst, copy), TCIMContext());
}

void TCIMCopy::CopyInstance(boost::shared_ptr<ICIMInstance> inst, boost::shared_ptr<ICIMNamespace> dst) {
  boost::recursive_mutex::scoped_lock const lock(copyInstMutex);
  std::string const className = inst->GetClass(TCIMContext())->GetName(TCIMContext());
  boost::shared_ptr<ICIMClass> const cls = ClassIn(*dst, className);
  boost::shared_ptr<ICIMInstance> const copy = Required(cls->CreateInstance(TCIMContext()), "instance of", className);
  inst->EnumerateProperties(TCopyInstanceProperty(dst, copy), TCIMContext());
  cls->CommitInstance(copy, TCIMContext());
}

TCIMValue TCIMCopy::CopyValue(TCIMValue const& v, boost::shared_ptr<ICIMNamespace> dst) {
  if (v.IsReference()) return CopyReference(v, dst);
  return IsArrayOfReferences(v) ? CopyReferences(v, dst) : v;
}

}  // namespace NQRVZEP20
