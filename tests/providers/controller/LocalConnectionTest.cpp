// SPDX-License-Identifier: Apache-2.0

// The controller of this machine through a libfreeipmi that hangs. The functions here take the place of the library's.

#include "providers/controller/Connections.h"
#include "providers/controller/TController.h"
#include "tests/Support.h"
#include "tests/providers/controller/ControllerBytes.h"

#include <freeipmi/freeipmi.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <atomic>

namespace {

std::atomic<bool> gHangsWhenOpened{false};
std::atomic<int> gCommands{0};

[[noreturn]] void Hang() {
  for (;;) ::pause();
}

}  // namespace

extern "C" int ipmi_ctx_open_inband(ipmi_ctx_t, ipmi_driver_type_t, int, std::uint16_t, std::uint8_t, char const*, unsigned,
                                    unsigned) {
  if (gHangsWhenOpened) Hang();
  return 0;
}

// Answers Get Device ID, and then nothing more.
extern "C" int ipmi_cmd_raw(ipmi_ctx_t, std::uint8_t, std::uint8_t, void const*, unsigned, void* answer, unsigned size) {
  if (++gCommands > 1) Hang();
  std::string const id = NQRVZEP20::Bytes({1, 0, 0x20, 0x81, 0x01, 0x10, 0x02, 0x9F, 0x91, 0x12, 0, 0x02, 0x0F});
  return static_cast<int>(id.copy(static_cast<char*>(answer), size));
}

namespace NQRVZEP20 {
namespace {

class LocalConnectionTest : public testing::Test {
protected:
  LocalConnectionTest() {
    gHangsWhenOpened = false;
    gCommands = 0;
    WriteFile(fDir.Path("ipmi0"), "");
  }

  TController Read() const {
    constexpr std::chrono::milliseconds limit{2000};
    TIpmi const ipmi = WithinTime(InThreads(LocalConnection({fDir.Path("absent"), fDir.Path("ipmi0")}), limit), limit);
    auto const start = std::chrono::steady_clock::now();
    auto controller = ReadController(
        ipmi, [](std::string const&) { return nullptr; }, [](char const*, std::size_t, std::size_t) {});
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(20));
    return controller;
  }

  TTempDir const fDir;
};

TEST_F(LocalConnectionTest, AnswersBeforeACommandThatHangsAreKept) {
  auto const controller = Read();
  ASSERT_TRUE(controller.fDeviceId);
  EXPECT_EQ(controller.fDeviceId->fFirmware, "1.10");
  EXPECT_EQ(controller.fGuid.Why().fCode, kMissingTimeIsUp);
  EXPECT_EQ(controller.fLog.Why().fCode, kMissingTimeIsUp);
  EXPECT_EQ(gCommands, 2) << "no further command is sent";
}

TEST_F(LocalConnectionTest, ADeviceThatHangsWhenItIsOpenedHasTheReason) {
  gHangsWhenOpened = true;
  auto const controller = Read();
  EXPECT_EQ(controller.fDeviceId.Why().fReason, "the time limit for reading the controller had expired");
  EXPECT_EQ(gCommands, 0);
}

}  // namespace
}  // namespace NQRVZEP20
