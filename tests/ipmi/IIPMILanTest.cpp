// SPDX-License-Identifier: Apache-2.0

// Tests the link to the management controller with stand-ins for its platform libraries.

#include "IIPMILan.h"

#include "TRootObject.h"
#include "tests/ipmi/standin/LoadStandIn.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/socket.h>

#include <cstring>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// The first test of the program, because any other test may create a link.
TEST(NoIPMILanTest, BeforeInitializeTheLinkIsNull) {
  EXPECT_EQ(IIPMILan::GetInstance(), nullptr);
  EXPECT_EQ(TRootObject::GetipmiLanIns(), nullptr);
  EXPECT_EQ(gIPMILanHost + gIPMILanPort + gIPMILanUser + gIPMILanPass, "");
}

class IIPMILanTest : public testing::Test {
protected:
  IIPMILanTest() : fStandIn(LoadStandInIpmiClient()), fDirectory(std::filesystem::current_path()), fLink(IIPMILan::Initialize()) {
    std::filesystem::current_path(fDir.Path());
  }
  ~IIPMILanTest() override { std::filesystem::current_path(fDirectory); }

  void UseUsbLan(std::string const& variant, char const* nodes = "3") {
    std::filesystem::copy(ZEP_IPMI_STANDINS "/" + variant + "/ovdusblan.so", fDir.Path("ovdusblan.so"));
    ::setenv("STANDIN_NODES", nodes, 1);
  }
  bool IsUsbLanLoaded() { return ::dlopen(fDir.Path("ovdusblan.so").c_str(), RTLD_LAZY | RTLD_NOLOAD) != nullptr; }

  // Checks a valid response, which makes the link's status true.
  void GetAResponse() {
    char packet[32] = {};
    ASSERT_TRUE(fLink->ChkResponse(packet, 29, 1));
  }

  TTempDir fDir;
  TEnvironmentGuard const fNodes{"STANDIN_NODES", nullptr}, fUp{"STANDIN_UP", nullptr}, fThrows{"STANDIN_THROWS", nullptr};
  TStandInIpmiClient& fStandIn;
  std::filesystem::path const fDirectory;
  IIPMILan* const fLink;
};

std::vector<std::string> SessionParameters() { return {gIPMILanHost, gIPMILanPort, gIPMILanUser, gIPMILanPass}; }

// ---- The link ----

TEST_F(IIPMILanTest, InitializeMakesAFreshLinkEachTime) {
  EXPECT_EQ(IIPMILan::GetInstance(), fLink);
  EXPECT_EQ(TRootObject::GetipmiLanIns(), fLink);
  fLink->setAccount(0, "zepadmin", "secret");
  fLink->getSeqNum();
  fLink->m_useGlobalAccount = true;
  fLink->m_enabled = 0;
  GetAResponse();

  IIPMILan* const fresh = IIPMILan::Initialize();
  EXPECT_NE(fresh, fLink);
  EXPECT_EQ(IIPMILan::GetInstance(), fresh);
  EXPECT_EQ(TRootObject::GetipmiLanIns(), fresh);
  EXPECT_FALSE(fresh->getipmiLanStatus());
  EXPECT_FALSE(fresh->m_useGlobalAccount);
  EXPECT_EQ(fresh->m_enabled, 1);
  EXPECT_EQ(fresh->getSeqNum(), 1u);
  EXPECT_EQ(fresh->getCurrentUser() + fresh->getCurrentPassword() + fresh->getCurrentHost(), "") << "no node is current";
  EXPECT_THAT(LogOf([&] { fresh->IpmiInBandLanConnect(0, "p"); }),
              testing::Contains("[Debug] > OpenConnection(3, 169.254.95.118, 623, , )"))
      << "accounts are empty";
  EXPECT_TRUE(fLink->getipmiLanStatus()) << "the old link is not freed";
}

