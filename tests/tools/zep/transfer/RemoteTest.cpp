// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Remote.h"

#include "tests/Support.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/transfer/Sha256.h"

namespace NQRVZEP20::zep {
namespace {

TEST(RemoteTest, IsReadAndWritten) {
  struct TRow {
    char const *text, *url, *shown;
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
    SCOPED_TRACE(row.text);
    if (row.url == nullptr) {
      EXPECT_THROW(RemoteOf(row.text, "ftp"), TWrongUsage);
      continue;
    }
    TRemote const remote = RemoteOf(row.text, "ftp");
    EXPECT_EQ(UrlOf(remote), row.url);
    EXPECT_EQ(ShownUrlOf(remote), row.shown);
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

TEST(Sha256Test, IsThatOfTheStandard) {
  struct TRow {
    std::string text;
    char const* sum;
  };
  TRow const rows[] = {
      {"", "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855"},
      {"abc", "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad"},
      {"abcdbcdecdefdefgefghfghighijhijkijkljklmklmnlmnomnopnopq",
       "248d6a61d20638b8e5c026930c3e6039a33ce45964ff2167f6ecedd419db06c1"},
      {std::string(1000000, 'a'), "cdc76e5c9914fb9281a1c7e284d73e67f1809a48a497200e046d39ccc7112cd0"},
  };
  TTempDir const dir;
  for (TRow const& row : rows) {
    WriteFile(dir.Path("f"), row.text);
    EXPECT_EQ(Sha256Of(dir.Path("f")), row.sum) << row.text.size();
  }
  // Around the ends of blocks and of chunks, beside the system's own.
  for (int const size : {55, 56, 63, 64, 65, 65535, 65536, 65537, 65591, 65592}) {
    WriteFile(dir.Path("f"), std::string(static_cast<std::size_t>(size), 'x'));
    std::string const command = "sha256sum " + dir.Path("f") + " > " + dir.Path("sum");
    ASSERT_EQ(::system(command.c_str()), 0);
    EXPECT_EQ(Sha256Of(dir.Path("f")), ReadFile(dir.Path("sum")).substr(0, 64)) << size;
  }
  EXPECT_THROW(Sha256Of(dir.Path("none")), std::system_error);
  EXPECT_THROW(Sha256Of(dir.Path()), std::system_error);
}

}  // namespace
}  // namespace NQRVZEP20::zep
