// SPDX-License-Identifier: Apache-2.0

// Prints the open descriptors above standard error, each with its file.
#include <dirent.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <map>
#include <string>

int main() {
  std::map<int, std::string> names;
  DIR* const dir = ::opendir("/proc/self/fd");
  while (dirent const* const entry = ::readdir(dir)) {
    int const fd = std::atoi(entry->d_name);
    if (fd <= 2 || fd == ::dirfd(dir)) continue;
    char name[4096];
    ssize_t const length = ::readlinkat(::dirfd(dir), entry->d_name, name, sizeof name);
    names[fd] = std::string(name, length > 0 ? static_cast<std::size_t>(length) : 0);
  }
  ::closedir(dir);
  for (auto const& [fd, name] : names) std::printf("%d %s\n", fd, name.c_str());
  return 0;
}
