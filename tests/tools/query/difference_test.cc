// In what policies differ, and how that is told.
#include "tools/query/difference.h"

#include <sstream>

#include "tests/tools/query/policy_parts.h"
#include "tools/query/difference_report.h"
#include "tools/query/label_folding.h"

namespace SecPolicyTool {
namespace {

std::string Text(const Policy& before, const Policy& after,
                 const std::vector<std::string>& files = {}, bool isColoured = false) {
  std::ostringstream out;
  PrintDifference(Compare(before, after), files, Painter(isColoured), out);
  return out.str();
}

Policy With(const DomainContent& domain) { return {{{"appDom", domain}}, {}, {}, {}, {}}; }

// The lines below the heading.
std::string RulesText(std::initializer_list<const char*> before,
                      std::initializer_list<const char*> after) {
  const std::string text = Text(With(DomainWith(before)), With(DomainWith(after)));
  const std::string heading = "domain appDom\n";
  return text.starts_with(heading) ? text.substr(heading.size()) : text;
}

TEST(DifferenceTest, RulesOfEveryTypeAreCompared) {
  for (const char* line :
       {"-a conf read", "-c sys_admin", "-d program netDom exec", "-f conf conf file",
        "-p net_bind_service 443", "-s open", "-u conf stream"}) {
    const std::string rule = line;
    const std::string granted = rule + " grant";
    const std::string revoked = rule + " revoke";
    EXPECT_EQ(RulesText({granted.c_str()}, {granted.c_str()}), "");
    EXPECT_EQ(RulesText({granted.c_str()}, {}), "- " + granted + "  (policy:1:1)\n");
    EXPECT_EQ(RulesText({}, {granted.c_str()}), "+ " + granted + "  (policy:1:1)\n");
    EXPECT_EQ(RulesText({granted.c_str()}, {revoked.c_str()}),
              "~ " + granted + " -> revoke  (policy:1:1)\n");
  }
}

TEST(DifferenceTest, PermissionsOfPathsAreCompared) {
  EXPECT_EQ(RulesText({"-r /etc rw"}, {"-r /etc wr"}), "");
  EXPECT_EQ(RulesText({"-r /etc rw"}, {"-r /etc r"}), "~ -r /etc rw -> r  (policy:1:1)\n");
  EXPECT_EQ(RulesText({"-r /etc r"}, {"-r /etc"}), "~ -r /etc r -> nothing  (policy:1:1)\n");
  EXPECT_EQ(RulesText({}, {"-r /etc"}), "+ -r /etc  (policy:1:1)\n");
}

TEST(DifferenceTest, OrderDoesNotCount) {
  EXPECT_EQ(RulesText({"-s open grant", "-s read grant"}, {"-s read grant", "-s open grant"}), "");
}

TEST(DifferenceTest, TransitionWithAnotherTargetIsAChange) {
  EXPECT_EQ(RulesText({"-d program aDom exec grant"}, {"-d program bDom exec grant"}),
            "~ -d program aDom -> bDom exec grant  (policy:1:1)\n");
  // Otherwise it is not clear what became what.
  EXPECT_EQ(RulesText({"-d program aDom exec grant"},
                      {"-d program bDom exec grant", "-d program cDom exec grant"}),
            "- -d program aDom exec grant  (policy:1:1)\n"
            "+ -d program bDom exec grant  (policy:1:1)\n"
            "+ -d program cDom exec grant  (policy:2:1)\n");
  EXPECT_EQ(RulesText({"-d program aDom exec grant"},
                      {"-d program aDom exec revoke", "-d program bDom exec grant"}),
            "~ -d program aDom exec grant -> revoke  (policy:1:1)\n"
            "+ -d program bDom exec grant  (policy:2:1)\n");
  EXPECT_EQ(RulesText({"-d program aDom exec grant"}, {"-d other bDom exec grant"}),
            "+ -d other bDom exec grant  (policy:1:1)\n"
            "- -d program aDom exec grant  (policy:1:1)\n");
}

TEST(DifferenceTest, WorldsOfPathRulesAreTold) {
  DomainContent before = DomainWith({"-r /etc r"});
  before.rules[0].key.world = 7;
  DomainContent after = before;
  after.rules[0].permission = 0x3;
  EXPECT_EQ(Text(With(before), With(after)),
            "domain appDom\n~ -r /etc r -> rw # world 7  (policy:1:1)\n");
}

TEST(DifferenceTest, DomainsThatAreNewOrGoneHaveTheirRules) {
  Policy policy = With(DomainWith({"-s open grant"}));
  policy.domains["appDom"].place = Place{"domains/appDom", 0, 0};
  EXPECT_EQ(Text({}, policy), "+ domain appDom  (domains/appDom)\n+ -s open grant  (policy:1:1)\n");
  EXPECT_EQ(Text(policy, {}), "- domain appDom  (domains/appDom)\n- -s open grant  (policy:1:1)\n");
  EXPECT_EQ(Text({}, With({})), "+ domain appDom\n");
}

TEST(DifferenceTest, ObjectsAndTardisksAreCompared) {
  Policy before;
  before.objects = {{"old", {false, std::nullopt}}, {"fixed", {true, std::nullopt}}};
  before.tardisks = {{"base.tar", {"tardisk", std::nullopt}}, {"gone.tar", {"", std::nullopt}}};
  Policy after;
  after.objects = {{"new", {false, Place{"objects/base", 3, 1}}}};
  after.tardisks = {{"base.tar", {"vendorApp", Place{"vendor", 2, 1}}}};
  EXPECT_EQ(Text(before, after),
            "objects\n+ new  (objects/base:3:1)\n- old\n"
            "\n"
            "tardisks\n~ base.tar tardisk -> vendorApp  (vendor:2:1)\n"
            "- gone.tar (a label without a name)\n");
}

TEST(DifferenceTest, ColoursSayWhatTheSignsSay) {
  EXPECT_EQ(Text(With(DomainWith({"-s open grant", "-s read grant"})),
                 With(DomainWith({"-s open revoke", "-s write grant"})), {}, true),
            "\x1b[1mdomain appDom\x1b[0m\n"
            "\x1b[33m~ -s open grant -> revoke\x1b[0m  (policy:1:1)\n"
            "\x1b[31m- -s read grant\x1b[0m  (policy:2:1)\n"
            "\x1b[32m+ -s write grant\x1b[0m  (policy:2:1)\n");
}

TEST(DifferenceTest, WhatCouldChangeATerminalIsMadePrintable) {
  Policy policy;
  policy.domains["a\x1b[2J"] = {};
  policy.files["/etc/\n"] = {"conf", std::nullopt};
  EXPECT_EQ(Text({}, policy), "+ domain a\\x1b[2J\n\nfile labels\n+ /etc/\\x0a conf\n");
}

// ---- Trees of files ----

constexpr char kLabel[] = "conf";

// The lines for files that get labels, given as path and label, on a host with these files.
std::string FilesText(const std::map<std::string, std::string>& labels,
                      const std::vector<std::string>& all) {
  Policy after;
  for (const auto& [path, label] : labels) after.files[path] = {label, std::nullopt};
  const std::string text = Text({}, after, all);
  const std::string heading = "file labels\n";
  return text.starts_with(heading) ? text.substr(heading.size()) : text;
}

TEST(LabelFoldingTest, TreeThatChangesAlikeIsSaidOnce) {
  const std::vector<std::string> all{"/", "/etc", "/etc/a", "/etc/d", "/etc/d/b", "/var"};
  EXPECT_EQ(
      FilesText({{"/etc", kLabel}, {"/etc/a", kLabel}, {"/etc/d", kLabel}, {"/etc/d/b", kLabel}},
                all),
      "+ /etc/* (4 files) conf\n");
}

TEST(LabelFoldingTest, OneThatDiffersLeavesTheTreesBesideIt) {
  const std::vector<std::string> all{"/", "/etc", "/etc/a", "/etc/d", "/etc/d/b", "/etc/e"};
  // One with another label, one without a change, and a directory that is not changed itself.
  EXPECT_EQ(FilesText({{"/etc", kLabel},
                       {"/etc/a", "key"},
                       {"/etc/d", kLabel},
                       {"/etc/d/b", kLabel},
                       {"/etc/e", kLabel}},
                      all),
            "+ /etc conf\n+ /etc/a key\n+ /etc/d/* (2 files) conf\n+ /etc/e conf\n");
  EXPECT_EQ(FilesText({{"/etc", kLabel}, {"/etc/d", kLabel}, {"/etc/d/b", kLabel}}, all),
            "+ /etc conf\n+ /etc/d/* (2 files) conf\n");
  EXPECT_EQ(FilesText({{"/etc/d/b", kLabel}}, all), "+ /etc/d/b conf\n");
}

TEST(LabelFoldingTest, NeighbourOfTheSameBeginningIsNotBelow) {
  EXPECT_EQ(FilesText({{"/etc", kLabel}, {"/etc.d", kLabel}}, {"/", "/etc", "/etc.d"}),
            "+ /etc conf\n+ /etc.d conf\n");
}

TEST(LabelFoldingTest, WholeRootIsATree) {
  EXPECT_EQ(FilesText({{"/", kLabel}, {"/etc", kLabel}}, {"/", "/etc"}), "+ /* (2 files) conf\n");
}

TEST(LabelFoldingTest, BothLabelsAndTheKindOfChangeCount) {
  Policy before;
  before.files = {{"/a", {"old", std::nullopt}},
                  {"/a/b", {"older", std::nullopt}},
                  {"/c", {"old", std::nullopt}},
                  {"/c/d", {"old", std::nullopt}}};
  Policy after;
  after.files = {{"/a", {"new", std::nullopt}}, {"/a/b", {"new", std::nullopt}}};
  EXPECT_EQ(Text(before, after, {"/", "/a", "/a/b", "/c", "/c/d"}),
            "file labels\n~ /a old -> new\n~ /a/b older -> new\n- /c/* (2 files) old\n");
}

TEST(LabelFoldingTest, PlaceIsToldWhenItIsThatOfAll) {
  Policy after;
  const Place line{"fileLabels/base", 2, 1};
  after.files = {{"/a", {kLabel, line}}, {"/a/b", {kLabel, line}}};
  EXPECT_EQ(Text({}, after, {"/"}), "file labels\n+ /a/* (2 files) conf  (fileLabels/base:2:1)\n");
  after.files["/a/b"].place->line = 3;
  EXPECT_EQ(Text({}, after, {"/"}), "file labels\n+ /a/* (2 files) conf\n");
}

}  // namespace
}  // namespace SecPolicyTool