TEST_F(IIPMILanTest, EachNodeHasItsOwnAddress) {
  char const* const addresses[] = {
      "169.254.95.118",  "169.254.96.118",  "169.254.97.118",  "169.254.98.118",  "169.254.99.118",  "169.254.100.118",
      "169.254.101.118", "169.254.102.118", "169.254.103.118", "169.254.104.118", "169.254.105.118", "169.254.106.118",
      "169.254.107.118", "169.254.108.118", "169.254.109.118", "169.254.110.118",
  };
  EXPECT_EQ(IIPMILan::MAXMULTINODE, 16);
  for (int node = 0; node < 16; ++node) {
    SCOPED_TRACE(node);
    EXPECT_EQ(IIPMILan::m_LANMapping[node], addresses[node]);
    EXPECT_TRUE(fLink->IpmiInBandLanConnect(node, "p"));
    EXPECT_EQ(gIPMILanHost, addresses[node]);
    EXPECT_EQ(fLink->getCurrentHost(), addresses[node]);
  }
}

// ---- Accounts ----

TEST_F(IIPMILanTest, EachNodeHasItsOwnAccount) {
  for (int node = 0; node < 16; ++node) fLink->setAccount(node, "user" + std::to_string(node), "password" + std::to_string(node));
  for (int node : {15, 0, 7}) {
    fLink->IpmiInBandLanConnect(node, "p");
    EXPECT_EQ(fLink->getCurrentUser(), "user" + std::to_string(node));
    EXPECT_EQ(fLink->getCurrentPassword(), "password" + std::to_string(node));
    EXPECT_EQ(gIPMILanUser, "user" + std::to_string(node));
    EXPECT_EQ(gIPMILanPass, "password" + std::to_string(node));
  }
}

TEST_F(IIPMILanTest, AnIndexAbove15IsLoggedAndChangesNothing) {
  for (int index : {16, 17, 2147483647}) {
    EXPECT_THAT(LogOf([&] { fLink->setAccount(index, "zepadmin", "secret"); }),
                ElementsAre("[Debug] IIPMILan::setAccount index you set larger that MAXMULTINODE !!"));
  }
  EXPECT_THAT(LogOf([&] { fLink->setAccount(15, "zepadmin", "secret"); }), IsEmpty());
  for (int node = 0; node < 15; ++node) {
    fLink->IpmiInBandLanConnect(node, "p");
    EXPECT_EQ(fLink->getCurrentUser() + fLink->getCurrentPassword(), "") << node;
  }
  fLink->IpmiInBandLanConnect(15, "p");
  EXPECT_EQ(fLink->getCurrentUser(), "zepadmin");
}

TEST_F(IIPMILanTest, TheGlobalAccountIsThatOfTheSession) {
  fLink->setAccount(2, "user2", "password2");
  fLink->IpmiInBandLanConnect(2, "p");
  fLink->IpmilanOpenConnect("bmc.example", "zepadmin", "secret");
  EXPECT_EQ(fLink->getCurrentUser(), "user2");
  EXPECT_EQ(fLink->getCurrentPassword(), "password2");
  EXPECT_EQ(fLink->getCurrentHost(), "169.254.97.118");
  fLink->m_useGlobalAccount = true;
  EXPECT_EQ(fLink->getCurrentUser(), "zepadmin");
  EXPECT_EQ(fLink->getCurrentPassword(), "secret");
  EXPECT_EQ(fLink->getCurrentHost(), "bmc.example");
}

// ---- Session ----

TEST_F(IIPMILanTest, OpeningLogsThePasswordAndRemembersTheParameters) {
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->IpmilanOpenConnect("bmc.example", "zepadmin", "secret")); }),
              ElementsAre("[Debug] Enter IpmilanOpenConnect", "[Debug] host: bmc.example", "[Debug] username: zepadmin",
                          "[Debug] password: secret", "[Debug] > OpenConnection(3, bmc.example, 623, zepadmin, secret)",
                          "[Debug] Open IPMI Lan Connection successfully. \n"));
  EXPECT_THAT(SessionParameters(), ElementsAre("bmc.example", "623", "zepadmin", "secret"));
  EXPECT_FALSE(fLink->getipmiLanStatus()) << "only a response makes the status true";
}

