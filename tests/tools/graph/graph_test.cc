// secpolicy graph.
#include <filesystem>
#include <nlohmann/json.hpp>
#include <regex>

#include "host/text/escaped.h"
#include "tests/tools/command_fixture.h"
#include "tests/tools/schema.h"
#include "tests/tools/stand_in_dot.h"
#include "tools/graph/graph_forms.h"
#include "tools/graph/graphviz.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class GraphTest : public CommandTest {
 protected:
  GraphTest() {
    Policy("objects/base", "conf\nprogram\nother\n");
    Policy("domains/appDom",
           "-d program guestDom exec grant\n-d other guestDom fork grant\n"
           "-d conf ioFilterDom exec revoke\n  -d other appDom exec grant\n");
    Policy("domains/guestDom", "-s read grant\n");
  }
  void SetUp() override { MakeHost(); }

  [[nodiscard]] Arguments Verb(const Arguments& more) const {
    Arguments arguments{"graph", "--host", Host(), PolicyDir()};
    arguments.insert(arguments.end(), more.begin(), more.end());
    return arguments;
  }
  [[nodiscard]] std::string Graph(const Arguments& more = {}) const { return Done(Verb(more)).out; }

  // With a program "dot" of this text, or none.
  [[nodiscard]] Result WithDot(const std::string& script, const Arguments& more) const {
    const StandInDot dot(script);
    return Command(Verb(more));
  }
};

TEST_F(GraphTest, TextNamesEachDomainsTransitionsAndTheirPlaces) {
  EXPECT_EQ(Graph(),
            "appDom\n"
            "  --other,exec--> appDom      " +
                PolicyDir() +
                "/domains/appDom:4:3\n"
                "  --program,exec--> guestDom  " +
                PolicyDir() +
                "/domains/appDom:1:1\n"
                "  --other,fork--> guestDom    " +
                PolicyDir() +
                "/domains/appDom:2:1\n"
                "globalVMDom (no transitions)\n"
                "guestDom (no transitions)\n"
                "ioFilterDom (no transitions)\n"
                "rootDom\n"
                "  --tardisk,exec--> appDom  -\n");
}

TEST_F(GraphTest, OneEventAlone) {
  const std::string text = Graph({"--event", "fork"});
  EXPECT_THAT(text, StartsWith("appDom\n  --other,fork--> guestDom  "));
  EXPECT_THAT(text, HasSubstr("rootDom (no transitions)\n"));
  EXPECT_THAT(text, Not(HasSubstr("exec")));
}

TEST_F(GraphTest, EventThatThereIsNotIsAnError) {
  const Result result = Command(Verb({"--event", "exce"}));
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.err, "Error: unknown transition event \"exce\" (nearest: exec)\n");
}

TEST_F(GraphTest, KernelIsASourceToo) {
  ASSERT_EQ(Load().status, 0);
  const std::string text = Done({"graph", "--host", Host(), "kernel"}).out;
  EXPECT_THAT(text, HasSubstr("  --program,exec--> guestDom  line 1\n"));
}

TEST_F(GraphTest, DirectoryWithErrorsIsShownWithAWarning) {
  Policy("domains/guestDom", "-x\n");
  const Result result = Command(Verb({}));
  EXPECT_EQ(result.status, 0);
  EXPECT_THAT(result.out, StartsWith("appDom\n"));
  EXPECT_THAT(result.err, StartsWith("Warning: a load of "));
}

TEST_F(GraphTest, DotIsWhatGraphvizReads) {
  EXPECT_EQ(Graph({"--format", "dot"}),
            "digraph policy {\n"
            "  rankdir=LR;\n"
            "  node [shape=box, style=rounded, fontname=\"sans-serif\"];\n"
            "  edge [fontname=\"sans-serif\", fontsize=10];\n"
            "  \"appDom\";\n  \"globalVMDom\";\n  \"guestDom\";\n  \"ioFilterDom\";\n"
            "  \"rootDom\";\n"
            "  \"appDom\" -> \"appDom\" [label=\"other, exec\"];\n"
            "  \"appDom\" -> \"guestDom\" [label=\"program, exec\\nother, fork\"];\n"
            "  \"rootDom\" -> \"appDom\" [label=\"tardisk, exec\"];\n"
            "}\n");
}

TEST_F(GraphTest, JsonIsAsDescribed) {
  const std::string text = Graph({"--json"});
  EXPECT_EQ(JsonProblem(text, "graph"), "");
  EXPECT_EQ(text, Graph({"--format", "json"}));
  const auto json = nlohmann::json::parse(text);
  EXPECT_EQ(json["source"], PolicyDir());
  EXPECT_EQ(json["domains"].size(), 5U);
  const nlohmann::json first{
      {"label", "program"},
      {"event", "exec"},
      {"target", "guestDom"},
      {"place", {{"file", PolicyDir() + "/domains/appDom"}, {"line", 1}, {"column", 1}}}};
  EXPECT_EQ(json["domains"][0]["transitions"][1], first);
  EXPECT_EQ(json["domains"][4]["transitions"][0]["place"], nullptr);
}

