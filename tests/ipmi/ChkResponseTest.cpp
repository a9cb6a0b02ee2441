// SPDX-License-Identifier: Apache-2.0

// Checksums and response packets.

#include "IIPMILan.h"

#include "tests/Support.h"

#include <sys/mman.h>

#include <algorithm>
#include <new>
#include <random>

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;

// ---- GenSum ----

TEST(GenSumTest, IsTheTwosComplementOfTheSum) {
  struct TRow {
    char const* fWhat;
    std::string fBytes;
    int fFirst, fLast;
    int fSum;
  };
  TRow const rows[] = {
      {"responder address and network function", "\x20\x18"s, 0, 1, 0xC8},
      {"the second byte alone", "\x20\x18"s, 1, 1, 0xE8},
      {"a part in the middle", "\xFF\x20\x18\xFF"s, 1, 2, 0xC8},
      {"no bytes", "\x20\x18"s, 1, 0, 0},
      {"last far below first", "\x20\x18"s, 0, -2147483647 - 1, 0},
      {"zeros", "\0\0\0"s, 0, 2, 0},
      {"bytes above 127 are unsigned", "\x80\x81"s, 0, 1, 0xFF},
      {"modulo 256", std::string(200, '\xFF'), 0, 199, 200},
      {"a sum of 256", "\x80\x80"s, 0, 1, 0},
  };
  IIPMILan& link = *IIPMILan::Initialize();
  for (TRow row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(static_cast<unsigned char>(link.GenSum(row.fBytes.data(), row.fFirst, row.fLast)), row.fSum);
  }
}

TEST(GenSumTest, BytesAndChecksumAddUpToZero) {
  std::mt19937 random(7);
  IIPMILan& link = *IIPMILan::Initialize();
  for (int round = 0; round < 200; ++round) {
    std::string bytes(random() % 300 + 1, '\0');
    for (char& byte : bytes) byte = static_cast<char>(random());
    bytes.push_back(link.GenSum(bytes.data(), 0, static_cast<int>(bytes.size()) - 1));
    EXPECT_EQ(link.GenSum(bytes.data(), 0, static_cast<int>(bytes.size()) - 1), 0);
  }
}

// ---- ChkResponse ----

// The offset of the length byte in a packet with an authentication code: RMCP header 4, session header 9, code 16.
constexpr int kLengthPosition = 29;

enum class EAuthentication { kNone = 0, kMD5 = 2 };

// A complete response packet with correct checksums.
std::string Packet(EAuthentication authentication, int completionCode, std::string const& data) {
  std::string packet = "\x06\0\xFF\x07"s;  // RMCP
  packet += static_cast<char>(authentication);
  packet += "\x01\0\0\0"s + "\x11\x22\x33\x44"s;  // sequence, session
  if (authentication != EAuthentication::kNone) packet += std::string(16, '\x5A');
  std::string message = "\x81\x2C\x53"s;  // responder, network function, checksum 1
  std::string rest = "\x20\x04\x11"s;     // requester, sequence, command
  rest += static_cast<char>(completionCode) + data;
  unsigned char sum = 0;
  for (char byte : rest) sum = static_cast<unsigned char>(sum + static_cast<unsigned char>(byte));
  message += rest + static_cast<char>(-sum);
  packet += static_cast<char>(message.size());
  return packet + message;
}

// Checks the packet in a buffer of exactly its size, so that the sanitizers detect a read outside it.
bool Check(IIPMILan& link, std::string const& packet, int lengthPosition, int mode) {
  std::vector<char> area(packet.begin(), packet.end());
  area.shrink_to_fit();
  return link.ChkResponse(area.data(), lengthPosition, mode);
}

