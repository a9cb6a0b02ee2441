#include "Password.h"

#include "Text.h"

#include <fcntl.h>
#include <termios.h>
#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kVariable = "ZEP_BMC_PASSWORD";

std::string PasswordIn(std::string const& path) {
  std::ifstream file(path);
  std::string line;
  if (!std::getline(file, line)) throw std::runtime_error("there is no password in " + Printable(path));
  return line;
}

std::string TakeOutOfTheEnvironment() {
  std::string password = std::getenv(kVariable);
  ::unsetenv(kVariable);
  return password;
}

// The terminal of the process, without echo for as long as this lives.
class TQuietTerminal {
public:
  TQuietTerminal() : fFd(::open("/dev/tty", O_RDWR | O_CLOEXEC)) {
    if (fFd < 0 || ::tcgetattr(fFd, &fOld) != 0)
      throw std::runtime_error("there is no terminal to ask for the password: set ZEP_BMC_PASSWORD or use --password-file");
    termios quiet = fOld;
    // An interrupt arrives as a character that ends the line, so that it cannot leave the terminal without echo.
    quiet.c_lflag &= ~static_cast<tcflag_t>(ECHO | ISIG);
    quiet.c_cc[VEOL] = fOld.c_cc[VINTR];
    ::tcsetattr(fFd, TCSAFLUSH, &quiet);
  }
  ~TQuietTerminal() {
    Write("\n");
    ::tcsetattr(fFd, TCSAFLUSH, &fOld);
    ::close(fFd);
  }
  TQuietTerminal(TQuietTerminal const&) = delete;
  TQuietTerminal& operator=(TQuietTerminal const&) = delete;

  bool Write(std::string const& text) const { return ::write(fFd, text.data(), text.size()) >= 0; }

  std::string ReadLine() const {
    std::string line;
    char c = 0;
    while (::read(fFd, &c, 1) == 1 && c != '\n') {
      if (c == static_cast<char>(fOld.c_cc[VINTR])) throw std::runtime_error("no password was given");
      line += c;
    }
    if (c != '\n') throw std::runtime_error("no password was given");
    return line;
  }

private:
  int const fFd;
  termios fOld;
};

std::string AskAtTheTerminal(std::string const& user) {
  TQuietTerminal const terminal;
  terminal.Write("Password of " + Printable(user) + ": ");
  return terminal.ReadLine();
}

}  // namespace

std::string AskForPassword(std::string const& user, std::string const& file) {
  if (!file.empty()) return PasswordIn(file);
  if (std::getenv(kVariable) != nullptr) return TakeOutOfTheEnvironment();
  return AskAtTheTerminal(user);
}

}  // namespace NQRVZEP20::zep
