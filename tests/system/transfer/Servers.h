// SPDX-License-Identifier: Apache-2.0
#pragma once

// Real servers on free ports of loopback, each started and stopped by a test.

#include "tests/os/HostTools.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/socket.h>

#include <chrono>
#include <cstdlib>
#include <map>

namespace NQRVZEP20 {

// Waits for at most two minutes until the condition is true, and returns whether it is. The limit is long because a machine under
// load is slow.
template <class TCondition>
bool IsTrueSoon(TCondition const& condition) {
  constexpr int kTries = 24000;
  for (int tries = 0; tries < kTries; ++tries, ::usleep(5000))
    if (condition()) return true;
  return condition();
}

// A TCP port of loopback that refuses connections. No other program can use it while the object exists.
class TClosedPort {
public:
  TClosedPort() : fSocket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    sockaddr_in name{};
    name.sin_family = AF_INET;
    name.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof name;
    auto* const address = reinterpret_cast<sockaddr*>(&name);
    if (::bind(fSocket.get(), address, size) != 0 || ::getsockname(fSocket.get(), address, &size) != 0)
      throw std::runtime_error("no port");
    fNumber = std::to_string(ntohs(name.sin_port));
  }
  std::string const& Number() const { return fNumber; }

private:
  TUniqueFd fSocket;
  std::string fNumber;
};

// A TCP port on the loopback interface that neither accepts nor refuses a connection, like one behind a firewall that drops
// packets: its queue, which has room for one connection, is full.
class TSilentPort {
public:
  TSilentPort()
      : fSocket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)), fWaiting(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    sockaddr_in name{};
    name.sin_family = AF_INET;
    name.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof name;
    auto* const address = reinterpret_cast<sockaddr*>(&name);
    bool const isBound = ::bind(fSocket.get(), address, size) == 0 && ::getsockname(fSocket.get(), address, &size) == 0;
    if (!isBound || ::listen(fSocket.get(), 0) != 0 || ::connect(fWaiting.get(), address, size) != 0)
      throw std::runtime_error("no port");
    fNumber = std::to_string(ntohs(name.sin_port));
  }
  std::string const& Number() const { return fNumber; }

private:
  TUniqueFd fSocket, fWaiting;
  std::string fNumber;
};

// A script of tests/system/transfer/servers, which runs while the object exists. The script prints one line of NAME=VALUE words
// when it is ready. If another program has taken its port, it is started again.
class TServer {
public:
  TServer(std::string const& script, std::vector<std::string> const& arguments,
          std::map<std::string, std::string> const& environment = {}) {
    for (int tries = 0; tries < 3 && fWords.empty(); ++tries) Start(script, arguments, environment);
    if (fWords.empty()) throw std::runtime_error(script + " did not start");
  }
  ~TServer() { Stop(); }
  TServer(TServer const&) = delete;
  TServer& operator=(TServer const&) = delete;

  std::string Word(std::string const& name) const { return fWords.at(name); }
  std::string Port() const { return Word("port"); }

  void Stop() {
    if (fProcess <= 0) return;
    ::kill(fProcess, SIGTERM);
    ::waitpid(fProcess, nullptr, 0);
    fProcess = 0;
  }

private:
  void Start(std::string const& script, std::vector<std::string> const& arguments,
             std::map<std::string, std::string> const& environment) {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
    fProcess = ::fork();
    if (fProcess == 0) Exec(ends[1], script, arguments, environment);
    ::close(ends[1]);
    std::string line;
    for (char next; ::read(ends[0], &next, 1) == 1 && next != '\n';) line += next;
    ::close(ends[0]);
    std::istringstream words(line);
    for (std::string word; words >> word;)
      fWords[word.substr(0, word.find('='))] = word.substr(std::min(word.size(), word.find('=') + 1));
    if (fWords.empty()) Stop();
  }

