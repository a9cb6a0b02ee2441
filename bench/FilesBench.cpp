// SPDX-License-Identifier: Apache-2.0

// Compares file operations with GLib, Qt (where it is installed), the standard library and cp: reading a large file and a
// pseudo-file, copying a large file and a tree, listing a directory.

#include "TOSSpecific.h"

#include <benchmark/benchmark.h>
#include <glib.h>
#include <stdlib.h>
#ifdef ZEP_HAS_QT
#include <QFile>
#endif

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;
using NQRVZEP20::TOSSpecific;

constexpr std::size_t kGibibyte = std::size_t{1} << 30;

// A directory for the files that the benchmarks work on. Each file or tree is created on first use.
class TWorkshop {
public:
  TWorkshop() {
    if (::mkdtemp(fPath) == nullptr) throw std::runtime_error("no temporary directory");
  }
  ~TWorkshop() { fs::remove_all(fPath); }

  std::string Path(std::string const& name) const { return std::string(fPath) + "/" + name; }

  std::string LargeFile() const {
    return Made("large", [](std::string const& path) {
      std::ofstream file(path);
      std::string const mebibyte(1 << 20, 'x');
      for (std::size_t i = 0; i < kGibibyte / mebibyte.size(); ++i) file << mebibyte;
    });
  }

  // 100 directories of 100 files of a kilobyte each.
  std::string Tree() const {
    return Made("tree", [](std::string const& path) {
      for (int i = 0; i < 100; ++i) {
        std::string const directory = path + "/directory" + std::to_string(i);
        fs::create_directories(directory);
        for (int j = 0; j < 100; ++j) std::ofstream(directory + "/file" + std::to_string(j)) << std::string(1000, 'x');
      }
    });
  }

  std::string LongDirectory() const {
    return Made("long", [](std::string const& path) {
      fs::create_directory(path);
      for (int i = 0; i < 10000; ++i) std::ofstream(path + "/name-of-file-" + std::to_string(i));
    });
  }

private:
  std::string Made(std::string const& name, std::function<void(std::string const&)> const& make) const {
    if (!fs::exists(Path(name))) make(Path(name));
    return Path(name);
  }

  char fPath[32] = "/tmp/zep-files-bench.XXXXXX";
} const gWorkshop;

// ---- Reading ----

using TReadSize = std::size_t (*)(char const*);  // reads the complete file and returns its size

std::size_t SizeByZep(char const* path) { return TOSSpecific::CaptureFile(path).size(); }

std::size_t SizeByGLib(char const* path) {
  char* contents = nullptr;
  gsize size = 0;
  g_file_get_contents(path, &contents, &size, nullptr);
  g_free(contents);
  return size;
}

std::size_t SizeByIfstream(char const* path) {
  std::ifstream file(path, std::ios::binary);
  std::string contents(fs::file_size(path), '\0');
  file.read(contents.data(), static_cast<std::streamsize>(contents.size()));
  return static_cast<std::size_t>(file.gcount());
}

#ifdef ZEP_HAS_QT
std::size_t SizeByQFile(char const* path) {
  QFile file(path);
  file.open(QIODevice::ReadOnly);
  return static_cast<std::size_t>(file.readAll().size());
}
#endif

std::size_t SizeByFread(char const* path) {
  std::FILE* const file = std::fopen(path, "r");
  std::string contents;
  char chunk[4096];
  while (std::size_t const got = std::fread(chunk, 1, sizeof chunk, file)) contents.append(chunk, got);
  std::fclose(file);
  return contents.size();
}

void ReadGibibyte(benchmark::State& state, TReadSize read) {
  std::string const path = gWorkshop.LargeFile();
  for (auto _ : state)
    if (read(path.c_str()) != kGibibyte) throw std::runtime_error("contents lost");
}
BENCHMARK_CAPTURE(ReadGibibyte, Zep, SizeByZep)->Name("ReadGibibyte_Zep")->UseRealTime()->Iterations(2);
#ifdef ZEP_HAS_QT
BENCHMARK_CAPTURE(ReadGibibyte, QFile, SizeByQFile)->Name("ReadGibibyte_QFile")->UseRealTime()->Iterations(2);
#endif
BENCHMARK_CAPTURE(ReadGibibyte, GLib, SizeByGLib)->Name("ReadGibibyte_GLib")->UseRealTime()->Iterations(2);
BENCHMARK_CAPTURE(ReadGibibyte, ifstream, SizeByIfstream)->Name("ReadGibibyte_ifstream")->UseRealTime()->Iterations(2);

