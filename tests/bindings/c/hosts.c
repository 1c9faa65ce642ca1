/* Making, opening and assembling host directories. */
#include <stdio.h>
#include <unistd.h>

#include "tests/bindings/c/support.h"

static void AHostIsMadeOnce(const struct directory* directory) {
  secpolicy_error* error = NULL;
  const char* path = Below(directory, "some/where/host");
  CHECK_DONE(secpolicy_host_create(path, &error), &error);
  CHECK_FAILURE(secpolicy_host_create(path, &error), SECPOLICY_FAILED,
                "is a host directory already", &error);
}

static void OnlyAHostIsOpened(const struct directory* directory) {
  secpolicy_error* error = NULL;
  secpolicy_host* host = NULL;
  CHECK_FAILURE(secpolicy_host_open(Below(directory, "none"), &host, &error), SECPOLICY_FAILED,
                "none: cannot be opened: No such file or directory", &error);
  CHECK_FAILURE(secpolicy_host_open("/proc", &host, &error), SECPOLICY_FAILED,
                "/proc is not a host directory: it has no host.json", &error);
  CHECK(host == NULL);
}

static void AHostThatIsNotAssembledHasNoFiles(const struct directory* directory) {
  secpolicy_error* error = NULL;
  secpolicy_host* host = NULL;
  secpolicy_text* text = NULL;
  CHECK_DONE(secpolicy_host_create(Below(directory, "new"), &error), &error);
  CHECK_DONE(secpolicy_host_open(Below(directory, "new"), &host, &error), &error);
  CHECK_FAILURE(secpolicy_show(host, SECPOLICY_ALL_DOMAINS, &text, &error), SECPOLICY_FAILED,
                "has not been assembled", &error);
  CHECK(text == NULL);
  CHECK_DONE(secpolicy_host_assemble(host, &error), &error);
  CHECK_DONE(secpolicy_show(host, SECPOLICY_ALL_DOMAINS, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"rootDom\"");
  secpolicy_text_free(text);
  secpolicy_host_free(host);
}

static void ARelativePathStaysWhereItWas(const struct directory* directory) {
  secpolicy_error* error = NULL;
  secpolicy_host* host = NULL;
  secpolicy_text* text = NULL;
  CHECK(chdir(directory->path) == 0);
  CHECK_DONE(secpolicy_host_open("new/", &host, &error), &error);
  CHECK(chdir("/") == 0);
  CHECK_CONTAINS(secpolicy_host_path(host), Below(directory, "new"));
  CHECK_DONE(secpolicy_show(host, 0, &text, &error), &error);
  secpolicy_text_free(text);
  secpolicy_host_free(host);
}

static void ADamagedHostIsNamed(const struct directory* directory) {
  secpolicy_error* error = NULL;
  secpolicy_host* host = NULL;
  secpolicy_text* text = NULL;
  secpolicy_policy* policy = NULL;
  CHECK_DONE(secpolicy_host_open(Below(directory, "new"), &host, &error), &error);
  WriteFile(Below(directory, "new/kernel.json"), "{\"domains\": 7");
  CHECK_FAILURE(secpolicy_show(host, 0, &text, &error), SECPOLICY_FAILED, "new/kernel.json",
                &error);
  CHECK_FAILURE(secpolicy_load(host, "/nowhere", &text, &error), SECPOLICY_FAILED,
                "new/kernel.json", &error);
  CHECK_FAILURE(secpolicy_policy_read(host, "kernel", &policy, &error), SECPOLICY_FAILED,
                "new/kernel.json", &error);
  CHECK(text == NULL && policy == NULL);
  WriteFile(Below(directory, "new/host.json"), "[]");
  CHECK_FAILURE(secpolicy_check(host, NULL, &text, &error), SECPOLICY_FAILED, "new/host.json",
                &error);
  WriteFile(Below(directory, "new/tardisks/bad.tar"), "this is no archive");
  CHECK_FAILURE(secpolicy_host_assemble(host, &error), SECPOLICY_FAILED, "bad.tar", &error);
  secpolicy_host_free(host);
}

/* A handle keeps nothing open: it says what is wrong when its host is gone, and works again. */
static void AHostMayGoAndComeAgain(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  CHECK(rename(Below(&fixture.directory, "host"), Below(&fixture.directory, "away")) == 0);
  CHECK_FAILURE(secpolicy_show(fixture.host, 0, &text, &error), SECPOLICY_FAILED,
                "cannot be opened", &error);
  CHECK(rename(Below(&fixture.directory, "away"), Below(&fixture.directory, "host")) == 0);
  CHECK_DONE(secpolicy_show(fixture.host, 0, &text, &error), &error);
  secpolicy_text_free(text);
  TearDown(&fixture);
}

void TestHosts(void) {
  struct directory directory;
  MakeDirectory(&directory);
  AHostIsMadeOnce(&directory);
  OnlyAHostIsOpened(&directory);
  AHostThatIsNotAssembledHasNoFiles(&directory);
  ARelativePathStaysWhereItWas(&directory);
  ADamagedHostIsNamed(&directory);
  RemoveDirectory(&directory);
  AHostMayGoAndComeAgain();
}
