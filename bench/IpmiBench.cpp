// SPDX-License-Identifier: Apache-2.0

// Compares zep with ipmitool, each run as a program, for reading the identity of a remote server from a simulated
// controller; the inventory of a controller with 66 sensors with ipmitool's table of sensors, both with cached sensor records; a
// query of a hundred controllers with a query of the slowest one alone; and the checksum of a message with a plain loop. Needs
// root, to create its own network namespace.

#include "IIPMILan.h"

#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <net/if.h>
#include <sched.h>
#include <signal.h>
#include <spawn.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

constexpr int kControllers = 4;               // simulators; each has room for 63 sessions
constexpr char const* kSilent = "192.0.2.2";  // an address that never answers
constexpr char const* kWithSensors = "127.2.0.99";

std::string AddressOf(int controller) { return "127.2.0." + std::to_string(controller % kControllers + 1); }

void Do(std::string const& command) {
  if (std::system(command.c_str()) != 0) throw std::runtime_error("failed: " + command);
}

std::string ReplaceAll(std::string text, std::string const& from, std::string const& to) {
  for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size()) text.replace(at, from.size(), to);
  return text;
}

// The commands for the simulator to have the six sensors of the tests, and the fan among them sixty times more.
std::string ManySensors() {
  std::ifstream file(ZEP_SOURCE_DIR "/tests/system/ipmi/sim/sensors.emu");
  std::string all, fan;
  for (std::string line; std::getline(file, line); all += line + "\n")
    if (line.find(" 0x31 ") != std::string::npos) fan += line + "\n";
  constexpr int first = 0x60, more = 60;
  for (int number = first; number < first + more; ++number) {
    char text[8];
    std::snprintf(text, sizeof text, " 0x%02x ", number);
    all += ReplaceAll(fan, " 0x31 ", text);
  }
  return all;
}

std::string FileOf(std::string const& name, std::string const& text) {
  std::string const path = "/tmp/zep-ipmi-bench-" + std::to_string(::getpid()) + name;
  std::ofstream(path) << text;
  return path;
}

// The network in which everything runs: the controllers on loopback, and an interface to an address that never answers.
class TNetwork {
public:
  TNetwork() {
    if (::unshare(CLONE_NEWNET) != 0) throw std::runtime_error("no network namespace");
    Do("ip link set lo up && ip link add silent0 type veth peer name silent1 && ip link set silent0 arp off up && "
       "ip link set silent1 up && ip addr add 192.0.2.1/24 dev silent0");
    ::setenv("ZEP_BMC_PASSWORD", "zeppass1", 1);
    for (int n = 0; n < kControllers; ++n) Start(AddressOf(n));
    std::string const sensors = FileOf(".emu", ManySensors());
    Start(kWithSensors, "--more " + sensors);
    ::unlink(sensors.c_str());
  }
  ~TNetwork() {
    for (pid_t simulator : fSimulators) ::kill(simulator, SIGTERM);
    for (std::FILE* script : fScripts) ::pclose(script);
  }

private:
  void Start(std::string const& address, std::string const& more = "") {
    std::FILE* const script = ::popen(
        (ZEP_SOURCE_DIR "/tests/system/ipmi/sim/start.sh --addr " + address + " " + more + " 623 2>/dev/null").c_str(), "re");
    int simulator = 0;
    if (std::fscanf(script, "ready pid %d", &simulator) != 1) throw std::runtime_error("no simulator");
    fScripts.push_back(script);
    fSimulators.push_back(simulator);
  }

  std::vector<std::FILE*> fScripts;
  std::vector<pid_t> fSimulators;
};

void UseNetwork() { static TNetwork const network; }

// Runs a program and returns its exit status and its output.
std::pair<int, std::string> OutputOf(std::vector<std::string> const& command) {
  int ends[2];
  if (::pipe2(ends, O_CLOEXEC) != 0) return {-1, ""};
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);
  posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
  std::vector<char*> arguments;
  for (std::string const& argument : command) arguments.push_back(const_cast<char*>(argument.c_str()));
  arguments.push_back(nullptr);
  pid_t child = -1;
  ::posix_spawnp(&child, arguments[0], &actions, nullptr, arguments.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  ::close(ends[1]);
  std::string output;
  char chunk[4096];
  for (ssize_t got; (got = ::read(ends[0], chunk, sizeof chunk)) > 0;) output.append(chunk, static_cast<std::size_t>(got));
  ::close(ends[0]);
  int status = -1;
  if (child > 0) ::waitpid(child, &status, 0);
  return {WEXITSTATUS(status), output};
}

void RunRepeatedly(benchmark::State& state, std::vector<std::string> const& command, std::string const& expected,
                   int status = 0) {
  auto const [result, output] = OutputOf(command);
  if (result != status || output.find(expected) == std::string::npos) return state.SkipWithError("unexpected result");
  for (auto _ : state) {
    auto run = OutputOf(command);
    benchmark::DoNotOptimize(run);
  }
}

