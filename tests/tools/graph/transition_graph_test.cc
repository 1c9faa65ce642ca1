// A policy's transitions as a graph.
#include "tools/graph/transition_graph.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/tools/some_policy.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// "from -label,event-> to", for each transition in its order.
std::vector<std::string> Shown(const TransitionGraph& graph) {
  std::vector<std::string> shown;
  for (const Transition& transition : graph.Transitions()) {
    shown.push_back(graph.Domains()[transition.from] + " -" + transition.label + "," +
                    transition.event + "-> " + graph.Domains()[transition.to]);
  }
  return shown;
}

TEST(TransitionGraphTest, HoldsWhatIsGranted) {
  Policy policy;
  policy.domains["a"].rules = {SomeRule(RuleType::kTransition, {"x", "c", "exec"}, false),
                               Goes("b", "y"), SomeRule(RuleType::kSyscall, {"read"})};
  policy.domains["b"];
  policy.domains["c"];
  const TransitionGraph graph(policy);
  EXPECT_THAT(graph.Domains(), ElementsAre("a", "b", "c"));
  EXPECT_THAT(Shown(graph), ElementsAre("a -y,exec-> b"));
}

TEST(TransitionGraphTest, IsInOrderWhateverTheOrderOfRules) {
  Policy policy;
  policy.domains["b"].rules = {Goes("a", "y", "fork"), Goes("b", "z"), Goes("a", "z"),
                               Goes("a", "x")};
  policy.domains["a"].rules = {Goes("b", "x")};
  EXPECT_THAT(Shown(TransitionGraph(policy)),
              ElementsAre("a -x,exec-> b", "b -x,exec-> a", "b -z,exec-> a", "b -y,fork-> a",
                          "b -z,exec-> b"));
}

TEST(TransitionGraphTest, OneEventCanBeAskedFor) {
  Policy policy;
  policy.domains["a"].rules = {Goes("a", "x"), Goes("b", "x", "fork")};
  policy.domains["b"];
  EXPECT_THAT(Shown(TransitionGraph(policy, "fork")), ElementsAre("a -x,fork-> b"));
  EXPECT_THAT(Shown(TransitionGraph(policy, "sleep")), IsEmpty());
  EXPECT_EQ(TransitionGraph(policy, "fork").Domains().size(), 2U);
}

TEST(TransitionGraphTest, LinksHoldTheTransitionsBetweenTwoDomains) {
  Policy policy;
  policy.domains["a"].rules = {Goes("c", "x"), Goes("b", "x"), Goes("c", "y")};
  policy.domains["b"];
  policy.domains["c"].rules = {Goes("a", "x")};
  const TransitionGraph graph(policy);
  std::vector<std::string> shown;
  for (std::size_t domain = 0; domain < graph.Domains().size(); ++domain) {
    for (const Link& link : graph.LinksFrom(domain)) {
      EXPECT_EQ(link.from, domain);
      std::string labels;
      for (const Transition& transition : graph.TransitionsOf(link)) labels += transition.label;
      shown.push_back(graph.Domains()[domain] + graph.Domains()[link.to] + ":" + labels);
    }
  }
  EXPECT_THAT(shown, ElementsAre("ab:x", "ac:xy", "ca:x"));
}

TEST(TransitionGraphTest, TargetThatIsNoDomainAnyMoreIsShownAllTheSame) {
  Policy policy;
  policy.domains["a"].rules = {Goes("gone")};
  const TransitionGraph graph(policy);
  EXPECT_THAT(graph.Domains(), ElementsAre("a", "gone"));
  EXPECT_THAT(graph.LinksFrom(*graph.Find("gone")), IsEmpty());
}

TEST(TransitionGraphTest, DomainsAreFoundByName) {
  const TransitionGraph graph(PolicyOfLinks({"ab", "bd"}));
  EXPECT_EQ(graph.Find("d"), 2U);
  EXPECT_EQ(graph.Find("c"), std::nullopt);
  EXPECT_EQ(graph.Find("e"), std::nullopt);
  EXPECT_THAT(TransitionGraph(Policy()).Domains(), IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTool
