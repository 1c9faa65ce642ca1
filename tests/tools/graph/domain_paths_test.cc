// How one domain is reached from another.
#include "tools/graph/domain_paths.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/tools/some_policy.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::ElementsAreArray;

std::string Name(const TransitionGraph& graph, const DomainPath& path) {
  std::string name;
  for (const std::size_t domain : path) name += graph.Domains()[domain];
  return name;
}

// The paths from "from" to "to", by the letters of their domains, and "..." when there are more.
std::vector<std::string> Paths(const TransitionGraph& graph, const std::string& from,
                               const std::string& to, std::size_t most) {
  const FoundPaths found = FindPaths(graph, graph.Find(from).value(), graph.Find(to).value(), most);
  std::vector<std::string> names;
  for (const DomainPath& path : found.paths) names.push_back(Name(graph, path));
  if (found.hasMore) names.emplace_back("...");
  return names;
}

TEST(DomainPathsTest, Table) {
  struct Case {
    const char* name;
    std::vector<std::string> links;
    std::vector<std::string> paths;  // from a to z, at most 4
  };
  for (const Case& row : {
           Case{"one step", {"az"}, {"az"}},
           Case{"against the arrow", {"za"}, {}},
           Case{"apart", {"ab", "yz"}, {}},
           Case{"a chain", {"ab", "bc", "cz"}, {"abcz"}},
           Case{"shortest first", {"ab", "bc", "cz", "az", "ad", "dz"}, {"az", "adz", "abcz"}},
           Case{"by name among equals", {"ac", "cz", "ab", "bz"}, {"abz", "acz"}},
           Case{"loops are passed by", {"aa", "ab", "ba", "bb", "bz", "zz", "zb"}, {"abz"}},
           Case{"through no domain twice", {"ab", "bc", "cb", "cz", "bd", "dc"}, {"abcz", "abdcz"}},
           Case{"more than asked for",
                {"ab", "ac", "ad", "ae", "af", "bz", "cz", "dz", "ez", "fz"},
                {"abz", "acz", "adz", "aez", "..."}},
           Case{"as many as asked for",
                {"ab", "ac", "ad", "ae", "bz", "cz", "dz", "ez"},
                {"abz", "acz", "adz", "aez"}},
       }) {
    SCOPED_TRACE(row.name);
    Policy policy = PolicyOfLinks(row.links);
    policy.domains["a"];
    policy.domains["z"];
    EXPECT_THAT(Paths(TransitionGraph(policy), "a", "z", 4), ElementsAreArray(row.paths));
  }
}

TEST(DomainPathsTest, ToItselfIsNoStep) {
  EXPECT_THAT(Paths(TransitionGraph(PolicyOfLinks({"aa", "ab", "ba"})), "a", "a", 9),
              ElementsAre("a"));
}

// All simple paths, by trying each.
void AddPaths(const TransitionGraph& graph, DomainPath path, std::size_t to,
              std::vector<DomainPath>& paths) {
  if (path.back() == to) {
    paths.push_back(path);
    return;
  }
  for (const Link& link : graph.LinksFrom(path.back())) {
    if (std::find(path.begin(), path.end(), link.to) != path.end()) continue;
    DomainPath longer = path;
    longer.push_back(link.to);
    AddPaths(graph, longer, to, paths);
  }
}

TEST(DomainPathsTest, FindsWhatTryingEachPathFinds) {
  // Seven domains; each seed decides which of the 49 links there are.
  for (unsigned int seed = 1; seed <= 60; ++seed) {
    std::vector<std::string> links;
    unsigned int state = seed;
    for (const char from : std::string("abcdefg")) {
      for (const char to : std::string("abcdefg")) {
        state = state * 1664525 + 1013904223;
        if ((state >> 16) % 3 == 0) links.push_back({from, to});
      }
    }
    Policy policy = PolicyOfLinks(links);
    policy.domains["a"];
    policy.domains["g"];
    const TransitionGraph graph(policy);
    std::vector<DomainPath> all;
    AddPaths(graph, {graph.Find("a").value()}, graph.Find("g").value(), all);
    std::sort(all.begin(), all.end(), [](const DomainPath& a, const DomainPath& b) {
      return a.size() != b.size() ? a.size() < b.size() : a < b;
    });
    const FoundPaths found =
        FindPaths(graph, graph.Find("a").value(), graph.Find("g").value(), 1000);
    EXPECT_THAT(found.paths, ElementsAreArray(all)) << "seed " << seed;
    EXPECT_FALSE(found.hasMore);
  }
}

TEST(DomainPathsTest, NumberOfPathsThatThereAreIsNoBurden) {
  // Twenty-five forks in a row: 33,554,432 paths.
  Policy policy;
  const auto name = [](int i, const char* side) { return std::to_string(100 + i) + side; };
  for (int i = 0; i < 25; ++i) {
    for (const char* side : {"l", "r"}) {
      policy.domains[name(i, "")].rules.push_back(Goes(name(i, side)));
      policy.domains[name(i, side)].rules.push_back(Goes(name(i + 1, "")));
    }
  }
  policy.domains[name(25, "")];
  const TransitionGraph graph(policy);
  const FoundPaths found =
      FindPaths(graph, graph.Find("100").value(), graph.Find("125").value(), 20);
  EXPECT_EQ(found.paths.size(), 20U);
  EXPECT_TRUE(found.hasMore);
  for (const DomainPath& path : found.paths) EXPECT_EQ(path.size(), 51U);
}

TEST(DomainPathsTest, StepsHaveTheirRules) {
  Policy policy = PolicyOfLinks({"ab", "ac", "bz"});
  policy.domains["a"].rules.push_back(Goes("b", "other"));
  const TransitionGraph graph(policy);
  const FoundPaths found = FindPaths(graph, 0, graph.Find("z").value(), 1);
  ASSERT_EQ(found.paths.size(), 1U);
  std::vector<std::string> labels;
  for (std::size_t step = 0; step < 2; ++step) {
    for (const Transition& rule : graph.TransitionsOf(LinkOf(graph, found.paths.front(), step))) {
      labels.push_back(rule.label);
    }
  }
  EXPECT_THAT(labels, ElementsAre("other", "tob", "toz"));
}

}  // namespace
}  // namespace SecPolicyTool
