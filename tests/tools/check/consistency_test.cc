// Findings against what was said of every kind of line beforehand: whatever the library refuses is
// an error in its words, and what it takes is none.
#include <cstdio>
#include <map>
#include <set>

#include "tests/corpus/corpus.h"
#include "tests/corpus/word_table.h"
#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {
namespace {

using SecPolicyTest::CorpusCase;
using SecPolicyTest::CorpusLine;
using SecPolicyTest::kFileMark;
using SecPolicyTest::kLineMark;

constexpr char kHeld[] = "/etc/motd";
constexpr std::size_t kMostShown = 10;

std::string Replaced(std::string text, const std::string& what, const std::string& with) {
  for (std::size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += with.size()) {
    text.replace(at, what.size(), with);
  }
  return text;
}

std::string TextOf(const CorpusLine& line) {
  std::string text;
  for (const std::string& word : line.words) text += (text.empty() ? "" : " ") + word;
  return text + "\n";
}

// The words of the errors of one file, by line.
using Reported = std::map<unsigned int, std::set<std::string>>;

class ConsistencyTest : public CheckTest {
 protected:
  ConsistencyTest() {
    std::string objects;
    for (const std::string& name : SecPolicyTest::kCorpusObjects) objects += name + "\n";
    Policy("objects/base", objects);
    Policy("fileLabels/base", "");
    for (const std::string& domain : SecPolicyTest::kCorpusDomains) Policy("domains/" + domain, "");
  }

  [[nodiscard]] std::map<std::string, Reported> ReportedErrors() const {
    std::map<std::string, Reported> reported;
    for (const Finding& finding : Findings()) {
      if (finding.severity == Severity::kError && finding.id != "contradictory-parameter") {
        EXPECT_NE(finding.id, "load-error") << finding.loadMessage;
        reported[WithoutDir(finding.place.file)][finding.place.line].insert(finding.loadMessage);
      }
    }
    return reported;
  }

  // One line after the other, in one file: an error of one does not hide the next.
  void CheckLines(const std::string& file, const std::vector<CorpusLine>& lines,
                  std::size_t least) const {
    std::string text;
    for (const CorpusLine& line : lines) text += TextOf(line);
    Policy(file, text);
    const Reported reported = ReportedErrors()[file];
    unsigned int number = 0;
    std::size_t failures = 0;
    for (const CorpusLine& line : lines) {
      ++number;
      const std::string expected = Expected(line, file, number);
      const auto found = reported.find(number);
      const bool isError = found != reported.end();
      const bool isRight =
          expected.empty() ? !isError : isError && found->second.contains(expected);
      if (isRight || ++failures > kMostShown) continue;
      ADD_FAILURE() << TextOf(line) << "has to be \"" << expected << "\" and is "
                    << (isError ? testing::PrintToString(found->second) : "no error");
    }
    EXPECT_EQ(failures, 0U);
    EXPECT_GE(lines.size(), least);
    std::printf("%s: %zu lines\n", file.c_str(), lines.size());
  }