TEST_F(GraphTest, SvgIsMadeByGraphviz) {
  // The program gets the format as its argument and the graph on its standard input.
  const Result result = WithDot("echo \"$@\"\nexec /bin/cat\n", {"--format", "svg"});
  EXPECT_EQ(result.status, 0) << result.err;
  EXPECT_EQ(result.out, "-Tsvg\n" + Graph({"--format", "dot"}));
}

TEST_F(GraphTest, FailuresOfGraphvizAreReported) {
  struct Case {
    const char* script;
    const char* error;
  };
  for (const Case& row : {
           Case{"", "Graphviz is not installed: there is no program \"dot\" in PATH"},
           Case{"printf 'no \\033fonts\\n\\n' >&2\nexit 3\n", "Graphviz failed: no \\x1bfonts"},
           Case{"exit 3\n", "Graphviz failed: exit status 3"},
           Case{"kill -9 $$\n", "Graphviz failed: signal 9"},
       }) {
    SCOPED_TRACE(row.error);
    const Result result = WithDot(row.script, {"--format", "svg"});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, std::string("Error: ") + row.error + "\n");
  }
}

TEST_F(GraphTest, OutputGoesToTheFile) {
  const Result result = Done(Verb({"-o", Path("graph.txt")}));
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(StandIn::ReadBytes(Path("graph.txt")), Graph());
}

TEST_F(GraphTest, FileIsLeftAloneWhenTheGraphCannotBeMade) {
  StandIn::WriteBytes(Path("graph.svg"), "old");
  EXPECT_EQ(WithDot("echo half; exit 1\n", {"--format", "svg", "-o", Path("graph.svg")}).status, 1);
  EXPECT_EQ(StandIn::ReadBytes(Path("graph.svg")), "old");
}

TEST_F(GraphTest, LinkStaysALink) {
  StandIn::WriteBytes(Path("behind"), "old");
  fs::create_symlink("behind", Path("link"));
  Done(Verb({"-o", Path("link")}));
  EXPECT_TRUE(fs::is_symlink(Path("link")));
  EXPECT_EQ(StandIn::ReadBytes(Path("behind")), Graph());
}

TEST_F(GraphTest, FilesThatCannotBeWritten) {
  for (const auto& [file, reason] : std::vector<std::pair<std::string, std::string>>{
           {"/dev/full", "not a regular file"},
           {Path("policy"), "not a regular file"},
           {Path("nowhere/graph"), "cannot be written: No such file or directory"},
           {Path("nowhere"), ""}}) {
    const Result result = Command(Verb({"-o", file}));
    EXPECT_EQ(result.status, reason.empty() ? 0 : 1);
    EXPECT_EQ(result.err, reason.empty() ? "" : "Error: " + file + ": " + reason + "\n");
  }
  EXPECT_FALSE(fs::is_regular_file("/dev/full"));
}

TEST_F(GraphTest, WrongUse) {
  for (const Arguments& arguments : std::vector<Arguments>{
           {"--format", "png"}, {"--format"}, {"--json", "--format", "dot"}, {"more"}}) {
    EXPECT_EQ(Command(Verb(arguments)).status, 2) << arguments.back();
  }
}

// ---- Names of any bytes ----

Policy PolicyOfNames(const std::string& domain, const std::string& label) {
  SecPolicyTool::Policy policy;
  PolicyRule rule;
  rule.key = {RuleType::kTransition, {label, domain, "exec"}, 0};
  rule.isGranted = true;
  policy.domains[domain].rules = {rule};
  return policy;
}

TEST(GraphFormsTest, NamesCannotChangeATerminal) {
  const std::string text =
      GraphText(TransitionGraph(PolicyOfNames("a\x1b[2Jb", "l\nx")), Painter(false)).Text();
  EXPECT_EQ(text, "a\\x1b[2Jb\n  --l\\x0ax,exec--> a\\x1b[2Jb  -\n");
}

TEST(GraphFormsTest, ColoursMarkDomainsAndPlaces) {
  EXPECT_EQ(GraphText(TransitionGraph(PolicyOfNames("a", "l")), Painter(true)),
            "\x1b[1ma\x1b[0m\n  --l,exec--> a  \x1b[36m-\x1b[0m\n");
}

