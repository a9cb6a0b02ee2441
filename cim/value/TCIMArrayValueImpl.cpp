#include "TCIMArrayValueImpl.h"

#include "TZEPException.h"

namespace NQRVZEP20 {

TCIMArrayValueImpl::TCIMArrayValueImpl(std::vector<TCIMValue> const& elements) : fElements(elements) {}
TCIMArrayValueImpl::TCIMArrayValueImpl(TCIMArrayValueImpl const& other) = default;
TCIMArrayValueImpl::~TCIMArrayValueImpl() = default;

TCIMArrayValueImpl::operator std::vector<TCIMValue>&() const { return fElements; }

std::string TCIMArrayValueImpl::ToString(unsigned char radix) const {
  std::string text = "{ ";
  char const* separator = "";
  for (TCIMValue const& element : fElements) {
    text += separator;
    text += element.ToString(radix);
    separator = ", ";
  }
  text += " }";
  return text;
}

bool TCIMArrayValueImpl::operator==(TCIMValue const& other) const {
  if (!other.IsArray()) return false;
  return fElements == DataOf<TCIMArrayValueImpl>(other).fElements;
}

bool TCIMArrayValueImpl::operator<(TCIMValue const&) const { throw TZEPException(kZEPStatusNotImplemented); }

}  // namespace NQRVZEP20
