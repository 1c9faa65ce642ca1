/* Tests of the C interface, in C: c_interface_test SUBJECT. */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "tests/bindings/c/support.h"

struct subject {
  const char* name;
  void (*test)(void);
};

static const struct subject subjects[] = {
    {"errors", TestErrors},     {"hosts", TestHosts},     {"loads", TestLoads},
    {"policies", TestPolicies}, {"process", TestProcess}, {"threads", TestThreads},
};

int main(int argc, char** argv) {
  for (size_t i = 0; argc == 2 && i < sizeof subjects / sizeof subjects[0]; ++i) {
    if (strcmp(argv[1], subjects[i].name) != 0) continue;
    subjects[i].test();
    fprintf(stderr, "%d checks failed\n", FailedChecks());
    return FailedChecks() == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
  }
  fprintf(stderr, "usage: c_interface_test errors|hosts|loads|policies|process|threads\n");
  return 2;
}