TEST(GraphFormsTest, NamesAreQuotedForGraphviz) {
  struct Case {
    std::string name;
    const char* node;
  };
  for (const Case& row : {
           Case{"a b", R"("a b")"},
           Case{"node", R"("node")"},
           Case{"<b>", R"("<b>")"},
           Case{R"(a"b)", R"("a\"b")"},
           Case{R"(a\N)", R"("a\\N")"},
           Case{R"(a\)", R"("a\\")"},
           Case{R"(a\"];x)", R"("a\\\"];x")"},
           Case{"a&lt;", R"("a&amp;lt;")"},
           Case{"%a%", R"("\x25a%" [label="%a%"])"},
           Case{"a\nb", R"("a\x0ab" [label="a\\x0ab"])"},
           Case{"a\\x0ab", R"("a\\x0ab")"},  // another domain than the one before
           Case{"\x1b\xC2\x9B\xFF", R"("\x1b\xc2\x9b\xff" [label="\\x1b\\xc2\\x9b\\xff"])"},
       }) {
    SCOPED_TRACE(row.name);
    EXPECT_THAT(GraphDot(TransitionGraph(PolicyOfNames(row.name, "l"))),
                HasSubstr(std::string("\n  ") + row.node + ";\n"));
  }
}

TEST(GraphFormsTest, GraphvizReadsHostileNamesAsTheyAre) {
  std::string svg;
  try {
    svg = RunGraphviz(
        GraphDot(TransitionGraph(PolicyOfNames("a\\\"];evil[label=\"<script>", "x\\N&lt;"))),
        "svg");
  } catch (const GraphvizMissing&) {
    GTEST_SKIP() << "Graphviz is not installed";
  }
  EXPECT_THAT(svg, HasSubstr(">a\\&quot;];evil[label=&quot;&lt;script&gt;</text>"));
  EXPECT_THAT(svg, HasSubstr(">x\\N&amp;lt;, exec</text>"));
}

// An XML parser accepts the drawing, and finds the names that it shows.
TEST(GraphFormsTest, DrawingIsWellFormedWhateverTheNames) {
  const std::vector<std::string> names{"&foo;",
                                       "&#0;",
                                       "&#x1b;",
                                       "&amp;",
                                       "a\x1b[2Jb",
                                       "a\nb",
                                       "\xFF\xFE",
                                       "\xC2\x9B",
                                       "]]>",
                                       "--",
                                       "<!--",
                                       "</svg>",
                                       "\"'\\",
                                       "\x01\x7F",
                                       "\xEF\xBF\xBF",
                                       "\\",
                                       "%s",
                                       "a\tb",
                                       "\\x1b",
                                       "\x1b",
                                       "\xE2\x80\xAE",
                                       "\xED\xA0\x80",
                                       "gr\xC3\xBC\xC3\x9F"};
  SecPolicyTool::Policy policy;
  for (const std::string& name : names) {
    PolicyRule rule;
    rule.key = {RuleType::kTransition, {name, names.front(), name}, 0};
    rule.isGranted = true;
    policy.domains[name].rules.push_back(rule);
  }
  std::string svg;
  try {
    svg = RunGraphviz(GraphDot(TransitionGraph(policy)), "svg");
  } catch (const GraphvizMissing&) {
    GTEST_SKIP() << "Graphviz is not installed";
  }
  const StandIn::TemporaryDirectory directory;
  StandIn::WriteBytes(directory / "graph.svg", svg);
  const Result parsed =
      RunProgram("/usr/bin/python3",
                 {"-c",
                  "import sys, xml.etree.ElementTree as tree\n"
                  "svg = tree.parse(sys.argv[1]).getroot()\n"
                  "nodes = svg.findall('.//{*}g[@class=\"node\"]')\n"
                  "print(len(nodes), *(node.find('{*}text').text for node in nodes), sep='\\n')\n",
                  directory / "graph.svg"},
                 [] { setenv("PYTHONIOENCODING", "utf-8", 1); });
  EXPECT_EQ(parsed.err, "");
  EXPECT_THAT(parsed.out, StartsWith(std::to_string(names.size()) + "\n"));
  for (const std::string& name : names) {
    EXPECT_THAT(parsed.out, HasSubstr("\n" + StandIn::Escaped(name).Text() + "\n"));
  }
}

TEST(GraphFormsTest, DotHoldsNoControls) {
  const std::string dot = GraphDot(
      TransitionGraph(PolicyOfNames("a\x1b]0;t\x07\xC2\x9B\xE2\x80\xAE\xFF", "l\x1b[2J\r")));
  EXPECT_EQ(StandIn::Escaped(dot).Text(), std::regex_replace(dot, std::regex("\n"), "\\x0a"));
}

TEST(GraphFormsTest, LinkOfManyTransitionsIsLabelledWithSome) {
  SecPolicyTool::Policy policy;
  for (int i = 1; i <= 9; ++i) {
    PolicyRule rule;
    rule.key = {RuleType::kTransition, {"l" + std::to_string(i), "a", "exec"}, 0};
    rule.isGranted = true;
    policy.domains["a"].rules.push_back(rule);
  }
  EXPECT_THAT(GraphDot(TransitionGraph(policy)),
              HasSubstr("[label=\"l1, exec\\nl2, exec\\nl3, exec\\nl4, exec\\nl5, exec\\nl6, "
                        "exec\\nand 3 more\"]"));
}

}  // namespace
}  // namespace SecPolicyTool
