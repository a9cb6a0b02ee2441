// SPDX-License-Identifier: Apache-2.0
#include "TSmbiosReader.h"

#include "platform/include/smbios.h"

#include <dlfcn.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <system_error>

namespace NQRVZEP20 {

namespace {

constexpr char const* kTableFileVariable = "ZEP_SMBIOS_TABLE";
constexpr char const* kKernelTable = "/sys/firmware/dmi/tables/DMI";
constexpr char const* kLibraryName = "libsmbios.so";

constexpr std::size_t kLargestStructure = 64 * 1024;  // what is longer is cut
constexpr std::size_t kMostStructures = 4096;         // of one type, so that no library keeps us for ever

struct TLibraryCloser {
  void operator()(void* library) const { ::dlclose(library); }
};

std::string TableFile() {
  char const* file = std::getenv(kTableFileVariable);
  return file != nullptr ? file : "";
}

// ": Too many open files", or an empty text where the library has left no reason.
std::string Reason(int status, int error) {
  return status == kSmbiosFileSystemError && error != 0 ? ": " + std::generic_category().message(error) : "";
}

// `error`: what the library left in errno.
TMissing WhyTablesFailed(int status, int error, std::string const& tableFile) {
  if (!tableFile.empty()) {
    std::string const what = "the SMBIOS table file " + tableFile;
    if (status == kSmbiosFileNotFound) return {kMissingUnreadable, what + " does not exist"};
    if (status == kSmbiosAccessDenied) return {kMissingUnreadable, what + " may not be read by this user"};
    if (status == kSmbiosFileSystemError) return {kMissingUnreadable, what + " cannot be read" + Reason(status, error)};
    return {kMissingUnreadable, what + " holds no SMBIOS table"};
  }
  if (status == kSmbiosFileNotFound) return {kMissingNoTables, "no SMBIOS tables exported"};
  if (status == kSmbiosAccessDenied) return {kMissingNeedsRoot, "needs root (SMBIOS tables)"};
  return {kMissingUnreadable, "the system's SMBIOS tables cannot be read" + Reason(status, error)};
}

char const* NameOf(int type) {
  switch (type) {
    case kSmbiosBios:
      return "BIOS Information";
    case kSmbiosSystem:
      return "System Information";
    case kSmbiosChassis:
      return "Chassis";
    case kSmbiosProcessor:
      return "Processor";
    case kSmbiosMemoryDevice:
      return "Memory Device";
    default:
      return "other";
  }
}

}  // namespace

// The library, and the tables opened with it.
struct TSmbiosReader::TLibrary {
  using TGetStructure = decltype(smBiosGetFirst);

  std::unique_ptr<void, TLibraryCloser> library;
  void* tables = nullptr;
  decltype(smBiosClose)* close = nullptr;
  TGetStructure* getFirst = nullptr;
  TGetStructure* getNext = nullptr;  // null in a library that does not have it

  ~TLibrary() {
    if (tables != nullptr) close(tables);
  }

  template <class TFunction>
  TFunction* Function(char const* name) const {
    return reinterpret_cast<TFunction*>(::dlsym(library.get(), name));
  }

  // Null, and the reason, when the library cannot be used or cannot open the tables.
  static std::unique_ptr<TLibrary> Open(std::string const& tableFile, TMissing& whyNot) {
    auto opened = std::make_unique<TLibrary>();
    opened->library.reset(::dlopen(kLibraryName, RTLD_NOW | RTLD_LOCAL));
    if (!opened->library) {
      char const* reason = ::dlerror();
      whyNot = {kMissingUnreadable, std::string("the SMBIOS library cannot be loaded: ") + (reason ? reason : kLibraryName)};
      return nullptr;
    }
    auto* load = opened->Function<decltype(smBiosLoad)>("smBiosLoad");
    opened->close = opened->Function<decltype(smBiosClose)>("smBiosClose");
    opened->getFirst = opened->Function<TGetStructure>("smBiosGetFirst");
    opened->getNext = opened->Function<TGetStructure>("smBiosGetNext");
    if (load == nullptr || opened->close == nullptr || opened->getFirst == nullptr) {
      whyNot = {kMissingUnreadable, std::string(kLibraryName) + " lacks a function that it should have"};
      return nullptr;
    }
    errno = 0;
    int const status = load(nullptr, &opened->tables);
    int const error = errno;
    if (status != kSmbiosOk || opened->tables == nullptr) {
      whyNot = WhyTablesFailed(status, error, tableFile);
      return nullptr;
    }
    return opened;
  }

  // The structure that `get` hands out; empty when there is none.
  std::vector<unsigned char> Read(TGetStructure* get, int type) const {
    std::vector<unsigned char> buffer(kLargestStructure);
    int length = static_cast<int>(buffer.size());
    if (get(tables, type, buffer.data(), &length) != kSmbiosOk || length <= 0) return {};
    auto const size = std::min<std::size_t>(static_cast<std::size_t>(length), buffer.size());
    return std::vector<unsigned char>(buffer.begin(), buffer.begin() + static_cast<std::ptrdiff_t>(size));
  }
};

TSmbiosReader::TSmbiosReader() : fTableFile(TableFile()) { fLibrary = TLibrary::Open(fTableFile, fWhyNot); }

TSmbiosReader::~TSmbiosReader() = default;

TSmbiosStructure TSmbiosReader::First(int type) const {
  if (!fLibrary) return TSmbiosStructure(fWhyNot);
  auto bytes = fLibrary->Read(fLibrary->getFirst, type);
  return bytes.empty() ? TSmbiosStructure(WhyNone(type)) : TSmbiosStructure(std::move(bytes));
}

std::vector<TSmbiosStructure> TSmbiosReader::All(int type) const {
  std::vector<TSmbiosStructure> structures;
  if (!fLibrary) return structures;
  for (auto* get = fLibrary->getFirst; get != nullptr && structures.size() < kMostStructures; get = fLibrary->getNext) {
    auto bytes = fLibrary->Read(get, type);
    if (bytes.empty()) break;
    structures.emplace_back(std::move(bytes));
  }
  return structures;
}

TFinding<std::optional<TSmbiosVersion>> TSmbiosReader::Version() const {
  return VersionOfTables(fTableFile.empty() ? kKernelTable : fTableFile);
}

std::string TSmbiosReader::SourceOf(int type) const {
  std::string const source = "SMBIOS type " + std::to_string(type);
  return fTableFile.empty() ? source : source + " (file)";
}

TMissing TSmbiosReader::WhyNone(int type) const {
  if (!fLibrary) return fWhyNot;
  return {kMissingNotGiven, "the SMBIOS tables hold no structure of type " + std::to_string(type) + " (" + NameOf(type) + ")"};
}

}  // namespace NQRVZEP20
