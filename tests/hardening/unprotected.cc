// Something to be protected: a buffer on the stack, a function that others call.
#include <cstdio>
#include <cstring>

__attribute__((visibility("default"))) int Show(const char* text) {
  char copy[16];
  std::strcpy(copy, text);
  return std::printf("%s\n", copy);
}