TEST_F(IIPMILanTest, TheParametersAreStoredAfterTheCall) {
  std::vector<std::string> before;
  fLink->IpmilanOpenConnect("earlier", "one", "two");
  fStandIn.fAtOpen = [&] { before = SessionParameters(); };
  fLink->IpmilanOpenConnect("later", "three", "four");
  EXPECT_THAT(before, ElementsAre("earlier", "623", "one", "two"));
  fStandIn.fThrownByOpen = 9;
  EXPECT_THROW(fLink->IpmilanOpenConnect("last", "five", "six"), int);
  EXPECT_THAT(SessionParameters(), ElementsAre("later", "623", "three", "four"));
}

TEST_F(IIPMILanTest, AFailureToOpenIsLoggedWithTheCodeAndRemembersTheParameters) {
  for (int code : {1, -1, 255, 2147483647}) {
    SCOPED_TRACE(code);
    fStandIn.fOpenResult = code;
    std::string const number = std::to_string(code);
    EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->IpmilanOpenConnect("h" + number, "u", "p")); }),
                ElementsAre("[Debug] Enter IpmilanOpenConnect", "[Debug] host: h" + number, "[Debug] username: u",
                            "[Debug] password: p", "[Debug] > OpenConnection(3, h" + number + ", 623, u, p)",
                            "[Debug] Connection Error code:" + number, "[Debug] Open IPMI Lan Connection failed. \n"));
    EXPECT_THAT(SessionParameters(), ElementsAre("h" + number, "623", "u", "p"));
  }
}

TEST_F(IIPMILanTest, ClosingForgetsTheSession) {
  fLink->IpmilanOpenConnect("h", "u", "p");
  GetAResponse();
  fLink->m_socket = ::socket(AF_INET, SOCK_DGRAM, 0);
  int const socket = fLink->getTheSocket();
  ASSERT_GE(::fcntl(socket, F_GETFD), 0);
  EXPECT_THAT(
      LogOf([&] { fLink->IpmilanCloseConnect(); }),
      ElementsAre("[Debug] Enter IpmilanCloseConnect", "[Debug] > CloseConnection()", "[Debug] Exit IpmilanCloseConnect"));
  EXPECT_THAT(SessionParameters(), ElementsAre("", "", "", ""));
  EXPECT_FALSE(fLink->getipmiLanStatus());
  EXPECT_EQ(::fcntl(socket, F_GETFD), -1) << "the socket should be closed";
}

TEST_F(IIPMILanTest, ClosingWithoutASessionStillCallsTheLibrary) {
  EXPECT_THAT(
      LogOf([&] { fLink->IpmilanCloseConnect(); }),
      ElementsAre("[Debug] Enter IpmilanCloseConnect", "[Debug] > CloseConnection()", "[Debug] Exit IpmilanCloseConnect"));
  EXPECT_GE(::fcntl(0, F_GETFD), 0) << "standard input is not closed in place of a socket";
}

// ---- In-band ----

std::vector<std::string> ConnectedAsNode0(char const* last) {
  return {"[Debug] Enter IpmilanOpenConnect",
          "[Debug] host: 169.254.95.118",
          "[Debug] username: u0",
          "[Debug] password: p0",
          "[Debug] > OpenConnection(3, 169.254.95.118, 623, u0, p0)",
          "[Debug] Open IPMI Lan Connection successfully. \n",
          last};
}

TEST_F(IIPMILanTest, InBandConnectsToTheNodesAddressWithItsAccount) {
  fLink->setAccount(0, "u0", "p0");
  EXPECT_EQ(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(0, "libFan")); }),
            ConnectedAsNode0("[Debug] IPMILan Local connected success in plugin:libFan"));
}

