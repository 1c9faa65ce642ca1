/* Calls from several threads, and in the midst of what others do. */
#include <fcntl.h>
#include <link.h>
#include <pthread.h>
#include <stdatomic.h>
#include <stdlib.h>
#include <string.h>
#include <syslog.h>
#include <time.h>
#include <unistd.h>

#include "tests/bindings/c/support.h"

enum { kThreads = 16, kRounds = 3 };

static void* UseOwnHost(void* unused) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  for (int i = 0; i < kRounds; ++i) {
    CHECK_DONE(secpolicy_load(fixture.host, PolicyOf(&fixture), NULL, &error), &error);
    CHECK_DONE(secpolicy_check(fixture.host, PolicyOf(&fixture), &text, &error), &error);
    CHECK_CONTAINS(secpolicy_text_data(text), "\"errors\": 0");
    secpolicy_text_free(text);
  }
  TearDown(&fixture);
  return unused;
}

static void RunThreads(void* (*body)(void*), void* argument) {
  pthread_t threads[kThreads];
  for (int i = 0; i < kThreads; ++i) CHECK(pthread_create(&threads[i], NULL, body, argument) == 0);
  for (int i = 0; i < kThreads; ++i) pthread_join(threads[i], NULL);
}

static void* UseOneHost(void* fixture) {
  const struct fixture* const shared = fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  for (int i = 0; i < kRounds; ++i) {
    CHECK_DONE(secpolicy_load(shared->host, PolicyOf(shared), &text, &error), &error);
    CHECK_CONTAINS(secpolicy_text_data(text), "\"outcome\": \"done\"");
    secpolicy_text_free(text);
  }
  return NULL;
}

static void HandlesAreShared(void) {
  struct fixture fixture;
  SetUp(&fixture);
  RunThreads(UseOneHost, &fixture);
  TearDown(&fixture);
}

/* Threads that are, every other moment, in a place that takes a lock of the C library. */
static atomic_bool isOver;

static bool GoesOn(void) {
  const struct timespec moment = {.tv_nsec = 50000};
  nanosleep(&moment, NULL);
  return !atomic_load(&isOver);
}

static void* Log(void* unused) {
  openlog("c_interface_test", LOG_NDELAY, LOG_USER);
  while (GoesOn()) {
    for (int i = 0; i < 5; ++i) syslog(LOG_DEBUG, "busy");
  }
  closelog();
  return unused;
}

static void* TellTime(void* unused) {
  const time_t now = 0;
  struct tm parts;
  while (GoesOn()) {
    for (int i = 0; i < 100; ++i) localtime_r(&now, &parts);
  }
  return unused;
}

static int LookAtLibrary(struct dl_phdr_info* info, size_t size, void* unused) {
  (void)info;
  (void)size;
  (void)unused;
  return 0;
}

static void* LookAtLibraries(void* unused) {
  while (GoesOn()) {
    for (int i = 0; i < 50; ++i) dl_iterate_phdr(LookAtLibrary, NULL);
  }
  return unused;
}

static void* Allocate(void* unused) {
  while (GoesOn()) {
    for (int i = 0; i < 100; ++i) {
      void* volatile block = malloc(1000);
      free(block);
    }
  }
  return unused;
}

static void LocksOfOthersHoldNobodyUp(void) {
  void* (*const busy[])(void*) = {Log, TellTime, LookAtLibraries, Allocate};
  pthread_t threads[4];
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  atomic_store(&isOver, false);
  for (int i = 0; i < 4; ++i) CHECK(pthread_create(&threads[i], NULL, busy[i], NULL) == 0);
  for (int i = 0; i < 20; ++i) {
    CHECK_DONE(secpolicy_show(fixture.host, 0, &text, &error), &error);
    secpolicy_text_free(text);
  }
  CHECK_DONE(secpolicy_load(fixture.host, PolicyOf(&fixture), NULL, &error), &error);
  atomic_store(&isOver, true);
  for (int i = 0; i < 4; ++i) pthread_join(threads[i], NULL);
  TearDown(&fixture);
}

static void* Show(void* host) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  CHECK_DONE(secpolicy_show(host, 0, &text, &error), &error);
  secpolicy_text_free(text);
  return NULL;
}

static void* Load(void* argument) {
  struct fixture* fixture = argument;
  secpolicy_error* error = NULL;
  CHECK_DONE(secpolicy_load(fixture->host, PolicyOf(fixture), NULL, &error), &error);
  return NULL;
}

/* A load that waits for the host's lock holds up no other call. */
static void WaitingHoldsNobodyUp(void) {
  struct fixture fixture;
  struct flock whole = {.l_type = F_WRLCK, .l_whence = SEEK_SET};
  pthread_t thread;
  SetUp(&fixture);
  const int lock = open(Below(&fixture.directory, "host/kernel.lock"), O_RDWR | O_CREAT, 0666);
  CHECK(lock >= 0 && fcntl(lock, F_OFD_SETLK, &whole) == 0);
  CHECK(pthread_create(&thread, NULL, Load, &fixture) == 0);
  for (int i = 0; i < 20; ++i) Show(fixture.host);
  close(lock);
  pthread_join(thread, NULL);
  TearDown(&fixture);
}

static void* ShowUntilCancelled(void* host) {
  for (int i = 0; i < 10000; ++i) {
    Show(host);
    pthread_testcancel();
  }
  return NULL;
}

/* Cancelled in the midst of a call, a thread ends behind it. */
static void CancellationWaitsForTheCall(void) {
  struct fixture fixture;
  const struct timespec moment = {.tv_nsec = 20000000};
  pthread_t thread;
  void* result = NULL;
  SetUp(&fixture);
  CHECK(pthread_create(&thread, NULL, ShowUntilCancelled, fixture.host) == 0);
  nanosleep(&moment, NULL);
  pthread_cancel(thread);
  pthread_join(thread, &result);
  CHECK(result == PTHREAD_CANCELED);
  TearDown(&fixture);
}

void TestThreads(void) {
  RunThreads(UseOwnHost, NULL);
  HandlesAreShared();
  LocksOfOthersHoldNobodyUp();
  WaitingHoldsNobodyUp();
  CancellationWaitsForTheCall();
}
