// SPDX-License-Identifier: Apache-2.0
#include "TReasonReader.h"

#include "CIMNames.h"
#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMNamespace.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "MissingValueClass.h"
#include "TCIMReference.h"
#include "TZEPException.h"

namespace NQRVZEP20 {

namespace {

// Empty when the namespace does not have the class.
boost::shared_ptr<ICIMClass> FindMissingValueClass(ICIMNamespace const& ns) {
  try {
    return ns.GetClass(kMissingValueClass, TCIMContext());
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    return {};
  }
}

// The text of a property; empty when the property is missing or NULL.
std::string TextOf(ICIMInstance const& instance, char const* name) {
  auto const property = instance.GetProperty(name, TCIMContext());
  if (!property) return "";
  TCIMValue const value = property->GetValue(TCIMContext());
  return value.IsNull() ? "" : value.ToString();
}

template <class TMap>
std::optional<TMissing> Found(TMap const& reasons, typename TMap::key_type const& key) {
  auto const found = reasons.find(key);
  if (found == reasons.end()) return std::nullopt;
  return found->second;
}

}  // namespace

TReasonReader::TReasonReader(ICIMNamespace const& ns) {
  auto const missingValues = FindMissingValueClass(ns);
  if (!missingValues) return;
  missingValues->EnumerateInstances(
      [this](boost::shared_ptr<ICIMInstance> missing) {
        Store(TextOf(*missing, kElementPath), TextOf(*missing, kElementProperty),
              {TextOf(*missing, kMissingCode), TextOf(*missing, kMissingReason)});
        return true;
      },
      TCIMContext());
}

void TReasonReader::Store(std::string const& path, std::string const& property, TMissing const& why) {
  if (property.empty())
    fOfClasses[FoldName(path)] = why;
  else
    fOfProperties[{path, FoldName(property)}] = why;
}

std::optional<TMissing> TReasonReader::WhyMissing(ICIMInstance const& instance, std::string const& property) const {
  return Found(fOfProperties, {instance.GetPath(TCIMContext()).GetPath(), FoldName(property)});
}

std::optional<TMissing> TReasonReader::WhyNoInstance(std::string const& className) const {
  return Found(fOfClasses, FoldName(className));
}

std::optional<std::string> TReasonReader::SourceOf(ICIMPropertyDecl const& property) {
  auto const qualifier = property.GetQualifier(kValueSource, TCIMContext());
  if (!qualifier) return std::nullopt;
  TCIMValue const source = qualifier->GetValue(TCIMContext());
  if (source.IsNull()) return std::nullopt;
  return source.ToString();
}

}  // namespace NQRVZEP20