TEST_F(IIPMILanTest, InBandBringsTheUsbLanUpFirst) {
  UseUsbLan("whole", "1");
  fLink->setAccount(0, "u0", "p0");
  std::vector<std::string> expected = ConnectedAsNode0("[Debug] IPMILan Local connected success in plugin:libFan");
  expected.insert(expected.begin(), {"[Debug] > GetNodes()", "[Debug] > QueryOvdLanState(0)", "[Debug] > BringupOvdLan(0)"});
  EXPECT_EQ(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(0, "libFan")); }), expected);
}

TEST_F(IIPMILanTest, InBandLogsAndReturnsItsFailure) {
  fStandIn.fOpenResult = 4;
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->IpmiInBandLanConnect(1, "libFan")); }),
              ElementsAre("[Debug] Enter IpmilanOpenConnect", "[Debug] host: 169.254.96.118",
                          "[Debug] username: ", "[Debug] password: ", "[Debug] > OpenConnection(3, 169.254.96.118, 623, , )",
                          "[Debug] Connection Error code:4", "[Debug] Open IPMI Lan Connection failed. \n",
                          "[Debug] IPMILan Local connected Failed in plugin:libFan"));
  EXPECT_EQ(fLink->getCurrentHost(), "169.254.96.118") << "the node becomes the current one nevertheless";
}

TEST_F(IIPMILanTest, AThrownIntegerIsLoggedWithoutTheFirstLetter) {
  fStandIn.fThrownByOpen = -5;
  std::vector<std::string> const log = LogOf([&] { EXPECT_FALSE(fLink->IpmiInBandLanConnect(0, "libFan")); });
  ASSERT_FALSE(log.empty());
  EXPECT_EQ(log.back(), "[Debug] PMILan Local connected Failed in plugin: libFan,Error Msg:-5");
}

TEST_F(IIPMILanTest, TheSessionOfTheCurrentNodeIsReusedWhileTheStatusIsTrue) {
  ASSERT_TRUE(fLink->IpmiInBandLanConnect(3, "p"));
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(3, "p")); }), testing::SizeIs(8))
      << "the status is still false, so it is read and a session is opened";
  GetAResponse();
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(3, "p")); }), ElementsAre("[Debug] getipmiLanStatus = 1"));
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(4, "p")); }), testing::SizeIs(7)) << "another node";
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(4, "p")); }), ElementsAre("[Debug] getipmiLanStatus = 1"))
      << "the status remains true when the node changes";
  fLink->IpmilanCloseConnect();
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->IpmiInBandLanConnect(4, "p")); }), testing::SizeIs(8));
}

TEST_F(IIPMILanTest, InBandDoesNothingWhileDisabledOrWithTheGlobalAccount) {
  fLink->m_enabled = 0;
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->IpmiInBandLanConnect(0, "p")); }), IsEmpty());
  EXPECT_EQ(fLink->getCurrentHost(), "") << "no node has become the current one";
  fLink->m_enabled = 1;
  fLink->m_useGlobalAccount = true;
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->IpmiInBandLanConnect(0, "p")); }), IsEmpty());
  fLink->m_enabled = -1;
  fLink->m_useGlobalAccount = false;
  EXPECT_TRUE(fLink->IpmiInBandLanConnect(0, "p"));
}

// ---- USB-LAN ----

TEST_F(IIPMILanTest, BringsUpEveryNodeThatIsDown) {
  UseUsbLan("whole", "4");
  ::setenv("STANDIN_UP", "1", 1);
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->bringupOvdLan()); }),
              ElementsAre("[Debug] > GetNodes()", "[Debug] > QueryOvdLanState(0)", "[Debug] > BringupOvdLan(0)",
                          "[Debug] > QueryOvdLanState(1)", "[Debug] > QueryOvdLanState(2)", "[Debug] > BringupOvdLan(2)",
                          "[Debug] > QueryOvdLanState(3)", "[Debug] > BringupOvdLan(3)"));
  EXPECT_FALSE(IsUsbLanLoaded());
}

