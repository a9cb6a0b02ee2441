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
  auto const found = fLayout->fNumbers.find(name);
  if (found == fLayout->fNumbers.end()) return {};
  std::size_t const number = found->second;
  return boost::make_shared<TReceivedProperty>(ns, fLayout->fProperties[number], ns->PositionsOf(*this)[number]);
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
  std::vector<std::size_t> const& positions = ns->PositionsOf(*this);
  TByteReader reader = ns->ReaderAt(positions.back());
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

std::vector<std::size_t> TReceivedInstance::PositionsIn(TReceivedNamespace const& ns) const {
  std::vector<std::size_t> positions = {fAt};
  TByteReader reader = ns.ReaderAt(fAt);
  for (std::size_t left = fLayout->fProperties.size(); left > 0; --left) {
    SkipProperty(reader);
    positions.push_back(reader.At());
  }
  return positions;
}

}  // namespace NQRVZEP20