TEST(ChkResponseTest, EachModeTestsOnlyItsOwnParts) {
  struct TRow {
    bool fIsChecksumRight;
    int fCompletionCode;
    bool fResults[5];  // for the modes 0, 1, 2, 3 and -1
  };
  TRow const rows[] = {
      {true, 0, {true, true, true, true, true}},
      {true, 0xC1, {false, true, false, true, true}},
      {false, 0, {false, false, true, true, true}},
      {false, 0xC1, {false, false, false, true, true}},
  };
  int const modes[] = {0, 1, 2, 3, -1};
  for (EAuthentication authentication : {EAuthentication::kNone, EAuthentication::kMD5})
    for (TRow const& row : rows)
      for (int m = 0; m < 5; ++m) {
        SCOPED_TRACE(testing::Message() << "authentication " << static_cast<int>(authentication) << ", checksum "
                                        << row.fIsChecksumRight << ", code " << row.fCompletionCode << ", mode " << modes[m]);
        std::string packet = Packet(authentication, row.fCompletionCode,
                                    "\x03"
                                    "abc");
        if (!row.fIsChecksumRight) ++packet.back();
        IIPMILan& link = *IIPMILan::Initialize();
        EXPECT_EQ(Check(link, packet, kLengthPosition, modes[m]), row.fResults[m]);
        EXPECT_EQ(link.getipmiLanStatus(), row.fResults[m]) << "a success makes the status true";
      }
}

TEST(ChkResponseTest, AFailureDoesNotChangeTheStatus) {
  IIPMILan& link = *IIPMILan::Initialize();
  std::string const good = Packet(EAuthentication::kNone, 0, "");
  std::string const bad = Packet(EAuthentication::kNone, 0xC1, "");
  EXPECT_FALSE(Check(link, bad, kLengthPosition, 0));
  EXPECT_FALSE(link.getipmiLanStatus());
  EXPECT_TRUE(Check(link, good, kLengthPosition, 0));
  EXPECT_FALSE(Check(link, bad, kLengthPosition, 0));
  EXPECT_TRUE(link.getipmiLanStatus());
}

TEST(ChkResponseTest, AuthenticationType0ReadsTheLength16BytesEarlier) {
  IIPMILan& link = *IIPMILan::Initialize();
  std::string packet = Packet(EAuthentication::kMD5, 0, "abc");
  EXPECT_TRUE(Check(link, packet, kLengthPosition, 0));
  packet[4] = 0;  // the length is now byte 13, and is 90
  EXPECT_FALSE(Check(link, packet + std::string(100, '\0'), kLengthPosition, 0));
  EXPECT_TRUE(Check(link, packet, kLengthPosition + 16, 0));
  for (int type : {1, 2, 4, 5, 6, 255}) {
    packet[4] = static_cast<char>(type);
    EXPECT_TRUE(Check(link, packet, kLengthPosition, 0)) << type;
  }
}

TEST(ChkResponseTest, EveryChangedByteOfTheMessageIsDetected) {
  IIPMILan& link = *IIPMILan::Initialize();
  std::string const good = Packet(EAuthentication::kNone, 0, "some data");
  for (std::size_t place = 14; place < good.size(); ++place) {
    std::string packet = good;
    packet[place] = static_cast<char>(packet[place] ^ 0x40);
    EXPECT_FALSE(Check(link, packet, kLengthPosition, 1)) << place;
  }
}

// The message length is a signed byte. A negative length leads to bytes before the message and before the packet.
TEST(ChkResponseTest, ANegativeLengthIsComparedWithAnEarlierByte) {
  struct TRow {
    int fLength;
    int fPlace;  // offset of the byte that is compared with 0, the empty sum; negative: before the packet
  };
  TRow const rows[] = {{0, 13}, {-1, 12}, {-2, 11}, {-13, 0}, {-14, -1}, {-15, -2}, {-128, -115}};
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fLength);
    for (bool isZero : {true, false}) {
      std::string packet(14, '\x5A');
      packet[4] = 0;
      packet[13] = static_cast<char>(row.fLength);
      if (row.fPlace >= 0 && row.fPlace != 13) packet[static_cast<std::size_t>(row.fPlace)] = isZero ? 0 : 1;
      bool const expected = row.fPlace == 13 || (row.fPlace >= 0 && isZero);
      EXPECT_EQ(Check(*IIPMILan::Initialize(), packet, kLengthPosition, 1), expected);
    }
  }
}

