/* Calls that are wrong in themselves, and what accessors say of nothing. */
#include <string.h>

#include "tests/bindings/c/support.h"

static const char kBadUtf8[] = "dir\xff";

static void AccessorsAcceptNull(void) {
  CHECK(secpolicy_error_status(NULL) == SECPOLICY_OK);
  CHECK_TEXT(secpolicy_error_message(NULL), "");
  CHECK_TEXT(secpolicy_error_file(NULL), NULL);
  CHECK(secpolicy_error_line(NULL) == 0);
  CHECK_TEXT(secpolicy_text_data(NULL), NULL);
  CHECK(secpolicy_text_size(NULL) == 0);
  CHECK_TEXT(secpolicy_host_path(NULL), NULL);
  CHECK(secpolicy_policy_error_count(NULL) == 0);
  CHECK_TEXT(secpolicy_policy_error(NULL, 0), NULL);
  secpolicy_error_free(NULL);
  secpolicy_text_free(NULL);
  secpolicy_host_free(NULL);
  secpolicy_policy_free(NULL);
}

static void NamesOfStatuses(void) {
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_OK), "SECPOLICY_OK");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_INVALID_ARGUMENT), "SECPOLICY_INVALID_ARGUMENT");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_BAD_REQUEST), "SECPOLICY_BAD_REQUEST");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_FAILED), "SECPOLICY_FAILED");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_LOAD_FAILED), "SECPOLICY_LOAD_FAILED");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_LOAD_TERMINATED), "SECPOLICY_LOAD_TERMINATED");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_OUT_OF_MEMORY), "SECPOLICY_OUT_OF_MEMORY");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_SYSTEM), "SECPOLICY_SYSTEM");
  CHECK_TEXT(secpolicy_status_name((secpolicy_status)8), "unknown");
  CHECK_TEXT(secpolicy_status_name(SECPOLICY_STATUS_RANGE), "unknown");
}

static void VersionIsThatOfTheHeader(void) {
  CHECK(secpolicy_c_version() >> 16 == SECPOLICY_C_VERSION_MAJOR);
  CHECK((secpolicy_c_version() & 0xFFFF) == SECPOLICY_C_VERSION_MINOR);
}

static void MissingHandlesAreRefused(void) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  secpolicy_policy* policy = NULL;
  secpolicy_search_terms terms = {.size = sizeof terms};
  const char* words[] = {"syscall", "open"};
  const secpolicy_status wrong = SECPOLICY_INVALID_ARGUMENT;
  CHECK_FAILURE(secpolicy_host_assemble(NULL, &error), wrong, "host is NULL", &error);
  CHECK_FAILURE(secpolicy_load(NULL, "p", &text, &error), wrong, "host is NULL", &error);
  CHECK_FAILURE(secpolicy_show(NULL, 0, &text, &error), wrong, "host is NULL", &error);
  CHECK_FAILURE(secpolicy_check(NULL, "p", &text, &error), wrong, "host is NULL", &error);
  CHECK_FAILURE(secpolicy_policy_read(NULL, "p", &policy, &error), wrong, "host is NULL", &error);
  CHECK_FAILURE(secpolicy_search(NULL, &terms, &text, &error), wrong, "policy is NULL", &error);
  CHECK_FAILURE(secpolicy_may(NULL, "d", words, 2, &text, &error), wrong, "policy is NULL", &error);
  CHECK_FAILURE(secpolicy_who(NULL, words, 2, &text, &error), wrong, "policy is NULL", &error);
  CHECK(text == NULL);
  CHECK(policy == NULL);
}

static void BadStringsAreRefused(void) {
  secpolicy_error* error = NULL;
  secpolicy_host* host = NULL;
  const secpolicy_status wrong = SECPOLICY_INVALID_ARGUMENT;
  CHECK_FAILURE(secpolicy_host_create(NULL, &error), wrong, "directory is NULL", &error);
  CHECK_FAILURE(secpolicy_host_create("", &error), wrong, "directory is empty", &error);
  CHECK_FAILURE(secpolicy_host_create(kBadUtf8, &error), wrong, "directory is not UTF-8", &error);
  CHECK_FAILURE(secpolicy_host_open(NULL, &host, &error), wrong, "directory is NULL", &error);
  CHECK_FAILURE(secpolicy_host_open(kBadUtf8, &host, &error), wrong, "directory is not UTF-8",
                &error);
  CHECK_FAILURE(secpolicy_host_open("x", NULL, &error), wrong, "host is NULL", &error);
  CHECK(host == NULL);
}

