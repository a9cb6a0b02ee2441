#pragma once

#include "platform/include/ipmiClient.h"

#include <array>
#include <cstddef>
#include <memory>
#include <string>
#include <vector>

struct ipmi_ctx;

namespace ipmi {

// Longer requests fit no message over the LAN.
constexpr int kMaxRequestLength = 255;

// Which controller, and as whom. The password is wiped at the end.
struct TTarget {
  std::string host, port, user, password;

  ~TTarget();
};

struct TBytes {
  unsigned char const* data;
  std::size_t size;
};

struct TAnswer {
  unsigned char completionCode;
  std::size_t length;  // of the data
  std::array<unsigned char, kIpmiClientResponseSize> data;
};

// A session with a controller, as administrator. Closed when it goes out of scope. What its functions return is of the list
// in ipmiClient.h.
class TSession {
public:
  explicit TSession(TTarget target);

  int Open();

  // Sends a command and waits for its answer. A session that has expired is opened again once.
  int Send(unsigned char netFn, unsigned char command, TBytes request, TAnswer& answer);

private:
  struct TContextCloser {
    void operator()(ipmi_ctx* context) const noexcept;
  };
  using TContext = std::unique_ptr<ipmi_ctx, TContextCloser>;

  // Both return an error number of libfreeipmi, 0 for success. A context that failed to open cannot be used again.
  int TryToOpen(int way);
  int TryToSend(unsigned char netFn, std::vector<unsigned char> const& message, TAnswer& answer);

  TTarget fTarget;
  TContext fContext;       // null: not open
  int fWayThatWorked = 0;  // an index of kWays
};

}  // namespace ipmi
