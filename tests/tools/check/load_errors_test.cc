// What a load reports, and the findings that explain it.
#include "tools/check/load_errors.h"

#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

struct ParseCase {
  const char* text;
  const char* file;
  unsigned int line;
  const char* cause;
};

TEST(LoadErrors, PlaceIsReadFromTheText) {
  const ParseCase kCases[] = {
      {"/p/objects/a:3 : cause : x", "/p/objects/a", 3, "cause : x"},
      {"Error in parsing policy for domain: appDom: 12 : cause", "appDom", 12, "cause"},
      {"Error in setting policy for domain: appDom: 1 : cause", "appDom", 1, "cause"},
      {"Error in parsing policy for domain: /t/x: 1 : cause", "/t/x", 1, "cause"},
      {"/p : 1/a:3 : cause", "/p : 1/a", 3, "cause"},
      {"no place", "", 0, "no place"},
      {"no line : cause", "", 0, "no line : cause"},
      {"a7 : cause", "", 0, "a7 : cause"},
      {"a:99999999999 : cause", "", 0, "a:99999999999 : cause"},
      {" : ", "", 0, " : "},
  };
  for (const ParseCase& one : kCases) {
    const LoadError error = ParseLoadError(one.text);
    EXPECT_EQ(error.file, one.file) << one.text;
    EXPECT_EQ(error.line, one.line) << one.text;
    EXPECT_EQ(error.cause, one.cause) << one.text;
  }
}

CheckedDirectory Directory(const std::string& path, const std::string& file,
                           const std::string& text) {
  return {path, "shown", {{file, path + "/" + file, "shown/" + file, ReadPolicyText(text)}}};
}

std::vector<std::string> Unexplained(const std::vector<std::string>& errors,
                                     Findings findings = {}) {
  const CheckedDirectory domains = Directory("/p/domains", "appDom", "-s open grant\n\n");
  const CheckedDirectory labels = Directory("/p/fileLabels", "base", "/a b\n");
  LoadErrors(errors).AddUnexplained({&domains, &labels}, findings);
  std::vector<std::string> found;
  for (const Finding& finding : std::move(findings).Sorted()) {
    if (finding.id == "load-error") {
      found.push_back(PlaceText(finding.place) + " " + finding.message);
    }
  }
  return found;
}

TEST(LoadErrors, WhatNothingExplainsHasThePlaceThatItNames) {
  EXPECT_THAT(
      Unexplained({"Error in setting policy for domain: appDom: 1 : no room",
                   "Error in setting policy for domain: appDom: 2 : blank line",
                   "Error in setting policy for domain: appDom: 77 : beyond",
                   "Error in setting policy for domain: other: 1 : elsewhere",
                   "/p/fileLabels/base:1 : label", "Error parsing file /p/fileLabels/base", "odd",
                   "nowhere"}),
      ElementsAre("shown/appDom blank line", "shown/appDom beyond", "shown/appDom:1:1 no room",
                  "shown/base odd", "shown/base:1:1 label", " elsewhere", " nowhere"));
}

TEST(LoadErrors, SummariesAreDroppedWhenWhatTheySumUpIsShown) {
  EXPECT_THAT(Unexplained({"cause", "Error in parsing the policy for some domains",
                           "Failure in domain policy",
                           "There were some problems encountered in setting the policy"}),
              ElementsAre(" cause"));
}

TEST(LoadErrors, SummariesWithoutACauseAreKept) {
  EXPECT_THAT(Unexplained({"Failure in object policy", "Failure in domain policy"}),
              ElementsAre(" Failure in object policy", " Failure in domain policy"));
  EXPECT_THAT(Unexplained({"There were some problems encountered in setting the policy"}),
              ElementsAre(" There were some problems encountered in setting the policy"));
  EXPECT_THAT(Unexplained({"Error parsing file /p/fileLabels/base"}),
              ElementsAre("shown/base Error parsing file /p/fileLabels/base"));
}

TEST(LoadErrors, ExplainedErrorsAreNotRepeated) {
  Findings findings;
  findings.AddError(Kind::kUnknownWord, {}, "explained", "said by the load");
  EXPECT_THAT(Unexplained({"said by the load", "Failure in file labels policy"}, findings),
              IsEmpty());
}

class LoadErrorsTest : public CheckTest {};

TEST_F(LoadErrorsTest, FullTableIsReportedWithItsLine) {
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "limits": {"fileRulesPerDomain": 1}})");
  Policy("domains/appDom", "-s open grant\n-r /etc/motd r\n-r /etc/hosts r\n");
  EXPECT_THAT(Found(),
              ElementsAre("domains/appDom:3:1: error: Failed to add file policies to domain :1: "
                          "world ID :0:No space left on device [load-error]"));
}

TEST_F(LoadErrorsTest, DefaultsThatTheHostDoesNotHave) {
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "tardisks": {"defaultLabel": "nothing"}})");
  std::filesystem::create_directories(Host() + "/root/etc/olvane/secpolicy/tardisks");
  const auto found = Found();
  EXPECT_THAT(found, testing::Each(testing::StartsWith(": error: ")));
  EXPECT_THAT(found, testing::Contains(": error: unknown object label \"nothing\" [load-error]"));
}

}  // namespace
}  // namespace SecPolicyTool
