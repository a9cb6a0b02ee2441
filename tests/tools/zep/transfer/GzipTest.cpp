// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Gzip.h"

#include <gtest/gtest.h>
#include <zlib.h>

namespace NQRVZEP20::zep {
namespace {

// What zlib makes of a gzip file; an empty text when it is not one.
std::string Unpacked(std::string const& packed, std::size_t size) {
  std::string text(size + 1, '\0');
  z_stream stream{};
  stream.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(packed.data()));
  stream.avail_in = static_cast<uInt>(packed.size());
  stream.next_out = reinterpret_cast<Bytef*>(text.data());
  stream.avail_out = static_cast<uInt>(text.size());
  constexpr int kGzipOnly = 16;
  bool const isWhole = ::inflateInit2(&stream, MAX_WBITS + kGzipOnly) == Z_OK && ::inflate(&stream, Z_FINISH) == Z_STREAM_END;
  text.resize(isWhole ? stream.total_out : 0);
  ::inflateEnd(&stream);
  return text;
}

TEST(GzipTest, ThePackedTextIsTheText) {
  std::string noise;
  for (unsigned number = 1; noise.size() < 200000; number = number * 1103515245 + 12345) noise += static_cast<char>(number >> 16);
  for (std::string const& text : {std::string("a"), std::string(1000000, 'a'), noise})
    EXPECT_TRUE(Unpacked(Gzipped(text), text.size()) == text) << text.size();
  EXPECT_LT(Gzipped(std::string(1000000, 'a')).size(), 2000u);
}

TEST(GzipTest, AnEmptyTextIsAnEmptyFileOfTheFormat) {
  std::string const packed = Gzipped("");
  ASSERT_EQ(packed.size(), 20u);  // head, one empty block, checksum and size
  EXPECT_EQ(packed.substr(0, 4), std::string("\x1f\x8b\x08\0", 4)) << "without a name";
  EXPECT_EQ(packed.substr(4, 4), std::string(4, '\0')) << "without a time";
}

}  // namespace
}  // namespace NQRVZEP20::zep
