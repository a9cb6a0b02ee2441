// SPDX-License-Identifier: Apache-2.0

// A library to be preloaded. It makes one call of a function of the C library fail, which ZEP_FAULT names as
// FUNCTION:NUMBER:ERRNO. The number counts the calls of that function from 1; with "child." before the function, it counts the
// calls of a child before its exec. For write, the error 0 means that nothing is written and -1 that the first half is; for
// select, the error 0 means a time-out of 300 seconds.
//
// Only calls between ArmFaults and DisarmFaults are counted, so that a program can prepare itself first. CallsOfFaults returns
// the number of calls of each function in between.

#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <signal.h>
#include <stdarg.h>
#include <stdio.h>
#include <stdio_ext.h>
#include <stdlib.h>
#include <string.h>
#include <sys/mman.h>
#include <sys/select.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>

#define EXPORT extern "C" __attribute__((visibility("default")))

namespace {

constexpr int kFunctions = 64;

// Shared with children, whose calls are counted as well.
struct TState {
  struct {
    char fName[32];
    int fCalls;
  } fFunctions[kFunctions];
  bool fArmed;
  bool fFired;
};

TState* gState = nullptr;
pid_t gProcess = 0;
char gFault[64] = "";
int gNumber = 0, gError = 0;

__attribute__((constructor)) void Prepare() {
  gState = static_cast<TState*>(::mmap(nullptr, sizeof(TState), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));
  char const* const fault = ::getenv("ZEP_FAULT");
  if (fault != nullptr) ::sscanf(fault, "%63[^:]:%d:%d", gFault, &gNumber, &gError);
}

// How often the function was called by now, this call included.
int Count(char const* name) {
  for (auto& function : gState->fFunctions) {
    if (function.fName[0] == '\0') ::strcpy(function.fName, name);
    if (::strcmp(function.fName, name) == 0) return ++function.fCalls;
  }
  ::abort();
}

bool IsTheOne(char const* function) {
  if (gState == nullptr || !gState->fArmed) return false;
  char name[32] = "";
  if (::getpid() != gProcess) ::strcpy(name, "child.");
  ::strcat(name, function);
  if (Count(name) != gNumber || ::strcmp(name, gFault) != 0) return false;
  gState->fFired = true;
  return true;
}

template <class TFunction>
TFunction* Next(char const* name, TFunction*) {
  return reinterpret_cast<TFunction*>(::dlsym(RTLD_NEXT, name));
}

}  // namespace

