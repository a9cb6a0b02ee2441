// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <new>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20::zep {

// Overwrites the bytes; the compiler cannot optimise this away.
void Wipe(void* bytes, std::size_t size);

struct THeap {
  static void* Take(std::size_t size) { return ::operator new(size); }
  static void GiveBack(void* memory, std::size_t) { ::operator delete(memory); }
};

// Memory that is overwritten before it is freed.
template <class T, class TUpstream = THeap>
struct TWipingAllocator {
  using value_type = T;

  TWipingAllocator() = default;
  template <class TOther>
  TWipingAllocator(TWipingAllocator<TOther, TUpstream> const&) {}

  T* allocate(std::size_t count) { return static_cast<T*>(TUpstream::Take(count * sizeof(T))); }
  void deallocate(T* memory, std::size_t count) {
    Wipe(memory, count * sizeof(T));
    TUpstream::GiveBack(memory, count * sizeof(T));
  }
  bool operator==(TWipingAllocator const&) const { return true; }
  bool operator!=(TWipingAllocator const&) const { return false; }
};

using TSecretBytes = std::vector<char, TWipingAllocator<char>>;

// A password. Copies are deep, and each is overwritten when it is destroyed.
//
// The first non-empty password makes the process, and children that do not call exec, inaccessible to other processes of the
// same user: no core dump, no ptrace, no access to the memory. Every password is hidden in the output of zep (Secrets.h).
class TSecret {
public:
  TSecret() = default;
  explicit TSecret(std::string_view text);

  bool IsEmpty() const { return fBytes.empty(); }
  std::string_view View() const { return {fBytes.data(), fBytes.size()}; }

  // A std::string for the library, which accepts nothing else. It is not overwritten, so use it only in a child process that
  // exits afterwards.
  std::string ForLibrary() const { return std::string(View()); }

private:
  TSecretBytes fBytes;
};

// Moves `text` into a secret and overwrites `text`.
TSecret SecretOf(std::string&& text);

}  // namespace NQRVZEP20::zep
