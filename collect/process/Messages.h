// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The messages that a plug-in process sends: one byte for the kind, four bytes for the length of the text, and the text.
enum class EMessage : unsigned char {
  kStage,        // a stage of loading begins: one byte, an EStage
  kRegistered,   // a provider has been registered: its name
  kTaken,        // a provider has not been registered, because its name is taken: the name
  kLoaded,       // loading has ended: the time in microseconds, as text
  kFilling,      // a provider begins to fill its namespace: its name
  kBytes,        // a chunk of the serialised namespace (NamespaceBytes.h)
  kClasses,      // the chunks so far are all up to the ending of the classes
  kFilled,       // the namespace is complete: the time to fill it in microseconds, as text
  kFailed,       // loading, or the provider, has failed: why. Later messages are about the next provider
  kFatal,        // the same, but the process ends
  kExits,        // the plug-in has called exit: the status, as text
  kCost,         // the measured cost of the step that has ended (Costs.h)
  kLeftOpen,     // a descriptor that the plug-in leaves open: its number and target. Sent before kTraced
  kLeftRunning,  // a process that the plug-in leaves running: its number and name. Sent before kTraced
  kTraced,       // all descriptors and processes that the plug-in leaves have been sent
  kLogsDebug,    // the plug-in has set the log threshold so that debug entries are logged
  kUndefined,    // a symbol that no library defines, because of which loading has failed: its name
  kDone          // nothing more follows; the last kind
};

struct TMessage {
  EMessage fKind;
  std::string fText;
};

constexpr std::size_t kMessageHead = 5;
constexpr std::size_t kLongestMessage = 1024 * 1024;  // the limit for the text, in bytes

// The header of a message with a text of `length` bytes, which must be at most kLongestMessage.
std::string HeadOf(EMessage kind, std::size_t length);

// Reassembles messages from chunks of any size. After malformed data, IsBad is true and Next returns nothing.
class TMessageReader {
public:
  void Add(std::string_view bytes) { fBytes.append(bytes); }
  std::optional<TMessage> Next();  // the next complete message, if there is one
  bool IsBad() const { return fIsBad; }

private:
  std::string fBytes;
  std::size_t fAt = 0;  // the position of the next message
  bool fIsBad = false;
};

}  // namespace NQRVZEP20
