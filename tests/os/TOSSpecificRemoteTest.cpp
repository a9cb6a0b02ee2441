// SPDX-License-Identifier: Apache-2.0

// The identity of a remote server, with a stand-in for the IPMI client library.

#include "TOSSpecific.h"

#include "TLogger.h"
#include "tests/SmbiosTables.h"
#include "tests/ipmi/standin/LoadStandIn.h"
#include "tests/os/FakeClock.h"

#include <gmock/gmock.h>
#include <unistd.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;

using TRemoteOperation = std::string (*)(std::string, std::string, std::string);

struct TOperation {
  char const* fName;
  TRemoteOperation fCall;
  char const* fOffset;  // low and high byte, as the stand-in writes them
};

TOperation const kOperations[] = {
    {"GetRemoteMSN", TOSSpecific::GetRemoteMSN, "cc 01"},
    {"GetRemoteMT", TOSSpecific::GetRemoteMT, "ac 01"},
    {"GetRemoteMachineModel", TOSSpecific::GetRemoteMachineModel, "ac 01"},
};

std::string const kOpened = "[Debug] > OpenConnection(3, bmc.example, 623, zepadmin, secret)";

std::string Sent(TOperation const& operation) {
  return std::string("[Debug] > SendIpmiCommand(11, 00 ") + operation.fOffset + " 1e, 4, cleared buffer, 0, ff, 0a)";
}

// An answer as a controller gives it: the count, then 30 bytes of FRU data.
std::string Answer(std::string const& text) { return "\x1E" + text + "\0"s + std::string(29 - text.size(), ' '); }

std::string UpToZero(std::string const& text) { return text.substr(0, text.find('\0')); }

class RemoteIdentityTest : public testing::Test {
protected:
  // Calls the operation with the answer given.
  std::string ResultOf(TRemoteOperation operation, std::string const& answer, int length = -1) {
    fStandIn.fResponse = answer;
    fStandIn.fResponseLength = length;
    return operation("bmc.example", "zepadmin", "secret");
  }

  TStandInIpmiClient& fStandIn = LoadStandInIpmiClient();
};

TEST_F(RemoteIdentityTest, EachOperationReadsItsPartOfTheFruData) {
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMSN, Answer("KQ12345")), "KQ12345");
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMT, Answer("1234AB7")), "1234");
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMachineModel, Answer("1234AB7")), "AB7");
}

TEST_F(RemoteIdentityTest, TheResultIsCutOutOfTheResponse) {
  struct TRow {
    char const* fWhat;
    std::string fAnswer;
    char const *fSerialNumber, *fType, *fModel;
  };
  TRow const rows[] = {
      {"longer than each field", Answer("1234567890abcdefghij"), "1234567", "1234", "567890abcdefghij"},
      {"no zero byte at all", "\x1E" + std::string(30, 'x'), "xxxxxxx", "xxxx", "xxxxxxxxxxxxxxxxxxxxxxxxxx"},
      {"a count that is a character",
       "\x41"
       "1234AB7\0"s,
       "1234AB7", "1234", "AB7"},
      {"three bytes, as counted",
       "\x03"
       "ABC"s,
       "ABC", "ABC", ""},
      {"five bytes",
       "\x05"
       "12345"s,
       "12345", "1234", "5"},
      {"the count alone", "\0"s, "", "", ""},
      {"nothing", "", "", "", ""},
      {"blanks", "\x1E" + std::string(30, ' '), "       ", "    ", "                          "},
      {"bytes above 127", "\x1E" + std::string(30, '\xFF'), "\xFF\xFF\xFF\xFF\xFF\xFF\xFF", "\xFF\xFF\xFF\xFF",
       "\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFF"},
      {"a model that begins with its end", Answer("1234"), "1234", "1234", ""},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(UpToZero(ResultOf(TOSSpecific::GetRemoteMSN, row.fAnswer)), row.fSerialNumber);
    EXPECT_EQ(UpToZero(ResultOf(TOSSpecific::GetRemoteMT, row.fAnswer)), row.fType);
    EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMachineModel, row.fAnswer), row.fModel);
  }
}

