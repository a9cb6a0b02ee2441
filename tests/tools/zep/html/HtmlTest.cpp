// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/html/Html.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

TEST(HtmlTest, HostileTextsAreShownAsText) {
  struct {
    std::string fText, fHtml;
  } const rows[] = {
      {"a & b", "a &amp; b"},
      {"<script>alert(1)</script>", "&lt;script&gt;alert(1)&lt;/script&gt;"},
      {"x\" onload=\"y", "x&quot; onload=&quot;y"},
      {"\xe2\x80\xae"
       "abc",
       "\\u202eabc"},
      {"a\xff"
       "b",
       "a\\xffb"},
      {std::string("a\0b", 3), "a\\x00b"},
      {"\x1b[2J", "\\x1b[2J"},
      {"S\xc3\xbc"
       "d",
       "S\xc3\xbc"
       "d"},
  };
  for (auto const& row : rows) EXPECT_EQ(Html(row.fText), row.fHtml);
}

TEST(HtmlTest, AVeryLongTextIsCut) {
  std::string const html = Html(std::string(5000000, 'x'));
  EXPECT_EQ(html.size(), 2000u);
  EXPECT_THAT(html, testing::EndsWith("x..."));
}

TEST(HtmlTest, ThePageForbidsEveryRequest) {
  std::string const page = HtmlPage("<t>", "<p>x</p>\n");
  EXPECT_THAT(page, testing::StartsWith("<!DOCTYPE html>"));
  EXPECT_THAT(page, testing::HasSubstr("default-src 'none'"));
  EXPECT_THAT(page, testing::HasSubstr("<title>&lt;t&gt;</title>"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