TEST_F(IIPMILanTest, WithoutNodesNothingIsBroughtUp) {
  UseUsbLan("whole", "0");
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->bringupOvdLan()); }), ElementsAre("[Debug] > GetNodes()"));
  ::setenv("STANDIN_NODES", "-3", 1);
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->bringupOvdLan()); }), ElementsAre("[Debug] > GetNodes()"));
}

TEST_F(IIPMILanTest, WithTheGlobalAccountTheUsbLanIsNotTouched) {
  UseUsbLan("whole");
  fLink->m_useGlobalAccount = true;
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->bringupOvdLan()); }), IsEmpty());
}

TEST_F(IIPMILanTest, WithoutTheUsbLanLibraryOrOneOfItsFunctionsNothingIsBroughtUp) {
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->bringupOvdLan()); }), IsEmpty());
  WriteFile(fDir.Path("ovdusblan.so"), "not a library");
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->bringupOvdLan()); }), IsEmpty());
  for (char const* variant : {"without-nodes", "without-query", "without-bringup"}) {
    SCOPED_TRACE(variant);
    std::filesystem::remove(fDir.Path("ovdusblan.so"));
    UseUsbLan(variant);
    EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->bringupOvdLan()); }), IsEmpty());
    EXPECT_FALSE(IsUsbLanLoaded());
  }
}

TEST_F(IIPMILanTest, AUsbLanLibraryWithAnUnresolvedSymbolIsUsed) {
  UseUsbLan("unresolved", "0");
  EXPECT_EQ(::dlopen("./ovdusblan.so", RTLD_NOW), nullptr) << "a symbol of the library should be unresolved";
  EXPECT_TRUE(fLink->bringupOvdLan());
}

TEST_F(IIPMILanTest, TheUsbLanLibraryIsLoadedFromTheWorkingDirectory) {
  UseUsbLan("whole");
  std::filesystem::create_directory(fDir.Path("elsewhere"));
  std::filesystem::current_path(fDir.Path("elsewhere"));
  EXPECT_FALSE(fLink->bringupOvdLan());
}

TEST_F(IIPMILanTest, AnExceptionThrownByTheUsbLanLibraryIsLogged) {
  UseUsbLan("whole", "1");
  for (char const* thrown : {"GetNodes int", "GetNodes text", "QueryOvdLanState int", "BringupOvdLan text"}) {
    SCOPED_TRACE(thrown);
    ::setenv("STANDIN_THROWS", thrown, 1);
    std::vector<std::string> const log = LogOf([&] { EXPECT_FALSE(fLink->bringupOvdLan()); });
    ASSERT_FALSE(log.empty());
    EXPECT_EQ(log.back(), "[Debug] USB over Lan Bring up fail. \n");
    EXPECT_FALSE(IsUsbLanLoaded());
  }
  ::setenv("STANDIN_THROWS", "GetNodes int", 1);
  EXPECT_TRUE(fLink->IpmiInBandLanConnect(0, "p")) << "the session is opened nevertheless";
}

// ---- For callers that speak the protocol themselves ----

TEST_F(IIPMILanTest, TheStatusIsLogged) {
  EXPECT_THAT(LogOf([&] { EXPECT_FALSE(fLink->getipmiLanStatus()); }), ElementsAre("[Debug] getipmiLanStatus = 0"));
  GetAResponse();
  EXPECT_THAT(LogOf([&] { EXPECT_TRUE(fLink->getipmiLanStatus()); }), ElementsAre("[Debug] getipmiLanStatus = 1"));
}