// A function that fails with a value and errno.
#define FAILING(result, name, parameters, arguments, failure) \
  EXPORT result name parameters {                             \
    static auto* const next = Next(#name, &name);             \
    if (!IsTheOne(#name)) return next arguments;              \
    errno = gError;                                           \
    return failure;                                           \
  }

FAILING(FILE*, fopen, (char const* path, char const* mode), (path, mode), nullptr)
FAILING(FILE*, fopen64, (char const* path, char const* mode), (path, mode), nullptr)
FAILING(ssize_t, read, (int fd, void* buffer, size_t length), (fd, buffer, length), -1)
FAILING(ssize_t, copy_file_range, (int from, off64_t* in, int to, off64_t* out, size_t length, unsigned int flags),
        (from, in, to, out, length, flags), -1)
FAILING(off64_t, lseek, (int fd, off64_t offset, int whence), (fd, offset, whence), -1)
FAILING(int, stat, (char const* path, struct stat* status), (path, status), -1)
FAILING(int, fstat, (int fd, struct stat* status), (fd, status), -1)
FAILING(int, mkdir, (char const* path, mode_t mode), (path, mode), -1)
FAILING(DIR*, opendir, (char const* path), (path), nullptr)
FAILING(struct dirent*, readdir, (DIR * dir), (dir), nullptr)
FAILING(char*, getcwd, (char* buffer, size_t length), (buffer, length), nullptr)
FAILING(int, setenv, (char const* name, char const* value, int overwrite), (name, value, overwrite), -1)
FAILING(int, pipe2, (int ends[2], int flags), (ends, flags), -1)
FAILING(int, dup2, (int from, int to), (from, to), -1)
FAILING(pid_t, waitpid, (pid_t child, int* status, int options), (child, status, options), -1)
FAILING(int, sigaction, (int number, struct sigaction const* action, struct sigaction* old), (number, action, old), -1)
FAILING(int, execve, (char const* path, char* const arguments[], char* const environment[]), (path, arguments, environment), -1)
FAILING(int, execvp, (char const* path, char* const arguments[]), (path, arguments), -1)
FAILING(int, system, (char const* command), (command), -1)
FAILING(int, tcgetattr, (int fd, struct termios* settings), (fd, settings), -1)
FAILING(int, tcsetattr, (int fd, int when, struct termios const* settings), (fd, when, settings), -1)
FAILING(int, usleep, (useconds_t time), (time), -1)

// Those that take further arguments, or do something all the same when they fail.

EXPORT int open(char const* path, int flags, ...) {
  static auto* const next = Next("open", &open);
  va_list arguments;
  va_start(arguments, flags);
  mode_t const mode = (flags & O_CREAT) != 0 ? va_arg(arguments, mode_t) : 0;
  va_end(arguments);
  if (!IsTheOne("open")) return next(path, flags, mode);
  errno = gError;
  return -1;
}

// Makes the underlying read fail, so that the stream has its error. The number in ZEP_FAULT is ignored.
EXPORT size_t fread(void* buffer, size_t size, size_t count, FILE* stream) {
  static auto* const next = Next("fread", &fread);
  if (IsTheOne("fread")) {
    ::__fpurge(stream);
    ::dup3(STDOUT_FILENO, ::fileno(stream), O_CLOEXEC);  // which is not open for reading
  }
  return next(buffer, size, count, stream);
}

EXPORT int select(int count, fd_set* in, fd_set* out, fd_set* special, struct timeval* limit) {
  static auto* const next = Next("select", &select);
  if (!IsTheOne("select")) return next(count, in, out, special, limit);
  errno = gError;
  bool const isOf300Seconds = limit != nullptr && limit->tv_sec == 300 && limit->tv_usec == 0;
  return gError == 0 && isOf300Seconds ? 0 : -1;
}

EXPORT int close(int fd) {
  static auto* const next = Next("close", &close);
  bool const fails = IsTheOne("close");
  int const result = next(fd);
  if (!fails) return result;
  errno = gError;
  return -1;
}

EXPORT int fclose(FILE* file) {
  static auto* const next = Next("fclose", &fclose);
  bool const fails = IsTheOne("fclose");
  int const result = next(file);
  if (!fails) return result;
  errno = gError;
  return EOF;
}

EXPORT int closedir(DIR* dir) {
  static auto* const next = Next("closedir", &closedir);
  bool const fails = IsTheOne("closedir");
  int const result = next(dir);
  if (!fails) return result;
  errno = gError;
  return -1;
}

EXPORT ssize_t write(int fd, void const* buffer, size_t length) {
  static auto* const next = Next("write", &write);
  if (!IsTheOne("write")) return next(fd, buffer, length);
  if (gError == 0) return 0;
  if (gError < 0) return next(fd, buffer, length / 2);
  errno = gError;
  return -1;
}

// A child made through here is one of fork: this function cannot return in one that shares its stack.
EXPORT pid_t vfork() {
  if (!IsTheOne("vfork")) return ::fork();
  errno = gError;
  return -1;
}

EXPORT void ArmFaults() {
  gProcess = ::getpid();
  gState->fArmed = true;
}

EXPORT bool DisarmFaults() {
  gState->fArmed = false;
  return gState->fFired;
}

EXPORT char const* CallsOfFaults() {
  static char text[4096];
  for (auto const& function : gState->fFunctions)
    if (function.fName[0] != '\0') ::sprintf(text + ::strlen(text), "%s %d\n", function.fName, function.fCalls);
  return text;
}
