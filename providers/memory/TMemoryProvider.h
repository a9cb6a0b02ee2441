// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "INamespaceProvider.h"

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TMemoryNamespace;

// A provider of one in-memory namespace, which a function fills on the first call of GetNamespace. A plug-in creates and
// registers the provider during static initialisation, when it is too early to collect the data:
//
//   boost::make_shared<TMemoryProvider>("Clock", "root/clock", FillNamespace)
class TMemoryProvider : public INamespaceProvider {
public:
  using TFill = boost::function<void(TMemoryNamespace&)>;

  TMemoryProvider(std::string const& name, std::string const& namespaceName, TFill fill);
  ~TMemoryProvider() override;

  std::string const& GetName(TCIMContext const& context) const override;

  // If the function throws, the exception passes through and the incomplete namespace is discarded; the next call fills a new
  // one.
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) override;

private:
  std::string fName;
  std::string fNamespaceName;
  TFill fFill;
  boost::shared_ptr<TMemoryNamespace> fNamespace;  // empty until it is filled
};

}  // namespace NQRVZEP20
