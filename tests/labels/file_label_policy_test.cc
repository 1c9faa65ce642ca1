// File-label files: a path, or a tree, and its label.
#include "labels/file_label_policy.h"

#include <new>

#include "tests/labels/labels_fixture.h"
#include "tests/support/counted_memory.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::FileLabelPolicy;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

class FileLabelPolicyTest : public LabelsTest {
 protected:
  FileLabelPolicyTest() {
    Tardisk("base").File("opt/x/a", "").File("opt/y", "").File("opt/star*", "").File("opt/z", "");
    Define({"web", "mail"});
  }

  std::string Parse(const std::string& text) {
    Policy("fileLabels/x", text);
    return RunWithInterface([&](auto& iface) {
             FileLabelPolicy().ParsePolicy(PolicyPath("fileLabels/x"), iface);
           })
        .error;
  }

  // Parses `text` and applies what was kept; the error is that of the applying.
  Outcome ParseAndSet(const std::string& text) {
    Policy("fileLabels/x", text);
    return RunWithInterface([&](auto& iface) {
      FileLabelPolicy policy;
      try {
        policy.ParsePolicy(PolicyPath("fileLabels/x"), iface);
      } catch (const Tavon::Lib::TavonException&) {
      }
      policy.SetFileLabels(iface);
    });
  }

  [[nodiscard]] std::string AtLine(int line, const std::string& cause) const {
    return PolicyPath("fileLabels/x") + ":" + std::to_string(line) + " : " + cause;
  }
};

TEST_F(FileLabelPolicyTest, SpecificationNamesAPathOrATree) {
  struct Case {
    std::string path;
    std::vector<std::string> labelled;
  };
  const Case cases[] = {
      {"/opt/y", {"/opt/y"}},
      {"/opt/x", {"/opt/x"}},
      {"/opt/x/*", {"/opt/x", "/opt/x/a"}},
      {"/opt/star*", {"/opt/star*"}},  // a star is a wildcard behind a slash only
  };
  for (const Case& row : cases) {
    const Outcome outcome = ParseAndSet(row.path + " web\n");
    EXPECT_EQ(outcome.error, "") << row.path;
    EXPECT_THAT(outcome.Operations({"lookup-label", "set-file-label"}),
                ElementsAreArray(Labelling(row.labelled, "web")))
        << row.path;
  }
}

TEST_F(FileLabelPolicyTest, WildcardAnywhereButAtTheEndIsRefused) {
  for (const std::string path :
       {"/opt/*/y", "/*/y", "/*y", "/opt/*y", "/opt/*/", "/opt/**", "/opt/*/*", "/*/*", "a/*b/*"}) {
    EXPECT_EQ(Parse(path + " web\n"), AtLine(1, "Unrecognized format for file/dir specification"))
        << path;
  }
}

TEST_F(FileLabelPolicyTest, LineMustHoldTwoWords) {
  for (const std::string line : {"/opt/y", "/opt/y web more", "/opt/y web grant more"}) {
    EXPECT_EQ(Parse("# comment\n\n" + line + "\n"), AtLine(3, "incorrect no of parameters"))
        << line;
  }
  EXPECT_EQ(Parse("/opt/y web # more\n"), "");
}

TEST_F(FileLabelPolicyTest, UnknownLabelIsTheKernelsFailureAlone) {
  EXPECT_EQ(Parse("/opt/y webb\n"), "unknown object label \"webb\" (nearest: web)");
}

TEST_F(FileLabelPolicyTest, WordsAreCountedThenTheLabelIsJudgedThenThePath) {
  EXPECT_EQ(Parse("/opt/*/y shelf more\n"), AtLine(1, "incorrect no of parameters"));
  Fail(Operation::kValidateWord);
  EXPECT_EQ(Parse("/opt/*/y shelf\n"), "refused on request: validate-word, call 1");
}

TEST_F(FileLabelPolicyTest, EachLabelIsValidatedAsAnObjectInLineOrder) {
  Policy("fileLabels/x", "/opt/y web\n/opt/z mail\n/none tardisk\n");
  const Outcome outcome = RunWithInterface(
      [&](auto& iface) { FileLabelPolicy().ParsePolicy(PolicyPath("fileLabels/x"), iface); });
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: validate-word object web", "kernel: validate-word object mail",
                          "kernel: validate-word object tardisk"));
}

