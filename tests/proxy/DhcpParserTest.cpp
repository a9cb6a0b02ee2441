// SPDX-License-Identifier: Apache-2.0

// Parsing the options of a DHCP reply, which anyone can send to the port.

#include "tests/proxy/Replies.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr std::size_t kSize = AutoProxyDiscovery::kOptionsSize;

class DhcpParserTest : public testing::Test {
protected:
  std::string Parse(TBytes const& options) {
    fArea.Hold(options);
    return AutoProxyDiscovery::dhcp_parser(fArea.Data());
  }

  TOptionsArea fArea;
};

// As few options as possible, each of code 1, that fill the area up to that offset.
TBytes FilledTo(std::size_t offset) {
  TBytes options;
  while (options.size() < offset) {
    std::size_t const rest = offset - options.size();
    std::size_t const size = rest > 257 ? std::min<std::size_t>(257, rest - 2) : rest;
    options.push_back(1);
    options.push_back(static_cast<unsigned char>(size - 2));
    options.resize(options.size() + size - 2, 'x');
  }
  return options;
}

TBytes operator+(TBytes left, TBytes const& right) {
  left.insert(left.end(), right.begin(), right.end());
  return left;
}

TBytes const kUrlOption = {252, 3, 'u', 'r', 'l'};
TBytes const kEnd = {255};

TEST_F(DhcpParserTest, FindsTheUrl) {
  struct {
    char const* fWhat;
    TBytes fOptions;
    std::string fUrl;
  } const rows[] = {
      {"252 first", kUrlOption + kEnd, "url"},
      {"252 first, and no end", kUrlOption, "url"},
      {"252 after others", TBytes{53, 1, 5, 54, 4, 10, 77, 0, 1} + kUrlOption + kEnd, "url"},
      {"53, 55, 255", {53, 1, 8, 55, 1, 252, 255}, ""},
      {"255 first", kEnd + kUrlOption, ""},
      {"nothing at all", {}, ""},
      {"252 after the end", TBytes{53, 1, 5, 255} + kUrlOption, ""},
      {"252 as a value", {53, 2, 252, 1, 255}, ""},
      {"252 as a length", TBytes{1, 252} + TBytes(252, 7) + kUrlOption, "url"},
      {"255 as a value", TBytes{53, 2, 255, 255} + kUrlOption, "url"},
      {"255 as a length", TBytes{1, 255} + TBytes(255, 7) + kUrlOption, "url"},
      {"a length of 0", {252, 0, 255}, ""},
      {"a length of 0 first, then a second option", TBytes{252, 0} + kUrlOption, ""},
      {"a length of 1", {252, 1, 'u', 255}, "u"},
      {"the first of two", TBytes{252, 1, '1'} + kUrlOption, "1"},
      {"zero bytes in the value", {252, 3, 0, 'u', 0, 255}, std::string("\0u\0", 3)},
      {"a length above 127", TBytes{252, 200} + TBytes(200, 'u') + kEnd, std::string(200, 'u')},
      {"the longest", TBytes{252, 255} + TBytes(255, 'u'), std::string(255, 'u')},
      {"another option of no length", TBytes{53, 0} + kUrlOption, "url"},
      {"an even number of pads", TBytes{0, 0} + kUrlOption, "url"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(Parse(row.fOptions), row.fUrl);
  }
}

TEST_F(DhcpParserTest, APadIsReadWithALength) {
  EXPECT_EQ(Parse(TBytes{0} + kUrlOption), "");                   // 252 is read as the pad's length
  EXPECT_EQ(Parse(TBytes{0, 2, 252, 1} + kUrlOption), "url");     // 252 is inside the pad's value
  EXPECT_EQ(Parse(TBytes{0, 1, 255, 252, 1, 'u', 255, 0}), "u");  // 255 is, too
}

TEST_F(DhcpParserTest, ReadsToTheLastByteOfTheAreaAndNoFurther) {
  struct {
    char const* fWhat;
    TBytes fOptions;
    std::string fUrl;
  } const rows[] = {
      {"the value ends with the area", FilledTo(kSize - 5) + kUrlOption, "url"},
      {"the value is one byte short", FilledTo(kSize - 4) + kUrlOption, ""},
      {"the value begins after the area", FilledTo(kSize - 2) + kUrlOption, ""},
      {"the length is the last byte, and 0", FilledTo(kSize - 2) + TBytes{252, 0}, ""},
      {"the length would be after the area", FilledTo(kSize - 1) + kUrlOption, ""},
      {"another code is the last byte", FilledTo(kSize - 1) + TBytes{1}, ""},
      {"the end is the last byte", FilledTo(kSize - 1) + kEnd, ""},
      {"the area is full", FilledTo(kSize), ""},
      {"the last option claims more than there is", FilledTo(kSize - 2) + TBytes{1, 255}, ""},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(Parse(row.fOptions), row.fUrl);
  }
}

// Every parse must end, and none may read the page after the area.
TEST_F(DhcpParserTest, AnyByteMayFillTheArea) {
  for (int byte = 0; byte < 256; ++byte) {
    SCOPED_TRACE(byte);
    auto const value = static_cast<unsigned char>(byte);
    EXPECT_EQ(Parse(TBytes(kSize, value)), byte == 252 ? std::string(252, '\xfc') : "");
    // A URL option of that length at every distance from the end.
    for (std::size_t at = 0; at < kSize; at = at == 0 ? 2 : at + 1) {
      std::size_t const room = kSize - at;
      std::string const url = Parse(FilledTo(at) + TBytes{252, value});
      EXPECT_EQ(url, value + 2u <= room ? std::string(value, '\0') : "") << at;
      if (byte % 16 != 15) break;  // try every distance with some of the lengths only
    }
  }
}

TEST_F(DhcpParserTest, ReadsTheRepliesOfRealServers) {
  struct {
    char const* fFile;
    std::string fUrl;
  } const rows[] = {
      {"reply-isc.hex", "http://wpad.test/wpad.dat"},
      {"reply-isc-full.hex", "http://wpad.test/wpad.dat"},
      {"reply-isc-long.hex", "http://wpad.test/very/long/" + std::string(180, 'x') + ".dat"},
      {"reply-isc-no252.hex", ""},
      {"reply-dnsmasq.hex", "http://wpad.test/wpad.dat"},
      {"reply-kea.hex", "http://wpad.test/wpad.dat"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fFile);
    TBytes const reply = RecordedReply(row.fFile);
    ASSERT_GT(reply.size(), 240u);
    EXPECT_EQ(Parse(TBytes(reply.begin() + 240, reply.end())), row.fUrl);
  }
}

}  // namespace
}  // namespace NQRVZEP20
