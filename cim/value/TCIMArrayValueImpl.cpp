// SPDX-License-Identifier: Apache-2.0
#include "TCIMArrayValueImpl.h"

#include "TCIMNumericValueImpl.h"
#include "TZEPException.h"
#include "cim/value/IntegerText.h"

#include <string_view>

namespace NQRVZEP20 {
namespace {

bool IsNumber(TCIMValue const& value) {
  TCIMValue::TCIMType const type = value.GetType();
  return type >= TCIMValue::TCIMType::kCIMTypeBoolean && type <= TCIMValue::TCIMType::kCIMTypeReal64;
}

}  // namespace

TCIMArrayValueImpl::TCIMArrayValueImpl(std::vector<TCIMValue> const& elements) : fElements(elements) {}
TCIMArrayValueImpl::TCIMArrayValueImpl(TCIMArrayValueImpl const& other) = default;
TCIMArrayValueImpl::~TCIMArrayValueImpl() = default;

TCIMArrayValueImpl::operator std::vector<TCIMValue>&() const { return fElements; }

// Numbers, the elements of most arrays, are written directly into the result, without a string of their own.
std::string TCIMArrayValueImpl::ToString(unsigned char radix) const {
  std::string text = "{ ";
  std::size_t length = text.size();
  auto const makeRoom = [&](std::size_t room) {
    if (text.size() - length < room) text.resize(2 * (length + room));
    return text.data() + length;
  };
  auto const put = [&](std::string_view piece) { length += piece.copy(makeRoom(piece.size()), piece.size()); };

  for (TCIMValue const& element : fElements) {
    if (&element != &fElements.front()) put(", ");
    if (IsNumber(element)) {
      char* const place = makeRoom(kRoomForInteger);
      length += static_cast<std::size_t>(DataOf<TCIMNumericValueImpl>(element).PutText(place, radix) - place);
    } else {
      put(element.ToString(radix));
    }
  }
  put(" }");
  text.resize(length);
  return text;
}

bool TCIMArrayValueImpl::operator==(TCIMValue const& other) const {
  if (!other.IsArray()) return false;
  return fElements == DataOf<TCIMArrayValueImpl>(other).fElements;
}

bool TCIMArrayValueImpl::operator<(TCIMValue const&) const { throw TZEPException(kZEPStatusNotImplemented); }

}  // namespace NQRVZEP20
