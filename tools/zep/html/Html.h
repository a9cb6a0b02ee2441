// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// A text from a document as content of an HTML element or of an attribute in double quotes. Nothing in it is markup, controls the
// writing direction or is invalid UTF-8 (Printable in SafeText.h); a text of more than 2000 bytes is cut, and ends in "...".
std::string Html(std::string_view text);

// `<name>text</name>`, and the same with attributes. The text is made safe, the attributes are not.
std::string Element(std::string const& name, std::string_view text);
std::string Element(std::string const& name, std::string const& attributes, std::string_view text);

// A complete page: one file without scripts and without requests to other files, light or dark as the reader's system, which can
// be printed on A4. `title` is any text; `body` is HTML.
std::string HtmlPage(std::string const& title, std::string const& body);

}  // namespace NQRVZEP20::zep
