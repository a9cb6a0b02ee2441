// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SharedObject.h"

#include "TOSSpecific.h"
#include "core/Handles.h"

#include <cxxabi.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <link.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <memory>
#include <sstream>

namespace NQRVZEP20 {

namespace {

bool IsWithin(std::uint64_t begin, std::uint64_t length, std::uint64_t end) { return begin <= end && length <= end - begin; }

// A file that is read within its bounds.
class TFile {
public:
  explicit TFile(std::string const& name) : fFd(::open(name.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC)) {
    struct stat status {};
    if (fFd && ::fstat(fFd.get(), &status) == 0 && S_ISREG(status.st_mode)) fSize = static_cast<std::uint64_t>(status.st_size);
  }

  bool Has(std::uint64_t at, std::uint64_t bytes) const { return IsWithin(at, bytes, fSize); }

  // None when they are not all in the file.
  template <class T>
  std::optional<std::vector<T>> Read(std::uint64_t at, std::uint64_t count) const {
    if (count > fSize / sizeof(T) || !Has(at, count * sizeof(T))) return std::nullopt;
    std::vector<T> elements(count);
    std::size_t const bytes = count * sizeof(T);
    if (::pread(fFd.get(), elements.data(), bytes, static_cast<off_t>(at)) != static_cast<ssize_t>(bytes)) return std::nullopt;
    return elements;
  }

private:
  TUniqueFd fFd;
  std::uint64_t fSize = 0;  // 0 for a file that is not regular or cannot be read
};

// The header of a shared object of this machine's word size; none for any other file.
std::optional<ElfW(Ehdr)> HeaderOf(TFile const& file) {
  auto const header = file.Read<ElfW(Ehdr)>(0, 1);
  if (!header || std::memcmp(header->front().e_ident, ELFMAG, SELFMAG) != 0) return std::nullopt;
  unsigned char const wordSize = sizeof(void*) == 8 ? ELFCLASS64 : ELFCLASS32;
  if (header->front().e_ident[EI_CLASS] != wordSize || header->front().e_type != ET_DYN) return std::nullopt;
  return header->front();
}

// ---- The type of processor ----

// In the byte order of this machine; none for a file that is not an ELF file. The number has one place in files of any word size.
std::optional<ElfW(Half)> ProcessorOf(std::string const& fileName) {
  auto const header = TFile(fileName).Read<Elf32_Ehdr>(0, 1);
  if (!header || std::memcmp(header->front().e_ident, ELFMAG, SELFMAG) != 0) return std::nullopt;
  constexpr unsigned char kOrder = __BYTE_ORDER__ == __ORDER_BIG_ENDIAN__ ? ELFDATA2MSB : ELFDATA2LSB;
  ElfW(Half) const number = header->front().e_machine;
  return header->front().e_ident[EI_DATA] == kOrder ? number : __builtin_bswap16(number);
}

std::string NameOfProcessor(ElfW(Half) number) {
  constexpr struct {
    ElfW(Half) fNumber;
    char const* fName;
  } kNames[] = {{EM_X86_64, "x86-64"}, {EM_386, "i386"}, {EM_AARCH64, "aarch64"}, {EM_ARM, "arm"},   {EM_RISCV, "riscv"},
                {EM_PPC64, "ppc64"},   {EM_PPC, "ppc"},  {EM_S390, "s390"},       {EM_MIPS, "mips"}, {EM_SPARCV9, "sparc64"}};
  for (auto const& known : kNames)
    if (known.fNumber == number) return known.fName;
  return "processor type " + std::to_string(number);
}

// ---- Symbols ----

bool IsExported(ElfW(Sym) const& symbol) {
  unsigned char const binding = ELF64_ST_BIND(symbol.st_info), visibility = ELF64_ST_VISIBILITY(symbol.st_other);
  bool const isDefined = symbol.st_shndx != SHN_UNDEF && symbol.st_shndx != SHN_ABS;
  return isDefined && binding != STB_LOCAL && (visibility == STV_DEFAULT || visibility == STV_PROTECTED);
}

bool IsOfLinker(std::string const& name) {
  constexpr char const* kNames[] = {"_init", "_fini", "_edata", "_end", "__bss_start"};
  return std::find(std::begin(kNames), std::end(kNames), name) != std::end(kNames);
}

// The text at that place of a table of texts, each of which ends with a zero byte. A long one is cut.
std::string TextAt(std::vector<char> const& texts, std::size_t at) {
  constexpr std::size_t kLongest = 16 * 1024;
  if (at >= texts.size()) return "";
  auto const begin = texts.begin() + static_cast<std::ptrdiff_t>(at);
  auto const end = begin + static_cast<std::ptrdiff_t>(std::min(kLongest, texts.size() - at));
  return {begin, std::find(begin, end, '\0')};
}

// The symbol that a line of the dynamic linker names as undefined; empty if it names none. A version or a file may follow.
std::string UndefinedSymbolIn(std::string const& line) {
  std::string const words = "undefined symbol: ";
  std::size_t const start = line.find(words);
  if (start == line.npos) return "";
  std::string const rest = line.substr(start + words.size());
  return rest.substr(0, rest.find_first_of("\t,"));
}

}  // namespace

bool CanBeMapped(std::string const& fileName) {
  TFile const file(fileName);
  auto const header = HeaderOf(file);
  if (!header || header->e_phentsize != sizeof(ElfW(Phdr))) return false;
  auto const segments = file.Read<ElfW(Phdr)>(header->e_phoff, header->e_phnum);
  return segments && std::all_of(segments->begin(), segments->end(), [&](ElfW(Phdr) const& segment) {
           return segment.p_type != PT_LOAD || file.Has(segment.p_offset, segment.p_filesz);
         });
}

std::string WhyOfOtherProcessor(std::string const& fileName) {
  auto const ofFile = ProcessorOf(fileName), own = ProcessorOf("/proc/self/exe");
  if (!ofFile || !own || *ofFile == *own) return "";
  return "it is built for " + NameOfProcessor(*ofFile) + ", and this process for " + NameOfProcessor(*own);
}

std::optional<std::vector<std::string>> ExportedSymbols(std::string const& fileName) {
  TFile const file(fileName);
  auto const header = HeaderOf(file);
  if (!header || header->e_shentsize != sizeof(ElfW(Shdr))) return std::nullopt;
  auto const sections = file.Read<ElfW(Shdr)>(header->e_shoff, header->e_shnum);
  if (!sections) return std::nullopt;
  auto const isTable = [](ElfW(Shdr) const& section) { return section.sh_type == SHT_DYNSYM; };
  auto const table = std::find_if(sections->begin(), sections->end(), isTable);
  if (table == sections->end() || table->sh_link >= sections->size()) return std::nullopt;
  ElfW(Shdr) const& names = (*sections)[table->sh_link];
  auto const symbols = file.Read<ElfW(Sym)>(table->sh_offset, table->sh_size / sizeof(ElfW(Sym)));
  auto const texts = file.Read<char>(names.sh_offset, names.sh_size);
  if (!symbols || !texts) return std::nullopt;

  std::vector<std::string> exported;
  for (ElfW(Sym) const& symbol : *symbols) {
    if (!IsExported(symbol)) continue;
    std::string const text = TextAt(*texts, symbol.st_name);
    if (!IsOfLinker(text)) exported.push_back(text);
  }
  return exported;
}

std::vector<std::string> UndefinedSymbols(std::string const& message, std::string const& fileName) {
  constexpr int kSeconds = 30;
  std::vector<std::string> names = {UndefinedSymbolIn(message)};
  if (names.front().empty()) return {};
  std::string output;
  TOSSpecific::SpawnProcess("ldd", {"-r", fileName}, output, kSeconds);
  std::istringstream lines(output);
  for (std::string line; std::getline(lines, line);) {
    std::string const name = UndefinedSymbolIn(line);
    bool const isKnown = name.empty() || std::find(names.begin(), names.end(), name) != names.end();
    if (!isKnown && ::dlsym(RTLD_DEFAULT, name.c_str()) == nullptr) names.push_back(name);
  }
  return names;
}

std::string Demangled(std::string const& text) {
  std::string const characters = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789_";
  std::size_t const start = text.find("_Z");
  if (start == text.npos) return text;
  std::size_t const end = std::min(text.find_first_not_of(characters, start), text.size());
  int status = 0;
  std::unique_ptr<char, void (*)(void*)> const name(
      abi::__cxa_demangle(text.substr(start, end - start).c_str(), nullptr, nullptr, &status), std::free);
  std::string const rest = Demangled(text.substr(end));
  return text.substr(0, start) + (name ? name.get() : text.substr(start, end - start)) + rest;
}

}  // namespace NQRVZEP20