  // What a load says of the line, which stands there as the first bad one.
  [[nodiscard]] std::string Expected(const CorpusLine& line, const std::string& file,
                                     unsigned int number) const {
    std::string error = line.error;
    if (error.empty() && line.record.find(" : ") != std::string::npos) {
      // What is left behind by labelling is a failure, or the label of the one that can be.
      error = line.record.substr(line.record.starts_with("held|") ? line.record.find('\n') + 1 : 0);
    }
    error = Replaced(error, std::string(1, kLineMark), std::to_string(number));
    return Replaced(error, std::string(1, kFileMark), PolicyDir() + "/" + file);
  }
};

TEST_F(ConsistencyTest, RulesOfWords) {
  const std::pair<const char*, std::size_t> kTypes[] = {
      {"-s", 800}, {"-c", 300}, {"-p", 700}, {"-a", 500}, {"-d", 600}, {"-f", 900}, {"-u", 400}};
  for (const auto& [keyword, least] : kTypes) {
    CheckLines("domains/appDom", SecPolicyTest::KeywordLines(keyword), least);
  }
}

TEST_F(ConsistencyTest, PathRules) {
  // No relative path is to lead anywhere.
  std::filesystem::remove(Host() + "/root/etc/hosts");
  CheckLines("domains/appDom", SecPolicyTest::PathLines(), 400);
}

TEST_F(ConsistencyTest, UnknownRuleTypes) {
  CheckLines("domains/appDom", SecPolicyTest::LinesOfUnknownType(), 100);
}

TEST_F(ConsistencyTest, Objects) { CheckLines("objects/more", SecPolicyTest::ObjectLines(), 300); }

TEST_F(ConsistencyTest, FileLabels) {
  CheckLines("fileLabels/base", SecPolicyTest::FileLabelLines(kHeld), 350);
}

TEST_F(ConsistencyTest, TardiskExceptions) {
  std::filesystem::create_directory(PolicyDir() + "/tardisks");
  const auto lines = SecPolicyTest::TardiskLines();
  std::size_t number = 0;
  for (const CorpusLine& line : lines) Policy("tardisks/" + std::to_string(number++), TextOf(line));
  const auto reported = ReportedErrors();
  number = 0;
  for (const CorpusLine& line : lines) {
    const std::string name = std::to_string(number++);
    const auto found = reported.find("tardisks/" + name);
    // What is left of an accepted line is no finding, or, of an unknown label, a warning here.
    EXPECT_EQ(found == reported.end(), line.error.empty()) << TextOf(line);
    if (found == reported.end()) continue;
    const std::string error =
        Replaced(Replaced(line.error, std::string(1, kLineMark), "1"), std::string(1, kFileMark),
                 "/etc/olvane/secpolicy/tardisks/" + name);
    EXPECT_TRUE(found->second.at(1).contains(error)) << error;
  }
  EXPECT_GE(lines.size(), 200U);
}

// Files of every shape: with other spaces, comments, NULs, lengths and neighbours. Each is a domain
// of its own, so that the load of each is a part of the check.
class LayoutTest : public ConsistencyTest {
 protected:
  void CheckCases(const std::vector<CorpusCase>& cases) const {
    constexpr std::size_t kFiles = 900;
    const std::size_t step = cases.size() / kFiles + 1;
    std::map<std::string, std::string> expected;
    for (std::size_t i = 0; i < cases.size(); i += step) {
      const std::string name = "x" + std::to_string(i);
      Policy("domains/" + name, cases[i].text);
      expected["domains/" + name] = Replaced(cases[i].error, "domain: appDom", "domain: " + name);
    }
    const auto reported = ReportedErrors();
    for (const auto& [file, error] : expected) {
      std::set<std::string> all;
      if (const auto found = reported.find(file); found != reported.end()) {
        for (const auto& [line, texts] : found->second) all.insert(texts.begin(), texts.end());
      }
      if (error.empty()) {
        EXPECT_THAT(all, testing::IsEmpty()) << file;
      } else if (!error.starts_with("Policy constraint")) {
        EXPECT_THAT(all, testing::Contains(error)) << file;
      }
      std::filesystem::remove(PolicyDir() + "/" + file);
    }
    EXPECT_GE(expected.size(), 400U);
  }
};

TEST_F(LayoutTest, SystemCalls) {
  CheckCases(SecPolicyTest::LayOut(SecPolicyTest::KeywordLines("-s"), {}, 3));
}

TEST_F(LayoutTest, Transitions) {
  CheckCases(SecPolicyTest::LayOut(SecPolicyTest::KeywordLines("-d"), {}, 3));
}

TEST_F(LayoutTest, UnknownRuleTypes) {
  CheckCases(SecPolicyTest::LayOut(SecPolicyTest::LinesOfUnknownType(), {}));
}

}  // namespace
}  // namespace SecPolicyTool
