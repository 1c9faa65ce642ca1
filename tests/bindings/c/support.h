/* What the tests of the C interface share. */
#ifndef TESTS_BINDINGS_C_SUPPORT_H
#define TESTS_BINDINGS_C_SUPPORT_H

#include <stdbool.h>
#include <stddef.h>

#include "secpolicy/secpolicy_c.h"

/* Counts a failure, and names it with its place, unless `condition` holds. */
#define CHECK(condition) CheckThat((condition), #condition, __FILE__, __LINE__)
/* The same for texts; either may be NULL. */
#define CHECK_TEXT(text, expected) CheckText((text), (expected), __FILE__, __LINE__)
#define CHECK_CONTAINS(text, part) CheckContains((text), (part), __FILE__, __LINE__)
/* That a call returned `status` and said so in `error`, which is freed. */
#define CHECK_FAILURE(call, expected, part, error) \
  CheckFailure((call), (expected), (part), (error), __FILE__, __LINE__)
/* That a call succeeded and left no error. */
#define CHECK_DONE(call, error) CheckDone((call), (error), __FILE__, __LINE__)

void CheckThat(bool holds, const char* what, const char* file, int line);
void CheckText(const char* text, const char* expected, const char* file, int line);
void CheckContains(const char* text, const char* part, const char* file, int line);
void CheckFailure(secpolicy_status status, secpolicy_status expected, const char* part,
                  secpolicy_error** error, const char* file, int line);
void CheckDone(secpolicy_status status, secpolicy_error** error, const char* file, int line);
int FailedChecks(void);

/* A directory for one test, and paths below it. */
struct directory {
  char path[64];
};
void MakeDirectory(struct directory* directory);
void RemoveDirectory(const struct directory* directory);
/* DIR/NAME, in one of a few buffers that are used in turn. */
const char* Below(const struct directory* directory, const char* name);
/* Writes a file, and makes the directories that it lies in. */
void WriteFile(const char* path, const char* text);
/* Its content; the caller frees it. NULL when there is none. */
char* ReadWholeFile(const char* path);

/* A host, assembled, and a policy without faults at DIR/policy. */
struct fixture {
  struct directory directory;
  secpolicy_host* host;
};
void SetUp(struct fixture* fixture);
void TearDown(struct fixture* fixture);
/* A file of the policy. */
void WritePolicy(const struct fixture* fixture, const char* file, const char* text);
const char* PolicyOf(const struct fixture* fixture);

/* The tests, by subject. */
void TestErrors(void);
void TestHosts(void);
void TestLoads(void);
void TestPolicies(void);
void TestProcess(void);
void TestThreads(void);

#endif
