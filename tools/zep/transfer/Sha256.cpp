// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Sha256.h"

#include "tools/zep/packing/Checksum.h"
#include "tools/zep/processes/Interrupts.h"

#include <cerrno>
#include <cstdio>
#include <memory>
#include <system_error>
#include <vector>

namespace NQRVZEP20::zep {

std::string Sha256Of(std::string const& file) {
  std::unique_ptr<std::FILE, int (*)(std::FILE*)> const stream(std::fopen(file.c_str(), "rb"), std::fclose);
  if (!stream) throw std::system_error(errno, std::generic_category(), file);
  auto const sum = NewSha256();
  std::vector<char> chunk(65536);
  while (std::size_t const got = std::fread(chunk.data(), 1, chunk.size(), stream.get())) {
    if (PendingInterrupt() != 0) return "";
    sum->Add({chunk.data(), got});
  }
  if (PendingInterrupt() != 0) return "";
  if (std::ferror(stream.get()) != 0) throw std::system_error(EIO, std::generic_category(), file);
  return sum->Digits();
}

std::string Sha256OfText(std::string const& text) {
  auto const sum = NewSha256();
  sum->Add(text);
  return sum->Digits();
}

}  // namespace NQRVZEP20::zep
