// SPDX-License-Identifier: Apache-2.0

// Compares transferring a file of 1 GiB to and from a server on loopback with the curl program, which uses the same libcurl.
// A download is slower for two reasons: the curl program uses larger chunks (100 KiB instead of 16), and the library's write
// callback opens and closes its file for each chunk. The benchmark with a file that stays open shows the first reason alone.

#include "TOSSpecific.h"

#include <benchmark/benchmark.h>
#include <curl/curl.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>

namespace {

namespace fs = std::filesystem;
using NQRVZEP20::TOSSpecific;

constexpr std::size_t kSize = std::size_t{1} << 30;

// Files in memory and a server for them, one of each for the complete run.
class TBed {
public:
  TBed() {
    std::string pattern = std::string(fs::exists("/dev/shm") ? "/dev/shm" : "/tmp") + "/zep-transfer-bench.XXXXXX";
    if (::mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("no temporary directory");
    fDirectory = pattern;
    fs::permissions(fDirectory, fs::perms(0755));
    std::ofstream file(Local());
    std::string const chunk(1 << 20, 'x');
    for (std::size_t i = 0; i < kSize / chunk.size(); ++i) file << chunk;
    file.close();
    CheckSize(Local());
    fs::create_directory(fDirectory + "/tree");
    fs::copy_file(Local(), fDirectory + "/tree/big");
  }
  ~TBed() {
    if (fServer > 0 && ::kill(fServer, SIGTERM) == 0) ::waitpid(fServer, nullptr, 0);
    fs::remove_all(fDirectory);
  }
  TBed(TBed const&) = delete;
  TBed& operator=(TBed const&) = delete;

  static void CheckSize(std::string const& file) {
    if (fs::file_size(file) != kSize) throw std::runtime_error(file + " has not all of its bytes");
  }

  std::string Local() const { return fDirectory + "/local"; }
  std::string Up() const { return fDirectory + "/tree/up"; }
  std::string Down() const { return fDirectory + "/down"; }
  std::string Url(char const* script) {
    if (fScript != script) Start(script);
    return fUrl;
  }

private:
  void Start(std::string const& script) {
    if (fServer > 0 && ::kill(fServer, SIGTERM) == 0) ::waitpid(fServer, nullptr, 0);
    int ends[2];
    if (::pipe(ends) != 0) throw std::runtime_error("no pipe");
    fServer = ::fork();
    if (fServer == 0) {
      ::prctl(PR_SET_PDEATHSIG, SIGTERM);
      ::dup2(ends[1], STDOUT_FILENO);
      ::close(ends[0]);
      ::close(ends[1]);
      std::string const path = ZEP_SOURCE_DIR "/tests/system/transfer/servers/" + script + ".sh";
      ::execl(path.c_str(), path.c_str(), "0", (fDirectory + "/tree").c_str(), nullptr);
      ::_exit(127);
    }
    ::close(ends[1]);
    std::string line;
    for (char next; ::read(ends[0], &next, 1) == 1 && next != '\n';) line += next;
    ::close(ends[0]);
    std::size_t const url = line.find("url=");
    if (url == line.npos) throw std::runtime_error(script + " did not start");
    fUrl = line.substr(url + 4, line.find(' ', url) - url - 4);
    fScript = script;
  }

  std::string fDirectory, fScript, fUrl;
  pid_t fServer = 0;
};

TBed& Bed() {
  static TBed bed;
  return bed;
}

void RunCurl(std::string const& arguments) {
  if (std::system(("curl -sS -k --disable-epsv " + arguments).c_str()) != 0) throw std::runtime_error("curl failed");
}

std::size_t WriteToStream(void* data, std::size_t size, std::size_t count, void* stream) {
  return std::fwrite(data, size, count, static_cast<std::FILE*>(stream));
}

// Downloads as the library does, except that the file stays open.
void DownloadToAnOpenFile(std::string const& url) {
  CURL* const curl = curl_easy_init();
  std::FILE* const stream = std::fopen(Bed().Down().c_str(), "ab");
  curl_easy_setopt(curl, CURLOPT_FTP_USE_EPSV, 0L);
  curl_easy_setopt(curl, CURLOPT_PROXY, "");
  curl_easy_setopt(curl, CURLOPT_WRITEFUNCTION, WriteToStream);
  curl_easy_setopt(curl, CURLOPT_WRITEDATA, stream);
  curl_easy_setopt(curl, CURLOPT_URL, (url + "/big").c_str());
  bool const isDone = curl_easy_perform(curl) == CURLE_OK;
  curl_easy_cleanup(curl);
  if (std::fclose(stream) != 0 || !isDone) throw std::runtime_error("libcurl failed");
}

using TTransfer = void (*)(std::string const& url);

void UploadByZep(std::string const& url) { TOSSpecific::CurlTransferFile(url + "/up", Bed().Local(), false); }
void UploadByCurl(std::string const& url) { RunCurl("--ftp-create-dirs -T " + Bed().Local() + " " + url + "/up"); }
void DownloadByZep(std::string const& url) { TOSSpecific::CurlTransferFile(url + "/big", Bed().Down(), true); }
void DownloadByCurl(std::string const& url) { RunCurl("-o " + Bed().Down() + " " + url + "/big"); }

void Transfer(benchmark::State& state, char const* script, TTransfer transfer) {
  std::string const url = Bed().Url(script);
  for (auto _ : state) {
    transfer(url);
    state.PauseTiming();
    std::string const file = fs::exists(Bed().Up()) ? Bed().Up() : Bed().Down();
    Bed().CheckSize(file);
    fs::remove(file);
    state.ResumeTiming();
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kSize));
}

#define TRANSFER(name, script, transfer) \
  BENCHMARK_CAPTURE(Transfer, name, script, transfer)->Name(#name)->UseRealTime()->Iterations(1)->Unit(benchmark::kMillisecond)

TRANSFER(FtpUpload_Zep, "ftp", UploadByZep);
TRANSFER(FtpUpload_Curl, "ftp", UploadByCurl);
TRANSFER(FtpDownload_Zep, "ftp", DownloadByZep);
TRANSFER(FtpDownload_Curl, "ftp", DownloadByCurl);
TRANSFER(FtpDownload_OpenFile, "ftp", DownloadToAnOpenFile);

// The size of libcurl's chunks; the benchmarks below write 1 GiB in such chunks.
constexpr std::size_t kChunk = 16384;

void WriteByCallback(benchmark::State& state) {
  std::string chunk(kChunk, 'x');
  NQRVZEP20::TCurlWriteContext context{Bed().Down(), nullptr};
  for (auto _ : state) {
    for (std::size_t i = 0; i < kSize / kChunk; ++i)
      if (NQRVZEP20::curl_fwrite(chunk.data(), 1, kChunk, &context) != kChunk) throw std::runtime_error("not written");
    fs::remove(Bed().Down());
  }
}
BENCHMARK(WriteByCallback)->Name("Write_Zep")->UseRealTime()->Iterations(1)->Unit(benchmark::kMillisecond);

void WriteToAnOpenFile(benchmark::State& state) {
  std::string chunk(kChunk, 'x');
  for (auto _ : state) {
    std::FILE* const file = std::fopen(Bed().Down().c_str(), "ab");
    for (std::size_t i = 0; i < kSize / kChunk; ++i)
      if (std::fwrite(chunk.data(), 1, kChunk, file) != kChunk) throw std::runtime_error("not written");
    std::fclose(file);
    fs::remove(Bed().Down());
  }
}
BENCHMARK(WriteToAnOpenFile)->Name("Write_OpenFile")->UseRealTime()->Iterations(1)->Unit(benchmark::kMillisecond);

}  // namespace
