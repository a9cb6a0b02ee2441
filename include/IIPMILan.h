#pragma once

#include "ZEPExport.h"

#include <netinet/in.h>

#include <array>
#include <cstdint>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// Host, port, user name and password of the open session; empty without one.
ZEP_EXPORT extern std::string gIPMILanHost;
ZEP_EXPORT extern std::string gIPMILanPort;
ZEP_EXPORT extern std::string gIPMILanUser;
ZEP_EXPORT extern std::string gIPMILanPass;

constexpr int MAXMULTINODE = 16;  // nodes of a server

// The link to the server's management controller: IPMI over the LAN, through the platform library libipmiClient.so, with
// the controller's USB-LAN brought up by the platform library ./ovdusblan.so.
//
// A server has up to 16 nodes (0 to 15), each with a controller and an account of its own. There is one session at a time,
// and one link of the process, which TRootObject::GetipmiLanIns hands out. No lock is taken: use it from one thread at a
// time. Opening, closing and bringing up block for the network.
class ZEP_EXPORT IIPMILan {
public:
  static constexpr int MAXMULTINODE = NQRVZEP20::MAXMULTINODE;

  // Makes a new link the one of the process and returns it. An earlier one is not freed: pointers to it stay valid. Kept.
  static IIPMILan* Initialize();

  // The link of the process; null before Initialize.
  static IIPMILan* GetInstance();

  IIPMILan(IIPMILan const&) = delete;
  IIPMILan& operator=(IIPMILan const&) = delete;

  // ---- Accounts ----

  // Stores the account of a node. An index above 15 is logged and changes nothing; one below 0 changes nothing.
  void setAccount(int index, std::string user, std::string password);

  // The account and the host in use: those of the open session while m_useGlobalAccount is set, otherwise those of the
  // current node (empty while there is none).
  std::string getCurrentUser();
  std::string getCurrentPassword();
  std::string getCurrentHost();

  // ---- Session ----

  // Brings up the USB-LAN of every node that has it down, through the three functions of ./ovdusblan.so (relative to the
  // working directory, loaded for the duration of the call). False when the library or one of its functions is missing,
  // when it throws, and without trying while m_useGlobalAccount is set. What the bring-up of a node says is not asked for.
  bool bringupOvdLan();

  // Opens a session on port 623 and remembers its parameters, also when that fails. The password is written to the log in
  // clear text at debug severity. Kept.
  bool IpmilanOpenConnect(std::string host, std::string user, std::string password);

  // Connects to the controller of `node` (0 to 15) at its USB-LAN address, with the node's account; any other node becomes
  // the current one as well and is opened with an empty address and account. The name of the plug-in is for the log.
  // Without a new session when the node is the current one and a response was valid since the session began. False without
  // trying while m_enabled is 0 or m_useGlobalAccount is set.
  bool IpmiInBandLanConnect(int node, std::string pluginName);

  // Closes the session and the socket and forgets the session's parameters.
  void IpmilanCloseConnect();

  // Whether a response passed ChkResponse since the last Initialize or IpmilanCloseConnect.
  bool getipmiLanStatus();

  // ---- What a caller needs that speaks the protocol itself ----

  // Advances the sequence counter by 1 and returns it.
  std::uint64_t getSeqNum();

  // Copies `count` bytes of the session identifier when `count` is 1 to 19, else nothing.
  void getIPMISessionID(char* output, int count);

  // Copy 20 and 40 bytes, whatever the second argument says. Kept.
  void getBMCPassword(char* output, int size);
  void getIPMIAddress(char* output, int size);

  int getTheSocket();
  sockaddr_in getSaServer();
  bool closeSocket();  // always true

  // The IPMI checksum of the bytes from place `first` to place `last`: with it they add up to 0. It is 0 when `last` lies
  // below `first`.
  char GenSum(char* buffer, int first, int last);

  // Validates a response packet: RMCP header, session header from byte 4 on, a 16-byte authentication code unless byte 4
  // is 0, message length, message. `lengthPosition` is the place of the length in a packet with authentication code.
  // `mode`: 0 tests checksum and completion code, 1 the checksum, 2 the completion code, any other nothing. A success makes
  // the link's status true, a failure leaves it. A place in front of the packet is not read and fails the test that needs
  // it; behind the length byte the packet's area must hold as many bytes as that says, and at least 7.
  bool ChkResponse(char* packet, int lengthPosition, int mode);

  static IIPMILan* fgipmilanInstance;             // null before Initialize
  static std::string m_LANMapping[MAXMULTINODE];  // the USB-LAN address of each node's controller

  // ---- For the caller to fill in; the link itself only hands them out and asks the two flags ----

  std::array<char, 20> m_sessionID{};
  std::array<char, 40> m_address{};
  std::array<char, 20> m_password{};
  bool m_useGlobalAccount = false;  // accounts and USB-LAN of the nodes are passed over, the open session serves
  int m_enabled = 1;                // 0: IpmiInBandLanConnect does nothing
  int m_socket = -1;                // closed by closeSocket and IpmilanCloseConnect; -1: none
  sockaddr_in m_saServer{};

private:
  explicit IIPMILan(IIPMILan* replaced) : fReplaced(replaced) {}

  using TAccount = std::pair<std::string, std::string>;  // user name, password
  TAccount AccountOf(int node) const;
  bool OpenNode(int node);

  std::array<TAccount, MAXMULTINODE> fAccounts;
  int fCurrentNode = -1;
  bool fIsResponseValid = false;
  std::uint64_t fSequence = 0;
  [[maybe_unused]] IIPMILan* const fReplaced;  // the link before this one, so that what is never freed stays within reach
};

}  // namespace NQRVZEP20
