// SPDX-License-Identifier: Apache-2.0
#pragma once

// Management controllers for tests: the simulator ipmi_sim at addresses of a network namespace, peers that misbehave, and the
// platform library that connects to them.

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
bool CanMakeNetworks();  // iproute2 is installed and this user may create network namespaces
inline constexpr char const* kIpmiBedNeeds = "ipmi_sim (package openipmi), ip (package iproute2), and root";

// Moves the calling thread, and the processes that it starts, into a new network namespace in which only loopback is up, for the
// rest of the process.
void EnterNetworkNamespace();

// A simulated controller, ended by the destructor. Its account is zepadmin; its FRU data contain the given texts.
class TSimulator {
public:
  struct TSettings {
    std::string fAddress = "127.0.0.1";
    int fPort = 623;
    std::string fModel = "1234AB7";
    std::string fSerialNumber = "KQ12345";
    std::string fPassword = "zeppass1";
    std::string fFru = {};   // a complete FRU image instead of the two texts
    std::string fMore = {};  // a file with further commands for the simulator
    bool fHasLan = false;    // whether it has the LAN parameters of sim/lan-config.sh
  };

  explicit TSimulator(TSettings const& settings);
  ~TSimulator();
  TSimulator(TSimulator const&) = delete;
  TSimulator& operator=(TSimulator const&) = delete;

  // Waits until the simulator, which starts in the background, listens. Call this before using it.
  void WaitUntilReady();

  void Stop() const;  // suspends it until GoOn
  void GoOn() const;

private:
  int fScript;         // process id of the script that runs it
  int fSimulator = 0;  // process id of the simulator, once it is ready
  TUniqueFd fOutput;
};

// Receives the datagrams of a UDP port of 127.0.0.1 on a separate thread and passes them to a function. Its result, if any, is
// sent back.
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

// A bad network between clients and a controller: forwards the datagrams that arrive at a UDP port of 127.0.0.1 to the controller
// at another port, and its answers back, according to a rule. Runs on a separate thread.
class TRelay {
public:
  struct TDatagram {
    bool fIsAnswer;
    int fPlace;  // the number of the datagram in its direction, from 0
    std::string fBytes;
  };
  // The delay of each copy of a datagram; without a delay, the datagram is lost.
  using TFate = std::vector<std::chrono::milliseconds>;
  // May change the datagram's bytes.
  using TRule = std::function<TFate(TDatagram&)>;

  TRelay(int port, int controllersPort, TRule rule);
  ~TRelay();

  std::vector<std::string> Requests() const;  // all datagrams from clients, oldest first

  static TFate AtOnce() { return {std::chrono::milliseconds(0)}; }

private:
  struct TWaiting;

  void Run();
  void Take(bool isAnswer);
  void PassOn(TWaiting const& waiting);

  TUniqueFd fClients, fController;
  TRule fRule;
  sockaddr_in fClient{};  // the client of the last request
  int fPlaces[2] = {0, 0};
  std::multimap<std::chrono::steady_clock::time_point, TWaiting> fWaiting;
  mutable std::mutex fMutex;
  std::vector<std::string> fRequests;
  std::atomic<bool> fEnds{false};
  std::thread fThread;
};

// Sends a datagram on to the controller at 127.0.0.1 and that port and returns its answer.
std::optional<std::string> AskOf(int port, std::string const& datagram);

// Removes version 2.0 from a controller's answer to Get Channel Authentication Capabilities; other packets are not changed.
std::string WithoutVersion2(std::string answer);

// The build's libipmiClient.so, loaded in the same way as the core loads it.
struct TIpmiClientLibrary {
  TIpmiClientLibrary();

  decltype(&OpenConnection) fOpen;
  decltype(&SendIpmiCommand) fSend;
  decltype(&CloseConnection) fClose;

  // Opens a session as zepadmin.
  int Open(int port, char const* host = "127.0.0.1") const;

  // Reads FRU data of device 0.
  struct TRead {
    int fResult;
    int fCompletionCode;
    std::string fData;  // the count and the data after it
  };
  TRead ReadFru(unsigned offset, unsigned char count, unsigned char device = 0) const;

  // Adds an entry to the controller's event log; returns the library's result.
  int AddEvent() const;

  // The number of entries in the event log; -1 when the controller does not report it.
  int Events() const;
};

}  // namespace NQRVZEP20
