// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/html/Html.h"

#include "collect/SafeText.h"
#include "tools/zep/html/Style.h"

namespace NQRVZEP20::zep {

std::string Html(std::string_view text) {
  constexpr std::size_t longest = 2000;
  std::string html;
  for (char const c : Printable(Shortened(text, longest))) switch (c) {
      case '&':
        html += "&amp;";
        break;
      case '<':
        html += "&lt;";
        break;
      case '>':
        html += "&gt;";
        break;
      case '"':
        html += "&quot;";
        break;
      default:
        html += c;
    }
  return html;
}

std::string Element(std::string const& name, std::string_view text) { return Element(name, "", text); }

std::string Element(std::string const& name, std::string const& attributes, std::string_view text) {
  return "<" + name + (attributes.empty() ? "" : " " + attributes) + ">" + Html(text) + "</" + name + ">";
}

// The policy allows the browser no request at all, whatever the page contains.
std::string HtmlPage(std::string const& title, std::string const& body) {
  return "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
         "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; style-src 'unsafe-inline'\">\n"
         "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
         "<meta name=\"color-scheme\" content=\"light dark\">\n" +
         Element("title", title) + "\n<style>\n" + kStyle + "</style>\n</head>\n<body>\n" + body + "</body>\n</html>\n";
}

}  // namespace NQRVZEP20::zep
