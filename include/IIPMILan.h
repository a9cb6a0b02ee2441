// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <netinet/in.h>

#include <array>
#include <cstdint>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// Host, port, user name and password of the latest session that was opened or failed to open; empty before the first one and
// after IpmilanCloseConnect.
ZEP_EXPORT extern std::string gIPMILanHost;
ZEP_EXPORT extern std::string gIPMILanPort;
ZEP_EXPORT extern std::string gIPMILanUser;
ZEP_EXPORT extern std::string gIPMILanPass;

constexpr int MAXMULTINODE = 16;  // nodes of a server

// The link to the server's management controller. It uses IPMI over LAN through the platform library libipmiClient.so, and
// brings up the controller's USB-LAN interface through the platform library ./ovdusblan.so.
//
// A server has up to 16 nodes (0 to 15), each with a controller and an account of its own. The process has one link, which
// TRootObject::GetipmiLanIns returns, and one session at a time. No lock is taken: use the link from one thread at a time.
// The operations that open or close a session or bring up the USB-LAN block until the network responds or a time limit has
// passed.
class ZEP_EXPORT IIPMILan {
public:
  static constexpr int MAXMULTINODE = NQRVZEP20::MAXMULTINODE;

  // Creates a new link, makes it the link of the process and returns it. The previous link is not freed: pointers to it stay
  // valid. Kept.
  static IIPMILan* Initialize();

  // The link of the process; null before Initialize.
  static IIPMILan* GetInstance();

  IIPMILan(IIPMILan const&) = delete;
  IIPMILan& operator=(IIPMILan const&) = delete;

  // ---- Accounts ----

  // Stores the account of a node. An index above 15 is logged and changes nothing; a negative index changes nothing.
  void setAccount(int index, std::string user, std::string password);

  // The account and the host in use. While m_useGlobalAccount is true, they are those of the session (gIPMILanUser,
  // gIPMILanPass, gIPMILanHost). Otherwise they are those of the current node, and empty while there is no current node.
  std::string getCurrentUser();
  std::string getCurrentPassword();
  std::string getCurrentHost();

  // ---- Session ----

  // Brings up the USB-LAN of every node whose USB-LAN is down, through the three functions of ./ovdusblan.so. The library is
  // loaded from the working directory for the duration of the call. Returns false when the library or one of its functions is
  // missing or the library throws, otherwise true: the result for a single node is ignored. While m_useGlobalAccount is true,
  // does nothing and returns false.
  bool bringupOvdLan();

  // Opens a session on port 623. The arguments are stored (gIPMILanHost and the others) even when opening fails. Returns
  // whether the session is open. The password is written to the log in clear text, at debug severity. Kept.
  bool IpmilanOpenConnect(std::string host, std::string user, std::string password);

  // Makes `node` (0 to 15) the current node, brings up the USB-LAN of all nodes, and opens a session with the node's
  // controller at its USB-LAN address, with the node's account. A node outside that range becomes the current one, too; its
  // address and account are empty. `pluginName` is only used in log lines. If `node` is already the current node and
  // getipmiLanStatus is true, the session is reused and the result is true. While m_enabled is 0 or m_useGlobalAccount is
  // true, does nothing and returns false. If a platform library throws an int, the int is logged and the result is false;
  // other exceptions pass through.
  bool IpmiInBandLanConnect(int node, std::string pluginName);

  // Closes the session and the socket, clears gIPMILanHost and the others, and makes getipmiLanStatus false.
  void IpmilanCloseConnect();

  // Whether a response has passed ChkResponse since the last Initialize or IpmilanCloseConnect.
  bool getipmiLanStatus();

  // ---- For callers that speak the protocol themselves ----

  // Advances the sequence counter by 1 and returns it.
  std::uint64_t getSeqNum();

  // Copies `count` bytes of the session identifier when `count` is 1 to 19, otherwise nothing.
  void getIPMISessionID(char* output, int count);

  // Copy 20 bytes (getBMCPassword) and 40 bytes (getIPMIAddress), regardless of `size`. Kept.
  void getBMCPassword(char* output, int size);
  void getIPMIAddress(char* output, int size);

  int getTheSocket();
  sockaddr_in getSaServer();
  bool closeSocket();  // always true

  // Returns the IPMI checksum of the bytes at the offsets `first` to `last`: the sum of the bytes and the checksum is 0
  // modulo 256. The checksum is 0 when `last` is less than `first`.
  char GenSum(char* buffer, int first, int last);

  // Validates a response packet. The packet consists of the RMCP header, the session header, which starts at byte 4, an
  // authentication code of 16 bytes unless byte 4 is 0, the message length and the message. `lengthPosition` is the offset that
  // the length byte has in a packet with an authentication code; pass the same for a packet without one. `mode` 0 tests the
  // checksum and the completion code, 1 the checksum, 2 the completion code, any other value nothing. Success makes
  // getipmiLanStatus true; failure does not change it. A test that would need a byte before the start of the packet fails.
  // After the length byte, the buffer must contain at least as many bytes as the message length, and never less than 7.
  bool ChkResponse(char* packet, int lengthPosition, int mode);

  static IIPMILan* fgipmilanInstance;             // null before Initialize
  static std::string m_LANMapping[MAXMULTINODE];  // the USB-LAN address of each node's controller

  // ---- Fields that the caller sets. The link reads the two flags; the operations above return the other fields. ----

  std::array<char, 20> m_sessionID{};
  std::array<char, 40> m_address{};
  std::array<char, 20> m_password{};
  bool m_useGlobalAccount = false;  // true: the accounts and the USB-LAN of the nodes are not used
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
  [[maybe_unused]] IIPMILan* const fReplaced;  // the previous link, kept so that a leak checker still finds it
};

}  // namespace NQRVZEP20
