#include <cstdio>

int main() {
  for (int c; (c = std::getchar()) != EOF;) std::putchar(c);
  return 0;
}
