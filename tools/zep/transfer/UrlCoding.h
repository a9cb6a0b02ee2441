// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Letters, digits, "-", ".", "_" and "~".
bool IsUnreserved(char c);

// Every character but the unreserved ones of a URL and those of `others` as "%2F".
std::string Encoded(std::string_view text, std::string_view others);

// The same, but "%2F" in the text stays as it is.
std::string EncodedPath(std::string_view text);

std::string Decoded(std::string_view text);

}  // namespace NQRVZEP20::zep
