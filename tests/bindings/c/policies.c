/* Reading a policy, and asking it. */
#include <string.h>

#include "tests/bindings/c/support.h"

struct asked {
  struct fixture fixture;
  secpolicy_policy* policy;
};

static void Read(struct asked* asked) {
  secpolicy_error* error = NULL;
  SetUp(&asked->fixture);
  CHECK_DONE(
      secpolicy_policy_read(asked->fixture.host, PolicyOf(&asked->fixture), &asked->policy, &error),
      &error);
}

static void Forget(struct asked* asked) {
  secpolicy_policy_free(asked->policy);
  TearDown(&asked->fixture);
}

/* The number of rules that are found. */
static unsigned int Matches(const secpolicy_policy* policy, const secpolicy_search_terms* terms) {
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  unsigned int count = 0;
  CHECK_DONE(secpolicy_search(policy, terms, &text, &error), &error);
  if (text == NULL) return 0;
  for (const char* at = secpolicy_text_data(text); (at = strstr(at, "\"domain\"")) != NULL; ++at) {
    ++count;
  }
  secpolicy_text_free(text);
  return count;
}

static void EachTermNarrowsASearch(const struct asked* asked) {
  const secpolicy_search_terms all = {.size = sizeof all};
  secpolicy_search_terms terms = all;
  const unsigned int rules = Matches(asked->policy, &all);
  CHECK(rules >= 5);
  terms.domain = "appDom";
  CHECK(Matches(asked->policy, &terms) == 3);
  terms.type = "syscall";
  CHECK(Matches(asked->policy, &terms) == 1);
  terms = all;
  terms.word = "read";
  CHECK(Matches(asked->policy, &terms) == 2);
  terms = all;
  terms.pattern = "^(open|write)$";
  CHECK(Matches(asked->policy, &terms) == 2);
  terms.decision = SECPOLICY_REVOKED;
  CHECK(Matches(asked->policy, &terms) == 1);
  terms.decision = SECPOLICY_GRANTED;
  CHECK(Matches(asked->policy, &terms) == 1);
  terms = all;
  terms.path = "/etc/hosts";
  CHECK(Matches(asked->policy, &terms) == 1);
  terms.path = "/usr";
  CHECK(Matches(asked->policy, &terms) == 0);
}

static void BadSearchesAreTold(const struct asked* asked) {
  secpolicy_search_terms terms = {.size = sizeof terms};
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  terms.domain = "apDom";
  CHECK_FAILURE(secpolicy_search(asked->policy, &terms, &text, &error), SECPOLICY_BAD_REQUEST,
                "unknown domain \"apDom\" (nearest: appDom)", &error);
  terms.domain = NULL;
  terms.type = "sysall";
  CHECK_FAILURE(secpolicy_search(asked->policy, &terms, &text, &error), SECPOLICY_BAD_REQUEST,
                "no type of rules is called \"sysall\"", &error);
  terms.type = NULL;
  terms.pattern = "(";
  CHECK_FAILURE(secpolicy_search(asked->policy, &terms, &text, &error), SECPOLICY_BAD_REQUEST,
                "\"(\" is no regular expression", &error);
  terms.pattern = NULL;
  terms.path = "etc";
  CHECK_FAILURE(secpolicy_search(asked->policy, &terms, &text, &error), SECPOLICY_BAD_REQUEST,
                "not an absolute path: \"etc\"", &error);
  CHECK(text == NULL);
}

static void QuestionsAreAnswered(const struct asked* asked) {
  const char* open[] = {"syscall", "open"};
  const char* read[] = {"read", "/etc/hosts"};
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  CHECK_DONE(secpolicy_may(asked->policy, "appDom", open, 2, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"allowed\": true");
  CHECK_CONTAINS(secpolicy_text_data(text), "\"line\": \"-s open grant\"");
  secpolicy_text_free(text);
  CHECK_DONE(secpolicy_may(asked->policy, "ioFilterDom", open, 2, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"allowed\": false");
  CHECK_CONTAINS(secpolicy_text_data(text), "\"rule\": null");
  secpolicy_text_free(text);
  CHECK_DONE(secpolicy_who(asked->policy, read, 2, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"domain\": \"appDom\"");
  CHECK_CONTAINS(secpolicy_text_data(text), "\"path\": \"/etc/hosts\"");
  secpolicy_text_free(text);
}

static void BadQuestionsAreTold(const struct asked* asked) {
  const char* unknown[] = {"syscall", "opne"};
  const char* many[] = {"syscall", "open", "read", "write"};
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  CHECK_FAILURE(secpolicy_may(asked->policy, "appDom", unknown, 2, &text, &error),
                SECPOLICY_BAD_REQUEST, "unknown system call \"opne\" (nearest: open)", &error);
  CHECK_FAILURE(secpolicy_who(asked->policy, unknown, 2, &text, &error), SECPOLICY_BAD_REQUEST,
                "unknown system call \"opne\"", &error);
  CHECK_FAILURE(secpolicy_who(asked->policy, many, 4, &text, &error), SECPOLICY_BAD_REQUEST,
                "syscall", &error);
  CHECK_FAILURE(secpolicy_who(asked->policy, many, 0, &text, &error), SECPOLICY_BAD_REQUEST,
                "a question without words", &error);
  CHECK_FAILURE(secpolicy_may(asked->policy, "none", many, 2, &text, &error), SECPOLICY_BAD_REQUEST,
                "unknown domain \"none\"", &error);
  CHECK(text == NULL);
}

static void APolicyIsWhatItWasWhenItWasRead(struct asked* asked) {
  const char* open[] = {"syscall", "open"};
  secpolicy_error* error = NULL;
  secpolicy_text* text = NULL;
  WritePolicy(&asked->fixture, "domains/appDom", "-s open revoke\n");
  secpolicy_host_free(asked->fixture.host);
  asked->fixture.host = NULL;
  CHECK_DONE(secpolicy_may(asked->policy, "appDom", open, 2, &text, &error), &error);
  CHECK_CONTAINS(secpolicy_text_data(text), "\"allowed\": true");
  secpolicy_text_free(text);
}

static void ErrorsOfALoadAreKeptWithThePolicy(void) {
  struct asked asked = {.policy = NULL};
  secpolicy_error* error = NULL;
  SetUp(&asked.fixture);
  WritePolicy(&asked.fixture, "domains/appDom", "-s opne grant\n");
  CHECK_DONE(
      secpolicy_policy_read(asked.fixture.host, PolicyOf(&asked.fixture), &asked.policy, &error),
      &error);
  CHECK(secpolicy_policy_error_count(asked.policy) == 4);
  CHECK_CONTAINS(secpolicy_policy_error(asked.policy, 0), "unknown system call \"opne\"");
  CHECK_TEXT(secpolicy_policy_error(asked.policy, 4), NULL);
  Forget(&asked);
}

static void AKernelHasAPolicyToo(void) {
  struct asked asked = {.policy = NULL};
  const secpolicy_search_terms all = {.size = sizeof all};
  secpolicy_error* error = NULL;
  SetUp(&asked.fixture);
  CHECK_DONE(secpolicy_policy_read(asked.fixture.host, "kernel", &asked.policy, &error), &error);
  CHECK(Matches(asked.policy, &all) == 0);
  secpolicy_policy_free(asked.policy);
  CHECK_DONE(secpolicy_load(asked.fixture.host, PolicyOf(&asked.fixture), NULL, &error), &error);
  CHECK_DONE(secpolicy_policy_read(asked.fixture.host, "kernel", &asked.policy, &error), &error);
  CHECK(Matches(asked.policy, &all) >= 5);
  CHECK(secpolicy_policy_error_count(asked.policy) == 0);
  secpolicy_policy_free(asked.policy);
  CHECK_FAILURE(secpolicy_policy_read(asked.fixture.host, "/none", &asked.policy, &error),
                SECPOLICY_FAILED, "there is no policy directory /none", &error);
  CHECK(asked.policy == NULL);
  Forget(&asked);
}

void TestPolicies(void) {
  struct asked asked = {.policy = NULL};
  Read(&asked);
  EachTermNarrowsASearch(&asked);
  BadSearchesAreTold(&asked);
  QuestionsAreAnswered(&asked);
  BadQuestionsAreTold(&asked);
  APolicyIsWhatItWasWhenItWasRead(&asked);
  Forget(&asked);
  ErrorsOfALoadAreKeptWithThePolicy();
  AKernelHasAPolicyToo();
}
