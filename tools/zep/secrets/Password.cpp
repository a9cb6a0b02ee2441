// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/Password.h"

#include "core/Handles.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/secrets/PrivateFile.h"
#include "tools/zep/secrets/Secrets.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/signalfd.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kVariable = "ZEP_BMC_PASSWORD";

TSecret PasswordIn(std::string const& path) {
  TPrivateFile const file(path);
  ThrowIfInterrupted();
  std::string const name = NameOfPrivateFile(path, "--password-file");
  if (file.Error() != 0) throw std::runtime_error(name + " cannot be read: " + file.Reason());
  if (file.Text().empty()) throw std::runtime_error("there is no password in " + name);
  file.WarnWhenOthersMayRead();
  std::string_view line = file.Text().substr(0, file.Text().find('\n'));
  if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
  return TSecret(line);
}

// The value of the variable, as it was at the start of the program.
std::optional<TSecret>& PasswordOfEnvironment() {
  static std::optional<TSecret> password;
  return password;
}

// Holds back the signals that end or stop a program; each one that arrived has its effect at the end.
class TSignalsLater {
public:
  TSignalsLater() {
    ::sigemptyset(&fSignals);
    for (int const signal : {SIGHUP, SIGINT, SIGQUIT, SIGTERM, SIGTSTP}) ::sigaddset(&fSignals, signal);
    ::sigprocmask(SIG_BLOCK, &fSignals, &fBefore);
    fFile = TUniqueFd(::signalfd(-1, &fSignals, SFD_CLOEXEC));
  }
  ~TSignalsLater() { ::sigprocmask(SIG_SETMASK, &fBefore, nullptr); }
  TSignalsLater(TSignalsLater const&) = delete;
  TSignalsLater& operator=(TSignalsLater const&) = delete;

  int File() const { return fFile.get(); }  // readable when one has arrived; below 0 when it could not be opened

private:
  sigset_t fSignals, fBefore;
  TUniqueFd fFile;
};

// The terminal of the process. It does not echo input while this exists.
class TQuietTerminal {
public:
  explicit TQuietTerminal(std::string const& otherwise) : fFile(::open("/dev/tty", O_RDWR | O_CLOEXEC)) {
    if (!fFile || ::tcgetattr(fFile.get(), &fSettings) != 0)
      throw std::runtime_error("there is no terminal on which to prompt for the password: " + otherwise);
    termios settings = fSettings;
    settings.c_lflag &= ~static_cast<tcflag_t>(ECHO);
    ::tcsetattr(fFile.get(), TCSAFLUSH, &settings);
  }
  ~TQuietTerminal() {
    Write("\n");
    ::tcsetattr(fFile.get(), TCSAFLUSH, &fSettings);
  }
  TQuietTerminal(TQuietTerminal const&) = delete;
  TQuietTerminal& operator=(TQuietTerminal const&) = delete;

  void Write(std::string const& text) const { WriteWhole(fFile.get(), text); }

  bool IsLineTypedBefore(TSignalsLater const& signals) const {
    pollfd waiting[] = {{fFile.get(), POLLIN, 0}, {signals.File(), POLLIN, 0}};
    ::poll(waiting, 2, -1);
    return waiting[1].revents == 0;
  }

  TSecret ReadLine() const {
    TSecretBytes line;
    for (char c = 0; ::read(fFile.get(), &c, 1) == 1;) {
      if (c == '\n') return TSecret({line.data(), line.size()});
      line.push_back(c);
    }
    throw std::runtime_error("no password was given");
  }

private:
  TUniqueFd const fFile;
  termios fSettings;
};

// Empty after a signal, which has had its effect when this returns.
std::optional<TSecret> AskOnce(std::string const& owner, std::string const& otherwise) {
  TSignalsLater const signals;
  TQuietTerminal const terminal(otherwise);
  terminal.Write("Password of " + Printable(MessageWithoutSecrets(owner)) + ": ");
  return terminal.IsLineTypedBefore(signals) ? std::optional(terminal.ReadLine()) : std::nullopt;
}

}  // namespace

void TakePasswordOutOfTheEnvironment(bool isNeeded) {
  std::size_t const length = std::strlen(kVariable);
  for (char** entry = environ; entry != nullptr && *entry != nullptr; ++entry) {
    if (std::strncmp(*entry, kVariable, length) != 0 || (*entry)[length] != '=') continue;
    char* const value = *entry + length + 1;
    if (isNeeded && !PasswordOfEnvironment()) PasswordOfEnvironment() = TSecret(value);  // the first counts, as for getenv
    Wipe(value, std::strlen(value));
  }
  ::unsetenv(kVariable);
}

TSecret TypedPassword(std::string const& owner, std::string const& otherwise) {
  std::optional<TSecret> password;
  while (!password) {  // again after zep was stopped and continued
    password = AskOnce(owner, otherwise);
    ThrowIfInterrupted();
  }
  return *password;
}

TSecret ControllerPassword(std::string const& user, std::string const& file) {
  if (!file.empty()) return PasswordIn(file);
  if (PasswordOfEnvironment()) return *PasswordOfEnvironment();
  return TypedPassword(user, "set ZEP_BMC_PASSWORD or use --password-file");
}

}  // namespace NQRVZEP20::zep
