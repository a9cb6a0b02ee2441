// SPDX-License-Identifier: Apache-2.0
#include "NetlinkMessages.h"

#include <libmnl/libmnl.h>

#include <cerrno>
#include <climits>

namespace NQRVZEP20 {

namespace {

// The messages of a dump. libmnl reads lengths in place, so the bytes must be aligned as those of a string are. It compares
// lengths as signed numbers: a message of 2 GiB or more would pass its check.
template <class TVisit>
void VisitHeaders(std::string const& dump, TVisit const& visit) {
  int rest = static_cast<int>(dump.size());
  auto const* message = reinterpret_cast<nlmsghdr const*>(dump.data());
  for (; mnl_nlmsg_ok(message, rest) && message->nlmsg_len <= INT_MAX; message = mnl_nlmsg_next(message, &rest)) visit(*message);
}

}  // namespace

std::string_view TextIn(std::string_view bytes) { return bytes.substr(0, bytes.find('\0')); }

TNetlinkAttributes::TNetlinkAttributes(std::string_view bytes) {
  VisitEach(bytes, [&](unsigned type, std::string_view payload) {
    if (type < fPayloads.size()) fPayloads[type] = payload;
  });
}

void TNetlinkAttributes::VisitEach(std::string_view list, std::function<void(unsigned, std::string_view)> const& visit) {
  char const* const end = list.data() + list.size();
  auto const restFrom = [&](nlattr const* attribute) { return static_cast<int>(end - reinterpret_cast<char const*>(attribute)); };
  auto const* attribute = reinterpret_cast<nlattr const*>(list.data());
  for (; mnl_attr_ok(attribute, restFrom(attribute)); attribute = mnl_attr_next(attribute))
    visit(mnl_attr_get_type(attribute),
          {static_cast<char const*>(mnl_attr_get_payload(attribute)), mnl_attr_get_payload_len(attribute)});
}

bool TNetlinkAttributes::Has(unsigned type) const { return type < fPayloads.size() && fPayloads[type].data() != nullptr; }

std::string_view TNetlinkAttributes::Bytes(unsigned type) const { return Has(type) ? fPayloads[type] : std::string_view(); }

TFinding<std::string> TNetlinkAttributes::Text(unsigned type) const {
  if (!Has(type)) return WhyAbsent();
  std::string_view const text = TextIn(Bytes(type));
  if (text.empty()) return TMissing{kMissingNotGiven, "the kernel reports an empty text"};
  return std::string(text);
}

void VisitPayloads(std::string const& dump, std::function<void(unsigned, std::string_view)> const& visit) {
  VisitHeaders(dump, [&](nlmsghdr const& message) {
    visit(message.nlmsg_type, {static_cast<char const*>(mnl_nlmsg_get_payload(&message)), mnl_nlmsg_get_payload_len(&message)});
  });
}

TFinding<int> ErrorIn(std::string const& dump) {
  TFinding<int> error = TMissing{kMissingNotGiven, "the kernel reports no error"};
  VisitPayloads(dump, [&](unsigned type, std::string_view payload) {
    int number = 0;
    if ((type != NLMSG_ERROR && type != NLMSG_DONE) || payload.size() < sizeof number) return;
    std::memcpy(&number, payload.data(), sizeof number);
    if (number < 0) error = number == INT32_MIN ? EIO : -number;
  });
  return error;
}

bool IsInterrupted(std::string const& dump) {
  bool isInterrupted = false;
  VisitHeaders(dump, [&](nlmsghdr const& message) { isInterrupted |= (message.nlmsg_flags & NLM_F_DUMP_INTR) != 0; });
  return isInterrupted;
}

}  // namespace NQRVZEP20
