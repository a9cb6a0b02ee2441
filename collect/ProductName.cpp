// SPDX-License-Identifier: Apache-2.0
#include "collect/ProductName.h"

namespace NQRVZEP20 {

namespace {

// npos when there are no brackets.
std::size_t StartOfBrackets(std::string const& productName) {
  std::size_t const opening = productName.find("-[");
  return productName.find(']', opening) == std::string::npos ? std::string::npos : opening;
}

}  // namespace

bool HasBrackets(std::string const& productName) { return StartOfBrackets(productName) != std::string::npos; }

std::string WithoutBrackets(std::string const& productName) {
  std::string const name = productName.substr(0, StartOfBrackets(productName));
  std::size_t const last = name.find_last_not_of(' ');
  return last == std::string::npos ? productName : name.substr(0, last + 1);
}

}  // namespace NQRVZEP20
