/* What a call leaves of the process that makes it: everything. */
#include <dirent.h>
#include <errno.h>
#include <fcntl.h>
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "tests/bindings/c/support.h"

/* Each kind of call, those that fail among them. */
static void CallEverything(const struct fixture* fixture) {
  const char* words[] = {"syscall", "open"};
  const secpolicy_search_terms terms = {.size = sizeof terms};
  secpolicy_policy* policy = NULL;
  secpolicy_text* texts[6] = {NULL};
  secpolicy_text* none = NULL;
  const char* const dir = PolicyOf(fixture);
  CHECK(secpolicy_host_assemble(fixture->host, NULL) == SECPOLICY_OK);
  CHECK(secpolicy_load(fixture->host, dir, &texts[0], NULL) == SECPOLICY_LOAD_FAILED);
  CHECK(secpolicy_show(fixture->host, SECPOLICY_ALL_DOMAINS, &texts[1], NULL) == SECPOLICY_OK);
  CHECK(secpolicy_check(fixture->host, dir, &texts[2], NULL) == SECPOLICY_OK);
  CHECK(secpolicy_check(fixture->host, "/none", &none, NULL) == SECPOLICY_FAILED);
  CHECK(secpolicy_policy_read(fixture->host, dir, &policy, NULL) == SECPOLICY_OK);
  CHECK(secpolicy_search(policy, &terms, &texts[3], NULL) == SECPOLICY_OK);
  CHECK(secpolicy_may(policy, "appDom", words, 2, &texts[4], NULL) == SECPOLICY_OK);
  CHECK(secpolicy_who(policy, words, 2, &texts[5], NULL) == SECPOLICY_OK);
  for (size_t i = 0; i < 6; ++i) secpolicy_text_free(texts[i]);
  secpolicy_policy_free(policy);
}

struct state {
  struct stat root;
  char directory[256];
  char mounts[64];
  char users[64];
  mode_t mask;
  sigset_t blocked;
  struct sigaction actions[NSIG];
  bool isOpen[256];
  char* privileges; /* lines of /proc/self/status about filters and capabilities */
};

static char* Privileges(void) {
  char* status = ReadWholeFile("/proc/self/status");
  char* found = calloc(1, 4096);
  CHECK(status != NULL && found != NULL);
  for (char* line = strtok(status, "\n"); line != NULL; line = strtok(NULL, "\n")) {
    const char* const kept[] = {"Seccomp", "NoNewPrivs", "Cap", "Uid", "Gid", "Threads"};
    for (size_t i = 0; i < sizeof kept / sizeof kept[0]; ++i) {
      if (strncmp(line, kept[i], strlen(kept[i])) == 0) strcat(strcat(found, line), "\n");
    }
  }
  free(status);
  return found;
}

static void Note(struct state* state) {
  memset(state, 0, sizeof *state);
  CHECK(stat("/", &state->root) == 0);
  CHECK(getcwd(state->directory, sizeof state->directory) != NULL);
  CHECK(readlink("/proc/self/ns/mnt", state->mounts, sizeof state->mounts - 1) > 0);
  CHECK(readlink("/proc/self/ns/user", state->users, sizeof state->users - 1) > 0);
  state->mask = umask(0);
  umask(state->mask);
  sigprocmask(SIG_BLOCK, NULL, &state->blocked);
  for (int i = 1; i < NSIG; ++i) sigaction(i, NULL, &state->actions[i]);
  for (int fd = 0; fd < 256; ++fd) state->isOpen[fd] = fcntl(fd, F_GETFD) >= 0;
  state->privileges = Privileges();
}

static void CheckSame(const struct state* before, const struct state* after) {
  CHECK(before->root.st_dev == after->root.st_dev && before->root.st_ino == after->root.st_ino);
  CHECK_TEXT(after->directory, before->directory);
  CHECK_TEXT(after->mounts, before->mounts);
  CHECK_TEXT(after->users, before->users);
  CHECK(before->mask == after->mask);
  CHECK_TEXT(after->privileges, before->privileges);
  for (int i = 1; i < NSIG; ++i) {
    CHECK(sigismember(&before->blocked, i) == sigismember(&after->blocked, i));
    CHECK(before->actions[i].sa_handler == after->actions[i].sa_handler);
  }
  CHECK(memcmp(before->isOpen, after->isOpen, sizeof before->isOpen) == 0);
}

static void OnSignal(int number) { (void)number; }

static void TheProcessIsAsItWas(const struct fixture* fixture) {
  struct state before;
  struct state after;
  struct sigaction handled = {.sa_handler = OnSignal};
  sigset_t blocked;
  sigemptyset(&blocked);
  sigaddset(&blocked, SIGUSR2);
  sigprocmask(SIG_BLOCK, &blocked, NULL);
  sigaction(SIGUSR1, &handled, NULL);
  sigaction(SIGSYS, &handled, NULL);
  Note(&before);
  CHECK_CONTAINS(before.privileges, "Seccomp:\t");
  CallEverything(fixture);
  Note(&after);
  CheckSame(&before, &after);
  free(before.privileges);
  free(after.privileges);
  sigprocmask(SIG_UNBLOCK, &blocked, NULL);
  signal(SIGUSR1, SIG_DFL);
  signal(SIGSYS, SIG_DFL);
}

