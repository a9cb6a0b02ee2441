// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"
#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// The data of a TCIMValue that is a reference: an object path.
class ZEP_EXPORT TCIMReferenceValueImpl : public TCIMValueImpl {
public:
  TCIMReferenceValueImpl(TCIMReference const& reference);
  TCIMReferenceValueImpl(TCIMReferenceValueImpl const& other);
  ~TCIMReferenceValueImpl() override;

  operator TCIMReference() const override;

  // The path, regardless of the radix.
  std::string ToString(unsigned char radix) const override;

  // Compare as TCIMReference does.
  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  TCIMReference const fReference;
};

}  // namespace NQRVZEP20
