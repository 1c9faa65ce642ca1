#include "tests/bindings/c/support.h"

#include <ftw.h>
#include <stdatomic.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>
#include <unistd.h>

/* Threads check, too. */
static atomic_int failed;

void CheckThat(bool holds, const char* what, const char* file, int line) {
  if (holds) return;
  atomic_fetch_add(&failed, 1);
  fprintf(stderr, "%s:%d: does not hold: %s\n", file, line, what);
}

void CheckText(const char* text, const char* expected, const char* file, int line) {
  const bool both = text != NULL && expected != NULL;
  if (both ? strcmp(text, expected) == 0 : text == expected) return;
  atomic_fetch_add(&failed, 1);
  fprintf(stderr, "%s:%d: is \"%s\", not \"%s\"\n", file, line, text == NULL ? "(NULL)" : text,
          expected == NULL ? "(NULL)" : expected);
}

void CheckContains(const char* text, const char* part, const char* file, int line) {
  if (text != NULL && strstr(text, part) != NULL) return;
  atomic_fetch_add(&failed, 1);
  fprintf(stderr, "%s:%d: no \"%s\" in \"%s\"\n", file, line, part, text == NULL ? "(NULL)" : text);
}

void CheckFailure(secpolicy_status status, secpolicy_status expected, const char* part,
                  secpolicy_error** error, const char* file, int line) {
  CheckText(secpolicy_status_name(status), secpolicy_status_name(expected), file, line);
  CheckThat(*error != NULL, "there is an error", file, line);
  CheckThat(secpolicy_error_status(*error) == status, "the error has the status", file, line);
  CheckContains(secpolicy_error_message(*error), part, file, line);
  secpolicy_error_free(*error);
  *error = NULL;
}

void CheckDone(secpolicy_status status, secpolicy_error** error, const char* file, int line) {
  CheckText(secpolicy_status_name(status), "SECPOLICY_OK", file, line);
  CheckText(secpolicy_error_message(*error), "", file, line);
  CheckThat(*error == NULL, "there is no error", file, line);
  secpolicy_error_free(*error);
  *error = NULL;
}

int FailedChecks(void) { return atomic_load(&failed); }

static void Die(const char* what) {
  perror(what);
  exit(EXIT_FAILURE);
}

void MakeDirectory(struct directory* directory) {
  strcpy(directory->path, "/tmp/secpolicy-c-XXXXXX");
  if (mkdtemp(directory->path) == NULL) Die("mkdtemp");
}

static int RemoveEntry(const char* path, const struct stat* status, int type, struct FTW* walk) {
  (void)status;
  (void)type;
  (void)walk;
  return remove(path);
}

void RemoveDirectory(const struct directory* directory) {
  if (nftw(directory->path, RemoveEntry, 16, FTW_DEPTH | FTW_PHYS) != 0) Die(directory->path);
}

const char* Below(const struct directory* directory, const char* name) {
  static _Thread_local char paths[8][256];
  static _Thread_local unsigned int next;
  char* path = paths[next++ % 8];
  snprintf(path, sizeof paths[0], "%s/%s", directory->path, name);
  return path;
}

static void MakeParents(const char* path) {
  char parent[256];
  for (const char* slash = strchr(path + 1, '/'); slash != NULL; slash = strchr(slash + 1, '/')) {
    snprintf(parent, sizeof parent, "%.*s", (int)(slash - path), path);
    mkdir(parent, 0777);
  }
}

void WriteFile(const char* path, const char* text) {
  MakeParents(path);
  FILE* file = fopen(path, "w");
  if (file == NULL || fputs(text, file) < 0 || fclose(file) != 0) Die(path);
}

char* ReadWholeFile(const char* path) {
  FILE* file = fopen(path, "r");
  if (file == NULL) return NULL;
  const size_t room = 1U << 20;
  char* text = malloc(room);
  if (text == NULL) Die("malloc");
  text[fread(text, 1, room - 1, file)] = '\0';
  fclose(file);
  return text;
}

void SetUp(struct fixture* fixture) {
  secpolicy_error* error = NULL;
  MakeDirectory(&fixture->directory);
  CHECK_DONE(secpolicy_host_create(Below(&fixture->directory, "host"), &error), &error);
  CHECK_DONE(secpolicy_host_open(Below(&fixture->directory, "host"), &fixture->host, &error),
             &error);
  CHECK_DONE(secpolicy_host_assemble(fixture->host, &error), &error);
  WritePolicy(fixture, "objects/base", "conf\n");
  WritePolicy(fixture, "domains/appDom", "-s open grant\n-a conf read grant\n-r /etc rw\n");
  WritePolicy(fixture, "domains/globalVMDom", "-s read grant\n-s write revoke\n");
  WritePolicy(fixture, "domains/ioFilterDom", "# nothing\n");
  WritePolicy(fixture, "fileLabels/base", "# nothing\n");
}

void TearDown(struct fixture* fixture) {
  secpolicy_host_free(fixture->host);
  RemoveDirectory(&fixture->directory);
}

void WritePolicy(const struct fixture* fixture, const char* file, const char* text) {
  char name[128];
  snprintf(name, sizeof name, "policy/%s", file);
  WriteFile(Below(&fixture->directory, name), text);
}

const char* PolicyOf(const struct fixture* fixture) { return Below(&fixture->directory, "policy"); }
