// SPDX-License-Identifier: Apache-2.0
#pragma once

// Bytes as a controller sends them, for tests.

#include <cstdint>
#include <initializer_list>
#include <string>

namespace NQRVZEP20 {

inline std::string Bytes(std::initializer_list<int> bytes) {
  std::string text;
  for (int const byte : bytes) text += static_cast<char>(byte);
  return text;
}

// With a byte at the end that makes the sum a multiple of 256.
inline std::string WithChecksum(std::string bytes) {
  unsigned sum = 0;
  for (char const byte : bytes) sum += static_cast<std::uint8_t>(byte);
  return bytes + static_cast<char>(-sum);
}

// A text in eight-bit form, after the byte with its length.
inline std::string TextField(std::string const& text) { return static_cast<char>(0xC0 | text.size()) + text; }

// An information area: `fields` after its version, its length and `head`; a field that ends the list, and the checksum.
inline std::string FruArea(std::string const& head, std::string const& fields) {
  std::string area = Bytes({1, 0}) + head + fields + "\xC1";
  area.resize((area.size() + 1 + 7) / 8 * 8 - 1);
  area[1] = static_cast<char>((area.size() + 1) / 8);
  return WithChecksum(area);
}

inline std::string ChassisArea() { return FruArea("\x17", TextField("PN-1") + TextField("CH123") + TextField("rail kit")); }

inline std::string BoardArea() {
  // 0xD0ACA0 minutes after 1996: 1 January 2022
  return FruArea(Bytes({25, 0xA0, 0xAC, 0xD0}),
                 TextField("Maker") + TextField("Board 7") + TextField("BS 9") + TextField("BP-2") + TextField("file 3"));
}

inline std::string ProductArea() {
  return FruArea(Bytes({25}), TextField("Maker") + TextField("Server Q100") + TextField("1234AB7") + TextField("v2") +
                                  TextField("KQ12345") + TextField("asset 5") + TextField(""));
}

// A FRU device with the three areas.
inline std::string FruDevice(std::string const& chassis = ChassisArea(), std::string const& board = BoardArea(),
                             std::string const& product = ProductArea()) {
  auto const units = [](std::size_t bytes) { return static_cast<int>(bytes / 8); };
  int const boardAt = 1 + units(chassis.size()), productAt = boardAt + units(board.size());
  return WithChecksum(Bytes({1, 0, 1, boardAt, productAt, 0, 0})) + chassis + board + product;
}

// A full sensor record: a temperature with one degree for each step, upper thresholds at 80, 90 and 100, readable.
inline std::string FullSensorRecord(int id, int number, std::string const& name) {
  std::string body = Bytes({0x20, 0, number, 3, 1, 0x7F, 0x68, 1, 1, 0, 0, 0, 0, 0x38, 0, 0, 1, 0, 0, 1, 0, 0, 0, 0, 0});
  body += Bytes({0, 0, 0, 0, 0, 0, 100, 90, 80, 0, 0, 0, 0, 0, 0, 0, 0}) + TextField(name);
  return Bytes({id, 0, 0x51, 1, static_cast<int>(body.size())}) + body;
}

inline std::string CompactSensorRecord(int id, int number, int type, std::string const& name) {
  std::string body =
      Bytes({0x20, 0, number, 10, 1, 0x63, 0x40, type, 0x6F, 0, 0, 0, 0, 0xFF, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0});
  body += TextField(name);
  return Bytes({id, 0, 0x51, 2, static_cast<int>(body.size())}) + body;
}

inline std::string EventOnlyRecord(int id, int number, int type, std::string const& name) {
  std::string const body = Bytes({0x20, 0, number, 12, 1, type, 0x6F, 0, 0, 0, 0}) + TextField(name);
  return Bytes({id, 0, 0x51, 3, static_cast<int>(body.size())}) + body;
}

inline std::string FruLocatorRecord(int id, int device, std::string const& name) {
  std::string const body = Bytes({0x20, device, 0x80, 0, 0, 0x10, 0, 7, 1, 0}) + TextField(name);
  return Bytes({id, 0, 0x51, 0x11, static_cast<int>(body.size())}) + body;
}

// An event of a sensor at 1 February 2021, 00:00 UTC, unless `time` says otherwise.
inline std::string SelEvent(int id, int sensorType, int sensor, int eventType, int data1, int data2 = 0xFF, int data3 = 0xFF,
                            std::uint32_t time = 1612137600) {
  auto const byte = [&](unsigned place) { return static_cast<int>(time >> 8 * place & 0xFF); };
  return Bytes({id, 0, 2, byte(0), byte(1), byte(2), byte(3), 0x20, 0, 4, sensorType, sensor, eventType, data1, data2, data3});
}

}  // namespace NQRVZEP20
