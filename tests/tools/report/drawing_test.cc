// Drawings of transition graphs.
#include "tools/report/drawing.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <stdexcept>

#include "tests/tools/some_policy.h"
#include "tests/tools/stand_in_dot.h"
#include "tools/graph/graphviz.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TransitionGraph SomeGraph() {
  Policy policy = PolicyOfLinks({"ab", "bb", "bc"});
  policy.domains["alone"];
  policy.domains["b"].rules.push_back(Goes("c", "another", "fork"));
  return TransitionGraph(policy);
}

// The same number of domains and links, without repetition: each domain goes to the next ones.
TransitionGraph BigGraph(std::size_t domains, std::size_t links) {
  Policy policy;
  for (std::size_t i = 0; i < links; ++i) {
    policy.domains[std::to_string(i % domains)].rules.push_back(
        Goes(std::to_string((i + 1 + i / domains) % domains)));
  }
  return TransitionGraph(policy);
}

bool IsInside(const Drawing& drawing, const Point& point) {
  return point.x >= 0 && point.x <= drawing.width && point.y >= 0 && point.y <= drawing.height;
}

// Each linked domain and each link once, and inside.
void ExpectWhole(const TransitionGraph& graph, const Drawing& drawing) {
  std::vector<std::size_t> domains;
  for (const DrawnDomain& drawn : drawing.domains) {
    domains.push_back(drawn.domain);
    EXPECT_TRUE(IsInside(drawing, drawn.centre)) << graph.Domains()[drawn.domain];
  }
  EXPECT_THAT(domains, testing::UnorderedElementsAreArray(SplitDomains(graph).linked));
  std::vector<std::size_t> links;
  for (const DrawnLink& drawn : drawing.links) {
    links.push_back(drawn.link);
    EXPECT_THAT(drawn.path, testing::MatchesRegex("M[-0-9. ]+[CQ][-0-9. ]+"));
    if (drawn.caption) {
      EXPECT_TRUE(IsInside(drawing, *drawn.caption));
    }
  }
  std::vector<std::size_t> all(graph.Links().size());
  for (std::size_t i = 0; i < all.size(); ++i) all[i] = i;
  EXPECT_THAT(links, testing::UnorderedElementsAreArray(all));
}

bool HasBoxes(const Drawing& drawing) { return drawing.domains.at(0).width > 0; }

// ---- Words ----

TEST(DrawingTest, CaptionsNameTheFirstTransition) {
  const TransitionGraph graph = SomeGraph();
  std::vector<std::string> captions;
  for (const Link& link : graph.Links()) captions.push_back(CaptionOf(graph, link));
  EXPECT_THAT(captions, ElementsAre("tob, exec", "tob, exec", "toc, exec +1"));
}

TEST(DrawingTest, LongNamesAreShortened) {
  Policy policy;
  policy.domains[std::string(40, 'n')].rules = {Goes("b", std::string(40, 'l'))};
  policy.domains["b"];
  const TransitionGraph graph(policy);
  EXPECT_EQ(DrawnName(graph, 1), std::string(26, 'n') + "…");
  EXPECT_EQ(CaptionOf(graph, graph.Links()[0]), std::string(26, 'l') + "…, exec");
}

TEST(DrawingTest, DomainsWithoutALinkAreApart) {
  const LinkedDomains domains = SplitDomains(SomeGraph());
  EXPECT_THAT(domains.linked, ElementsAre(0, 2, 3));
  EXPECT_THAT(domains.alone, ElementsAre(1));
}

// ---- The circle ----

TEST(DrawingTest, CircleHoldsEverything) {
  const TransitionGraph graph = SomeGraph();
  const Drawing drawing = DrawCircle(graph);
  ExpectWhole(graph, drawing);
  EXPECT_FALSE(HasBoxes(drawing));
}

TEST(DrawingTest, NeighboursOnTheCircleDoNotTouch) {
  for (const std::size_t count : std::vector<std::size_t>{2, 3, 40, 1000}) {
    const TransitionGraph graph = BigGraph(count, count);
    const Drawing drawing = DrawCircle(graph);
    ExpectWhole(graph, drawing);
    for (std::size_t i = 1; i < count; ++i) {
      const Point& a = drawing.domains[i - 1].centre;
      const Point& b = drawing.domains[i].centre;
      EXPECT_GT(std::hypot(a.x - b.x, a.y - b.y), 18) << count;
    }
  }
}

TEST(DrawingTest, OneDomainAloneHasItsLoop) {
  const TransitionGraph graph(PolicyOfLinks({"aa"}));
  ExpectWhole(graph, DrawCircle(graph));
}

// ---- Graphviz ----

