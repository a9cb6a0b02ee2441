// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/BoundedJson.h"

#include "collect/stored/StoredReport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::ordered_json;

// Makes the values as the library does, and counts them before. The library's parser with a callback, which could do that, too,
// searches an array for each of its elements. The names of the members are those of the library.
class TBoundedParser : public nlohmann::detail::json_sax_dom_parser<TJson> {
public:
  TBoundedParser(TJson& document, TJsonBounds const& bounds) : json_sax_dom_parser(document), fBounds(bounds) {}

  bool null() { return Count() && json_sax_dom_parser::null(); }
  bool boolean(bool value) { return Count() && json_sax_dom_parser::boolean(value); }
  bool number_integer(number_integer_t value) { return Count() && json_sax_dom_parser::number_integer(value); }
  bool number_unsigned(number_unsigned_t value) { return Count() && json_sax_dom_parser::number_unsigned(value); }
  bool number_float(number_float_t value, string_t const& text) {
    return Count() && json_sax_dom_parser::number_float(value, text);
  }
  bool string(string_t& value) { return Count() && json_sax_dom_parser::string(value); }
  bool start_object(std::size_t size) { return Open() && json_sax_dom_parser::start_object(size); }
  bool start_array(std::size_t size) { return Open() && json_sax_dom_parser::start_array(size); }
  bool end_object() { return Close() && json_sax_dom_parser::end_object(); }
  bool end_array() { return Close() && json_sax_dom_parser::end_array(); }
  bool key(string_t& name) { return CountMember() && json_sax_dom_parser::key(name); }

private:
  bool Count() {
    if (++fValues > fBounds.fMostValues)
      throw TStoredReportError("it has more than " + std::to_string(fBounds.fMostValues) + " values");
    return true;
  }

  bool Open() {
    if (fMembers.size() >= fBounds.fDeepest) throw TStoredReportError("the document is nested too deeply");
    fMembers.push_back(0);
    return Count();
  }

  bool Close() {
    fMembers.pop_back();
    return true;
  }

  bool CountMember() {
    if (++fMembers.back() > fBounds.fMostMembers)
      throw TStoredReportError("an object has more than " + std::to_string(fBounds.fMostMembers) + " members");
    fComparisons += fMembers.back() - 1;
    if (fComparisons > fBounds.fMostComparisons) throw TStoredReportError("too many of its objects have many members");
    return true;
  }

  TJsonBounds const fBounds;
  std::vector<std::size_t> fMembers;  // of each open object; 0 for an array
  std::size_t fValues = 0, fComparisons = 0;
};

}  // namespace

TJson BoundedJson(std::string_view text, TJsonBounds const& bounds) {
  TJson document;
  TBoundedParser parser(document, bounds);
  TJson::sax_parse(text, &parser);
  return document;
}

}  // namespace NQRVZEP20
