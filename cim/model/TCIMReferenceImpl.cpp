// SPDX-License-Identifier: Apache-2.0
#include "TCIMReferenceImpl.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMNamespace.h"
#include "ICIMPropertyDecl.h"
#include "TZEPException.h"
#include "core/Failure.h"

#include <algorithm>
#include <sstream>
#include <string_view>

namespace NQRVZEP20 {
namespace {

constexpr std::size_t kNowhere = std::string::npos;
constexpr int kMaxDepth = 100;  // nesting of references in keys; limited because paths are foreign input

[[noreturn]] void ThrowInvalidReference(std::string_view reason, std::string const& path) {
  LogErrorAndThrow(kZEPStatusInvalidReference, "", std::string(reason) + path);
}

// The "." between class and keys. Only a "." after a ":" counts, so a path without a namespace prefix has no keys. Kept.
std::size_t FindEndOfClass(std::string const& path, std::size_t pos) {
  std::size_t const colon = path.find(':', pos);
  return colon == kNowhere ? kNowhere : path.find('.', colon);
}

bool IsEndOfKeys(std::string const& path, std::size_t pos, bool isNested) {
  return pos >= path.size() || (isNested && path[pos] == '"');
}

// Reads a quoted text and moves `pos` from its opening to its closing quote. A backslash escapes a quote or a backslash;
// before any other character it is kept.
std::string ReadQuotedText(std::string const& path, std::size_t& pos) {
  std::string text;
  for (++pos; pos < path.size(); ++pos) {
    std::size_t const start = pos;
    while (pos < path.size() && path[pos] != '"' && path[pos] != '\\') ++pos;
    text.append(path, start, pos - start);
    if (pos < path.size() && path[pos] == '"') return text;
    if (++pos >= path.size()) break;
    if (path[pos] != '"' && path[pos] != '\\') text += '\\';
    text += path[pos];
  }
  ThrowInvalidReference("Reference missing closing '\"', path=", path);
}

TCIMValue ReadValue(boost::shared_ptr<ICIMNamespace> const& ns, ICIMPropertyDecl const& declaration, std::string const& path,
                    std::size_t& pos) {
  std::string text = ReadQuotedText(path, pos);
  return TCIMValue(declaration.GetType(TCIMContext()), text, ns);
}

void AppendEscaped(std::string& path, std::string_view text) {
  for (char const c : text) {
    if (c == '"' || c == '\\') path += '\\';
    path += c;
  }
}

// A plug-in may report an unknown property by throwing kZEPStatusNotFound or by returning an empty pointer. Both throw
// kZEPStatusNotFound here.
boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(ICIMClass const& cls, std::string const& name) {
  auto declaration = cls.GetPropertyDecl(name, TCIMContext());
  if (!declaration) throw TZEPException(kZEPStatusNotFound);
  return declaration;
}

// The result of < for two vectors, but each name is compared only once.
template <class TKeyBindings>
bool AreKeysLess(TKeyBindings const& a, TKeyBindings const& b) {
  auto mine = a.begin();
  auto theirs = b.begin();
  for (; mine != a.end() && theirs != b.end(); ++mine, ++theirs) {
    int const order = mine->first.compare(theirs->first);
    if (order != 0) return order < 0;
    if (mine->second < theirs->second) return true;
    if (theirs->second < mine->second) return false;
  }
  return mine == a.end() && theirs != b.end();
}

std::string TypeMismatchText(TCIMValue::TCIMType declared, TCIMValue::TCIMType given) {
  std::ostringstream text;
  text << "Declaration type: " << declared << " Value type: " << given;
  return text.str();
}

}  // namespace

TCIMReferenceImpl::TCIMReferenceImpl(TCIMReference& owner, boost::shared_ptr<ICIMNamespace> ns, TCIMContext context)
    : fOwner(owner), fNamespace(ns), fContext(std::move(context)) {}

TCIMReferenceImpl::TCIMReferenceImpl(TCIMReference& owner, TCIMReferenceImpl const& other)
    : fClass(other.fClass),
      fKeys(other.fKeys),
      fOwner(owner),
      fNamespace(other.fNamespace),
      fContext(other.fContext),
      fElement(other.fElement),
      fNamespaceName(other.fNamespaceName) {}

TCIMReferenceImpl::~TCIMReferenceImpl() = default;

// ---- Printing ----

std::string TCIMReferenceImpl::GetPath() const {
  std::string path = GetClassName();
  if (fKeys.empty()) return path;
  path += '.';
  for (auto const& [name, value] : fKeys) {
    path += name;
    path += "=\"";
    if (value.IsReference())
      path += value.ToString(10);  // raw: quotes are not escaped. Kept.
    else
      AppendEscaped(path, value.ToString(10));
    path += "\",";
  }
  path.pop_back();
  return path;
}

// ---- Parsing ----

void TCIMReferenceImpl::SetPath(std::string const& path) {
  if (fNamespace.expired() || fClass || !fKeys.empty()) throw TZEPException(kZEPStatusInvalidOpSequence);
  std::size_t pos = 0;
  ParsePath(*this, path, pos);
}

void TCIMReferenceImpl::ParsePath(TCIMReferenceImpl& target, std::string const& path, std::size_t& pos) {
  boost::shared_ptr<ICIMNamespace> const ns(target.fNamespace);  // keeps the namespace alive until the path is read
  bool const isNested = pos != 0;
  if (isNested) ++pos;  // the opening quote

  std::size_t const end = std::min(FindEndOfClass(path, pos), path.size());
  target.ReadClass(*ns, path, pos, end);
  pos = end;
  while (!IsEndOfKeys(path, pos, isNested)) pos = target.ReadKeyBinding(ns, path, pos);
}

void TCIMReferenceImpl::ReadClass(ICIMNamespace const& ns, std::string const& path, std::size_t begin, std::size_t end) {
  std::size_t const colon = path.find(':', begin);
  if (colon < end) begin = colon + 1;
  try {
    LookUpClass(ns, path.substr(begin, end - begin));
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    ThrowInvalidReference("Reference specifies invalid class, path=", path);
  }
}

// Reads `,name="value"` and returns the position after it.
std::size_t TCIMReferenceImpl::ReadKeyBinding(boost::shared_ptr<ICIMNamespace> const& ns, std::string const& path,
                                              std::size_t pos) {
  if (path[pos] != ',' && path[pos] != '.') ThrowInvalidReference("Reference missing '.' or ',', path=", path);
  std::size_t const equals = path.find('=', pos);
  if (equals == kNowhere) ThrowInvalidReference("Reference missing property value, path=", path);
  std::string name = path.substr(pos + 1, equals - pos - 1);
  auto const declaration = ReadDeclaration(path, name);
  pos = equals + 1;
  if (pos == path.size() || path[pos] != '"') ThrowInvalidReference("Reference missing opening '\"', path=", path);

  bool const isReference = declaration->GetDefaultValue(TCIMContext()).IsReference();
  TCIMValue value = isReference ? ReadReference(ns, path, pos) : ReadValue(ns, *declaration, path, pos);
  AddKey(std::move(name), std::move(value));
  return std::min(pos + 1, path.size());
}

boost::shared_ptr<ICIMPropertyDecl const> TCIMReferenceImpl::ReadDeclaration(std::string const& path,
                                                                             std::string const& name) const {
  try {
    return GetDeclaration(*fClass, name);
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    ThrowInvalidReference("Reference specifies invalid property, property=" + name + ", path=", path);
  }
}

// Reads a path between quotes and moves `pos` from the opening to the closing quote. Quotes inside the path are not escaped.
TCIMValue TCIMReferenceImpl::ReadReference(boost::shared_ptr<ICIMNamespace> const& ns, std::string const& path,
                                           std::size_t& pos) const {
  if (fDepth == kMaxDepth) ThrowInvalidReference("Reference nested too deeply, path=", path);
  TCIMReference reference(ns, fContext);
  reference.GetBody()->fDepth = fDepth + 1;
  ParsePath(*reference.GetBody(), path, pos);
  return TCIMValue(reference);
}

// ---- Parts ----

void TCIMReferenceImpl::SetClass(boost::shared_ptr<ICIMClass> cls) {
  if (!fKeys.empty()) throw TZEPException(kZEPStatusInvalidOpSequence);
  fClass = std::move(cls);
}

std::string TCIMReferenceImpl::GetClassName() const { return fClass->GetName(TCIMContext()); }

void TCIMReferenceImpl::SetClassName(std::string const& name) {
  boost::shared_ptr<ICIMNamespace> const ns(fNamespace);  // throws boost::bad_weak_ptr when it was destroyed
  LookUpClass(*ns, name);
}

// A plug-in may report an unknown class, too, by throwing kZEPStatusNotFound or by returning an empty pointer. Both throw
// kZEPStatusNotFound here.
void TCIMReferenceImpl::LookUpClass(ICIMNamespace const& ns, std::string const& name) {
  boost::shared_ptr<ICIMClass> cls = ns.GetClass(name, fContext);
  if (!cls) throw TZEPException(kZEPStatusNotFound);
  SetClass(std::move(cls));
}

void TCIMReferenceImpl::AddKeyValue(std::string const& name, TCIMValue const& value) {
  if (!fClass) throw TZEPException(kZEPStatusInvalidOpSequence);
  TCIMValue::TCIMType const declared = GetDeclaration(*fClass, name)->GetType(TCIMContext());
  if (declared != value.GetType())
    LogErrorAndThrow(kZEPStatusTypeMismatch, "Core: ", TypeMismatchText(declared, value.GetType()));
  AddKey(std::string(name), TCIMValue(value));
}

void TCIMReferenceImpl::AddKey(std::string&& name, TCIMValue&& value) {
  if (fKeys.empty()) fKeys.reserve(4);  // more than most classes have
  auto const place =
      std::lower_bound(fKeys.begin(), fKeys.end(), name, [](auto const& key, auto const& wanted) { return key.first < wanted; });
  if (place != fKeys.end() && place->first == name) return;  // the first binding of a name stays. Kept.
  fKeys.emplace(place, std::move(name), std::move(value));
}

void TCIMReferenceImpl::EnumerateKeyBindings(boost::function<bool(std::pair<std::string, TCIMValue>)> callback) const {
  for (std::size_t i = 0; i < fKeys.size(); ++i)  // NOLINT(modernize-loop-convert): the callback may add keys
    if (!callback(fKeys[i])) return;
}

void TCIMReferenceImpl::Clear() {
  fNamespace.reset();
  fClass.reset();
  fKeys.clear();
  fElement.reset();
}

// ---- Resolving ----

boost::shared_ptr<ICIMElement> TCIMReferenceImpl::GetCIMElement(bool classOnly) {
  if (classOnly || fKeys.empty()) return fClass;
  if (!fElement) fElement = fClass->GetNamespace(TCIMContext())->GetInstance(fOwner, TCIMContext());
  if (!fElement) throw TZEPException(kZEPStatusNotFound);
  return fElement;
}

// ---- Comparison ----

bool TCIMReferenceImpl::operator==(TCIMReferenceImpl const& other) const {
  return fClass == other.fClass && fKeys == other.fKeys;
}

bool TCIMReferenceImpl::operator<(TCIMReferenceImpl const& other) const {
  if (fClass == other.fClass) return AreKeysLess(fKeys, other.fKeys);
  return fClass.owner_before(other.fClass);
}

}  // namespace NQRVZEP20