static void NoChildIsMade(const struct fixture* fixture) {
  CallEverything(fixture);
  errno = 0;
  CHECK(waitpid(-1, NULL, WNOHANG) == -1 && errno == ECHILD);
}

static void NothingIsWrittenNorWrittenTwice(const struct fixture* fixture) {
  const char* const path = Below(&fixture->directory, "output");
  const int out = dup(STDOUT_FILENO);
  const int err = dup(STDERR_FILENO);
  const int file = open(path, O_WRONLY | O_CREAT | O_APPEND, 0666);
  fflush(stdout);
  CHECK(dup2(file, STDOUT_FILENO) >= 0 && dup2(file, STDERR_FILENO) >= 0);
  FILE* const own = fopen(path, "a");
  fputs("held back by the caller\n", stdout);
  fputs("and in a file\n", own);
  CallEverything(fixture);
  fflush(stdout);
  fclose(own);
  CHECK(dup2(out, STDOUT_FILENO) >= 0 && dup2(err, STDERR_FILENO) >= 0);
  close(out);
  close(err);
  close(file);
  char* const text = ReadWholeFile(path);
  CHECK_TEXT(text, "held back by the caller\nand in a file\n");
  free(text);
}

static const char* endPath = NULL;

static void AtEnd(void) {
  if (endPath != NULL) WriteFile(endPath, "the end");
}

static void WhatIsRegisteredForTheEndIsTheCallers(const struct fixture* fixture) {
  char path[128];
  snprintf(path, sizeof path, "%s", Below(&fixture->directory, "end"));
  atexit(AtEnd);
  endPath = path;
  CallEverything(fixture);
  endPath = NULL;
  CHECK(access(path, F_OK) != 0);
}

static void StandardStreamsMayBeClosed(const struct fixture* fixture) {
  int kept[3];
  for (int fd = 0; fd < 3; ++fd) {
    kept[fd] = fcntl(fd, F_DUPFD_CLOEXEC, 10);
    close(fd);
  }
  CallEverything(fixture);
  for (int fd = 0; fd < 3; ++fd) {
    CHECK(fcntl(fd, F_GETFD) == -1);
    CHECK(dup2(kept[fd], fd) == fd);
    close(kept[fd]);
  }
}

/* The signal that such a write raises would end the caller. */
static void LimitOfFileSizesFailsALoad(const struct fixture* fixture) {
  secpolicy_error* error = NULL;
  struct rlimit before;
  struct rlimit none;
  sigset_t pending;
  getrlimit(RLIMIT_FSIZE, &before);
  none = before;
  none.rlim_cur = 0;
  setrlimit(RLIMIT_FSIZE, &none);
  const secpolicy_status status = secpolicy_load(fixture->host, PolicyOf(fixture), NULL, &error);
  setrlimit(RLIMIT_FSIZE, &before);
  CHECK_FAILURE(status, SECPOLICY_FAILED, "kernel.json: cannot be written: File too large", &error);
  CHECK(sigpending(&pending) == 0 && sigismember(&pending, SIGXFSZ) == 0);
}

#ifndef SECPOLICY_SANITIZED
static void WithoutDescriptorsNothingIsDone(const struct fixture* fixture) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  struct rlimit before;
  struct rlimit few;
  getrlimit(RLIMIT_NOFILE, &before);
  few = before;
  few.rlim_cur = 3;
  setrlimit(RLIMIT_NOFILE, &few);
  const secpolicy_status status = secpolicy_show(fixture->host, 0, &text, &error);
  setrlimit(RLIMIT_NOFILE, &before);
  CHECK_FAILURE(status, SECPOLICY_FAILED, "cannot be opened: Too many open files", &error);
  CHECK(text == NULL);
}
#endif

void TestProcess(void) {
  struct fixture fixture;
  SetUp(&fixture);
  WritePolicy(&fixture, "domains/globalVMDom", "-s opne grant\n");
  TheProcessIsAsItWas(&fixture);
  NoChildIsMade(&fixture);
  NothingIsWrittenNorWrittenTwice(&fixture);
  WhatIsRegisteredForTheEndIsTheCallers(&fixture);
  StandardStreamsMayBeClosed(&fixture);
  LimitOfFileSizesFailsALoad(&fixture);
#ifndef SECPOLICY_SANITIZED /* a sanitizer needs descriptors to see whether memory can be read */
  WithoutDescriptorsNothingIsDone(&fixture);
#endif
  TearDown(&fixture);
}
