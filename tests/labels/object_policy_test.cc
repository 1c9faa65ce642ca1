// Object files: one name on a line.
#include "labels/object_policy.h"

#include "tests/labels/labels_fixture.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::ObjectPolicy;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

class ObjectPolicyTest : public LabelsTest {
 protected:
  // Parses each file, failures aside, and installs what was kept. The value is the failures, each
  // on a line.
  Outcome ParseAndSet(const std::vector<std::string>& files) {
    return RunWithInterface([&](auto& iface) {
      ObjectPolicy policy;
      std::string failures;
      for (const std::string& file : files) {
        try {
          policy.ParsePolicy(PolicyPath(file));
        } catch (const Tavon::Lib::TavonException& failure) {
          failures += std::string(failure.what()) + "\n";
        }
      }
      policy.SetObjects(iface);
      return failures;
    });
  }
};

TEST_F(ObjectPolicyTest, NamesAreKeptInTheOrderOfTheirLines) {
  Policy("objects/x", "web\n\n# comment\n  mail   # trailing\nAnt\n");
  const Outcome outcome = ParseAndSet({"objects/x"});
  EXPECT_EQ(outcome.value, "");
  EXPECT_EQ(LastAdded(outcome), "add-labels object web mail Ant");
}

TEST_F(ObjectPolicyTest, FilesParsedIntoOnePolicyAppend) {
  Policy("objects/x", "web\nmail\n");
  Policy("objects/y", "mail\nprint\n");
  EXPECT_EQ(LastAdded(ParseAndSet({"objects/y", "objects/x"})),
            "add-labels object mail print web mail");
}

TEST_F(ObjectPolicyTest, LineWithMoreNamesStopsTheFileAndIsNamed) {
  struct Case {
    std::string text;
    std::string line;
    std::string kept;
  };
  const Case cases[] = {
      {"a\nb\nc d\ne\n", "3", " a b"},
      {"a b\nc\n", "1", ""},
      {"# one\n\n\n\n\n\na b c", "7", ""},
      {"a\nb grant # two words\n", "2", " a"},
  };
  for (const Case& row : cases) {
    Policy("objects/x", row.text);
    const Outcome outcome = ParseAndSet({"objects/x"});
    EXPECT_EQ(outcome.value, PolicyPath("objects/x") + ":" + row.line +
                                 " : cannot define more than one object per line\n")
        << row.text;
    EXPECT_EQ(LastAdded(outcome), "add-labels object" + row.kept) << row.text;
  }
}

TEST_F(ObjectPolicyTest, UnopenableFileIsTheReadersFailure) {
  EXPECT_EQ(ParseAndSet({"objects/none"}).value,
            "Unable to open policy file " + PolicyPath("objects/none") + "\n");
}

TEST_F(ObjectPolicyTest, NamesAreNotJudgedWhenTheyAreRead) {
  const std::string tooLong(128, 'n');
  Policy("objects/x", tooLong + "\n");
  const Outcome outcome =
      RunWithInterface([&](auto&) { ObjectPolicy().ParsePolicy(PolicyPath("objects/x")); });
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, IsEmpty());
  EXPECT_NE(ParseAndSet({"objects/x"}).error, "");
}

TEST_F(ObjectPolicyTest, SettingAsksForTheKernelsObjectsFirst) {
  Define({"old"});
  Policy("objects/x", "web\n");
  EXPECT_THAT(ParseAndSet({"objects/x"}).Operations(),
              ElementsAre("words object", "invalid-labels object", "remove-labels object",
                          "add-labels object", "predefined-label object default",
                          "predefined-label object old", "predefined-label object tardisk",
                          "remove-labels object old", "add-labels object web"));
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2), Pair("web", 4)));
}

TEST_F(ObjectPolicyTest, MapIsNotFetchedAgainAfterInvalidLabelsWereAddedAnew) {
  Describe(R"({"format": 1, "labels": {"object": {"predefined": ["default"],
               "invalid": ["stale"]}}})");
  Define({"stale"});
  Policy("objects/x", "stale\n");
  const Outcome outcome = ParseAndSet({"objects/x"});
  EXPECT_THAT(outcome.Operations({"words"}), ElementsAre("words object"));
  EXPECT_EQ(outcome.error, "");
}

TEST_F(ObjectPolicyTest, SettingPassesTheKernelsRefusalOn) {
  Fail(Operation::kWords);
  const Outcome outcome = ParseAndSet({});
  EXPECT_EQ(outcome.error, "refused on request: words, call 1");
  EXPECT_THAT(outcome.Operations(),
              ElementsAre("words object ! refused on request: words, call 1"));
}

}  // namespace
}  // namespace SecPolicyTest
