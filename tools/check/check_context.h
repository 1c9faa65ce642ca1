// What the parts of a check share.
#pragma once

#include <map>
#include <set>
#include <string>
#include <unordered_map>
#include <unordered_set>

#include "host/module/security_module.h"
#include "host/root/root_index.h"
#include "platform/tavon_exception.h"
#include "tools/check/findings.h"
#include "tools/check/load_errors.h"
#include "tools/check/word_judge.h"

namespace SecPolicyTool {

// What the files refer to, across all of them.
struct References {
  std::unordered_set<std::string> objects;
  // By domain: the domains into which a granted transition leads.
  std::map<std::string, std::set<std::string>> transitions;
  std::set<std::string> launched;  // domains in which programs of tardisks start
};

struct CheckContext {
  StandIn::SecurityModule& module;  // as the load on trial left it
  const StandIn::RootIndex& root;   // the host's files
  const LoadErrors& load;
  const std::set<std::string>& shortages;  // errors of the load for want of descriptors
  bool isTerminated;                       // the load, before it came to tardisks and file labels
  WordJudge& judge;
  Findings& findings;
  References& references;
};

// The words in which `refuse` fails, which has to be by a TavonException.
template <typename Refuse>
std::string TextOfRefusal(const Refuse& refuse) {
  try {
    refuse();
  } catch (const Tavon::Lib::TavonException& failure) {
    return failure.what();
  }
  return {};
}

// "FILE:LINE : CAUSE", as a load names a line of objects and file labels.
std::string AtLine(const std::string& path, unsigned int line, const std::string& cause);

}  // namespace SecPolicyTool
