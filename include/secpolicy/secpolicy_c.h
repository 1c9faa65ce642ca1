/* The C interface of libsecpolicy: policies of stand-in hosts, loaded, shown, checked and asked.
 *
 * For programs in C, and for other languages by way of it. Works on host directories, as the
 * command secpolicy does, and says the same things; results are JSON in the same form.
 *
 * Results. Every function that can fail returns a status and takes `error`, which may be NULL. On
 * success *error becomes NULL. On a failure *error becomes a description of it, which the caller
 * frees; and each other output becomes NULL, unless the function says otherwise. What such an
 * output held before is not looked at.
 *
 * Ownership. What a function hands out through a pointer to a pointer is the caller's, who frees it
 * with the function of its type; those accept NULL. Strings that functions return belong to what
 * they were asked of and live as long. Arguments are copied as far as they are kept.
 *
 * Strings are UTF-8 and end at their NUL byte; an argument with other bytes is refused. Bytes of
 * policy files that are not UTF-8 appear as U+FFFD in results. Positions in lines are in bytes.
 *
 * The calling process stays as it was. A host's kernel is an object in the caller's process and
 * thread: no child is made, and root directory, namespaces, filters, signal handlers, descriptors
 * and standard streams are not touched. Nothing is written to standard output or error; what a load
 * logs goes to the system log under the caller's own name. A write beyond the limit of file sizes
 * fails the call and raises no signal.
 *
 * Threads. All functions may be called from several threads at once. A handle may be used by
 * several of them, but for its being freed. A call blocks its thread, which cannot be cancelled
 * meanwhile. Two loads of one host take turns; one that waits for another process for more than 30
 * seconds fails and names that process. */
#ifndef SECPOLICY_SECPOLICY_C_H
#define SECPOLICY_SECPOLICY_C_H

/* NOLINTBEGIN(modernize-*): this is a header of C, too */

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif
#pragma GCC visibility push(default)

/* ---- Version ---- */

/* The major number of this header. A library of the same one, and the same or a later minor one,
 * has all that is declared here. */
#define SECPOLICY_C_VERSION_MAJOR 1
/* The minor number of this header. */
#define SECPOLICY_C_VERSION_MINOR 0

/* Of the library that runs: the major number times 65,536, plus the minor one. */
uint32_t secpolicy_c_version(void);

/* ---- Status and errors ---- */

/* What a call came to. */
typedef enum secpolicy_status {
  /* All was done. */
  SECPOLICY_OK = 0,
  /* The call is wrong: a NULL that is none of those allowed, a string that is not UTF-8. */
  SECPOLICY_INVALID_ARGUMENT = 1,
  /* The request is: a word, a domain or an id that the host or the policy does not have, a question
   * of the wrong form, a bad pattern. */
  SECPOLICY_BAD_REQUEST = 2,
  /* The host directory or the policy directory does not allow it: it is missing, damaged, not
   * assembled, not or not readable by this user. */
  SECPOLICY_FAILED = 3,
  /* The load was done to its end, and reported errors. */
  SECPOLICY_LOAD_FAILED = 4,
  /* The load was terminated, since a domain that every host needs is missing. */
  SECPOLICY_LOAD_TERMINATED = 5,
  /* There is no memory. */
  SECPOLICY_OUT_OF_MEMORY = 6,
  /* The system failed in a way that no other status names. */
  SECPOLICY_SYSTEM = 7,
  /* None. Any number may be asked for its name. */
  SECPOLICY_STATUS_RANGE = INT32_MAX
} secpolicy_status;

/* The name of a status, "SECPOLICY_OK" for instance; "unknown" for other numbers. Never NULL. */
const char* secpolicy_status_name(secpolicy_status status);

/* What went wrong in one call. */
typedef struct secpolicy_error secpolicy_error;

