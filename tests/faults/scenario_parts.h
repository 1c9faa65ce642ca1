// What scenarios are put together from.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "secpolicy/secpolicy.h"
#include "tests/faults/campaign_hosts.h"

namespace SecPolicyFaults {

using SecPolicy::ZekAccessInterfaceImpl;
using Text = std::string;

template <typename Action>
std::function<Text()> Doing(Action action) {
  return [action] {
    action();
    return Text();
  };
}

template <typename Action>
std::function<Text()> WithInterface(Action action) {
  return [action] {
    ZekAccessInterfaceImpl iface;
    action(iface);
    return Text();
  };
}

// Loads the policy of a host, as far as it goes.
inline std::function<void()> Loaded(HostKind host) {
  return [dir = PolicyDirOf(host)] {
    try {
      SecPolicy::LoadPolicy(dir);
    } catch (const Tavon::Lib::TavonException&) {
      // The bad policy is loaded as far as it goes.
    }
  };
}

// The id of appDom in a kernel that holds the good policy.
inline constexpr unsigned int kAppDomain = 1;

// The exported calls that are no stages and no displays.
void AddCallScenarios(std::vector<Scenario>& all);

}  // namespace SecPolicyFaults