TEST_F(RemoteIdentityTest, SerialNumberAndTypeKeepTheirLengthAroundAZeroByte) {
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMSN,
                     "\x1E"
                     "AB\0DEFG hi"s),
            "AB\0DEFG"s);
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMT,
                     "\x1E"
                     "\0"
                     "12AB7"s),
            "\0"
            "12A"s);
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMSN,
                     "\x1E"
                     "AB\0\0\0\0\0hi"s),
            "AB\0\0\0\0\0"s);
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMSN, "\x02xy"), "xy\0\0\0\0\0"s);
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMT, ""), std::string(4, '\0'));
}

TEST_F(RemoteIdentityTest, TheCompleteBufferMayBeFilled) {
  std::string const full(256, 'f');
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMSN, full), "fffffff");
  EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMachineModel, full), std::string(251, 'f')) << "ends with the buffer";
  for (int length : {0, 1, 65535})  // whatever length the library reports
    EXPECT_EQ(ResultOf(TOSSpecific::GetRemoteMT, Answer("1234AB7"), length), "1234") << length;
}

TEST_F(RemoteIdentityTest, ASuccessIsLoggedWithTheResponseAsText) {
  for (TOperation const& operation : kOperations) {
    SCOPED_TRACE(operation.fName);
    EXPECT_THAT(LogOf([&] { ResultOf(operation.fCall, Answer("1234AB7")); }),
                ElementsAre(kOpened, Sent(operation),
                            "[Debug] SendIpmiCommand successfully. \nrspBuffer for " + std::string(operation.fName) + ":",
                            "[Debug] \x1E"
                            "1234AB7"));
    EXPECT_THAT(LogOf([&] { ResultOf(operation.fCall, std::string(256, 'f')); }),
                testing::Contains("[Debug] " + std::string(256, 'f')));
  }
}

TEST_F(RemoteIdentityTest, WithoutASessionTheResultIsEmptyAndNoCommandIsSent) {
  for (int result : {1, -1, 1000})
    for (TOperation const& operation : kOperations) {
      SCOPED_TRACE(operation.fName);
      fStandIn.fOpenResult = result;
      EXPECT_THAT(LogOf([&] { EXPECT_EQ(ResultOf(operation.fCall, Answer("1234AB7")), ""); }), ElementsAre(kOpened));
    }
}

TEST_F(RemoteIdentityTest, AFailedCommandGivesNotAvailable) {
  for (int result : {1, -1, 1000})
    for (TOperation const& operation : kOperations) {
      SCOPED_TRACE(operation.fName);
      fStandIn.fSendResult = result;
      EXPECT_THAT(LogOf([&] { EXPECT_EQ(ResultOf(operation.fCall, Answer("1234AB7")), "N/A"); }),
                  ElementsAre(kOpened, Sent(operation)));
    }
}

TEST(RemoteIdentityWithoutAFunctionTest, WithoutOpenConnectionTheResultIsEmpty) {
  LoadStandInIpmiClient("without-open");
  for (TOperation const& operation : kOperations) EXPECT_EQ(operation.fCall("h", "u", "p"), "") << operation.fName;
}

TEST(RemoteIdentityWithoutAFunctionTest, WithoutSendIpmiCommandTheResultIsNotAvailable) {
  LoadStandInIpmiClient("without-send");
  for (TOperation const& operation : kOperations) EXPECT_EQ(operation.fCall("h", "u", "p"), "N/A") << operation.fName;
}

TEST(RemoteIdentityWithoutAFunctionTest, ClosingIsNotNeeded) {
  LoadStandInIpmiClient("without-close").fResponse = Answer("1234AB7");
  EXPECT_EQ(TOSSpecific::GetRemoteMT("h", "u", "p"), "1234");
}

}  // namespace
}  // namespace NQRVZEP20
