#include "tests/abi/border/raising_plugin.h"

#include "secpolicy/secpolicy.h"

extern "C" __attribute__((visibility("default"))) void Raise(Raised raised) {
  std::string word = "allow";
  switch (raised) {
    case Raised::kFailure:
      throw Tavon::Lib::TavonException("of the plug-in");
    case Raised::kRetry:
      throw SecPolicy::SecPolicyRetryException("again");
    case Raised::kOfTheLibrary:
      SecPolicy::IsGrant(word);
  }
}