TEST(DrawingTest, GraphvizLaysOut) {
  const TransitionGraph graph = SomeGraph();
  Drawing drawing;
  try {
    drawing = DrawWithGraphviz(graph);
  } catch (const GraphvizMissing&) {
    GTEST_SKIP() << "Graphviz is not installed";
  }
  ExpectWhole(graph, drawing);
  EXPECT_TRUE(HasBoxes(drawing));
  for (const DrawnLink& drawn : drawing.links) EXPECT_TRUE(drawn.caption.has_value());
}

TEST(DrawingTest, ManyLinksHaveNoCaptions) {
  const TransitionGraph graph = BigGraph(60, 101);
  Drawing drawing;
  try {
    drawing = DrawWithGraphviz(graph);
  } catch (const GraphvizMissing&) {
    GTEST_SKIP() << "Graphviz is not installed";
  }
  ExpectWhole(graph, drawing);
  for (const DrawnLink& drawn : drawing.links) EXPECT_FALSE(drawn.caption.has_value());
}

TEST(DrawingTest, GraphvizSeesNoWords) {
  Policy policy;
  policy.domains["secretDomain"].rules = {Goes("otherDomain", "secretLabel")};
  const StandInDot dot(
      "while read -r line; do case $line in *ecret*|*exec*) exit 1;; esac; done\n"
      "echo 'graph 1 2 2'\n");
  EXPECT_THAT(DrawWithGraphviz(TransitionGraph(policy)).links, IsEmpty());
}

TEST(DrawingTest, PlacesAreInPixelsFromTheUpperLeft) {
  const StandInDot dot(
      "echo 'graph 1 3 2'\n"
      "echo 'node 0 0.5 2 1 0.4 \"\" solid box black lightgrey'\n"
      "echo 'node 1 2.5 0 1 0.4 \"\" solid box black lightgrey'\n"
      "echo 'edge 0 1 4 1 2 1.5 1 1.5 1 2 0 x 1.5 1 solid black'\n"
      "echo stop\n");
  const Drawing drawing = DrawWithGraphviz(TransitionGraph(PolicyOfLinks({"ab"})));
  EXPECT_EQ(drawing.width, 3 * 72 + 24);
  EXPECT_EQ(drawing.height, 2 * 72 + 24);
  EXPECT_EQ(drawing.domains.at(0).centre.x, 36 + 12);
  EXPECT_EQ(drawing.domains.at(0).centre.y, 12);
  EXPECT_EQ(drawing.links.at(0).path, "M84.0 12.0C120.0 84.0 120.0 84.0 156.0 156.0");
  EXPECT_EQ(drawing.links.at(0).caption->y, 84);
}

TEST(DrawingTest, AnswersThatMakeNoSenseAreRefused) {
  const TransitionGraph graph(PolicyOfLinks({"ab"}));
  for (const std::string answer :
       {"graph 1 x", "node 7 1 1 1 1", "node 0", "edge 0 0 4 1 1 1 1 1 1 1 1 x 1 1",
        "edge 7 0 4 1 1 1 1 1 1 1 1 x 1 1", "edge 0 1 4 1 1", "edge 0 1 99999999999 1 1"}) {
    const StandInDot dot("echo '" + answer + "'\n");
    EXPECT_EQ(StandIn::MessageOf<std::runtime_error>([&] { DrawWithGraphviz(graph); }),
              "Graphviz failed: it answered \"" + answer + "\"");
  }
}

// ---- The choice ----

class DrawTest : public testing::Test {
 protected:
  Drawing Drawn(const TransitionGraph& graph) {
    return Draw(graph, [&](const std::string& text) { warnings_.push_back(text); });
  }

  std::vector<std::string> warnings_;
};

TEST_F(DrawTest, WithoutGraphvizItIsACircle) {
  const StandInDot none("");
  const TransitionGraph graph = SomeGraph();
  const Drawing drawing = Drawn(graph);
  ExpectWhole(graph, drawing);
  EXPECT_FALSE(HasBoxes(drawing));
  EXPECT_THAT(warnings_, IsEmpty());
}

TEST_F(DrawTest, FailureOfGraphvizIsAWarning) {
  const StandInDot failing("echo broken >&2; exit 1\n");
  ExpectWhole(SomeGraph(), Drawn(SomeGraph()));
  EXPECT_THAT(warnings_, ElementsAre("Graphviz failed: broken"));
}

TEST_F(DrawTest, GraphvizIsNotAskedForWhatIsTooMuch) {
  const StandInDot failing("exit 1\n");
  Drawn(BigGraph(151, 151));
  Drawn(BigGraph(100, 251));
  EXPECT_THAT(warnings_, IsEmpty());
  Drawn(BigGraph(150, 250));
  EXPECT_THAT(warnings_, ElementsAre("Graphviz failed: exit status 1"));
}

TEST_F(DrawTest, NothingIsDrawnOfNothing) {
  const StandInDot failing("exit 1\n");
  const Drawing drawing = Drawn(TransitionGraph(Policy()));
  EXPECT_THAT(drawing.domains, IsEmpty());
  EXPECT_THAT(warnings_, IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTool
