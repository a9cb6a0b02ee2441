// SPDX-License-Identifier: Apache-2.0
#include <unistd.h>

int main() {
  if (::write(2, "error|", 6) != 6) return 1;
  ::close(2);
  return ::write(1, "output", 6) == 6 ? 0 : 1;
}
