#include "tests/faults/load_rules.h"

#include <algorithm>
#include <iterator>

namespace SecPolicyFaults {

namespace {

constexpr char kParseError[] = "Error in parsing policy for domain: {place} : {cause}";

// The first row that fits counts.
constexpr Rule kRules[] = {
    {Phase::kDomainsSet, "prctl ", Reach::kNothing, {"{cause}", nullptr}},
    {Phase::kObjectsRead, "fopen ", Reach::kItem, {"{cause}", nullptr}},
    {Phase::kObjectsRead, "", Reach::kStage, {nullptr, nullptr}},
    {Phase::kObjectsSet, "", Reach::kStage, {"Error in defining some objects", nullptr}},
    {Phase::kDomainNames, "", Reach::kStage, {nullptr, nullptr}},
    {Phase::kDomainsParse, "fopen ", Reach::kItem, {"{cause}", nullptr}},
    {Phase::kDomainsParse, "", Reach::kItem, {kParseError, nullptr}},
    {Phase::kDomainsCheck,
     "",
     Reach::kItem,
     {"Policy constraint error for domain: {item} : {cause}", nullptr}},
    {Phase::kDomainsSet,
     "",
     Reach::kItem,
     {"Error in setting policy for domain: {place} : {cause}", nullptr}},
    {Phase::kWellKnown, "", Reach::kCall, {nullptr, nullptr}},
    {Phase::kTardisksFind, "", Reach::kStage, {nullptr, nullptr}},
    {Phase::kTardisksParse, "find-domain ", Reach::kItem, {kParseError, nullptr}},
    {Phase::kTardisksParse, "", Reach::kItem, {"{cause}", nullptr}},
    {Phase::kTardisksSet, "", Reach::kItem, {"{place} : Tardisk: {tardisk} : {cause}", nullptr}},
    {Phase::kTardisksDefault,
     "set-rule ",
     Reach::kItem,
     {"Failed to set default tardisk rule: ", "{cause}"}},
    {Phase::kTardisksDefault,
     "lookup-label ",
     Reach::kItem,
     {"Failed to set default tardisk label: ", "{cause}"}},
    {Phase::kTardisksDefault,
     "setxattr ",
     Reach::kItem,
     {"Failed to set default tardisk label: ", "{cause}"}},
    {Phase::kTardisksDefault, "", Reach::kPhase, {"{cause}", nullptr}},
    {Phase::kLabelsParse, "opendir ", Reach::kStage, {nullptr, nullptr}},
    {Phase::kLabelsParse, "", Reach::kItem, {"Error parsing file {item}", "{cause}"}},
    {Phase::kLabelsSet, "", Reach::kItem, {"{place} : {cause}", nullptr}},
};

}  // namespace

const Rule& RuleFor(Phase phase, const Event& event) {
  return *std::find_if(std::begin(kRules), std::end(kRules), [&](const Rule& rule) {
    return rule.phase == phase && event.text.starts_with(rule.what);
  });
}

}  // namespace SecPolicyFaults
