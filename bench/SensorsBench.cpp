// SPDX-License-Identifier: Apache-2.0

// Fills the namespace of the Sensors provider: on this machine, and for a written machine with many sensors and a long log. The
// peer is a fixed time.

#include "TMemoryNamespace.h"
#include "providers/sensors/SensorsNamespace.h"

#include <benchmark/benchmark.h>
#include <stdlib.h>
#include <boost/make_shared.hpp>

#include <filesystem>
#include <fstream>
#include <string>

namespace {

using namespace NQRVZEP20;
namespace fs = std::filesystem;

// 128 sensors, as of two processors with 56 cores, 16 memory modules, and 4,000 records of the log, 40 of them about errors.
class TWrittenMachine {
public:
  TWrittenMachine() {
    std::string name = fs::temp_directory_path() / "zep-sensors.XXXXXX";
    fRoot = ::mkdtemp(name.data());
    for (int chip = 0; chip < 16; ++chip)
      for (int sensor = 1; sensor <= 8; ++sensor) WriteSensor(chip, sensor);
    for (int module = 0; module < 16; ++module) WriteModule(module);
    std::string log;
    for (int i = 0; i < 4000; ++i)
      log += "6," + std::to_string(i) + ",1000000,-;" +
             (i % 100 == 0 ? "I/O error, dev sda, sector 1\n" : "usb 1-1: new high-speed USB device number 2 using xhci_hcd\n") +
             " SUBSYSTEM=usb\n";
    Write("dev/kmsg", log);
    Write("proc/uptime", "1000.0 1.0\n");
    Write("proc/stat", "cpu\nbtime 1700000000\n");
  }
  TWrittenMachine(TWrittenMachine const&) = delete;
  TWrittenMachine& operator=(TWrittenMachine const&) = delete;
  ~TWrittenMachine() { fs::remove_all(fRoot); }

  std::string const& GetRoot() const { return fRoot; }

private:
  void Write(std::string const& path, std::string const& text) const {
    fs::path const file = fs::path(fRoot) / path;
    fs::create_directories(file.parent_path());
    std::ofstream(file) << text;
  }

  void WriteSensor(int chip, int sensor) const {
    std::string const directory = "sys/class/hwmon/hwmon" + std::to_string(chip) + "/", prefix = "temp" + std::to_string(sensor);
    Write(directory + "name", "coretemp\n");
    Write(directory + prefix + "_input", "45000\n");
    Write(directory + prefix + "_max", "80000\n");
    Write(directory + prefix + "_crit", "100000\n");
    Write(directory + prefix + "_label", "Core " + std::to_string(sensor) + "\n");
  }

  void WriteModule(int module) const {
    std::string const directory = "sys/devices/system/edac/mc/mc0/dimm" + std::to_string(module) + "/";
    Write(directory + "dimm_label", "DIMM " + std::to_string(module) + "\n");
    Write(directory + "dimm_ce_count", "0\n");
    Write(directory + "dimm_ue_count", "0\n");
  }

  std::string fRoot;
};

void Fill(benchmark::State& state, std::string const& root) {
  for (auto _ : state) {
    auto const ns = boost::make_shared<TMemoryNamespace>("root/bench");
    FillSensorsNamespace(TMachineFiles(root), *ns);
    benchmark::DoNotOptimize(ns);
  }
}

void Machine_Zep(benchmark::State& state) { Fill(state, "/"); }
BENCHMARK(Machine_Zep)->UseRealTime()->Unit(benchmark::kMicrosecond);

void Written_Zep(benchmark::State& state) {
  TWrittenMachine const machine;
  Fill(state, machine.GetRoot());
}
BENCHMARK(Written_Zep)->UseRealTime()->Unit(benchmark::kMicrosecond);

void Twenty_Milliseconds(benchmark::State& state) {
  for (auto _ : state) state.SetIterationTime(0.020);
}
BENCHMARK(Twenty_Milliseconds)->UseManualTime()->Iterations(3)->Unit(benchmark::kMicrosecond);

}  // namespace
