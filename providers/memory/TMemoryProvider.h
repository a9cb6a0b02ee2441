// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "INamespaceProvider.h"

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TMemoryNamespace;

// A provider of one namespace in memory, which a function fills at the first call of GetNamespace. A plug-in creates and
// registers the provider in its start-up code, where collecting the data would be too early:
//
//   boost::make_shared<TMemoryProvider>("Clock", "root/clock", FillNamespace)
class TMemoryProvider : public INamespaceProvider {
public:
  using TFill = boost::function<void(TMemoryNamespace&)>;

  TMemoryProvider(std::string const& name, std::string const& namespaceName, TFill fill);
  ~TMemoryProvider() override;

  std::string const& GetName(TCIMContext const& context) const override;

  // An exception of the function passes on, and the incomplete namespace is dropped: the next call fills a new one.
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) override;

private:
  std::string fName;
  std::string fNamespaceName;
  TFill fFill;
  boost::shared_ptr<TMemoryNamespace> fNamespace;  // empty until it is filled
};

}  // namespace NQRVZEP20