  [[noreturn]] static void Exec(int output, std::string const& script, std::vector<std::string> const& arguments,
                                std::map<std::string, std::string> const& environment) {
    ::prctl(PR_SET_PDEATHSIG, SIGTERM);  // the servers end when the test dies
    ::dup2(output, STDOUT_FILENO);
    for (auto const& [name, value] : environment) ::setenv(name.c_str(), value.c_str(), 1);
    std::string const path = SourcePath("tests/system/transfer/servers/" + script);
    std::vector<char*> texts = {const_cast<char*>(path.c_str())};
    for (std::string const& argument : arguments) texts.push_back(const_cast<char*>(argument.c_str()));
    texts.push_back(nullptr);
    ::execv(path.c_str(), texts.data());
    ::_exit(127);
  }

  pid_t fProcess = 0;
  std::map<std::string, std::string> fWords;
};

inline bool IsOnPath(std::string const& program) {
  for (char const* directory : {"/usr/sbin/", "/usr/bin/", "/sbin/", "/bin/"})
    if (::access((directory + program).c_str(), X_OK) == 0) return true;
  return false;
}

// What the server of that script lacks to be started; empty if it can be started.
inline std::string WhyNoServer(std::string const& script) {
  if (::geteuid() != 0) return "root, whom the servers need";
  for (char const* program : {"python3", "openssl", "ss"})
    if (!IsOnPath(program)) return program;
  if (script == "ftp.sh") return IsOnPath("proftpd") ? "" : "proftpd (package proftpd-core)";
  if (script == "sftp.sh") return IsOnPath("sshd") ? "" : "sshd (package openssh-server)";
  if (script == "proxy.sh") return IsOnPath("tinyproxy") ? "" : "tinyproxy";
  return "";
}

// A directory that a server shows as "/". Its users can access it.
class TServedTree {
public:
  TServedTree() {
    std::filesystem::permissions(fDir.Path(), std::filesystem::perms(0755));
    std::filesystem::create_directory(fDir.Path("tree"));
  }
  std::string Path() const { return fDir.Path("tree"); }
  std::string Path(std::string const& name) const { return fDir.Path("tree/" + name); }
  std::string Beside(std::string const& name) const { return fDir.Path(name); }

private:
  TTempDir fDir;
};

// An FTP or SFTP server with its own directory. Its users have the password "secret": "zep" may read and write, the other one
// ("readonly" for FTP, "guest" for SFTP) may not write.
class TFileServer {
public:
  explicit TFileServer(std::string const& protocol, std::map<std::string, std::string> environment = {})
      : fProtocol(protocol), fServer(protocol + ".sh", {"0", fTree.Path()}, WithLog(std::move(environment), fTree)) {}

  TServedTree const& Tree() const { return fTree; }
  std::string Port() const { return fServer.Port(); }
  std::string Host(std::string const& user = "zep", std::string const& password = "secret") const {
    return HostAt(Port(), user, password);
  }
  static std::string HostAt(std::string const& port, std::string const& user = "zep", std::string const& password = "secret") {
    return user + ":" + password + "@127.0.0.1:" + port;
  }
  std::string Url(std::string const& path) const { return fProtocol + "://" + Host() + "/" + path; }
  std::string UrlAt(std::string const& port, std::string const& path) const {
    return fProtocol + "://" + HostAt(port) + "/" + path;
  }
  std::string Log() const { return ReadFile(fTree.Beside("log")); }  // the commands that the server logged

private:
  static std::map<std::string, std::string> WithLog(std::map<std::string, std::string> environment, TServedTree const& tree) {
    environment["FTP_LOG"] = environment["SFTP_LOG"] = tree.Beside("log");
    return environment;
  }

  TServedTree fTree;
  std::string fProtocol;
  TServer fServer;
};

// For use in a child: afterwards no libcurl can be loaded. Returns false if the child may not mount.
inline bool HideLibcurl() {
  if (::unshare(CLONE_NEWNS) != 0 || ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) return false;
  for (char const* name : {"libcurl.so", "libcurl.so.4"})
    for (char const* directory : {"/usr/lib/x86_64-linux-gnu/", "/lib/x86_64-linux-gnu/", "/usr/lib/", "/usr/lib64/"}) {
      std::string const path = std::string(directory) + name;
      if (std::filesystem::exists(path) && ::mount("/dev/null", path.c_str(), nullptr, MS_BIND, nullptr) != 0) return false;
    }
  return true;
}

inline double SecondsSince(std::chrono::steady_clock::time_point start) {
  return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

}  // namespace NQRVZEP20