TEST_F(IIPMILanTest, TheSequenceCounterAdvancesByOne) {
  EXPECT_THAT(LogOf([&] {
                EXPECT_EQ(fLink->getSeqNum(), 1u);
                EXPECT_EQ(fLink->getSeqNum(), 2u);
              }),
              ElementsAre("[Debug] Seqnum1", "[Debug] Seqnum2"));
  static_assert(sizeof(fLink->getSeqNum()) == 8);
}

TEST_F(IIPMILanTest, TheSessionIdentifierIsCopiedUpTo19Bytes) {
  std::string const bytes = "0123456789abcdefghij";
  std::copy(bytes.begin(), bytes.end(), fLink->m_sessionID.begin());
  for (int count : {1, 2, 18, 19}) {
    std::string output(24, '#');
    fLink->getIPMISessionID(output.data(), count);
    EXPECT_EQ(output, bytes.substr(0, static_cast<std::size_t>(count)) + std::string(24 - static_cast<std::size_t>(count), '#'));
  }
  for (int count : {20, 21, 0, -1, 2147483647, -2147483647 - 1}) {
    std::string output(24, '#');
    fLink->getIPMISessionID(output.data(), count);
    EXPECT_EQ(output, std::string(24, '#')) << count;
  }
}

TEST_F(IIPMILanTest, PasswordAndAddressAreCopiedCompletelyForAnySize) {
  fLink->m_password.fill('p');
  fLink->m_address.fill('a');
  for (int size : {20, 40, 0, 1, -1}) {
    std::string password(24, '#'), address(44, '#');
    fLink->getBMCPassword(password.data(), size);
    fLink->getIPMIAddress(address.data(), size);
    EXPECT_EQ(password, std::string(20, 'p') + "####");
    EXPECT_EQ(address, std::string(40, 'a') + "####");
  }
}

TEST_F(IIPMILanTest, SocketAndServerAddressAreReturned) {
  EXPECT_EQ(fLink->getTheSocket(), -1);
  EXPECT_TRUE(fLink->closeSocket()) << "also without a socket";
  fLink->m_saServer.sin_port = 623;
  EXPECT_EQ(fLink->getSaServer().sin_port, 623);
  static_assert(sizeof(fLink->getSaServer()) == 16);

  int const socket = ::socket(AF_INET, SOCK_DGRAM, 0);
  fLink->m_socket = socket;
  EXPECT_EQ(fLink->getTheSocket(), socket);
  EXPECT_TRUE(fLink->closeSocket());
  EXPECT_EQ(::fcntl(socket, F_GETFD), -1);
  int const another = ::dup(0);  // most likely gets the same number
  EXPECT_TRUE(fLink->closeSocket());
  EXPECT_GE(::fcntl(another, F_GETFD), 0) << "the number of a closed socket is not closed again";
  ::close(another);
}

// ---- With an incomplete platform library ----

TEST(IncompleteIpmiClientTest, AMissingFunctionGivesNotFoundAndTheOthersAreUsed) {
  LoadStandInIpmiClient("without-open");
  IIPMILan& link = *IIPMILan::Initialize();
  std::vector<std::string> const log = LogOf([&] { EXPECT_FALSE(link.IpmilanOpenConnect("h", "u", "p")); });
  ASSERT_EQ(log.size(), 6u);
  EXPECT_EQ(log[4], "[Debug] Connection Error code:15");
  EXPECT_EQ(gIPMILanHost, "h");
  EXPECT_THAT(LogOf([&] { link.IpmilanCloseConnect(); }), testing::Contains("[Debug] > CloseConnection()"));
}

TEST(IncompleteIpmiClientTest, ClosingWorksWithoutCloseConnection) {
  LoadStandInIpmiClient("without-close");
  IIPMILan& link = *IIPMILan::Initialize();
  EXPECT_TRUE(link.IpmilanOpenConnect("h", "u", "p"));
  link.IpmilanCloseConnect();
  EXPECT_EQ(gIPMILanHost, "");
}

}  // namespace
}  // namespace NQRVZEP20
