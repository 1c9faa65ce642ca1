// Which domains a program can come to.
#include "tools/query/reach.h"

#include "tests/tools/query/policy_parts.h"

namespace SecPolicyTool {
namespace {

// rootDom -exec-> aDom -exec-> bDom -fork-> cDom -exec-> aDom, and what was revoked.
Policy Transitions() {
  Policy policy;
  policy.domains["rootDom"] = DomainWith({"-d x aDom exec grant", "-d x cDom exec revoke"});
  policy.domains["aDom"] = DomainWith({"-s open grant", "-d x bDom exec grant"});
  policy.domains["bDom"] = DomainWith({"-d y cDom fork grant"});
  policy.domains["cDom"] = DomainWith({"-d y aDom exec grant"});
  policy.domains["lonelyDom"] = {};
  return policy;
}

TEST(ReachTest, WaysAreFollowedByEvent) {
  struct Row {
    const char* from;
    const char* to;
    std::optional<std::string> event;
    bool isReached;
  };
  const Policy policy = Transitions();
  Ways ways(policy);
  for (const Row& row : {
           Row{"rootDom", "aDom", std::nullopt, true},
           Row{"rootDom", "bDom", "exec", true},
           Row{"rootDom", "bDom", "fork", false},
           Row{"rootDom", "cDom", std::nullopt, true},
           Row{"rootDom", "cDom", "exec", false},
           Row{"bDom", "cDom", "fork", true},
           Row{"cDom", "cDom", "exec", true},
           Row{"cDom", "rootDom", std::nullopt, false},
           Row{"lonelyDom", "lonelyDom", std::nullopt, true},
           Row{"lonelyDom", "aDom", std::nullopt, false},
           Row{"rootDom", "lonelyDom", std::nullopt, false},
           Row{"rootDom", "noDom", std::nullopt, false},
       }) {
    EXPECT_EQ(ways.Shortest(row.from, row.to, row.event).has_value(), row.isReached)
        << row.from << " " << row.to << " " << row.event.value_or("any");
  }
}

TEST(ReachTest, TheWayIsAShortestOne) {
  Policy policy = Transitions();
  policy.domains["rootDom"].rules.push_back(RuleOf("-d z bDom fork grant"));
  Ways ways(policy);
  const auto way = ways.Shortest("rootDom", "cDom", std::nullopt);
  ASSERT_TRUE(way);
  std::vector<std::string> steps;
  for (const Step& step : *way) steps.push_back(*step.from + " " + LineOf(*step.rule));
  EXPECT_EQ(steps, (std::vector<std::string>{"rootDom -d z bDom fork grant",
                                             "bDom -d y cDom fork grant"}));
}

}  // namespace
}  // namespace SecPolicyTool