void Identity_Zep(benchmark::State& state) {
  UseNetwork();
  RunRepeatedly(state, {ZEP_PROGRAM, "remote", AddressOf(0), "--user", "zepadmin"}, "KQ12345");
}
BENCHMARK(Identity_Zep)->UseRealTime();

// The same three reads as zep, but in one session.
void Identity_ipmitool(benchmark::State& state) {
  UseNetwork();
  std::string const reads = FileOf(".reads",
                                   "raw 0x0a 0x11 0x00 0xac 0x01 0x1e\nraw 0x0a 0x11 0x00 0xac 0x01 0x1e\n"
                                   "raw 0x0a 0x11 0x00 0xcc 0x01 0x1e\n");
  RunRepeatedly(state,
                {"ipmitool", "-I", "lanplus", "-C", "3", "-H", AddressOf(0), "-U", "zepadmin", "-P", "zeppass1", "exec", reads},
                "4b 51 31 32 33 34 35");
  ::unlink(reads.c_str());
}
BENCHMARK(Identity_ipmitool)->UseRealTime();

// The controller, its accounts, FRU data and event log, too. The first run fills the cache.
void Inventory_Zep(benchmark::State& state) {
  UseNetwork();
  std::string const cache = "/tmp/zep-ipmi-bench-" + std::to_string(::getpid()) + ".cache";
  ::setenv("XDG_CACHE_HOME", cache.c_str(), 1);
  RunRepeatedly(state, {ZEP_PROGRAM, "remote", kWithSensors, "--user", "zepadmin", "--inventory"}, "4500 RPM");
  std::filesystem::remove_all(cache);
}
BENCHMARK(Inventory_Zep)->UseRealTime();

void Inventory_ipmitool(benchmark::State& state) {
  UseNetwork();
  std::string const cache = FileOf(".sdr", "");
  std::vector<std::string> const ipmitool = {"ipmitool",   "-I", "lanplus",  "-C", "3",       "-H",
                                             kWithSensors, "-U", "zepadmin", "-P", "zeppass1"};
  auto const with = [&](std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), ipmitool.begin(), ipmitool.end());
    return arguments;
  };
  OutputOf(with({"sdr", "dump", cache}));
  RunRepeatedly(state, with({"-S", cache, "sensor"}), "4500.000");
  ::unlink(cache.c_str());
}
BENCHMARK(Inventory_ipmitool)->UseRealTime();

// A hundred controllers at once, ten of which do not answer.
void Hundred_Zep(benchmark::State& state) {
  UseNetwork();
  std::string hosts;
  for (int n = 0; n < 100; ++n) hosts += (n % 10 == 3 ? std::string(kSilent) : AddressOf(n)) + "\n";
  std::string const file = FileOf(".hosts", hosts);
  RunRepeatedly(state, {ZEP_PROGRAM, "remote", "--hosts", file, "--parallel", "100", "--user", "zepadmin"}, "KQ12345", 2);
  ::unlink(file.c_str());
}
BENCHMARK(Hundred_Zep)->UseRealTime()->Iterations(1)->Repetitions(2);

void Slowest_Zep(benchmark::State& state) {
  UseNetwork();
  RunRepeatedly(state, {ZEP_PROGRAM, "remote", kSilent, "--user", "zepadmin"}, "unknown", 1);
}
BENCHMARK(Slowest_Zep)->UseRealTime()->Iterations(1)->Repetitions(2);

// ---- Checksum of 200 bytes ----

constexpr int kMessageSize = 200;

// The offset of the message's last byte, which the compiler cannot know in advance.
int LastPlace() {
  int last = kMessageSize - 1;
  benchmark::DoNotOptimize(last);
  return last;
}

std::vector<char> Message() {
  std::vector<char> message(kMessageSize);
  for (int n = 0; n < kMessageSize; ++n) message[static_cast<std::size_t>(n)] = static_cast<char>(n * 7);
  return message;
}

void Checksum_Zep(benchmark::State& state) {
  std::vector<char> message = Message();
  char* const bytes = message.data();
  benchmark::DoNotOptimize(bytes);
  NQRVZEP20::IIPMILan& link = *NQRVZEP20::IIPMILan::Initialize();
  for (auto _ : state) {
    benchmark::ClobberMemory();  // the compiler must assume changed bytes and sum them each time
    char sum = link.GenSum(message.data(), 0, LastPlace());
    benchmark::DoNotOptimize(sum);
  }
}
BENCHMARK(Checksum_Zep);

void Checksum_Loop(benchmark::State& state) {
  std::vector<char> message = Message();
  char* const bytes = message.data();
  benchmark::DoNotOptimize(bytes);
  for (auto _ : state) {
    benchmark::ClobberMemory();  // the compiler must assume changed bytes and sum them each time
    unsigned char sum = 0;
    int const last = LastPlace();
    for (int n = 0; n <= last; ++n)
      sum = static_cast<unsigned char>(sum + static_cast<unsigned char>(message[static_cast<std::size_t>(n)]));
    sum = static_cast<unsigned char>(-sum);
    benchmark::DoNotOptimize(sum);
  }
}
BENCHMARK(Checksum_Loop);

}  // namespace
