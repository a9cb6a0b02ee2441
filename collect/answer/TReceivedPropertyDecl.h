// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMPropertyDecl.h"
#include "collect/answer/TReceivedElement.h"
#include "collect/answer/TRecordedFailure.h"

#include <optional>

namespace NQRVZEP20 {

// A property declaration of a received namespace, or of a class outside it.
class TReceivedPropertyDecl : public TReceivedElement<ICIMPropertyDecl> {
public:
  static constexpr std::size_t kNoDefault = static_cast<std::size_t>(-1);

  struct TFacts {
    TCIMValue::TCIMType fType = TCIMValue::TCIMType::kCIMTypeInvalid;
    std::size_t fDefaultAt = 0;  // the position of the default value in the bytes, or kNoDefault
    bool fIsKey = false;
    std::optional<TRecordedFailure> fKeyFailure;  // if set, IsKey throws it
    boost::weak_ptr<ICIMNamedElement> fOwner;     // empty if the provider reported none
  };

  TReceivedPropertyDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TFacts facts);

  TCIMValue::TCIMType GetType(TCIMContext const& context) const override;
  TCIMValue GetDefaultValue(TCIMContext const& context) const override;
  bool IsKey(TCIMContext const& context) const override;
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override;

private:
  TFacts const fFacts;
};

}  // namespace NQRVZEP20
