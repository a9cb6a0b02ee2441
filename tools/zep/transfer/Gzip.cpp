// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Gzip.h"

#include <zlib.h>

#include <new>

namespace NQRVZEP20::zep {

namespace {

constexpr int kGzipFormat = 16;  // added to the window bits; without it zlib writes the zlib format

// A compressor, which owns its memory.
class TDeflater {
public:
  TDeflater() {
    if (::deflateInit2(&fStream, Z_DEFAULT_COMPRESSION, Z_DEFLATED, MAX_WBITS + kGzipFormat, MAX_MEM_LEVEL, Z_DEFAULT_STRATEGY) !=
        Z_OK)
      throw std::bad_alloc();
  }
  ~TDeflater() { ::deflateEnd(&fStream); }
  TDeflater(TDeflater const&) = delete;
  TDeflater& operator=(TDeflater const&) = delete;

  z_stream* operator->() { return &fStream; }
  z_stream* Get() { return &fStream; }

private:
  z_stream fStream{};
};

}  // namespace

std::string Gzipped(std::string const& bytes) {
  TDeflater deflater;
  std::string packed(::deflateBound(deflater.Get(), bytes.size()), '\0');  // large enough for a single call
  deflater->next_in = reinterpret_cast<Bytef*>(const_cast<char*>(bytes.data()));
  deflater->avail_in = static_cast<uInt>(bytes.size());
  deflater->next_out = reinterpret_cast<Bytef*>(packed.data());
  deflater->avail_out = static_cast<uInt>(packed.size());
  ::deflate(deflater.Get(), Z_FINISH);
  packed.resize(deflater->total_out);
  return packed;
}

}  // namespace NQRVZEP20::zep
