// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/packing/Archive.h"

#include "collect/SafeText.h"

#include <archive.h>
#include <archive_entry.h>

#include <cerrno>
#include <new>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kBlock = 65536;

mode_t TypeOf(EMemberKind kind) {
  return kind == EMemberKind::kFile ? AE_IFREG : kind == EMemberKind::kDirectory ? AE_IFDIR : AE_IFLNK;
}

EMemberKind KindOf(archive_entry* entry) {
  bool const isHardLink = archive_entry_hardlink(entry) != nullptr;
  mode_t const type = archive_entry_filetype(entry);
  if (isHardLink) return EMemberKind::kOther;
  if (type == AE_IFREG) return EMemberKind::kFile;
  if (type == AE_IFDIR) return EMemberKind::kDirectory;
  return type == AE_IFLNK ? EMemberKind::kLink : EMemberKind::kOther;
}

std::string TextOf(char const* text) { return text != nullptr ? text : ""; }

std::string WithoutEndSlash(std::string name) {
  while (name.size() > 1 && name.back() == '/') name.pop_back();
  return name;
}

// Called by libarchive, through which no exception may pass.
la_ssize_t Append(archive* of, void* bytes, void const* buffer, std::size_t length) {
  try {
    static_cast<std::string*>(bytes)->append(static_cast<char const*>(buffer), length);
    return static_cast<la_ssize_t>(length);
  } catch (std::bad_alloc const&) {
    archive_set_error(of, ENOMEM, "not enough memory");
    return ARCHIVE_FATAL;
  }
}

void Check(archive* of, bool isGood) {
  if (!isGood) throw std::runtime_error("libarchive: " + TextOf(archive_error_string(of)));
}

class TTarWriter : public TArchiveWriter {
public:
  TTarWriter();
  void Add(TMember const& member, std::string const& content) override;
  std::string Finish() override;

private:
  std::unique_ptr<archive, int (*)(archive*)> fArchive;
  std::string fBytes;
};

class TTarReader : public TArchiveReader {
public:
  explicit TTarReader(std::string const& file);
  std::optional<TMember> Next() override;
  std::string Content(std::uint64_t limit) override;
  void Read(std::uint64_t limit, std::function<void(std::string_view)> const& use) override;

private:
  [[noreturn]] void Throw(std::string const& where) const;

  std::unique_ptr<archive, int (*)(archive*)> fArchive;
  std::string fName;        // of the current member
  std::uint64_t fSize = 0;  // of its content, as its header says
};

TTarWriter::TTarWriter() : fArchive(archive_write_new(), archive_write_free) {
  if (!fArchive) throw std::bad_alloc();
  archive* const of = fArchive.get();
  // A pax archive could only have names in the character set of the locale; zep runs in the locale "C".
  Check(of, archive_write_set_format_gnutar(of) == ARCHIVE_OK && archive_write_add_filter_zstd(of) == ARCHIVE_OK &&
                archive_write_set_bytes_in_last_block(of, 1) == ARCHIVE_OK &&
                archive_write_open(of, &fBytes, nullptr, Append, nullptr) == ARCHIVE_OK);
}

void TTarWriter::Add(TMember const& member, std::string const& content) {
  std::unique_ptr<archive_entry, void (*)(archive_entry*)> const entry(archive_entry_new(), archive_entry_free);
  if (!entry) throw std::bad_alloc();
  archive_entry_set_pathname(entry.get(), member.fName.c_str());
  archive_entry_set_filetype(entry.get(), TypeOf(member.fKind));
  archive_entry_set_perm(entry.get(), member.fMode);
  archive_entry_set_mtime(entry.get(), member.fTime.tv_sec, member.fTime.tv_nsec);
  archive_entry_set_size(entry.get(), static_cast<la_int64_t>(content.size()));
  if (member.fKind == EMemberKind::kLink) archive_entry_set_symlink(entry.get(), member.fTarget.c_str());
  Check(fArchive.get(), archive_write_header(fArchive.get(), entry.get()) == ARCHIVE_OK);
  auto const written = archive_write_data(fArchive.get(), content.data(), content.size());
  Check(fArchive.get(), written == static_cast<la_ssize_t>(content.size()));
}

std::string TTarWriter::Finish() {
  Check(fArchive.get(), archive_write_close(fArchive.get()) == ARCHIVE_OK);
  return std::move(fBytes);
}

TTarReader::TTarReader(std::string const& file) : fArchive(archive_read_new(), archive_read_free) {
  if (!fArchive) throw std::bad_alloc();
  archive* const of = fArchive.get();
  archive_read_support_filter_zstd(of);
  archive_read_support_format_tar(of);
  if (archive_read_open_filename(of, file.c_str(), kBlock) != ARCHIVE_OK) Throw("");
}

std::optional<TMember> TTarReader::Next() {
  archive_entry* entry = nullptr;
  int const status = archive_read_next_header(fArchive.get(), &entry);
  if (status == ARCHIVE_EOF) return std::nullopt;
  if (status != ARCHIVE_OK) Throw(fName.empty() ? "" : " after its member " + Printable(fName));
  fName = WithoutEndSlash(TextOf(archive_entry_pathname(entry)));
  fSize = static_cast<std::uint64_t>(archive_entry_size(entry));
  EMemberKind const kind = KindOf(entry);
  if (kind != EMemberKind::kFile && fSize != 0)
    throw TArchiveError("its member " + Printable(fName) + " has a content, but is not a file");
  return TMember{kind, fName, TextOf(archive_entry_symlink(entry)), archive_entry_perm(entry), {}};
}

std::string TTarReader::Content(std::uint64_t limit) {
  std::string content;
  Read(limit, [&](std::string_view piece) { content += piece; });
  return content;
}

void TTarReader::Read(std::uint64_t limit, std::function<void(std::string_view)> const& use) {
  std::uint64_t bytes = 0;
  char buffer[kBlock];
  for (;;) {
    la_ssize_t const count = archive_read_data(fArchive.get(), buffer, sizeof buffer);
    if (count == 0) break;
    if (count < 0) Throw(" in its member " + Printable(fName));
    bytes += static_cast<std::uint64_t>(count);
    if (bytes > limit)
      throw TArchiveError("its member " + Printable(fName) + " is longer than " + std::to_string(limit) + " bytes");
    use({buffer, static_cast<std::size_t>(count)});
  }
  if (bytes != fSize) throw TArchiveError("its member " + Printable(fName) + " has a hole at its end");
}

void TTarReader::Throw(std::string const& where) const {
  throw TArchiveError("it is cut, damaged or not a zstd-compressed tar archive" + where + ": " +
                      TextOf(archive_error_string(fArchive.get())));
}

}  // namespace

std::unique_ptr<TArchiveWriter> NewArchiveWriter() { return std::make_unique<TTarWriter>(); }
std::unique_ptr<TArchiveReader> NewArchiveReader(std::string const& file) { return std::make_unique<TTarReader>(file); }

}  // namespace NQRVZEP20::zep
