// SPDX-License-Identifier: Apache-2.0
#pragma once

// Management controllers for tests: the simulator ipmi_sim on addresses of a network namespace, peers that misbehave, and
// the platform library that talks to them.

#include "core/Handles.h"
#include "platform/include/ipmiClient.h"
#include "tests/Support.h"

#include <netinet/in.h>

#include <atomic>
#include <chrono>
#include <map>
#include <mutex>
#include <optional>

namespace NQRVZEP20 {

// Whether the simulator is installed and this user may make network namespaces. A test that needs more than loopback's high
// ports calls EnterNetworkNamespace first.
bool HasIpmiBed();
bool CanMakeNetworks();  // iproute2, and the right to make network namespaces
inline constexpr char const* kIpmiBedNeeds = "ipmi_sim (package openipmi), ip (package iproute2), and root";

// Moves the calling thread, and the processes that it starts, into a network of its own in which only loopback is up. For
// the rest of the process.
void EnterNetworkNamespace();

// A simulated controller; ended with the object. Its account is zepadmin, its FRU data holds the given texts.
class TSimulator {
public:
  struct TSettings {
    std::string address = "127.0.0.1";
    int port = 623;
    std::string model = "1234AB7";
    std::string serialNumber = "KQ12345";
    std::string password = "zeppass1";
    std::string fru = {};  // a whole FRU image instead of the two
  };

  explicit TSimulator(TSettings const& settings);
  ~TSimulator();
  TSimulator(TSimulator const&) = delete;
  TSimulator& operator=(TSimulator const&) = delete;

  // It starts in the background: waits until it listens. To be called before it is used.
  void WaitUntilReady();

  void Stop() const;  // it receives nothing until it goes on
  void GoOn() const;

private:
  int fScript;         // process id of the script that runs it
  int fSimulator = 0;  // process id of the simulator, once it is ready
  TUniqueFd fOutput;
};

// Receives the datagrams of a UDP port of 127.0.0.1 on a thread of its own and hands them to a function, whose result, if
// any, is sent back.
class TUdpPeer {
public:
  using TAnswer = std::function<std::optional<std::string>(std::string const&)>;

  TUdpPeer(int port, TAnswer answer);
  ~TUdpPeer();

  int Received() const { return fReceived; }

private:
  void Run();

  TUniqueFd fSocket;
  TAnswer fAnswer;
  std::atomic<int> fReceived{0};
  std::atomic<bool> fEnds{false};
  std::thread fThread;
};

// A bad network between clients and a controller: passes the datagrams that come to a UDP port of 127.0.0.1 on to the
// controller at another, and its answers back, as a rule says. On a thread of its own.
class TRelay {
public:
  struct TDatagram {
    bool isAnswer;
    int place;  // among those of its direction, from 0
    std::string bytes;
  };
  // After what delay each copy of a datagram is passed on; without any it is lost.
  using TFate = std::vector<std::chrono::milliseconds>;
  // May change the datagram's bytes.
  using TRule = std::function<TFate(TDatagram&)>;

  TRelay(int port, int controllersPort, TRule rule);
  ~TRelay();

  std::vector<std::string> Requests() const;  // all that came from clients, oldest first

  static TFate AtOnce() { return {std::chrono::milliseconds(0)}; }

private:
  struct TWaiting;

  void Run();
  void Take(bool isAnswer);
  void PassOn(TWaiting const& waiting);

  TUniqueFd fClients, fController;
  TRule fRule;
  sockaddr_in fClient{};  // the latest
  int fPlaces[2] = {0, 0};
  std::multimap<std::chrono::steady_clock::time_point, TWaiting> fWaiting;
  mutable std::mutex fMutex;
  std::vector<std::string> fRequests;
  std::atomic<bool> fEnds{false};
  std::thread fThread;
};

// Sends a datagram on to the controller at 127.0.0.1 and that port and returns its answer.
std::optional<std::string> AskOf(int port, std::string const& datagram);

// Takes version 2.0 out of a controller's answer to Get Channel Authentication Capabilities; other packets stay as they are.
std::string WithoutVersion2(std::string answer);

// libipmiClient.so of the build, loaded as the core loads it.
struct TIpmiClientLibrary {
  TIpmiClientLibrary();

  decltype(&OpenConnection) open;
  decltype(&SendIpmiCommand) send;
  decltype(&CloseConnection) close;

  // Opens as zepadmin.
  int Open(int port, char const* host = "127.0.0.1") const;

  // Reads FRU data of device 0.
  struct TRead {
    int result;
    int completionCode;
    std::string data;  // the count and what follows
  };
  TRead ReadFru(unsigned offset, unsigned char count, unsigned char device = 0) const;

  // Adds an entry to the controller's event log; returns the library's result.
  int AddEvent() const;

  // How many entries the event log has; -1 when the controller does not tell.
  int Events() const;
};

}  // namespace NQRVZEP20