void ReadMeminfo(benchmark::State& state, TReadSize read) {
  for (auto _ : state)
    if (read("/proc/meminfo") == 0) throw std::runtime_error("contents lost");
}
BENCHMARK_CAPTURE(ReadMeminfo, Zep, SizeByZep)->Name("ReadMeminfo_Zep");
BENCHMARK_CAPTURE(ReadMeminfo, fread, SizeByFread)->Name("ReadMeminfo_fread");

// ---- Copying ----

using TCopy = void (*)(std::string const& from, std::string const& to);

void CopyByZep(std::string const& from, std::string const& to) { TOSSpecific::FileCopy(from, to); }

void CopyByStandard(std::string const& from, std::string const& to) { fs::copy_file(from, to); }

void CopyTreeByZep(std::string const& from, std::string const& to) { TOSSpecific::DirCopy(from, to, true); }

void CopyByCp(std::string const& from, std::string const& to) {
  if (std::system(("cp -r " + from + " " + to).c_str()) != 0) throw std::runtime_error("cp failed");
}

void Copy(benchmark::State& state, std::string const& from, TCopy copy) {
  std::string const to = gWorkshop.Path("copy");
  for (auto _ : state) {
    copy(from, to);
    state.PauseTiming();
    fs::remove_all(to);
    state.ResumeTiming();
  }
}

void CopyGibibyte(benchmark::State& state, TCopy copy) { Copy(state, gWorkshop.LargeFile(), copy); }
BENCHMARK_CAPTURE(CopyGibibyte, Zep, CopyByZep)->Name("CopyGibibyte_Zep")->UseRealTime()->Iterations(2);
BENCHMARK_CAPTURE(CopyGibibyte, filesystem, CopyByStandard)->Name("CopyGibibyte_filesystem")->UseRealTime()->Iterations(2);
BENCHMARK_CAPTURE(CopyGibibyte, cp, CopyByCp)->Name("CopyGibibyte_cp")->UseRealTime()->Iterations(2);

void CopyTree(benchmark::State& state, TCopy copy) { Copy(state, gWorkshop.Tree(), copy); }
BENCHMARK_CAPTURE(CopyTree, Zep, CopyTreeByZep)->Name("CopyTree_Zep")->UseRealTime()->Iterations(2);
BENCHMARK_CAPTURE(CopyTree, cp, CopyByCp)->Name("CopyTree_cp")->UseRealTime()->Iterations(2);

// ---- Listing ----

std::vector<std::string> NamesByZep(std::string const& path) { return TOSSpecific::ListDir(path); }

std::vector<std::string> NamesByGDir(std::string const& path) {
  GDir* const dir = g_dir_open(path.c_str(), 0, nullptr);
  std::vector<std::string> names;
  while (char const* const name = g_dir_read_name(dir)) names.push_back(name);
  g_dir_close(dir);
  return names;
}

void List(benchmark::State& state, std::vector<std::string> (*names)(std::string const&)) {
  std::string const path = gWorkshop.LongDirectory();
  for (auto _ : state)
    if (names(path).size() != 10000) throw std::runtime_error("names lost");
}
BENCHMARK_CAPTURE(List, Zep, NamesByZep)->Name("List_Zep");
BENCHMARK_CAPTURE(List, GDir, NamesByGDir)->Name("List_GDir");

// Does not store the names.
void List_GDirNamesOnly(benchmark::State& state) {
  std::string const path = gWorkshop.LongDirectory();
  for (auto _ : state) {
    GDir* const dir = g_dir_open(path.c_str(), 0, nullptr);
    while (char const* name = g_dir_read_name(dir)) benchmark::DoNotOptimize(name);
    g_dir_close(dir);
  }
}
BENCHMARK(List_GDirNamesOnly);

}  // namespace