/* What the call returned. SECPOLICY_OK for NULL. */
secpolicy_status secpolicy_error_status(const secpolicy_error* error);
/* For people; without a newline at its end unless a name in it has one. "" for NULL. */
const char* secpolicy_error_message(const secpolicy_error* error);
/* The policy file that the message is about; NULL when it is about none, or for NULL. */
const char* secpolicy_error_file(const secpolicy_error* error);
/* The line there, from 1; 0 when there is none, or for NULL. */
uint32_t secpolicy_error_line(const secpolicy_error* error);
/* Ends the description; nothing for NULL. */
void secpolicy_error_free(secpolicy_error* error);

/* ---- Texts ---- */

/* A result: JSON, by one of the schemas in docs/schemas. */
typedef struct secpolicy_text secpolicy_text;

/* The text, with a NUL byte behind it and none in it. NULL for NULL. */
const char* secpolicy_text_data(const secpolicy_text* text);
/* Its bytes, without that NUL. 0 for NULL. */
size_t secpolicy_text_size(const secpolicy_text* text);
/* Ends the text; nothing for NULL. */
void secpolicy_text_free(secpolicy_text* text);

/* ---- Hosts ---- */

/* A host directory. Holds its path, made absolute, and nothing open: what has become of the
 * directory is seen by each call anew. */
typedef struct secpolicy_host secpolicy_host;

/* Makes `directory`, with its parents as far as they are missing, a host directory with the default
 * description and no tardisks; as "secpolicy host init". SECPOLICY_FAILED when it is one already or
 * cannot be made; directories that were made until then stay. */
secpolicy_status secpolicy_host_create(const char* directory, secpolicy_error** error);

/* Opens `directory`. SECPOLICY_FAILED when it is no host directory. */
secpolicy_status secpolicy_host_open(const char* directory, secpolicy_host** host,
                                     secpolicy_error** error);

/* Unpacks the host's tardisks into its root file system and starts its kernel anew, which forgets
 * all policy; as "secpolicy host assemble". SECPOLICY_FAILED when that cannot be done: the root and
 * the kernel are as before. */
secpolicy_status secpolicy_host_assemble(const secpolicy_host* host, secpolicy_error** error);

/* The absolute path. NULL for NULL. */
const char* secpolicy_host_path(const secpolicy_host* host);

/* Texts and policies that were read by way of the host stay usable. */
void secpolicy_host_free(secpolicy_host* host);

/* ---- Loading, showing, checking ---- */

/* Loads the policy directory `directory` into the host's kernel and says what came of it; as
 * "secpolicy load". NULL for the host's own one, /etc/olvane/secpolicy.
 *
 * *result, by load.schema.json, has every error that the load logged, in order, and what the kernel
 * holds afterwards. It is there with SECPOLICY_OK, and also with
 *   SECPOLICY_LOAD_FAILED      what could be installed is; the error names the first logged error
 *                              that has a place
 *   SECPOLICY_LOAD_TERMINATED  what was installed before the domains were looked up is
 * SECPOLICY_FAILED when there is no such directory, among other things. With any other status it is
 * NULL; the kernel holds what it held before, unless the message says that the work was killed:
 * then it may be either, see secpolicy_show. The load's progress goes to the system log as
 * "secpolicy". `result` may be NULL when it is not wanted. */
secpolicy_status secpolicy_load(const secpolicy_host* host, const char* directory,
                                secpolicy_text** result, secpolicy_error** error);

/* For secpolicy_show: no single domain, but all. */
#define SECPOLICY_ALL_DOMAINS UINT32_MAX

/* What the host's kernel holds, by show.schema.json; as "secpolicy show --json". Of the domains,
 * only the one with the kernel's number `domain`, or all with SECPOLICY_ALL_DOMAINS.
 * SECPOLICY_BAD_REQUEST "no domain has the id N". Changes nothing. */
secpolicy_status secpolicy_show(const secpolicy_host* host, uint32_t domain,
                                secpolicy_text** result, secpolicy_error** error);

/* All findings in the policy directory `directory`, by check.schema.json; as "secpolicy check
 * --json". NULL for the host's own one. A policy with findings, errors among them, is SECPOLICY_OK.
 * Changes nothing. */
secpolicy_status secpolicy_check(const secpolicy_host* host, const char* directory,
                                 secpolicy_text** result, secpolicy_error** error);

/* ---- Asking a policy ---- */

/* A policy as it was when it was read. Knows the path of the host that it was read by way of, whose
 * words and files questions may speak of. */
typedef struct secpolicy_policy secpolicy_policy;

/* Reads a policy: of the directory `source`, as a kernel that has just been started holds it once
 * it was loaded (which is tried, and changes nothing); or with "kernel", what the host's kernel
 * holds. (A directory of that name is "./kernel".) NULL for the host's own directory. Errors of
 * such a load do not fail the call, see secpolicy_policy_errors. SECPOLICY_FAILED when there is no
 * such directory. */
secpolicy_status secpolicy_policy_read(const secpolicy_host* host, const char* source,
                                       secpolicy_policy** policy, secpolicy_error** error);

/* How many errors a load of the policy reports; what they are about is not in it. 0 for NULL. */
size_t secpolicy_policy_error_count(const secpolicy_policy* policy);
/* One of them, from 0, as the load words it. NULL from the count on, or for NULL. */
const char* secpolicy_policy_error(const secpolicy_policy* policy, size_t index);

/* Ends the use of the policy; nothing for NULL. */
void secpolicy_policy_free(secpolicy_policy* policy);

/* Which rules are looked for, by what they decide. */
typedef enum secpolicy_decision {
  SECPOLICY_ANY_DECISION = 0,          /* all */
  SECPOLICY_GRANTED = 1,               /* that grant, or permit something */
  SECPOLICY_REVOKED = 2,               /* that revoke, or permit nothing */
  SECPOLICY_DECISION_RANGE = INT32_MAX /* none */
} secpolicy_decision;

/* What is looked for; all of it has to hold. Zeroed, but for the size, for every rule. */
typedef struct secpolicy_search_terms {
  size_t size;                 /* sizeof (secpolicy_search_terms) */
  const char* domain;          /* rules of this domain; NULL for all */
  const char* type;            /* "-s" or "syscall", for instance; NULL for all */
  const char* word;            /* rules with this word; NULL for all */
  const char* pattern;         /* rules with a word that this regular expression (RE2 syntax, at
                                  most 1,000 bytes) is found in; NULL for all. Not together with
                                  `word`. */
  const char* path;            /* an absolute path of the host: path rules that decide on it, or are
                                  for something below it; NULL for all */
  secpolicy_decision decision; /* rules that decide so */
} secpolicy_search_terms;

/* The rules of `policy` for which `terms` hold, by search.schema.json; as "secpolicy search
 * --json". That there are none is SECPOLICY_OK. SECPOLICY_BAD_REQUEST for an unknown domain, type
 * or pattern, or a relative path. */
secpolicy_status secpolicy_search(const secpolicy_policy* policy,
                                  const secpolicy_search_terms* terms, secpolicy_text** result,
                                  secpolicy_error** error);

/* Whether `domain` is allowed what the `count` words at `words` say, "read" and "/etc/hosts" for
 * instance, and the rule that decides, by may.schema.json; as "secpolicy may --json". That it is
 * not allowed is SECPOLICY_OK. SECPOLICY_BAD_REQUEST for what is unknown or no question. */
secpolicy_status secpolicy_may(const secpolicy_policy* policy, const char* domain,
                               const char* const* words, size_t count, secpolicy_text** result,
                               secpolicy_error** error);

/* The domains that are allowed it, each with the rule that decides, by who.schema.json; as
 * "secpolicy who --json". */
secpolicy_status secpolicy_who(const secpolicy_policy* policy, const char* const* words,
                               size_t count, secpolicy_text** result, secpolicy_error** error);

#pragma GCC visibility pop
#ifdef __cplusplus
}
#endif

/* NOLINTEND(modernize-*) */

#endif /* SECPOLICY_SECPOLICY_C_H */
