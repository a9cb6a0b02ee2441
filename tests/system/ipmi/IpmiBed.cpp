// SPDX-License-Identifier: Apache-2.0
#include "tests/system/ipmi/IpmiBed.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <net/if.h>
#include <poll.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/wait.h>

#include <csignal>
#include <cstring>

namespace NQRVZEP20 {
namespace {

bool IsOnPath(std::string const& program) { return std::system(("command -v " + program + " >/dev/null 2>&1").c_str()) == 0; }

sockaddr_in Loopback(int port) {
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_port = htons(static_cast<std::uint16_t>(port));
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  return address;
}

bool IsReadable(int fd, int milliseconds) {
  pollfd polled = {fd, POLLIN, 0};
  return ::poll(&polled, 1, milliseconds) > 0;
}

std::string Receive(int fd, sockaddr_in* from) {
  std::string datagram(2048, '\0');
  socklen_t size = sizeof *from;
  ssize_t const got =
      ::recvfrom(fd, datagram.data(), datagram.size(), 0, reinterpret_cast<sockaddr*>(from), from ? &size : nullptr);
  datagram.resize(got > 0 ? static_cast<std::size_t>(got) : 0);
  return datagram;
}

TUniqueFd BoundSocket(int port) {
  TUniqueFd socket(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  sockaddr_in const address = Loopback(port);
  if (::bind(socket.get(), reinterpret_cast<sockaddr const*>(&address), sizeof address) != 0)
    throw std::runtime_error("port in use");
  return socket;
}

}  // namespace

bool HasIpmiBed() { return IsOnPath("ipmi_sim") && CanMakeNetworks(); }

bool CanMakeNetworks() { return ::geteuid() == 0 && IsOnPath("ip") && std::system("unshare --net true >/dev/null 2>&1") == 0; }

void EnterNetworkNamespace() {
  if (::unshare(CLONE_NEWNET) != 0) throw std::runtime_error("no network namespace");
  TUniqueFd const socket(::socket(AF_INET, SOCK_DGRAM, 0));
  ifreq request{};
  std::strcpy(request.ifr_name, "lo");
  request.ifr_flags = IFF_UP | IFF_RUNNING;
  if (::ioctl(socket.get(), SIOCSIFFLAGS, &request) != 0) throw std::runtime_error("loopback does not come up");
}

// ---- The simulator ----

TSimulator::TSimulator(TSettings const& settings) {
  int ends[2];
  if (::pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
  fOutput.reset(ends[0]);
  TUniqueFd const output(ends[1]);
  std::string const port = std::to_string(settings.fPort);
  std::vector<char const*> arguments = {ZEP_IPMI_SIM_START,        "--addr",   settings.fAddress.c_str(),      "--model",
                                        settings.fModel.c_str(),   "--serial", settings.fSerialNumber.c_str(), "--password",
                                        settings.fPassword.c_str()};
  if (!settings.fFru.empty()) arguments.insert(arguments.end(), {"--fru", settings.fFru.c_str()});
  if (!settings.fMore.empty()) arguments.insert(arguments.end(), {"--more", settings.fMore.c_str()});
  if (settings.fHasLan) arguments.push_back("--lan");
  arguments.insert(arguments.end(), {port.c_str(), nullptr});
  fScript = ::fork();
  if (fScript == 0) {
    ::prctl(PR_SET_PDEATHSIG, SIGTERM);
    ::dup2(output.get(), STDOUT_FILENO);
    ::execv(arguments[0], const_cast<char**>(arguments.data()));
    ::_exit(127);
  }
}

TSimulator::~TSimulator() {
  if (fSimulator > 0) GoOn();  // a stopped process cannot end
  ::kill(fScript, SIGTERM);
  ::waitpid(fScript, nullptr, 0);
}

void TSimulator::WaitUntilReady() {
  std::string line;
  constexpr int kLongestMilliseconds = 20000;
  for (char byte; IsReadable(fOutput.get(), kLongestMilliseconds) && ::read(fOutput.get(), &byte, 1) == 1 && byte != '\n';)
    line += byte;
  if (std::sscanf(line.c_str(), "ready pid %d", &fSimulator) != 1)
    throw std::runtime_error("the simulator did not come up: " + line);
}

void TSimulator::Stop() const { ::kill(fSimulator, SIGSTOP); }
void TSimulator::GoOn() const { ::kill(fSimulator, SIGCONT); }

// ---- Peers that misbehave ----

TUdpPeer::TUdpPeer(int port, TAnswer answer) : fSocket(BoundSocket(port)), fAnswer(std::move(answer)) {
  fThread = std::thread([this] { Run(); });
}

TUdpPeer::~TUdpPeer() {
  fEnds = true;
  fThread.join();
}

void TUdpPeer::Run() {
  while (!fEnds) {
    if (!IsReadable(fSocket.get(), 20)) continue;
    sockaddr_in from{};
    std::string const datagram = Receive(fSocket.get(), &from);
    ++fReceived;
    if (auto const answer = fAnswer(datagram))
      ::sendto(fSocket.get(), answer->data(), answer->size(), 0, reinterpret_cast<sockaddr*>(&from), sizeof from);
  }
}

struct TRelay::TWaiting {
  bool fIsAnswer;
  std::string fBytes;
};

TRelay::TRelay(int port, int controllersPort, TRule rule)
    : fClients(BoundSocket(port)), fController(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0)), fRule(std::move(rule)) {
  sockaddr_in const controller = Loopback(controllersPort);
  ::connect(fController.get(), reinterpret_cast<sockaddr const*>(&controller), sizeof controller);
  fThread = std::thread([this] { Run(); });
}

TRelay::~TRelay() {
  fEnds = true;
  fThread.join();
}

std::vector<std::string> TRelay::Requests() const {
  std::lock_guard const lock(fMutex);
  return fRequests;
}

void TRelay::Run() {
  while (!fEnds) {
    for (bool const isAnswer : {false, true})
      if (IsReadable((isAnswer ? fController : fClients).get(), 1)) Take(isAnswer);
    while (!fWaiting.empty() && fWaiting.begin()->first <= std::chrono::steady_clock::now())
      PassOn(fWaiting.extract(fWaiting.begin()).mapped());
  }
}

void TRelay::Take(bool isAnswer) {
  TDatagram datagram = {isAnswer, fPlaces[isAnswer]++,
                        Receive((isAnswer ? fController : fClients).get(), isAnswer ? nullptr : &fClient)};
  if (!isAnswer) {
    std::lock_guard const lock(fMutex);
    fRequests.push_back(datagram.fBytes);
  }
  for (auto const delay : fRule(datagram))
    fWaiting.emplace(std::chrono::steady_clock::now() + delay, TWaiting{isAnswer, datagram.fBytes});
}

void TRelay::PassOn(TWaiting const& waiting) {
  if (waiting.fIsAnswer)
    ::sendto(fClients.get(), waiting.fBytes.data(), waiting.fBytes.size(), 0, reinterpret_cast<sockaddr*>(&fClient),
             sizeof fClient);
  else
    ::send(fController.get(), waiting.fBytes.data(), waiting.fBytes.size(), 0);
}

std::optional<std::string> AskOf(int port, std::string const& datagram) {
  // One source address for all requests, as in a session.
  static TUniqueFd const socket(::socket(AF_INET, SOCK_DGRAM, 0));
  while (IsReadable(socket.get(), 0)) Receive(socket.get(), nullptr);  // discards a late answer
  sockaddr_in const address = Loopback(port);
  ::sendto(socket.get(), datagram.data(), datagram.size(), 0, reinterpret_cast<sockaddr const*>(&address), sizeof address);
  if (!IsReadable(socket.get(), 300)) return std::nullopt;
  return Receive(socket.get(), nullptr);
}

std::string WithoutVersion2(std::string answer) {
  constexpr std::size_t kAuthenticationTypeInHeader = 4, kMessage = 14, kCommand = 19, kTypes = 22, kExtended = 24;
  bool const isCapabilities = answer.size() >= 30 && answer[kAuthenticationTypeInHeader] == 0 && answer[kCommand] == 0x38;
  if (!isCapabilities) return answer;
  answer[kTypes] = static_cast<char>(answer[kTypes] & 0x7F);
  answer[kExtended] = 0;
  unsigned char sum = 0;
  for (std::size_t place = kMessage; place + 1 < answer.size(); ++place)
    sum = static_cast<unsigned char>(sum + static_cast<unsigned char>(answer[place]));
  answer.back() = static_cast<char>(-sum);
  return answer;
}

// ---- The platform library ----

TIpmiClientLibrary::TIpmiClientLibrary() {
  void* const library = ::dlopen(BuildPath("lib/libipmiClient.so").c_str(), RTLD_NOW);
  if (library == nullptr) throw std::runtime_error(::dlerror());
  fOpen = FunctionOf<decltype(OpenConnection)>(library, "OpenConnection");
  fSend = FunctionOf<decltype(SendIpmiCommand)>(library, "SendIpmiCommand");
  fClose = FunctionOf<decltype(CloseConnection)>(library, "CloseConnection");
}

int TIpmiClientLibrary::Open(int port, char const* host) const {
  return fOpen(kIpmiClientLan, host, std::to_string(port).c_str(), "zepadmin", "zeppass1");
}

TIpmiClientLibrary::TRead TIpmiClientLibrary::ReadFru(unsigned offset, unsigned char count, unsigned char device) const {
  unsigned char const request[] = {device, static_cast<unsigned char>(offset & 0xFF), static_cast<unsigned char>(offset >> 8),
                                   count};
  unsigned char response[kIpmiClientResponseSize];
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  TRead read;
  read.fResult = fSend(0x11, request, sizeof request, response, &length, &completionCode, 0x0A);
  read.fCompletionCode = completionCode;
  read.fData.assign(reinterpret_cast<char const*>(response), length);
  return read;
}

int TIpmiClientLibrary::AddEvent() const {
  unsigned char const entry[16] = {0, 0, 2, 0, 0, 0, 0, 0x41, 0, 4, 1, 1, 0x6F, 1, 2, 3};
  unsigned char response[kIpmiClientResponseSize];
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  return fSend(0x44, entry, sizeof entry, response, &length, &completionCode, 0x0A);
}

int TIpmiClientLibrary::Events() const {
  unsigned char response[kIpmiClientResponseSize];
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  bool const isTold = fSend(0x40, nullptr, 0, response, &length, &completionCode, 0x0A) == kIpmiClientOk && length > 2;
  return isTold ? response[1] + 256 * response[2] : -1;
}

}  // namespace NQRVZEP20
