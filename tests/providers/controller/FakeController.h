// SPDX-License-Identifier: Apache-2.0
#pragma once

// A management controller for tests, which answers from memory.

#include "providers/controller/Ipmi.h"
#include "tests/providers/controller/ControllerBytes.h"

#include <map>
#include <vector>

namespace NQRVZEP20 {

class TFakeController {
public:
  // The connection to it, which refers to it.
  TIpmi Connection() {
    return [this](TIpmiRequest const& request) { return AnswerTo(request); };
  }

  std::vector<std::string> fRecords;  // of sensor data
  std::vector<std::string> fEvents;
  std::string fFru;                             // the content of FRU device 0
  std::map<std::string, std::string> fAnswers;  // to other requests, by network function, command and data
  std::size_t fLongestPart = 255;               // of a record or of the FRU device
  int fTooLong = 0xCA;                          // the completion code for longer parts
  int fLostReservations = 0;                    // how many reservations others cancel
  int fFree = 1600;                             // bytes of the event log
  bool fHasLostEntries = false, fHasClock = true;
  std::size_t fRequests = 0, fMostRequests = 100000;  // after them it is silent
  bool fRepeatsRecords = false;                       // the list of records never ends
  int fAdded = 1;                                     // the time of the last addition

private:
  using TAnswer = TFinding<std::string>;

  static std::string Word(std::size_t value) { return Bytes({static_cast<int>(value & 0xFF), static_cast<int>(value >> 8)}); }
  static std::string Refusal(int code) { return Bytes({code}); }

  TAnswer AnswerTo(TIpmiRequest const& request) {
    if (++fRequests > fMostRequests) return TMissing{kMissingNoAnswer, "the controller does not answer"};
    std::string const key = Bytes({request.fNetFn, request.fCommand}) + request.fData;
    if (key.substr(0, 2) == "\x0A\x20")
      return Bytes({0, 0x51}) + Word(fRecords.size()) + Bytes({0, 0, fAdded, 0, 0, 0x60, 0, 0, 0, 0, 2});
    if (key.substr(0, 2) == "\x0A\x22") return Bytes({0, 7, 0});
    if (key.substr(0, 2) == "\x0A\x23") return RecordPart(request.fData);
    if (key.substr(0, 2) == "\x0A\x40")
      return Bytes({0, 0x51}) + Word(fEvents.size()) + Word(fFree) + std::string(8, '\0') + Bytes({fHasLostEntries ? 0x80 : 0});
    if (key.substr(0, 2) == "\x0A\x43") return Event(request.fData);
    if (key.substr(0, 2) == "\x0A\x48") return fHasClock ? Bytes({0, 0x80, 0x44, 0x17, 0x60}) : Bytes({0, 9, 0, 0, 0});
    if (key == Bytes({0x0A, 0x10, 0})) return Bytes({0}) + Word(fFru.size()) + Bytes({0});
    if (key.substr(0, 3) == Bytes({0x0A, 0x11, 0})) return FruPart(request.fData);
    auto const found = fAnswers.find(key);
    return found != fAnswers.end() ? found->second : Refusal(0xC1);
  }

  // Records are numbered from 0; 0xFFFF ends the list.
  static std::size_t IndexIn(std::string const& data) { return static_cast<std::uint8_t>(data[2]); }
  std::string Next(std::size_t index, std::size_t count) const {
    if (fRepeatsRecords) return Word(0);
    return Word(index + 1 < count ? index + 1 : 0xFFFF);
  }

  TAnswer RecordPart(std::string const& data) {
    if (fLostReservations > 0 && fLostReservations-- > 0) return Refusal(kReservationLost);
    auto const offset = static_cast<std::uint8_t>(data[4]), length = static_cast<std::uint8_t>(data[5]);
    if (length > fLongestPart) return Refusal(fTooLong);
    std::size_t const index = IndexIn(data);
    if (index >= fRecords.size()) return Refusal(0xCB);
    return Bytes({0}) + Next(index, fRecords.size()) + fRecords[index].substr(offset, length);
  }

  TAnswer FruPart(std::string const& data) const {
    auto const byte = [&](std::size_t place) { return static_cast<std::uint8_t>(data[place]); };
    std::size_t const offset = byte(1) + 256U * byte(2);
    if (offset >= fFru.size()) return Refusal(0xC9);
    if (byte(3) > fLongestPart) return Refusal(fTooLong);
    std::string const part = fFru.substr(offset, byte(3));
    return Bytes({0, static_cast<int>(part.size())}) + part;
  }

  TAnswer Event(std::string const& data) const {
    std::size_t const index = IndexIn(data);
    if (index >= fEvents.size()) return Refusal(0xCB);
    return Bytes({0}) + Next(index, fEvents.size()) + fEvents[index];
  }
};

}  // namespace NQRVZEP20
