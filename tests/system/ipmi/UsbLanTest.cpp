// SPDX-License-Identifier: Apache-2.0

// Tests ovdusblan.so with the interfaces of a network namespace, and the connection to the controllers that they reach.

#include "IIPMILan.h"
#include "TRootObject.h"
#include "platform/include/usblan.h"
#include "tests/system/ipmi/IpmiBed.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/wait.h>

#include <cerrno>
#include <future>

namespace NQRVZEP20 {
namespace {

std::string OutputOf(std::string const& command) {
  std::unique_ptr<FILE, int (*)(FILE*)> const pipe(::popen(command.c_str(), "r"), ::pclose);
  std::string output;
  char chunk[4096];
  while (std::size_t const got = std::fread(chunk, 1, sizeof chunk, pipe.get())) output.append(chunk, got);
  return output;
}

void RunShell(std::string const& command) { ASSERT_EQ(std::system(command.c_str()), 0) << command; }

class UsbLanTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(CanMakeNetworks(), "ip (package iproute2), and root");
    EnterNetworkNamespace();
    fLibrary.reset(::dlopen(BuildPath("lib/ovdusblan.so").c_str(), RTLD_LAZY));
    ASSERT_TRUE(fLibrary) << ::dlerror();
    fNodes = FunctionOf<decltype(GetNodes)>(fLibrary.get(), "GetNodes");
    fQuery = FunctionOf<decltype(QueryOvdLanState)>(fLibrary.get(), "QueryOvdLanState");
    fBringUp = FunctionOf<decltype(BringupOvdLan)>(fLibrary.get(), "BringupOvdLan");
  }

  static std::string AddressesOf(std::string const& interface) {
    return OutputOf("ip -4 -o addr show dev " + interface + " | awk '{print $4}' | tr '\\n' ' '");
  }

  TEnvironmentGuard const fNamed{"ZEP_USBLAN_INTERFACES", nullptr};
  TSharedLibrary fLibrary;
  decltype(&GetNodes) fNodes = nullptr;
  decltype(&QueryOvdLanState) fQuery = nullptr;
  decltype(&BringupOvdLan) fBringUp = nullptr;
};

TEST_F(UsbLanTest, WithoutAUsbInterfaceNoNodeExists) {
  EXPECT_EQ(fNodes(), 0);
  EXPECT_EQ(fQuery(0), 0);
  EXPECT_EQ(fBringUp(0), ENODEV);
  EXPECT_EQ(AddressesOf("lo"), "127.0.0.1/8 ") << "loopback is not changed";
}

TEST_F(UsbLanTest, AnInterfaceGetsAnAddressInTheControllersRange) {
  RunShell("ip link add bmc0 type veth peer name bmc1");
  ::setenv("ZEP_USBLAN_INTERFACES", "bmc0 bmc1", 1);
  EXPECT_EQ(fNodes(), 2);
  EXPECT_EQ(fQuery(0), 0);
  EXPECT_EQ(fBringUp(0), 0);
  EXPECT_EQ(fQuery(0), 1);
  EXPECT_EQ(fQuery(1), 0) << "the other interface is not changed";
  EXPECT_EQ(AddressesOf("bmc0"), "169.254.95.1/24 ");
  EXPECT_EQ(AddressesOf("bmc1"), "");
  EXPECT_EQ(fBringUp(1), 0);
  EXPECT_EQ(AddressesOf("bmc1"), "169.254.96.1/24 ");
  EXPECT_EQ(fBringUp(1), 0) << "a second call changes nothing";
  EXPECT_EQ(AddressesOf("bmc1"), "169.254.96.1/24 ");
  for (int node : {-1, 2, 16, 2147483647}) {
    EXPECT_EQ(fQuery(node), 0) << node;
    EXPECT_EQ(fBringUp(node), ENODEV) << node;
  }
}

TEST_F(UsbLanTest, AMissingInterfaceDoesNotRenumberTheOthers) {
  RunShell("ip link add bmc0 type veth peer name bmc1 && ip link add verylongname012 type veth peer name far0");
  ::setenv("ZEP_USBLAN_INTERFACES", "absent bmc0 verylongname0123 bmc1", 1);
  EXPECT_EQ(fNodes(), 4);
  for (int missing : {0, 2}) {
    EXPECT_EQ(fQuery(missing), 0) << missing;
    EXPECT_EQ(fBringUp(missing), ENODEV) << missing;
  }
  EXPECT_EQ(fBringUp(1), 0);
  EXPECT_EQ(fBringUp(3), 0);
  EXPECT_EQ(AddressesOf("bmc0"), "169.254.96.1/24 ");
  EXPECT_EQ(AddressesOf("bmc1"), "169.254.98.1/24 ");
  EXPECT_EQ(AddressesOf("verylongname012"), "") << "its name is only the start of the name of a missing interface";
}

