#include "host/json/json_limits.h"

#include "host/text/quoted_name.h"
#include "platform/tavon_strcat.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

using Tavon::Misc::StrCat;

void JsonLimits::Check(std::size_t depth) const {
  if (depth >= kDeepestNesting) {
    throw HostError(
        StrCat(file_, ": is nested more than ", kDeepestNesting, " arrays and objects deep"));
  }
}

void JsonLimits::Key(const std::string& key) {
  if (!keys_.back().insert(key).second) {
    throw HostError(StrCat(file_, ": gives the member ", QuotedName(key), " of one object twice"));
  }
}

}  // namespace StandIn
