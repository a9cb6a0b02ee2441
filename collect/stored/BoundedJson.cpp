// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/BoundedJson.h"

#include "collect/stored/StoredReport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::ordered_json;

// Fills a tree with the values that the library's parser finds. The names of the members are those of the library.
class TTreeFiller {
public:
  explicit TTreeFiller(TJsonTree& tree) : fTree(tree) {}

  bool null() { return Add(EKind::kNull, "null"); }
  bool boolean(bool value) { return Add(EKind::kBoolean, value ? "true" : "false"); }
  bool number_integer(TJson::number_integer_t value) { return Add(EKind::kInteger, std::to_string(value)); }
  bool number_unsigned(TJson::number_unsigned_t value) { return Add(EKind::kInteger, std::to_string(value)); }
  bool number_float(TJson::number_float_t, std::string const& text) { return Add(EKind::kFloat, text); }
  bool string(std::string const& value) { return Add(EKind::kString, value); }
  bool binary(TJson::binary_t const&) { return false; }  // JSON has none
  bool start_object(std::size_t) { return Open(EKind::kObject); }
  bool start_array(std::size_t) { return Open(EKind::kArray); }
  bool end_object() { return Close(); }
  bool end_array() { return Close(); }
  bool key(std::string const& name) {
    fTree.SetNameOfNext(name);
    return true;
  }
  template <class TFailure>
  bool parse_error(std::size_t, std::string const&, TFailure const& failure) {
    throw failure;
  }

private:
  using EKind = TJsonTree::EKind;

  bool Add(EKind kind, std::string_view text) {
    fTree.Add(kind, text);
    return true;
  }
  bool Open(EKind kind) {
    fTree.Open(kind);
    return true;
  }
  bool Close() {
    fTree.Close();
    return true;
  }

  TJsonTree& fTree;
};

// Counts the values before `TBase` makes them. The library's parser with a callback, which could do that, too, searches an array
// for each of its elements.
template <class TBase>
class TBounded : public TBase {
public:
  template <class TResult>
  TBounded(TResult& result, TJsonBounds const& bounds) : TBase(result), fBounds(bounds) {}

  bool null() { return Count() && TBase::null(); }
  bool boolean(bool value) { return Count() && TBase::boolean(value); }
  bool number_integer(TJson::number_integer_t value) { return Count() && TBase::number_integer(value); }
  bool number_unsigned(TJson::number_unsigned_t value) { return Count() && TBase::number_unsigned(value); }
  bool number_float(TJson::number_float_t value, std::string const& text) { return Count() && TBase::number_float(value, text); }
  bool string(std::string& value) { return Count() && TBase::string(value); }
  bool start_object(std::size_t size) { return CountOpened() && TBase::start_object(size); }
  bool start_array(std::size_t size) { return CountOpened() && TBase::start_array(size); }
  bool end_object() { return CountClosed() && TBase::end_object(); }
  bool end_array() { return CountClosed() && TBase::end_array(); }
  bool key(std::string& name) { return CountMember() && TBase::key(name); }

private:
  bool Count() {
    if (++fValues > fBounds.fMostValues)
      throw TStoredReportError("it has more than " + std::to_string(fBounds.fMostValues) + " values");
    return true;
  }

  bool CountOpened() {
    if (fMembers.size() >= fBounds.fDeepest) throw TStoredReportError("the document is nested too deeply");
    fMembers.push_back(0);
    return Count();
  }

  bool CountClosed() {
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
  TBounded<nlohmann::detail::json_sax_dom_parser<TJson>> parser(document, bounds);
  TJson::sax_parse(text, &parser);
  return document;
}

TJsonTree BoundedTree(std::string_view text, TJsonBounds const& bounds) {
  TJsonTree tree;
  tree.Reserve(text.size());
  TBounded<TTreeFiller> parser(tree, bounds);
  TJson::sax_parse(text, &parser);
  return tree;
}

}  // namespace NQRVZEP20