TEST_F(UsbLanTest, OtherAddressesAreKept) {
  RunShell(
      "ip link add bmc0 type veth peer name far0 && ip addr add 10.1.2.3/24 dev bmc0 && ip addr add 169.254.95.1/24 dev bmc0");
  ::setenv("ZEP_USBLAN_INTERFACES", "bmc0", 1);
  EXPECT_EQ(fQuery(0), 0) << "the interface is down";
  EXPECT_EQ(fBringUp(0), 0) << "the interface already has the address";
  EXPECT_EQ(fQuery(0), 1);
  EXPECT_EQ(AddressesOf("bmc0"), "10.1.2.3/24 169.254.95.1/24 ");

  RunShell("ip addr flush dev bmc0 && ip addr add 169.254.7.8/16 dev bmc0");
  EXPECT_EQ(fQuery(0), 1) << "the complete range is reachable";
  EXPECT_EQ(fBringUp(0), 0);
  EXPECT_EQ(AddressesOf("bmc0"), "169.254.7.8/16 ");
}

TEST_F(UsbLanTest, WithoutPermissionToConfigureItReturnsEPERM) {
  RunShell("ip link add bmc0 type veth peer name far0");
  ::setenv("ZEP_USBLAN_INTERFACES", "bmc0", 1);
  pid_t const child = ::fork();
  if (child == 0) ::_exit(::setuid(65534) != 0 ? 1 : fBringUp(0));
  int status = 0;
  ::waitpid(child, &status, 0);
  EXPECT_EQ(WEXITSTATUS(status), EPERM);
  EXPECT_EQ(fQuery(0), 0);
}

// ---- The link over it ----

class NodesTest : public UsbLanTest {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    UsbLanTest::SetUp();
    if (HasFatalFailure() || IsSkipped()) return;
    std::filesystem::current_path(BuildPath("lib"));  // the directory with ovdusblan.so
  }

  static std::string SerialNumberBehindTheSession() { return TIpmiClientLibrary().ReadFru(0x1CC, 7).fData; }
};

TEST_F(NodesTest, TheLinkBringsTheInterfaceUpAndConnects) {
  // The other end of the cable, with the controller, is in another network namespace.
  RunShell("ip link add bmc0 type veth peer name controller0");
  std::string const space = "zep-usblan-" + std::to_string(::getpid());
  RunShell("ip netns add " + space + " && ip link set controller0 netns " + space + " && ip -n " + space +
           " addr add 169.254.95.118/24 dev controller0 && ip -n " + space + " link set controller0 up");
  ::setenv("ZEP_USBLAN_INTERFACES", "bmc0", 1);
  std::promise<void> isReady, ends;
  std::thread controller([&] {  // the simulator ends with the thread that started it
    TUniqueFd const fd(::open(("/run/netns/" + space).c_str(), O_RDONLY | O_CLOEXEC));
    ASSERT_EQ(::setns(fd.get(), CLONE_NEWNET), 0);
    TSimulator simulator({"169.254.95.118", 623, "1234AB7", "BEHINDV"});
    simulator.WaitUntilReady();
    isReady.set_value();
    ends.get_future().wait();
  });
  isReady.get_future().wait();
  IIPMILan& link = *IIPMILan::Initialize();
  link.setAccount(0, "zepadmin", "zeppass1");
  EXPECT_TRUE(link.IpmiInBandLanConnect(0, "test"));
  EXPECT_EQ(AddressesOf("bmc0"), "169.254.95.1/24 ");
  EXPECT_EQ(SerialNumberBehindTheSession(),
            "\x07"
            "BEHINDV");
  link.IpmilanCloseConnect();
  ends.set_value();
  controller.join();
  RunShell("ip netns del " + space);
}

TEST_F(NodesTest, SixteenNodesAreConnectedOneByOne) {
  std::vector<std::unique_ptr<TSimulator>> simulators;
  IIPMILan& link = *IIPMILan::Initialize();
  for (int node = 0; node < 16; ++node) {
    std::string const& address = IIPMILan::m_LANMapping[node];
    RunShell("ip addr add " + address + "/32 dev lo");
    std::string const serialNumber = "KQ123" + std::to_string(10 + node);
    simulators.push_back(std::make_unique<TSimulator>(TSimulator::TSettings{address, 623, "1234AB7", serialNumber}));
    link.setAccount(node, "zepadmin", node == 9 ? "wrong" : "zeppass1");
  }
  for (auto const& simulator : simulators) simulator->WaitUntilReady();
  for (int node = 0; node < 16; ++node) {
    SCOPED_TRACE(node);
    EXPECT_EQ(TRootObject::GetipmiLanIns()->IpmiInBandLanConnect(node, "test"), node != 9);
    EXPECT_EQ(SerialNumberBehindTheSession(), node == 9 ? "" : "\x07KQ123" + std::to_string(10 + node));
  }
  link.IpmilanCloseConnect();
}

}  // namespace
}  // namespace NQRVZEP20