static void BadArgumentsOfOneHost(const struct fixture* fixture) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  secpolicy_policy* policy = NULL;
  const secpolicy_status wrong = SECPOLICY_INVALID_ARGUMENT;
  secpolicy_host* host = fixture->host;
  CHECK_FAILURE(secpolicy_load(host, kBadUtf8, &text, &error), wrong, "directory is not UTF-8",
                &error);
  CHECK_FAILURE(secpolicy_load(host, "", &text, &error), wrong, "directory is empty", &error);
  CHECK_FAILURE(secpolicy_check(host, kBadUtf8, &text, &error), wrong, "directory is not UTF-8",
                &error);
  CHECK_FAILURE(secpolicy_check(host, NULL, NULL, &error), wrong, "result is NULL", &error);
  CHECK_FAILURE(secpolicy_show(host, 0, NULL, &error), wrong, "result is NULL", &error);
  CHECK_FAILURE(secpolicy_policy_read(host, kBadUtf8, &policy, &error), wrong,
                "source is not UTF-8", &error);
  CHECK_FAILURE(secpolicy_policy_read(host, "kernel", NULL, &error), wrong, "policy is NULL",
                &error);
  CHECK(text == NULL);
  CHECK(policy == NULL);
}

static void BadArgumentsOfOnePolicy(const secpolicy_policy* policy) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  const secpolicy_status wrong = SECPOLICY_INVALID_ARGUMENT;
  const char* words[] = {"syscall", NULL};
  const char* bytes[] = {"syscall", kBadUtf8};
  CHECK_FAILURE(secpolicy_may(policy, NULL, words, 1, &text, &error), wrong, "domain is NULL",
                &error);
  CHECK_FAILURE(secpolicy_may(policy, "d", NULL, 1, &text, &error), wrong, "words is NULL", &error);
  CHECK_FAILURE(secpolicy_may(policy, "d", words, 2, &text, &error), wrong, "words[1] is NULL",
                &error);
  CHECK_FAILURE(secpolicy_may(policy, kBadUtf8, words, 1, &text, &error), wrong,
                "domain is not UTF-8", &error);
  CHECK_FAILURE(secpolicy_may(policy, "d", words, 1, NULL, &error), wrong, "result is NULL",
                &error);
  CHECK_FAILURE(secpolicy_who(policy, bytes, 2, &text, &error), wrong, "words[1] is not UTF-8",
                &error);
  CHECK_FAILURE(secpolicy_who(policy, words, 1, NULL, &error), wrong, "result is NULL", &error);
}

static void BadTerms(const secpolicy_policy* policy) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  const secpolicy_status wrong = SECPOLICY_INVALID_ARGUMENT;
  CHECK_FAILURE(secpolicy_search(policy, NULL, &text, &error), wrong, "terms is NULL", &error);
  secpolicy_search_terms terms;
  memset(&terms, 0, sizeof terms);
  CHECK_FAILURE(secpolicy_search(policy, &terms, &text, &error), wrong, "terms->size", &error);
  terms.size = sizeof terms;
  CHECK_FAILURE(secpolicy_search(policy, &terms, NULL, &error), wrong, "result is NULL", &error);
  terms.word = kBadUtf8;
  CHECK_FAILURE(secpolicy_search(policy, &terms, &text, &error), wrong, "terms->word is not UTF-8",
                &error);
  terms.word = terms.pattern = "open";
  CHECK_FAILURE(secpolicy_search(policy, &terms, &text, &error), wrong, "both a word and a pattern",
                &error);
  terms.word = terms.pattern = NULL;
  terms.decision = (secpolicy_decision)1000;
  CHECK_FAILURE(secpolicy_search(policy, &terms, &text, &error), wrong, "terms->decision", &error);
  CHECK(text == NULL);
}

static void AnErrorNeedNotBeWanted(const struct fixture* fixture) {
  secpolicy_text* text = NULL;
  CHECK(secpolicy_host_create(NULL, NULL) == SECPOLICY_INVALID_ARGUMENT);
  CHECK(secpolicy_show(fixture->host, 77, &text, NULL) == SECPOLICY_BAD_REQUEST);
  CHECK(text == NULL);
  CHECK(secpolicy_show(fixture->host, SECPOLICY_ALL_DOMAINS, &text, NULL) == SECPOLICY_OK);
  secpolicy_text_free(text);
}

/* What outputs held before is not looked at, and never left there. */
static void OutputsOfBeforeAreForgotten(void) {
  secpolicy_host* host = (secpolicy_host*)&kBadUtf8;
  secpolicy_error* error = (secpolicy_error*)&kBadUtf8;
  CHECK_FAILURE(secpolicy_host_open("", &host, &error), SECPOLICY_INVALID_ARGUMENT, "empty",
                &error);
  CHECK(host == NULL);
}

void TestErrors(void) {
  struct fixture fixture;
  secpolicy_policy* policy = NULL;
  secpolicy_error* error = NULL;
  AccessorsAcceptNull();
  NamesOfStatuses();
  VersionIsThatOfTheHeader();
  MissingHandlesAreRefused();
  BadStringsAreRefused();
  OutputsOfBeforeAreForgotten();
  SetUp(&fixture);
  BadArgumentsOfOneHost(&fixture);
  AnErrorNeedNotBeWanted(&fixture);
  CHECK_DONE(secpolicy_policy_read(fixture.host, "kernel", &policy, &error), &error);
  BadArgumentsOfOnePolicy(policy);
  BadTerms(policy);
  secpolicy_policy_free(policy);
  TearDown(&fixture);
}
