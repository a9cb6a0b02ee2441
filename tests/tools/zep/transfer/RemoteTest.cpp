// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Remote.h"

#include "tests/Support.h"
#include "tools/zep/output/Failure.h"

namespace NQRVZEP20::zep {
namespace {

TEST(RemoteTest, IsReadAndWritten) {
  struct TRow {
    char const *fText, *fUrl, *fShown;
  };
  TRow const rows[] = {
      {"ftp://h/f", "ftp://h/f", "ftp://h/f"},
      {"h", "ftp://h/", "ftp://h/"},
      {"u@h:21", "ftp://u@h:21/", "ftp://u@h:21/"},
      {"sftp://u:p@h:2222/d/f", "sftp://u:p@h:2222/d/f", "sftp://u@h:2222/d/f"},
      {"ftp://u:p@ss:w/rd@h/f", nullptr, nullptr},  // a "/" ends the host
      {"ftp://u:p@ss:word@h/f", "ftp://u:p%40ss%3Aword@h/f", "ftp://u@h/f"},
      {"ftp://u%40d:p%2Fq@h/f", "ftp://u%40d:p%2Fq@h/f", "ftp://u%40d@h/f"},
      {"ftp://u:@h/f", "ftp://u@h/f", "ftp://u@h/f"},
      {"ftp://[::1]:21/f", "ftp://[::1]:21/f", "ftp://[::1]:21/f"},
      {"ftp://[::1]/f", "ftp://[::1]/f", "ftp://[::1]/f"},
      {"ftp://h//etc/f", "ftp://h//etc/f", "ftp://h//etc/f"},
      {"ftp://h/a b;type=a?c#d%20%zz\n", "ftp://h/a%20b%3Btype=a%3Fc%23d%20%25zz%0A",
       "ftp://h/a%20b%3Btype=a%3Fc%23d%20%25zz%0A"},
      {"ftp:///f", nullptr, nullptr},
      {"ftp://h:/f", nullptr, nullptr},
      {"ftp://h:65536/f", nullptr, nullptr},
      {"ftp://h:1x/f", nullptr, nullptr},
      {"ftp://h\n/f", nullptr, nullptr},
      {"ftp://u:p@h h/f", nullptr, nullptr},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fText);
    if (row.fUrl == nullptr) {
      EXPECT_THROW(RemoteOf(row.fText, "ftp"), TWrongUsage);
      continue;
    }
    TRemote const remote = RemoteOf(row.fText, "ftp");
    EXPECT_EQ(UrlOf(remote), row.fUrl);
    EXPECT_EQ(ShownUrlOf(remote), row.fShown);
  }
}

TEST(RemoteTest, WhatIsWrongShowsNoneOfTheText) {
  for (char const* text : {"ftp://u:topsecret@h:x/", "ftp://u:topsecret@/", "ftp://u:topsecret@h h/", "ftp://u:topsecret/@h:1"})
    try {
      RemoteOf(text, "ftp");
      ADD_FAILURE() << text;
    } catch (TWrongUsage const& wrong) {
      EXPECT_EQ(std::string(wrong.what()).find("topsecret"), std::string::npos);
    }
}

TEST(RemoteTest, ANameIsEncodedWhole) { EXPECT_EQ(EncodedName("a/b c%20;?#\xc3\xa9\n"), "a/b%20c%2520%3B%3F%23%C3%A9%0A"); }

}  // namespace
}  // namespace NQRVZEP20::zep
