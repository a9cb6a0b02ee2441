// SPDX-License-Identifier: Apache-2.0
#include "platform/ipmi/Fields.h"

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"

#include <errno.h>

#include <algorithm>
#include <new>

namespace ipmi {

int Checked(int result) {
  if (result >= 0) return result;
  if (errno == ENOMEM) throw std::bad_alloc();
  throw TFailure{kIpmiClientFail};
}

TFields::TFields(fiid_field_t* form) : fObject(::fiid_obj_create(form)) {
  if (!fObject) throw std::bad_alloc();
}

TFields::TFields(fiid_field_t* form, TByteVector const& bytes) : TFields(form) {
  auto const longest = static_cast<std::size_t>(Checked(::fiid_template_len_bytes(form)));
  Checked(::fiid_obj_set_all(Object(), bytes.data(), static_cast<unsigned>(std::min(bytes.size(), longest))));
}

std::optional<std::uint64_t> TFields::Find(char const* name) const {
  std::uint64_t value = 0;
  return ::fiid_obj_get(Object(), name, &value) == 1 ? std::optional(value) : std::nullopt;
}

std::uint64_t TFields::Get(char const* name) const {
  std::optional<std::uint64_t> const value = Find(name);
  if (!value) throw TFailure{kIpmiClientFail};
  return *value;
}

TByteVector TFields::Data(char const* name) const {
  TByteVector data(static_cast<std::size_t>(Checked(::fiid_obj_field_len_bytes(Object(), name))));
  if (!data.empty()) Checked(::fiid_obj_get_data(Object(), name, data.data(), static_cast<unsigned>(data.size())));
  return data;
}

TByteVector TFields::Bytes() const {
  TByteVector bytes(static_cast<std::size_t>(Checked(::fiid_obj_len_bytes(Object()))));
  if (!bytes.empty()) Checked(::fiid_obj_get_all(Object(), bytes.data(), static_cast<unsigned>(bytes.size())));
  return bytes;
}

}  // namespace ipmi
