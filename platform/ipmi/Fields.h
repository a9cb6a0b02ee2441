// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <freeipmi/freeipmi.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <vector>

namespace ipmi {

using TByteVector = std::vector<unsigned char>;

// Throws std::bad_alloc or TFailure{kIpmiClientFail} when a function of libfreeipmi returned -1; passes on other results.
int Checked(int result);

// The values of one part of a packet, by name: an object of libfreeipmi. The forms, and the names in them, are in its folder
// templates/. Only its own functions read and write packets.
class TFields {
public:
  // Empty fields of that form. Throws std::bad_alloc.
  explicit TFields(fiid_field_t* form);

  // Fields with these bytes. Bytes after the end of the form are ignored.
  TFields(fiid_field_t* form, TByteVector const& bytes);

  // Nothing when the fields end before this one.
  std::optional<std::uint64_t> Find(char const* name) const;

  // Each throws TFailure{kIpmiClientFail} when the value is missing.
  std::uint64_t Get(char const* name) const;
  TByteVector Data(char const* name) const;
  TByteVector Bytes() const;  // all

  fiid_obj_t Object() const { return fObject.get(); }

private:
  struct TDestroyer {
    void operator()(fiid_obj_t object) const noexcept { ::fiid_obj_destroy(object); }
  };

  std::unique_ptr<fiid_obj, TDestroyer> fObject;
};

}  // namespace ipmi
