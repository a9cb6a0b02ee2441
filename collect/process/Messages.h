// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The messages that the process of a plug-in sends: a byte for the kind, four for the length of the text, and the text.
enum class EMessage : unsigned char {
  kStage,       // a stage of the load begins: a byte, an EStage
  kRegistered,  // a provider was registered: its name
  kTaken,       // a provider was not registered, because another one has its name: the name
  kLoaded,      // the load has ended: its milliseconds, as text
  kFilling,     // a provider begins to fill its namespace: its name
  kBytes,       // a piece of its namespace (NamespaceBytes.h)
  kFilled,      // the namespace is complete: the milliseconds to fill it, as text
  kFailed,      // the load, or the provider, failed: why. What follows is about the next provider
  kFatal,       // the same, and the process ends
  kExits,       // the plug-in called exit: the status, as text
  kDone         // nothing more follows; the last kind
};

struct TMessage {
  EMessage fKind;
  std::string fText;
};

constexpr std::size_t kMessageHead = 5;
constexpr std::size_t kLongestMessage = 1024 * 1024;  // its text

// The head of a message with a text of that length, at most kLongestMessage.
std::string HeadOf(EMessage kind, std::size_t length);

// Puts messages together from pieces of any size. After wrong bytes, IsBad is true and Next returns nothing.
class TMessageReader {
public:
  void Add(std::string_view bytes) { fBytes.append(bytes); }
  std::optional<TMessage> Next();  // the next complete message, if there is one
  bool IsBad() const { return fIsBad; }

private:
  std::string fBytes;
  std::size_t fAt = 0;  // of the next message
  bool fIsBad = false;
};

}  // namespace NQRVZEP20