TEST_F(FileLabelPolicyTest, UnopenableFileIsTheReadersFailure) {
  const Outcome outcome = RunWithInterface(
      [&](auto& iface) { FileLabelPolicy().ParsePolicy(PolicyPath("fileLabels/none"), iface); });
  EXPECT_EQ(outcome.error, "Unable to open policy file " + PolicyPath("fileLabels/none"));
}

TEST_F(FileLabelPolicyTest, MappingsBeforeABadLineAreKept) {
  const Outcome outcome = ParseAndSet("/opt/y web\n/opt/x mail\nbad\n/opt/z web\n");
  EXPECT_THAT(outcome.Operations({"set-file-label"}),
              ElementsAre("set-file-label /opt/y web", "set-file-label /opt/x mail"));
}

TEST_F(FileLabelPolicyTest, MappingsAreAppliedInLineOrderSoThatTheLastOneStands) {
  EXPECT_EQ(ParseAndSet("/opt/x/* web\n/opt/x/a mail\n").error, "");
  EXPECT_EQ(LabelOf("/opt/x"), "web");
  EXPECT_EQ(LabelOf("/opt/x/a"), "mail");
}

TEST_F(FileLabelPolicyTest, FailedMappingIsLoggedWithItsLineAndTheOthersAreApplied) {
  const Outcome outcome = ParseAndSet("\n/none web\n/opt/y mail\n/opt/z/* web\n");
  EXPECT_EQ(outcome.error, "There was a failure in setting file labels");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre(AtLine(2,
                                 "Unable to set file label (web) for file /none: No such file "
                                 "or directory"),
                          AtLine(4, "Unable to open directory /opt/z")));
  EXPECT_EQ(LabelOf("/opt/y"), "mail");
  EXPECT_EQ(LabelOf("/opt/z"), "web");
}

TEST_F(FileLabelPolicyTest, WildcardAloneIsAnEmptyPathThatFails) {
  const Outcome outcome = ParseAndSet("/* web\n");
  EXPECT_EQ(outcome.error, "There was a failure in setting file labels");
  EXPECT_THAT(outcome.Errors(), ElementsAre(AtLine(1,
                                                   "Unable to set file label (web) for file : "
                                                   "No such file or directory")));
}

TEST_F(FileLabelPolicyTest, NothingIsLeftToSetAfterwards) {
  Policy("fileLabels/x", "/opt/y web\n/none web\n");
  const Outcome outcome = RunWithInterface([&](auto& iface) {
    FileLabelPolicy policy;
    policy.ParsePolicy(PolicyPath("fileLabels/x"), iface);
    try {
      policy.SetFileLabels(iface);
    } catch (const Tavon::Lib::TavonException&) {
      SecPolicy::SecpolicyInfo("second time");
    }
    policy.SetFileLabels(iface);
  });
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: validate-word object web", "kernel: validate-word object web",
                          "kernel: lookup-label object web", "kernel: set-file-label /opt/y web",
                          "kernel: lookup-label object web", testing::StartsWith("error: "),
                          "info: second time"));
}

// An exception that is not the library's ends the attempts, and counts as the end of one.
TEST_F(FileLabelPolicyTest, MappingIsGoneWhateverEndedItsAttempt) {
  const std::string label = "label-that-needs-memory-of-its-own";
  Define({label});
  Policy("fileLabels/x", "/opt/y " + label + "\n/opt/z " + label + "\n");
  const Outcome outcome = RunWithInterface([&](auto& iface) {
    FileLabelPolicy policy;
    policy.ParsePolicy(PolicyPath("fileLabels/x"), iface);
    std::string failure = "nothing";
    FailAllocation(0);
    try {
      policy.SetFileLabels(iface);
    } catch (const std::bad_alloc&) {
      FailNoAllocation();
      failure = "no memory";
    }
    FailNoAllocation();
    policy.SetFileLabels(iface);
    return failure;
  });
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.value, "no memory");
  EXPECT_THAT(outcome.Operations({"set-file-label"}),
              ElementsAre("set-file-label /opt/z " + label));
}

TEST_F(FileLabelPolicyTest, EmptyPolicySetsNothing) {
  const Outcome outcome = ParseAndSet("# nothing\n\n");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTest
