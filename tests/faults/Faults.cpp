// SPDX-License-Identifier: Apache-2.0

// A library to be preloaded. It makes one call of a function of the C library fail, which ZEP_FAULT names as
// FUNCTION:NUMBER:ERRNO. The number counts the calls of that function from 1; with "child." before the function, it counts the
// calls of a child before its exec. For a program as a whole, "memory" is every function that allocates, and "any" every
// function.
//
// Instead of an errno: 0 means that write writes nothing, and that select has its time-out of 300 seconds; -1 means that write
// writes the first half; -9 means that the process is killed (SIGKILL) in place of the call.
//
// Only calls between ArmFaults and DisarmFaults are counted, so that a program can prepare itself first. CallsOfFaults returns
// the number of calls of each function in between. With ZEP_FAULT_REPORT=FILE the whole of main counts, its children included as
// if they were one process; then "fault", if the call was reached, and the numbers of calls go to that file when main ends. A
// program that the process starts runs without faults.

#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <stdarg.h>
#include <stdio.h>
#include <stdio_ext.h>
#include <stdlib.h>
#include <string.h>
#include <sys/file.h>
#include <sys/mman.h>
#include <sys/select.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <initializer_list>

#define EXPORT extern "C" __attribute__((visibility("default")))

namespace {

constexpr int kFunctions = 128;

// Shared with children, whose calls are counted as well.
struct TState {
  struct {
    char fName[32];
    std::atomic<int> fCalls;
  } fFunctions[kFunctions];
  std::atomic<bool> fArmed;
  std::atomic<bool> fFired;
};

TState* gState = nullptr;
pid_t gProcess = 0;
bool gIsProgram = false;
char gReport[4096] = "";
char gFault[64] = "";
int gNumber = 0, gError = 0;

__attribute__((constructor)) void Prepare() {
  gState = static_cast<TState*>(::mmap(nullptr, sizeof(TState), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));
  char const* const fault = ::getenv("ZEP_FAULT");
  if (fault != nullptr) ::sscanf(fault, "%63[^:]:%d:%d", gFault, &gNumber, &gError);
  char const* const report = ::getenv("ZEP_FAULT_REPORT");
  if (report == nullptr) return;
  gIsProgram = true;
  ::strncpy(gReport, report, sizeof gReport - 1);
  for (char const* name : {"LD_PRELOAD", "ZEP_FAULT", "ZEP_FAULT_REPORT"}) ::unsetenv(name);
}

// How often the function was called by now, this call included.
int Count(char const* name) {
  for (auto& function : gState->fFunctions) {
    if (function.fName[0] == '\0') ::strcpy(function.fName, name);
    if (::strcmp(function.fName, name) == 0) return ++function.fCalls;
  }
  ::abort();
}

bool Fires(char const* counted) {
  if (Count(counted) != gNumber || ::strcmp(counted, gFault) != 0) return false;
  gState->fFired = true;
  if (gError == -SIGKILL) ::kill(::getpid(), SIGKILL);
  return true;
}

bool IsTheOne(char const* function) {
  if (gState == nullptr || !gState->fArmed) return false;
  if (gIsProgram && Fires("any")) return true;
  char name[32] = "";
  if (!gIsProgram && ::getpid() != gProcess) ::strcpy(name, "child.");
  ::strcat(name, function);
  return Fires(name);
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
FAILING(ssize_t, pread, (int fd, void* buffer, size_t length, off_t offset), (fd, buffer, length, offset), -1)
FAILING(ssize_t, writev, (int fd, struct iovec const* pieces, int count), (fd, pieces, count), -1)
FAILING(ssize_t, send, (int fd, void const* data, size_t length, int flags), (fd, data, length, flags), -1)
FAILING(ssize_t, recv, (int fd, void* buffer, size_t length, int flags), (fd, buffer, length, flags), -1)
FAILING(ssize_t, sendmsg, (int fd, struct msghdr const* message, int flags), (fd, message, flags), -1)
FAILING(ssize_t, recvmsg, (int fd, struct msghdr* message, int flags), (fd, message, flags), -1)
FAILING(int, socket, (int domain, int type, int protocol), (domain, type, protocol), -1)
FAILING(int, socketpair, (int domain, int type, int protocol, int ends[2]), (domain, type, protocol, ends), -1)
FAILING(int, connect, (int fd, struct sockaddr const* address, socklen_t length), (fd, address, length), -1)
FAILING(int, poll, (struct pollfd * fds, nfds_t count, int limit), (fds, count, limit), -1)
FAILING(int, ppoll, (struct pollfd * fds, nfds_t count, struct timespec const* limit, sigset_t const* mask),
        (fds, count, limit, mask), -1)
FAILING(pid_t, fork, (), (), -1)
FAILING(int, lstat, (char const* path, struct stat* status), (path, status), -1)
FAILING(int, fstatat, (int fd, char const* path, struct stat* status, int flags), (fd, path, status, flags), -1)
FAILING(int, statx, (int fd, char const* path, int flags, unsigned int mask, struct statx* status),
        (fd, path, flags, mask, status), -1)
FAILING(int, rename, (char const* from, char const* to), (from, to), -1)
FAILING(int, renameat2, (int fromFd, char const* from, int toFd, char const* to, unsigned int flags),
        (fromFd, from, toFd, to, flags), -1)
FAILING(int, link, (char const* from, char const* to), (from, to), -1)
FAILING(int, linkat, (int fromFd, char const* from, int toFd, char const* to, int flags), (fromFd, from, toFd, to, flags), -1)
FAILING(int, unlink, (char const* path), (path), -1)
FAILING(int, unlinkat, (int fd, char const* path, int flags), (fd, path, flags), -1)
FAILING(int, fsync, (int fd), (fd), -1)
FAILING(int, fdatasync, (int fd), (fd), -1)
FAILING(int, ftruncate, (int fd, off_t length), (fd, length), -1)
FAILING(int, fchmod, (int fd, mode_t mode), (fd, mode), -1)
FAILING(int, chmod, (char const* path, mode_t mode), (path, mode), -1)
FAILING(int, flock, (int fd, int operation), (fd, operation), -1)
FAILING(int, mkstemp, (char* name), (name), -1)
FAILING(char*, mkdtemp, (char* name), (name), nullptr)
FAILING(char*, realpath, (char const* path, char* resolved), (path, resolved), nullptr)
FAILING(ssize_t, readlink, (char const* path, char* buffer, size_t length), (path, buffer, length), -1)
FAILING(ssize_t, readlinkat, (int fd, char const* path, char* buffer, size_t length), (fd, path, buffer, length), -1)
FAILING(int, dup, (int fd), (fd), -1)
FAILING(int, chdir, (char const* path), (path), -1)
FAILING(DIR*, fdopendir, (int fd), (fd), nullptr)
FAILING(FILE*, fdopen, (int fd, char const* mode), (fd, mode), nullptr)
FAILING(int, memfd_create, (char const* name, unsigned int flags), (name, flags), -1)

// glibc's own allocators, under which malloc and its relatives also stand: dlsym allocates, so it cannot be used here.
extern "C" void* __libc_malloc(size_t);
extern "C" void* __libc_calloc(size_t, size_t);
extern "C" void* __libc_realloc(void*, size_t);

#define FAILING_ALLOCATION(name, parameters, arguments)                     \
  EXPORT void* name parameters {                                            \
    if (!gIsProgram || !IsTheOne("memory")) return __libc_##name arguments; \
    errno = ENOMEM;                                                         \
    return nullptr;                                                         \
  }

FAILING_ALLOCATION(malloc, (size_t size), (size))
FAILING_ALLOCATION(calloc, (size_t count, size_t size), (count, size))
FAILING_ALLOCATION(realloc, (void* memory, size_t size), (memory, size))

// Those that take further arguments, or do something all the same when they fail.

EXPORT int openat(int fd, char const* path, int flags, ...) {
  static auto* const next = Next("openat", &openat);
  va_list arguments;
  va_start(arguments, flags);
  mode_t const mode = (flags & O_CREAT) != 0 ? va_arg(arguments, mode_t) : 0;
  va_end(arguments);
  if (!IsTheOne("openat")) return next(fd, path, flags, mode);
  errno = gError;
  return -1;
}

// System calls without a function of their own, such as openat2.
EXPORT long syscall(long number, ...) {
  static auto* const next = Next("syscall", &syscall);
  va_list list;
  va_start(list, number);
  long a[6];
  for (long& argument : a) argument = va_arg(list, long);
  va_end(list);
  if (!IsTheOne("syscall")) return next(number, a[0], a[1], a[2], a[3], a[4], a[5]);
  errno = gError;
  return -1;
}

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
  static auto* const next = Next("fork", &fork);
  if (!IsTheOne("vfork")) return next();
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
    if (function.fName[0] != '\0') ::sprintf(text + ::strlen(text), "%s %d\n", function.fName, function.fCalls.load());
  return text;
}

// ---- A program as a whole ----

namespace {

int (*gMain)(int, char**, char**) = nullptr;

void Report() {
  if (::getpid() != gProcess) return;
  bool const fired = DisarmFaults();
  if (FILE* const file = ::fopen(gReport, "w"); file != nullptr) {
    ::fprintf(file, "%s%s", fired ? "fault\n" : "", CallsOfFaults());
    ::fclose(file);
  }
}

int ArmedMain(int count, char** arguments, char** environment) {
  ArmFaults();
  ::atexit(&Report);
  return gMain(count, arguments, environment);
}

}  // namespace

EXPORT int __libc_start_main(int (*main)(int, char**, char**), int count, char** arguments, int (*init)(int, char**, char**),
                             void (*fini)(), void (*ldFini)(), void* stack) {
  static auto* const next = Next("__libc_start_main", &__libc_start_main);
  gMain = main;
  return next(gIsProgram ? &ArmedMain : main, count, arguments, init, fini, ldFini, stack);
}
