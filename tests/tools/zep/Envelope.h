// SPDX-License-Identifier: Apache-2.0
#pragma once

// The members that every JSON document of zep has.

#include "tests/tools/zep/Documents.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <string>

namespace NQRVZEP20::zep {

// Expects a document of that name that contains the exit status and, unless the status is 0, a reason.
inline void ExpectEnvelope(nlohmann::json const& document, int status, std::string const& name) {
  SCOPED_TRACE(document.dump());
  KeepDocument(document);
  ASSERT_TRUE(document.is_object());
  for (char const* member : {"document", "version", "zep", "sample", "exitStatus", "reason"})
    ASSERT_TRUE(document.contains(member)) << member;
  EXPECT_EQ(document["document"], name);
  EXPECT_EQ(document["version"], 2);
  EXPECT_TRUE(document["zep"].is_string());
  EXPECT_TRUE(document["sample"].is_boolean());
  EXPECT_EQ(document["exitStatus"], status);
  if (status == 0)
    EXPECT_TRUE(document["reason"].is_null());
  else
    EXPECT_TRUE(document["reason"].is_string() && document["reason"] != "");
}

inline void ExpectEnvelope(std::string const& output, int status, std::string const& name) {
  auto const document = nlohmann::json::parse(output, nullptr, false);
  ASSERT_FALSE(document.is_discarded()) << "not one JSON document: \"" << output << "\"";
  ExpectEnvelope(document, status, name);
}

}  // namespace NQRVZEP20::zep