TEST(ChkResponseTest, AMessageOfOneByteIsItsOwnChecksum) {
  for (auto const& [last, expected] : {std::pair('\0', true), std::pair('\1', false)}) {
    std::string packet(13, '\x5A');
    packet[4] = 0;
    packet += "\x01"s + last;
    EXPECT_EQ(Check(*IIPMILan::Initialize(), packet, kLengthPosition, 1), expected);
  }
}

TEST(ChkResponseTest, ALengthPositionBeforeThePacketFailsTheTestThatNeedsIt) {
  std::string packet(16, '\0');  // authentication type 0, and completion code 0 at any offset
  for (int position : {15, 8, 0, -1, -1000, -2147483647 - 1}) {
    SCOPED_TRACE(position);
    IIPMILan& link = *IIPMILan::Initialize();
    EXPECT_FALSE(Check(link, packet, position, 0));
    EXPECT_FALSE(Check(link, packet, position, 1));
    EXPECT_EQ(Check(link, packet, position, 2), position == 15) << "at position 15 the completion code is byte 6";
    EXPECT_TRUE(Check(link, packet, position, 3));
  }
}

// A page between two pages that cannot be accessed.
class TGuardedPage {
public:
  TGuardedPage() : fPages(static_cast<char*>(::mmap(nullptr, 3 * kSize, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0))) {
    if (fPages == MAP_FAILED || ::mprotect(fPages + kSize, kSize, PROT_READ | PROT_WRITE) != 0) throw std::bad_alloc();
  }
  ~TGuardedPage() { ::munmap(fPages, 3 * kSize); }
  TGuardedPage(TGuardedPage const&) = delete;
  TGuardedPage& operator=(TGuardedPage const&) = delete;

  char* AtTheStart(std::string const& bytes) const { return Copy(bytes, fPages + kSize); }
  char* AtTheEnd(std::string const& bytes) const { return Copy(bytes, fPages + 2 * kSize - bytes.size()); }

private:
  static char* Copy(std::string const& bytes, char* place) { return std::copy(bytes.begin(), bytes.end(), place) - bytes.size(); }

  static constexpr std::size_t kSize = 4096;
  char* const fPages;
};

// For any length byte, the check reads nothing outside the buffer that the header requires. A read outside it would crash
// the test, or give different results at the two ends of the page.
TEST(ChkResponseTest, NoLengthMakesTheCheckReadOutsideTheBuffer) {
  TGuardedPage const page;
  IIPMILan& link = *IIPMILan::Initialize();
  for (int length = -128; length <= 127; ++length)
    for (int mode : {0, 1, 2}) {
      std::string packet(static_cast<std::size_t>(14 + std::max(length, 7)), '\x11');
      packet[4] = 0;
      packet[13] = static_cast<char>(length);
      EXPECT_EQ(link.ChkResponse(page.AtTheStart(packet), kLengthPosition, mode),
                link.ChkResponse(page.AtTheEnd(packet), kLengthPosition, mode))
          << "length " << length << ", mode " << mode;
    }
}

TEST(ChkResponseTest, AModeReadsOnlyTheBytesThatItTests) {
  IIPMILan& link = *IIPMILan::Initialize();
  std::string const whole = Packet(EAuthentication::kNone, 0, "");
  EXPECT_TRUE(Check(link, whole.substr(0, 21), kLengthPosition, 2)) << "the packet ends before the checksum";
  EXPECT_TRUE(Check(link, std::string(13, '\0') + "\x02\x40\xC0"s, kLengthPosition, 1))
      << "the packet ends before the completion code";
  EXPECT_TRUE(Check(link, "\0\0\0\0\0"s, kLengthPosition, 3)) << "the packet ends after the authentication type";
}

}  // namespace
}  // namespace NQRVZEP20
