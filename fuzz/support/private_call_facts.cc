#include "fuzz/support/private_call_facts.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <initializer_list>

#include "fuzz/support/require.h"
#include "platform/zek_access.h"

namespace Fuzz {

using StandIn::CallArguments;
using StandIn::PrivateAnswer;
using ZekCtl::Kernel::PrivateCall;
using ZekCtl::Security::ZekAccess_FileRule;

namespace {

constexpr long kRefusedStatus = 0x0bad0000;
constexpr std::uint64_t kNowhere = ~0ULL - sizeof(std::uint32_t);

// What a call may be refused with, besides EFAULT.
struct Refusals {
  PrivateCall call;
  std::initializer_list<int> numbers;
};

const std::array<Refusals, 11> kRefusals{{
    {PrivateCall::kCreateDomain, {EINVAL, ENAMETOOLONG, EEXIST, ENOSPC}},
    {PrivateCall::kDestroyDomain, {ENOENT, EBUSY}},
    {PrivateCall::kUpdateRule, {ENOENT, EINVAL, ENAMETOOLONG}},
    {PrivateCall::kRemoveRule, {ENOENT, ENAMETOOLONG}},
    {PrivateCall::kReadRules, {ENOENT}},
    {PrivateCall::kCountRules, {ENOENT}},
    {PrivateCall::kAddRules, {ENOENT, ESRCH, EINVAL, ENAMETOOLONG, ENOSPC}},
    {PrivateCall::kLeakedDomains, {}},
    {PrivateCall::kWorldDomain, {ESRCH}},
    {PrivateCall::kDomainName, {ENOENT, ERANGE}},
    {PrivateCall::kReplacePath, {ENOENT, EINVAL, ENAMETOOLONG}},
}};

bool IsDocumented(PrivateCall call, int number) {
  for (const Refusals& refusals : kRefusals) {
    if (refusals.call != call) continue;
    for (const int known : refusals.numbers) {
      if (known == number) return true;
    }
    return number == EFAULT;
  }
  return number == ENOSYS;
}

}  // namespace

void RequireDocumented(PrivateCall call, const PrivateAnswer& answer) {
  if (answer.status == 0) {
    Require(answer.error == 0, "a call that is done has no error value");
  } else if (answer.status == ZekCtl::Kernel::kStatusTableTooSmall) {
    Require(call == PrivateCall::kReadRules && answer.error == -ENOSPC,
            "only the reading of rules finds no room");
  } else {
    Require(answer.status == kRefusedStatus - answer.error,
            "the status of a refusal tells its error value");
    Require(IsDocumented(call, static_cast<int>(-answer.error)),
            "a call is refused with an error of its own");
  }
}

Results ResultsOf(PrivateCall call, const CallArguments& arguments) {
  // No table of the small world has more entries, and no name more bytes.
  const auto bytes = [](std::uint64_t count, std::size_t size) {
    return static_cast<std::size_t>(std::min<std::uint64_t>(count, 128)) * size;
  };
  switch (call) {
    case PrivateCall::kCreateDomain:
      return {0, 0, arguments[2]};
    case PrivateCall::kReadRules:
      return {arguments[1],
              bytes(static_cast<std::uint32_t>(arguments[2]), sizeof(ZekAccess_FileRule)),
              kNowhere};
    case PrivateCall::kCountRules:
    case PrivateCall::kWorldDomain:
      return {0, 0, arguments[1]};
    case PrivateCall::kAddRules:
      return {0, 0, arguments[4]};
    case PrivateCall::kLeakedDomains:
      return {arguments[1], bytes(arguments[2], sizeof(std::uint32_t)), arguments[0]};
    case PrivateCall::kDomainName:
      return {arguments[1], bytes(arguments[2], 1), kNowhere};
    default:
      return {0, 0, kNowhere};
  }
}

}  // namespace Fuzz
