// What is wrong with lines of object files and file label files.
#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;

class LabelLinesTest : public CheckTest {
 protected:
  // One that is not in the image: it carries no label.
  void AddFileOfNoImage() const { StandIn::WriteBytes(Host() + "/root/etc/alien", ""); }
};

struct LabelLine {
  const char* text;
  std::vector<std::string> found;
};

const LabelLine kLabelLines[] = {
    {"/etc/motd", {"1: error: incorrect no of parameters [word-count]"}},
    {"/etc/my motd conf", {"1: error: incorrect no of parameters [word-count]"}},
    {"/etc/motd cnof", {"11: error: unknown object label \"cnof\" (nearest: conf) [unknown-word]"}},
    {"/opt/*/bin conf",
     {"1: error: Unrecognized format for file/dir specification [tree-pattern]"}},
    {"/opt/*.x cnof",
     {"1: error: Unrecognized format for file/dir specification [tree-pattern]",
      "10: error: unknown object label \"cnof\" (nearest: conf) [unknown-word]"}},
    {"/none conf",
     {"1: error: Unable to set file label (conf) for file /none: No such file or directory "
      "[missing-path]"}},
    {"/none/* conf",
     {"1: error: Unable to set file label (conf) for file /none: No such file or directory "
      "[missing-path]"}},
    {"/* conf",
     {"1: error: Unable to set file label (conf) for file : No such file or directory "
      "[root-label]"}},
    {"/opt/tool/* conf", {"1: error: Unable to open directory /opt/tool [label-refused]"}},
    {"/etc/alien conf",
     {"1: error: Unable to set file label (conf) for file /etc/alien: No data available "
      "[unlabelled-file]"}},
    {"/etc/* conf",
     {"1: error: Unable to set file label (conf) for file /etc/alien: No data available "
      "[unlabelled-file]"}},
    {"opt/tool conf",
     {"1: warning: the path leads from the loading process's own directory, wherever that is "
      "[relative-path]"}},
};

TEST_F(LabelLinesTest, EveryBadWordIsShown) {
  AddFileOfNoImage();
  Policy("fileLabels/base", "/usr/bin/ls program\n");
  for (const LabelLine& line : kLabelLines) {
    // Behind a bad line, which ends the file for a load, too.
    for (const std::string before : {"", "one\n"}) {
      Policy("fileLabels/more", before + line.text + "\n");
      const std::string number = before.empty() ? "1" : "2";
      std::vector<std::string> expected;
      if (!before.empty()) {
        expected.emplace_back(
            "fileLabels/more:1:1: error: incorrect no of parameters [word-count]");
      }
      for (const std::string& found : line.found) {
        expected.push_back("fileLabels/more:" + number + ":" + found);
      }
      EXPECT_EQ(Found(), expected) << line.text;
    }
  }
}

TEST_F(LabelLinesTest, LoadMessageIsWhatALoadReports) {
  AddFileOfNoImage();
  Policy("fileLabels/base", "/usr/bin/ls program\n");
  for (const LabelLine& line : kLabelLines) {
    Policy("fileLabels/more", std::string(line.text) + "\n");
    const std::vector<std::string> reported = LoadErrorsOf();
    std::vector<std::string> messages;
    for (const Finding& finding : Findings()) {
      if (finding.severity == Severity::kError) messages.push_back(finding.loadMessage);
    }
    if (messages.empty()) {
      EXPECT_THAT(reported, IsEmpty()) << line.text;
      continue;
    }
    // The first is a heading when the line cannot be parsed.
    const bool isParseError = reported.at(0).starts_with("Error parsing file ");
    EXPECT_THAT(messages, Contains(reported.at(isParseError ? 1 : 0))) << line.text;
  }
}

TEST_F(LabelLinesTest, LinesThatALoadDoesNotComeToAreJudgedAllTheSame) {
  std::filesystem::remove(PolicyDir() + "/domains/appDom");
  Policy("fileLabels/more", "/none conf\n/usr/bin/* program\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 2U);
  EXPECT_EQ(findings[0].id, "missing-domain");
  EXPECT_EQ(findings[1].id, "missing-path");
}

TEST_F(LabelLinesTest, WhatALaterLineOverrides) {
  Policy("fileLabels/base",
         "/etc/* conf\n"         // an exception follows: nothing to say
         "/etc/motd program\n"   // overridden by line 6
         "/etc/hosts program\n"  // the same as line 5
         "/bin/ls program\n"     // by way of a link
         "/etc/hosts program\n"  //
         "/etc/motd conf\n"      //
         "/usr/bin/ls conf\n"    // overridden by the tree
         "/usr/bin conf\n"       //
         "/usr/* program\n"      //
         "/opt/tool program\n"   // the same label as the tree's: nothing to say
         "/opt/* program\n");
  EXPECT_THAT(
      Found(),
      ElementsAre("fileLabels/base:2:1: warning: fileLabels/base:6 labels all of it \"conf\" "
                  "[overridden-label]",
                  "fileLabels/base:3:1: warning: fileLabels/base:5 says the same [repeated-rule]",
                  "fileLabels/base:4:1: warning: fileLabels/base:7 labels all of it \"conf\" "
                  "[overridden-label]",
                  "fileLabels/base:7:1: warning: fileLabels/base:9 labels all of it \"program\" "
                  "[overridden-label]",
                  "fileLabels/base:8:1: warning: fileLabels/base:9 labels all of it \"program\" "
                  "[overridden-label]"));
}

TEST_F(LabelLinesTest, TreesOverrideTrees) {
  Policy("fileLabels/base", "/etc/* program\n/usr/* program\n/etc/* conf\n");
  EXPECT_THAT(Found(), ElementsAre("fileLabels/base:1:1: warning: fileLabels/base:3 labels all of "
                                   "it \"conf\" [overridden-label]"));
}

TEST_F(LabelLinesTest, ObjectsOnOneLineAndNamesThatAreRefused) {
  const std::string name(128, 'n');
  Policy("objects/base", "conf\n  one two three\nprogram\n" + name + "\n");
  Policy("domains/netDom", "-a conf read grant\n-a program read grant\n");
  EXPECT_THAT(
      Found(),
      ElementsAre(
          "domains/netDom:2:4: error: unknown object label \"program\" [unknown-word]",
          "domains/rootDom:1:4: error: unknown object label \"program\" [unknown-word]",
          "fileLabels/base:2:13: error: unknown object label \"program\" [unknown-word]",
          "objects/base:2:7: error: cannot define more than one object per line [word-count]",
          "objects/base:4:1: error: the object label name \"" + name +
              "\" is longer than 127 bytes [refused-name]"));
}

TEST_F(LabelLinesTest, RefusalOfObjectsIsSummedUpByALoad) {
  Policy("objects/base", "conf\nprogram\n" + std::string(128, 'n') + "\n");
  const auto findings = Findings();
  ASSERT_EQ(findings.size(), 1U);
  EXPECT_EQ(findings[0].loadMessage, "Error in defining some objects");
  EXPECT_EQ(LoadErrorsOf().at(0), findings[0].loadMessage);
}

TEST_F(LabelLinesTest, UnusedObjects) {
  Policy("objects/base", "conf\nprogram\nspare\nspare\ndefault\nlabelled\n");
  Policy("fileLabels/base", "/etc/motd labelled\n");
  EXPECT_THAT(Found(), ElementsAre("objects/base:3:1: warning: no rule and no file label refers to "
                                   "the object \"spare\" [unused-object]"));
}

}  // namespace
}  // namespace SecPolicyTool
