// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMInstance.h"

#include <boost/weak_ptr.hpp>

#include <cstddef>
#include <vector>

namespace NQRVZEP20 {

class TReceivedNamespace;
struct TReceivedLayout;

// An instance of a received namespace. It stores only a position in the serialised bytes: property values are decoded when they
// are read.
class TReceivedInstance : public ICIMInstance {
public:
  // `layout` belongs to the namespace.
  TReceivedInstance(boost::weak_ptr<TReceivedNamespace> ns, TReceivedLayout const& layout, std::size_t at)
      : fNamespace(ns), fLayout(&layout), fAt(at) {}

  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override;
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                           TCIMContext const& context) const override;
  TCIMReference GetPath(TCIMContext const& context) const override;

  TReceivedLayout const& Layout() const { return *fLayout; }  // valid as long as the namespace exists
  std::size_t At() const { return fAt; }

  // The position of each value, and of the path after them.
  std::vector<std::size_t> PositionsIn(TReceivedNamespace const& ns) const;

private:
  boost::weak_ptr<TReceivedNamespace> const fNamespace;
  TReceivedLayout const* const fLayout;
  std::size_t const fAt;  // the position of the first property value
};

}  // namespace NQRVZEP20
