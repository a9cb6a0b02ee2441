// SPDX-License-Identifier: Apache-2.0
#include "Connections.h"

#include <freeipmi/freeipmi.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <memory>
#include <optional>

namespace NQRVZEP20 {

namespace {

struct TCloser {
  void operator()(ipmi_ctx_t context) const noexcept {
    ::ipmi_ctx_close(context);
    ::ipmi_ctx_destroy(context);
  }
};
using TContext = std::shared_ptr<ipmi_ctx>;

TMissing WhyNotOpened(std::string const& device, int error) {
  if (error == EACCES || error == EPERM) return {kMissingNeedsRoot, "only root may use " + device};
  return {kMissingUnreadable, device + " cannot be opened: " + std::strerror(error)};
}

TFinding<std::string> FindDevice(std::vector<std::string> const& devices) {
  for (std::string const& device : devices) {
    if (::access(device.c_str(), F_OK) != 0) continue;
    if (::access(device.c_str(), R_OK | W_OK) != 0) return WhyNotOpened(device, errno);
    return device;
  }
  return TMissing{kMissingNoSource,
                  "the kernel has no /dev/ipmi0: this machine has no management controller, or the modules ipmi_si and "
                  "ipmi_devintf are not loaded"};
}

TFinding<TContext> Open(std::string const& device) {
  TContext const context(::ipmi_ctx_create(), TCloser());
  if (!context) return TMissing{kMissingUnreadable, "libfreeipmi has no memory"};
  if (::ipmi_ctx_open_inband(context.get(), IPMI_DEVICE_OPENIPMI, 0, 0, 0, device.c_str(), 0, IPMI_FLAGS_DEFAULT) == 0)
    return context;
  return TMissing{kMissingUnreadable, device + " cannot be used: " + ::ipmi_ctx_errormsg(context.get())};
}

TFinding<std::string> Send(ipmi_ctx_t context, TIpmiRequest const& request) {
  std::string const bytes = static_cast<char>(request.fCommand) + request.fData;
  std::array<char, 512> answer = {};  // the command, the completion code and the data
  int const length = ::ipmi_cmd_raw(context, 0, request.fNetFn, bytes.data(), static_cast<unsigned>(bytes.size()), answer.data(),
                                    static_cast<unsigned>(answer.size()));
  if (length >= 2) return std::string(answer.data() + 1, static_cast<std::size_t>(length) - 1);
  return TMissing{kMissingNoAnswer, std::string("the controller did not answer a command: ") + ::ipmi_ctx_errormsg(context)};
}

}  // namespace

std::vector<std::string> LocalDevices() { return {"/dev/ipmi0", "/dev/ipmi/0", "/dev/ipmidev/0"}; }

TIpmi LocalConnection(std::vector<std::string> const& devices) {
  auto const context = std::make_shared<std::optional<TFinding<TContext>>>();
  return [context, devices](TIpmiRequest const& request) {
    if (!*context) *context = FindDevice(devices).Then(Open);
    return (*context)->Then([&](TContext const& open) { return Send(open.get(), request); });
  };
}

}  // namespace NQRVZEP20
