// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Ethtool.h"

#include "tests/Support.h"
#include "tests/providers/network/NetlinkBytes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/ethtool.h>

namespace NQRVZEP20 {
namespace {

std::string SettingsBytes(std::uint32_t speed, int duplex, int port, int words, std::vector<std::uint32_t> const& masks) {
  ethtool_link_settings settings = {};
  settings.speed = speed;
  settings.duplex = static_cast<std::uint8_t>(duplex);
  settings.port = static_cast<std::uint8_t>(port);
  settings.autoneg = AUTONEG_ENABLE;
  settings.link_mode_masks_nwords = static_cast<std::int8_t>(words);
  std::string bytes(reinterpret_cast<char const*>(&settings), sizeof settings);
  for (std::uint32_t const mask : masks) bytes += BytesOf(mask);
  return bytes;
}

TEST(EthtoolTest, LinkSettingsAreThoseOfTheDriver) {
  TLinkSettings const settings(SettingsBytes(1000, DUPLEX_FULL, PORT_TP, 2, {0x2f, 0, 0x20, 0, 0x08, 0}));
  EXPECT_EQ(*settings.fSpeed, 1'000'000'000u);
  EXPECT_TRUE(*settings.fIsFullDuplex);
  EXPECT_TRUE(*settings.fIsAutonegotiating);
  EXPECT_EQ(*settings.fConnector, "Twisted Pair");
  EXPECT_EQ(settings.fSupported->size(), 5u);
  EXPECT_EQ(settings.fAdvertised->at(0).fName, "1000baseT/Full");
  EXPECT_EQ(settings.fOfPartner->at(0).fName, "100baseT/Full");
  EXPECT_EQ(settings.fSupportedFeatures.Why().fReason, "the driver reports no such feature");
  TLinkSettings const withFeatures(SettingsBytes(1000, DUPLEX_FULL, PORT_TP, 1, {0xe0, 0x2060, 0}));
  EXPECT_EQ(*withFeatures.fSupportedFeatures, (std::vector<std::string>{"Autoneg", "TP"}));
  EXPECT_EQ(*withFeatures.fAdvertisedFeatures, (std::vector<std::string>{"Autoneg", "Pause"}));
}

TEST(EthtoolTest, UnknownSettingsAreMissing) {
  TLinkSettings const settings(SettingsBytes(UINT32_MAX, DUPLEX_UNKNOWN, 0x77, 1, {0, 0x40, 0}));
  EXPECT_EQ(settings.fSpeed.Why().fReason, "the driver reports the speed as unknown");
  EXPECT_EQ(settings.fIsFullDuplex.Why().fReason, "the driver reports the duplex mode as unknown");
  EXPECT_EQ(settings.fConnector.Why().fReason, "the driver reports the connector as unknown");
  EXPECT_EQ(settings.fSupported.Why().fReason, "the driver reports no link mode");
  EXPECT_EQ(settings.fAdvertised.Why().fReason, "the driver reports no link mode");
  EXPECT_FALSE(TLinkSettings(SettingsBytes(0, DUPLEX_HALF, PORT_NONE, 0, {})).fSpeed);
}

TEST(EthtoolTest, MasksThatExceedTheAnswerAreMissing) {
  for (int const words : {-128, -4, 0, 2, 127}) {
    TLinkSettings const settings(SettingsBytes(1000, DUPLEX_FULL, PORT_FIBRE, words, {0x20}));
    EXPECT_EQ(settings.fSupported.Why().fReason, "the driver reports the link modes as unknown") << words;
    EXPECT_EQ(*settings.fConnector, "FIBRE");
  }
}

TEST(EthtoolTest, EveryLengthOfAnAnswerIsRead) {
  std::string const whole = SettingsBytes(1000, DUPLEX_FULL, PORT_TP, 1, {0x20, 0x20, 0x20});
  for (std::size_t size = 0; size < whole.size(); ++size) EXPECT_FALSE(TLinkSettings(whole.substr(0, size)).fOfPartner) << size;
  EXPECT_EQ(TLinkSettings(std::string()).fSpeed.Why().fReason, "the driver's answer is too short");
  EXPECT_EQ(TDriverInfo(std::string(100, 'x')).fDriver.Why().fReason, "the driver's answer is too short");
  EXPECT_EQ(PermanentAddressIn("abc").Why().fReason, "the driver's answer is too short");
  EXPECT_EQ(TWakeOnLan(std::string("abc")).fIsSupported.Why().fReason, "the driver's answer is too short");
}

TEST(EthtoolTest, DriverAndFirmwareAreTexts) {
  ethtool_drvinfo info = {};
  std::memcpy(info.driver, "e1000e", 6);
  std::memset(info.version, 'v', sizeof info.version);  // without a zero byte
  std::memcpy(info.fw_version, "N/A", 3);
  TDriverInfo const driver(BytesOf(info));
  EXPECT_EQ(*driver.fDriver, "e1000e");
  EXPECT_EQ(*driver.fVersion, std::string(32, 'v'));
  EXPECT_EQ(driver.fFirmware.Why().fReason, "the driver does not report it");
}

TEST(EthtoolTest, ThePermanentAddressHasItsStatedSize) {
  std::string const header = BytesOf(std::uint32_t(ETHTOOL_GPERMADDR)) + BytesOf(std::uint32_t(6));
  EXPECT_EQ(*PermanentAddressIn(header + "\x52\x54\x00\x12\x34\x56\x77"s), "525400123456");
  EXPECT_EQ(*PermanentAddressIn(header + "\x52"), "52");
  EXPECT_EQ(PermanentAddressIn(header + std::string(6, '\0')).Why().fCode, "placeholder");
}

TEST(EthtoolTest, WakeOnLanIsSupportedAndEnabled) {
  ethtool_wolinfo info = {};
  info.supported = WAKE_MAGIC;
  TWakeOnLan const wake(BytesOf(info));
  EXPECT_TRUE(*wake.fIsSupported);
  EXPECT_FALSE(*wake.fIsEnabled);
}

TEST(EthtoolTest, APortWithoutADriverHasAReason) {
  TMachineFiles const thisMachine("/");
  EXPECT_EQ(AskDriverInfo(thisMachine, "lo").Why().fReason, "ethtool: the driver does not report it");
  EXPECT_EQ(AskLinkSettings(thisMachine, "no-such-port").Why().fReason, "ethtool: No such device");
  EXPECT_EQ(AskDriverInfo(thisMachine, std::string(100, 'x')).Why().fReason, "ethtool: No such device");
}

}  // namespace
}  // namespace NQRVZEP20
