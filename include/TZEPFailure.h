// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <memory>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// A TZEPException that also has a human-readable reason for the failure. The library throws it where a header states that a
// failure is logged and thrown; the reason is then the text of the log line. TCIMCopy throws it without logging. Plug-ins may
// throw it. Code that catches TZEPException catches it, too:
//
//   } catch (TZEPFailure const& failure) {
//     std::cerr << failure.what() << ": " << failure.Reason() << "\n";
//   }
//
// Copies share the text, and copying does not throw.
class ZEP_EXPORT TZEPFailure : public TZEPException {
public:
  // Throws std::bad_alloc if memory is exhausted.
  TZEPFailure(TZEPStatusCode code, std::string reason)
      : TZEPException(code), fReason(std::make_shared<std::string const>(std::move(reason))) {}
  TZEPFailure(TZEPFailure const&) noexcept = default;
  TZEPFailure& operator=(TZEPFailure const&) noexcept = default;
  ~TZEPFailure() override = default;

  // Why the operation failed, such as "libFan.nsp.so: cannot open shared object file". It names neither the status code nor
  // the function that failed. It may contain unprintable bytes if it quotes a file or a server. Valid as long as this
  // exception or a copy of it exists.
  std::string const& Reason() const noexcept { return *fReason; }

private:
  std::shared_ptr<std::string const> fReason;  // never null
};

}  // namespace NQRVZEP20
