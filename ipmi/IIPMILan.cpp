// SPDX-License-Identifier: Apache-2.0
#include "IIPMILan.h"

#include "core/Log.h"
#include "loaders/IpmiLibrary.h"
#include "loaders/UsbLan.h"

#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <memory>

namespace NQRVZEP20 {

std::string gIPMILanHost;
std::string gIPMILanPort;
std::string gIPMILanUser;
std::string gIPMILanPass;

IIPMILan* IIPMILan::fgipmilanInstance = nullptr;

std::string IIPMILan::m_LANMapping[MAXMULTINODE] = {
    "169.254.95.118",  "169.254.96.118",  "169.254.97.118",  "169.254.98.118",  "169.254.99.118",  "169.254.100.118",
    "169.254.101.118", "169.254.102.118", "169.254.103.118", "169.254.104.118", "169.254.105.118", "169.254.106.118",
    "169.254.107.118", "169.254.108.118", "169.254.109.118", "169.254.110.118",
};

namespace {

constexpr std::ptrdiff_t kCompletionCode = 6;           // offset in a message
constexpr std::ptrdiff_t kAuthenticationType = 4;       // offset in a packet
constexpr std::ptrdiff_t kAuthenticationCodeSize = 16;  // bytes, between the session header and the length

bool HasEntry(int node) { return node >= 0 && node < IIPMILan::MAXMULTINODE; }

std::string HostOf(int node) { return HasEntry(node) ? IIPMILan::m_LANMapping[node] : std::string(); }

char ChecksumOf(char const* bytes, std::ptrdiff_t first, std::ptrdiff_t last) {
  unsigned char sum = 0;
  for (std::ptrdiff_t place = first; place <= last; ++place)
    sum = static_cast<unsigned char>(sum + static_cast<unsigned char>(bytes[place]));
  return static_cast<char>(-sum);
}

// The length is a signed byte. A negative one leads to a byte before the message, possibly before the packet.
bool IsChecksumRight(char const* packet, std::ptrdiff_t lengthPlace) {
  if (lengthPlace < 0) return false;
  std::ptrdiff_t const message = lengthPlace + 1;
  std::ptrdiff_t const last = message + static_cast<signed char>(packet[lengthPlace]) - 1;
  return last >= 0 && ChecksumOf(packet, message, last - 1) == packet[last];
}

bool IsCompleted(char const* packet, std::ptrdiff_t lengthPlace) {
  std::ptrdiff_t const place = lengthPlace + 1 + kCompletionCode;
  return place >= 0 && packet[place] == 0;
}

// The code of a failure in the log: that of the library, or a status of ours when it could not be called.
int LoggedCodeOf(TIpmiResult const& result) { return result.fLoad ? result.fCode : static_cast<int>(StatusOf(result.fLoad)); }

}  // namespace

IIPMILan* IIPMILan::Initialize() {
  fgipmilanInstance = std::unique_ptr<IIPMILan>(new IIPMILan(fgipmilanInstance)).release();  // lives until the end of the process
  return fgipmilanInstance;
}

IIPMILan* IIPMILan::GetInstance() { return fgipmilanInstance; }

// ---- Accounts ----

void IIPMILan::setAccount(int index, std::string user, std::string password) {
  if (index >= MAXMULTINODE) {
    LogDebug("IIPMILan::setAccount index you set larger that MAXMULTINODE !!");
    return;
  }
  if (HasEntry(index)) fAccounts[static_cast<std::size_t>(index)] = {std::move(user), std::move(password)};
}

IIPMILan::TAccount IIPMILan::AccountOf(int node) const {
  return HasEntry(node) ? fAccounts[static_cast<std::size_t>(node)] : TAccount();
}

std::string IIPMILan::getCurrentUser() { return m_useGlobalAccount ? gIPMILanUser : AccountOf(fCurrentNode).first; }

std::string IIPMILan::getCurrentPassword() { return m_useGlobalAccount ? gIPMILanPass : AccountOf(fCurrentNode).second; }

std::string IIPMILan::getCurrentHost() { return m_useGlobalAccount ? gIPMILanHost : HostOf(fCurrentNode); }

// ---- Session ----

bool IIPMILan::bringupOvdLan() { return !m_useGlobalAccount && BringUpUsbLan(); }

bool IIPMILan::IpmilanOpenConnect(std::string host, std::string user, std::string password) {
  LogDebug("Enter IpmilanOpenConnect");
  LogDebug("host: ", host);
  LogDebug("username: ", user);
  LogDebug("password: ", password);  // in clear text. Kept.
  TIpmiResult const result = OpenIpmiConnection(host, user, password);
  gIPMILanHost = host;
  gIPMILanPort = kIpmiPort;
  gIPMILanUser = user;
  gIPMILanPass = password;
  if (!result) {
    LogDebug("Connection Error code:", LoggedCodeOf(result));
    LogDebug("Open IPMI Lan Connection failed. \n");
    return false;
  }
  LogDebug("Open IPMI Lan Connection successfully. \n");
  return true;
}

bool IIPMILan::OpenNode(int node) {
  fCurrentNode = node;
  bringupOvdLan();
  TAccount const account = AccountOf(node);
  return IpmilanOpenConnect(HostOf(node), account.first, account.second);
}

bool IIPMILan::IpmiInBandLanConnect(int node, std::string pluginName) {
  if (m_enabled == 0) return false;
  if (fgipmilanInstance == nullptr || m_useGlobalAccount) return false;
  if (node == fCurrentNode && getipmiLanStatus()) return true;
  try {
    bool const isOpen = OpenNode(node);
    LogDebug(isOpen ? "IPMILan Local connected success in plugin:" : "IPMILan Local connected Failed in plugin:", pluginName);
    return isOpen;
  } catch (int error) {
    // The first letter is missing. Kept.
    LogDebug("PMILan Local connected Failed in plugin: ", pluginName, ",Error Msg:", error);
    return false;
  }
}

void IIPMILan::IpmilanCloseConnect() {
  LogDebug("Enter IpmilanCloseConnect");
  CloseIpmiConnection();
  closeSocket();
  for (std::string* parameter : {&gIPMILanHost, &gIPMILanPort, &gIPMILanUser, &gIPMILanPass}) parameter->clear();
  fIsResponseValid = false;
  LogDebug("Exit IpmilanCloseConnect");
}

bool IIPMILan::getipmiLanStatus() {
  LogDebug("getipmiLanStatus = ", fIsResponseValid ? "1" : "0");
  return fIsResponseValid;
}

// ---- For callers that speak the protocol themselves ----

std::uint64_t IIPMILan::getSeqNum() {
  ++fSequence;
  LogDebug("Seqnum", fSequence);
  return fSequence;
}

void IIPMILan::getIPMISessionID(char* output, int count) {
  if (count >= 1 && count < static_cast<int>(m_sessionID.size())) std::copy_n(m_sessionID.begin(), count, output);
}

// The size is ignored. Kept.
void IIPMILan::getBMCPassword(char* output, int /*size*/) { std::copy(m_password.begin(), m_password.end(), output); }

void IIPMILan::getIPMIAddress(char* output, int /*size*/) { std::copy(m_address.begin(), m_address.end(), output); }

int IIPMILan::getTheSocket() { return m_socket; }

sockaddr_in IIPMILan::getSaServer() { return m_saServer; }

bool IIPMILan::closeSocket() {
  if (m_socket >= 0) ::close(m_socket);
  m_socket = -1;
  return true;
}

char IIPMILan::GenSum(char* buffer, int first, int last) { return ChecksumOf(buffer, first, last); }

bool IIPMILan::ChkResponse(char* packet, int lengthPosition, int mode) {
  bool const hasAuthenticationCode = packet[kAuthenticationType] != 0;
  std::ptrdiff_t const lengthPlace = std::ptrdiff_t(lengthPosition) - (hasAuthenticationCode ? 0 : kAuthenticationCodeSize);
  bool const testsChecksum = mode == 0 || mode == 1;
  bool const testsCompletion = mode == 0 || mode == 2;
  if (testsChecksum && !IsChecksumRight(packet, lengthPlace)) return false;
  if (testsCompletion && !IsCompleted(packet, lengthPlace)) return false;
  fIsResponseValid = true;
  return true;
}

}  // namespace NQRVZEP20
