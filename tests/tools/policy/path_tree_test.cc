// Values along paths.
#include "tools/policy/path_tree.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;

using Numbers = PathTree<int>;

// The paths that a visit comes to, each with its value.
std::vector<std::string> KnownAlong(const Numbers& tree, const std::string& path) {
  std::vector<std::string> seen;
  tree.VisitKnown(path, [&](int value, std::string_view at) {
    seen.push_back(std::string(at) + "=" + std::to_string(value));
  });
  return seen;
}

void AddOneAlong(Numbers& tree, const std::string& path) {
  tree.Visit(path, [](int& value, std::string_view) { ++value; });
}

TEST(PathTreeTest, VisitPassesEveryDirectoryOnTheWay) {
  Numbers tree;
  AddOneAlong(tree, "/usr/bin/ls");
  AddOneAlong(tree, "/usr/bin");
  AddOneAlong(tree, "/");
  EXPECT_THAT(KnownAlong(tree, "/usr/bin/ls"),
              ElementsAre("/=3", "/usr=2", "/usr/bin=2", "/usr/bin/ls=1"));
}

TEST(PathTreeTest, VisitOfKnownPathsEndsWhereTheTreeDoes) {
  Numbers tree;
  AddOneAlong(tree, "/usr/bin");
  EXPECT_THAT(KnownAlong(tree, "/usr/lib/x"), ElementsAre("/=1", "/usr=1"));
  EXPECT_THAT(KnownAlong(tree, "/usr/binary"), ElementsAre("/=1", "/usr=1"));
  EXPECT_THAT(KnownAlong(tree, "/"), ElementsAre("/=1"));
  EXPECT_THAT(KnownAlong(Numbers(), "/usr"), ElementsAre("/=0"));
}

TEST(PathTreeTest, SlashesThatDoNotCountAreLeftOut) {
  Numbers tree;
  AddOneAlong(tree, "/usr/bin");
  EXPECT_THAT(KnownAlong(tree, "//usr/bin/"), ElementsAre("/=1", "//usr=1", "//usr/bin=1"));
  EXPECT_THAT(KnownAlong(tree, ""), ElementsAre("/=1"));
}

TEST(PathTreeTest, ValuesSurviveAMove) {
  Numbers tree;
  AddOneAlong(tree, "/usr/bin");
  const Numbers moved = std::move(tree);
  EXPECT_THAT(KnownAlong(moved, "/usr/bin"), ElementsAre("/=1", "/usr=1", "/usr/bin=1"));
}

}  // namespace
}  // namespace SecPolicyTool
