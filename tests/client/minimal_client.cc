// A program of a host as small as one can be: the public header alone, the shared library, and an
// exception that is caught on the other side of it. Exit status 0 when all is as it should be.
#include "secpolicy/secpolicy.h"

int main() try {
  std::string word = "allow";
  SecPolicy::IsGrant(word);
  return 1;
} catch (const SecPolicy::SecPolicyRetryException&) {
  return 2;
} catch (const Tavon::Lib::TavonException& failure) {
  const SecPolicy::SecPolicyRetryException retry(failure.what());
  return std::string("invalid keyword allow") == retry.what() ? 0 : 3;
}
