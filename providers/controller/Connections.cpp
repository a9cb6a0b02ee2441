// SPDX-License-Identifier: Apache-2.0
#include "Connections.h"

#include "IpmiText.h"

#include <array>
#include <future>
#include <memory>
#include <optional>
#include <system_error>
#include <thread>
#include <utility>

namespace NQRVZEP20 {

namespace {

using TClock = std::chrono::steady_clock;

// Without the reservation that a sensor data record is read with: a new one, after the loss of the first, is for the same record.
std::string FileOf(TIpmiRequest const& request) {
  constexpr std::uint8_t getSensorDataRecord = 0x23;
  constexpr std::size_t reservation = 2;
  std::string const bytes = {static_cast<char>(request.fNetFn), static_cast<char>(request.fCommand)};
  bool const isReserved =
      request.fNetFn == kStorage && request.fCommand == getSensorDataRecord && request.fData.size() >= reservation;
  return "ipmi/" + HexText(bytes) + "-" + HexText(request.fData.substr(isReserved ? reservation : 0));
}

TMissing TimeIsUp() { return {kMissingTimeIsUp, "the time limit for reading the controller had expired"}; }

// Keeps the reason why no further command is sent.
struct TLimit {
  TIpmi fIpmi;
  TClock::time_point fEnd;
  std::optional<TMissing> fWhyNot = std::nullopt;

  TFinding<std::string> Send(TIpmiRequest const& request) {
    if (!fWhyNot && TClock::now() >= fEnd) fWhyNot = TimeIsUp();
    if (fWhyNot) return *fWhyNot;
    auto answer = fIpmi(request);
    if (!answer) fWhyNot = answer.Why();
    return answer;
  }
};

}  // namespace

TIpmi SessionConnection(TZepController const& controller) {
  return [send = controller.fSend](TIpmiRequest const& request) -> TFinding<std::string> {
    std::array<unsigned char, kZepControllerAnswerSize> answer = {};
    unsigned const length = send(request.fNetFn, request.fCommand, reinterpret_cast<unsigned char const*>(request.fData.data()),
                                 static_cast<unsigned>(request.fData.size()), answer.data());
    if (length == 0 || length > answer.size()) return TMissing{kMissingNoAnswer, "the controller did not answer a command"};
    return std::string(reinterpret_cast<char const*>(answer.data()), length);
  };
}

TIpmi WithinTime(TIpmi ipmi, TClock::duration limit) {
  auto const state = std::make_shared<TLimit>(TLimit{std::move(ipmi), TClock::now() + limit});
  return [state](TIpmiRequest const& request) { return state->Send(request); };
}

TIpmi InThreads(TIpmi ipmi, TClock::duration limit) {
  return [ipmi = std::move(ipmi), end = TClock::now() + limit](TIpmiRequest const& request) -> TFinding<std::string> {
    std::packaged_task<TFinding<std::string>()> task([ipmi, request] { return ipmi(request); });
    auto answer = task.get_future();
    try {
      std::thread(std::move(task)).detach();
    } catch (std::system_error const& failure) {
      return TMissing{kMissingUnreadable, "no thread can be started for the controller's commands: " + failure.code().message()};
    }
    if (answer.wait_until(end) != std::future_status::ready) return TimeIsUp();
    return answer.get();
  };
}

TIpmi Recorded(TIpmi ipmi, TMachineFiles const& files) {
  return [ipmi = std::move(ipmi), files](TIpmiRequest const& request) {
    return files.Answer(FileOf(request), [&] { return ipmi(request); });
  };
}

}  // namespace NQRVZEP20
