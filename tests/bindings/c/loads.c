/* Loading, showing and checking. */
#include <stdio.h>
#include <string.h>
#include <unistd.h>

#include "tests/bindings/c/support.h"

static void ALoadIsSeenByLaterCalls(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* loaded = NULL;
  secpolicy_text* shown = NULL;
  SetUp(&fixture);
  CHECK_DONE(secpolicy_load(fixture.host, PolicyOf(&fixture), &loaded, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(loaded), "\"outcome\": \"done\"");
  CHECK_CONTAINS(secpolicy_text_data(loaded), "\"errors\": []");
  CHECK_CONTAINS(secpolicy_text_data(loaded), "\"line\": \"-a conf read grant\"");
  CHECK(secpolicy_text_size(loaded) == strlen(secpolicy_text_data(loaded)));
  CHECK_DONE(secpolicy_show(fixture.host, SECPOLICY_ALL_DOMAINS, &shown, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(shown), "\"line\": \"-r /etc rw\"");
  CHECK_CONTAINS(secpolicy_text_data(shown), "\"ioFilterDom\"");
  secpolicy_text_free(shown);
  secpolicy_text_free(loaded);
  CHECK_DONE(secpolicy_load(fixture.host, PolicyOf(&fixture), NULL, &error), &error);
  TearDown(&fixture);
}

static void AResultOutlivesItsHost(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  CHECK_DONE(secpolicy_show(fixture.host, 0, &text, &error), &error);
  TearDown(&fixture);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"rootDom\"");
  secpolicy_text_free(text);
}

static void OneDomainIsShown(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  CHECK_DONE(secpolicy_load(fixture.host, PolicyOf(&fixture), NULL, &error), &error);
  CHECK_DONE(secpolicy_show(fixture.host, 1, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"name\": \"appDom\"");
  CHECK(strstr(secpolicy_text_data(text), "\"name\": \"globalVMDom\"") == NULL);
  secpolicy_text_free(text);
  CHECK_FAILURE(secpolicy_show(fixture.host, 77, &text, &error), SECPOLICY_BAD_REQUEST,
                "no domain has the id 77", &error);
  CHECK(text == NULL);
  TearDown(&fixture);
}

static void AFailedLoadNamesTheLineAndKeepsTheRest(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  WritePolicy(&fixture, "domains/globalVMDom", "-s read grant\n-s opne grant\n");
  CHECK(secpolicy_load(fixture.host, PolicyOf(&fixture), &text, &error) == SECPOLICY_LOAD_FAILED);
  CHECK_TEXT(secpolicy_error_message(error),
             "Error in parsing policy for domain: globalVMDom: 2 : unknown system call \"opne\" "
             "(nearest: open)");
  CHECK_TEXT(secpolicy_error_file(error), Below(&fixture.directory, "policy/domains/globalVMDom"));
  CHECK(secpolicy_error_line(error) == 2);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"outcome\": \"failed\"");
  CHECK_CONTAINS(secpolicy_text_data(text), "\"message\": \"Failure in domain policy\"");
  CHECK_CONTAINS(secpolicy_text_data(text), "\"line\": \"-s open grant\"");
  secpolicy_text_free(text);
  secpolicy_error_free(error);
  CHECK(secpolicy_load(fixture.host, PolicyOf(&fixture), NULL, NULL) == SECPOLICY_LOAD_FAILED);
  TearDown(&fixture);
}

static void ATerminatedLoadKeepsWhatItInstalled(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  CHECK(unlink(Below(&fixture.directory, "policy/domains/ioFilterDom")) == 0);
  CHECK_FAILURE(secpolicy_load(fixture.host, PolicyOf(&fixture), &text, &error),
                SECPOLICY_LOAD_TERMINATED, "Failed to fetch domainID for IOFilter domain", &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"outcome\": \"terminated\"");
  secpolicy_text_free(text);
  CHECK_DONE(secpolicy_show(fixture.host, 1, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"line\": \"-s open grant\"");
  secpolicy_text_free(text);
  TearDown(&fixture);
}

static void ADirectoryThatIsNotThereIsNotLoaded(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  CHECK_FAILURE(secpolicy_load(fixture.host, Below(&fixture.directory, "none"), &text, &error),
                SECPOLICY_FAILED, "there is no policy directory ", &error);
  CHECK(text == NULL);
  CHECK_FAILURE(secpolicy_load(fixture.host, NULL, &text, &error), SECPOLICY_FAILED,
                "there is no policy directory /etc/olvane/secpolicy", &error);
  CHECK(text == NULL);
  CHECK(secpolicy_show(fixture.host, SECPOLICY_ALL_DOMAINS, &text, NULL) == SECPOLICY_OK);
  CHECK(strstr(secpolicy_text_data(text), "globalVMDom") == NULL);
  secpolicy_text_free(text);
  TearDown(&fixture);
}

static void FindingsAreNoFailure(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  WritePolicy(&fixture, "domains/appDom", "-s opne grant\n");
  CHECK_DONE(secpolicy_check(fixture.host, PolicyOf(&fixture), &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"id\": \"unknown-word\"");
  CHECK_CONTAINS(secpolicy_text_data(text), "\"severity\": \"error\"");
  secpolicy_text_free(text);
  CHECK_FAILURE(secpolicy_check(fixture.host, Below(&fixture.directory, "none"), &text, &error),
                SECPOLICY_FAILED, "there is no policy directory", &error);
  CHECK(text == NULL);
  TearDown(&fixture);
}

/* Bytes that are not UTF-8 are somebody's mistake in a file, and no reason to fail. */
static void BytesOfFilesBecomeUtf8(void) {
  struct fixture fixture;
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  SetUp(&fixture);
  WritePolicy(&fixture, "domains/appDom", "-s op\xff grant\n");
  CHECK_DONE(secpolicy_check(fixture.host, PolicyOf(&fixture), &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "-s op\xEF\xBF\xBD grant");
  secpolicy_text_free(text);
  CHECK(secpolicy_load(fixture.host, PolicyOf(&fixture), &text, &error) == SECPOLICY_LOAD_FAILED);
  CHECK(strchr(secpolicy_text_data(text), '\xff') == NULL);
  CHECK(strchr(secpolicy_error_message(error), '\xff') == NULL);
  secpolicy_text_free(text);
  secpolicy_error_free(error);
  TearDown(&fixture);
}

void TestLoads(void) {
  ALoadIsSeenByLaterCalls();
  AResultOutlivesItsHost();
  OneDomainIsShown();
  AFailedLoadNamesTheLineAndKeepsTheRest();
  ATerminatedLoadKeepsWhatItInstalled();
  ADirectoryThatIsNotThereIsNotLoaded();
  FindingsAreNoFailure();
  BytesOfFilesBecomeUtf8();
}
