// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedInstance.h"

#include "CIMNames.h"
#include "collect/answer/NamespaceBytes.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TReceivedLayout.h"
#include "collect/answer/TReceivedNamespace.h"
#include "collect/answer/TReceivedProperty.h"
#include "collect/answer/ValueBytes.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

namespace {

void SkipProperty(TByteReader& reader) {
  if (IsMissingValue(reader))
    TRecordedFailure::ReadFrom(reader);
  else
    SkipValue(reader);
}

}  // namespace

boost::shared_ptr<ICIMClass> TReceivedInstance::GetClass(TCIMContext const&) const {
  boost::shared_ptr<TReceivedNamespace> const ns(fNamespace);
  if (fLayout->fClassFailure) fLayout->fClassFailure->Throw();
  return ns->ClassAt(fLayout->fClass);
}

boost::shared_ptr<ICIMProperty> TReceivedInstance::GetProperty(std::string const& name, TCIMContext const&) const {
  boost::shared_ptr<TReceivedNamespace> const ns(fNamespace);
  TByteReader reader = ns->ReaderAt(fAt);
  for (TReceivedPropertyName const& property : fLayout->fProperties) {
    if (IsSameName(property.fName, name)) return boost::make_shared<TReceivedProperty>(ns, property, reader.At());
    SkipProperty(reader);
  }
  return {};
}

void TReceivedInstance::EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                            TCIMContext const&) const {
  boost::shared_ptr<TReceivedNamespace> const ns(fNamespace);
  TByteReader reader = ns->ReaderAt(fAt);
  for (TReceivedPropertyName const& property : fLayout->fProperties) {
    if (!callback(boost::make_shared<TReceivedProperty>(ns, property, reader.At()))) return;
    SkipProperty(reader);
  }
}

TCIMReference TReceivedInstance::GetPath(TCIMContext const&) const {
  boost::shared_ptr<TReceivedNamespace> const ns(fNamespace);
  TByteReader reader = ns->ReaderAt(fAt);
  std::vector<std::size_t> positions;  // of the property values
  for (std::size_t n = 0; n < fLayout->fProperties.size(); ++n) {
    positions.push_back(reader.At());
    SkipProperty(reader);
  }

  unsigned int const kind = reader.Byte();
  if (kind == kPathFailed) TRecordedFailure::ReadFrom(reader).Throw();
  if (kind == kPathApart) return ReadReference(reader, *ns);
  TCIMReference path(ns, TCIMContext());
  path.SetClass(ns->ClassAt(fLayout->fClass));
  for (auto keys = reader.Number(); keys > 0; --keys) {
    auto const key = static_cast<std::size_t>(reader.Number());
    path.AddKeyValue(fLayout->fProperties[key].fName, ns->ValueAt(positions[key]));
  }
  return path;
}

}  // namespace NQRVZEP20
