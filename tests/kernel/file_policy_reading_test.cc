// Reading a domain's file rules: count, allocate, read, and again when there are more by then.
#include "tests/kernel/file_rules.h"
#include "tests/support/host_test.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;

class FilePolicyReadingTest : public HostTest {
 protected:
  FilePolicyReadingTest() { Add("/a"), Add("/b"); }

  // Adds a rule of rootDom.
  void Add(const std::string& path) {
    Run([&] { AddHere(path); });
  }

  static void AddHere(const std::string& path) {
    SecPolicy::ZekAccess_FileRule rule = FileRule(path, 1);
    unsigned int result = 0;
    SecPolicy::AddFilePolicyBatch(0, 0, &rule, 1, &result);
  }
};

TEST_F(FilePolicyReadingTest, RulesAreCountedAndRead) {
  const Outcome outcome = Run([] { return RulesHeldBy(0); });
  EXPECT_EQ(outcome.value, "/a 1, /b 1");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: count-file-rules rootDom", "kernel: read-file-rules rootDom"));
}

TEST_F(FilePolicyReadingTest, ADomainWithoutRulesHasNone) {
  Run([] { SecPolicy::CreateDomain("emptyDom"); });
  const Outcome outcome = Run([] {
    SecPolicy::RetrieveFilePolicies(1, nullptr, 0);
    return SecPolicy::RetrieveNumberOfFilePolicies(1);
  });
  EXPECT_EQ(outcome.value, "0");
}

TEST_F(FilePolicyReadingTest, TooLittleRoomAsksForARetryAndWritesNothing) {
  const Outcome outcome = Run([] {
    std::vector<SecPolicy::ZekAccess_FileRule> rules{FileRule("untouched", 7)};
    try {
      SecPolicy::RetrieveFilePolicies(0, rules.data(), 1);
    } catch (const SecPolicy::SecPolicyRetryException& failure) {
      return std::string(failure.what()) + " / " + TextOf(rules);
    }
    return std::string();
  });
  EXPECT_EQ(outcome.value,
            "Failed to retrieve policies from domain:: 0 : No space left on device / untouched 7");
}

TEST_F(FilePolicyReadingTest, NoRoomAtAllAsksForARetry) {
  const Outcome outcome = Run([] { SecPolicy::RetrieveFilePolicies(0, nullptr, 0); });
  EXPECT_EQ(outcome.error,
            "retry: Failed to retrieve policies from domain:: 0 : No space left on device");
  EXPECT_THAT(outcome.events, ElementsAre(testing::StartsWith("kernel: read-file-rules rootDom")));
}

TEST_F(FilePolicyReadingTest, MoreRoomThanRulesIsFilledAsFarAsItGoes) {
  const Outcome outcome = Run([] {
    std::vector<SecPolicy::ZekAccess_FileRule> rules(3, FileRule("untouched", 7));
    SecPolicy::RetrieveFilePolicies(0, rules.data(), 3);
    return TextOf(rules);
  });
  EXPECT_EQ(outcome.value, "/a 1, /b 1, untouched 7");
}

// What a careful caller does, with a rule added by someone else in between.
TEST_F(FilePolicyReadingTest, ARetryWithTheNewCountSucceeds) {
  const Outcome outcome = Run([] {
    for (bool added = false;; added = true) {
      const unsigned int count = SecPolicy::RetrieveNumberOfFilePolicies(0);
      if (!added) AddHere("/c");
      std::vector<SecPolicy::ZekAccess_FileRule> rules(count);
      try {
        SecPolicy::RetrieveFilePolicies(0, rules.data(), count);
        return TextOf(rules);
      } catch (const SecPolicy::SecPolicyRetryException&) {
      }
    }
  });
  EXPECT_EQ(outcome.value, "/a 1, /b 1, /c 1");
  EXPECT_EQ(outcome.Operations({"read-file-rules"}).size(), 2u);
}

TEST_F(FilePolicyReadingTest, TheStatusDecidesWhichExceptionIsThrown) {
  const std::string text = "Failed to retrieve policies from domain:: 0 : Input/output error";
  struct Row {
    long status;
    std::string error;
  };
  const Row rows[] = {
      {0x0bad011f, "retry: " + text},
      {195887391, "retry: " + text},
      {0x0bad011e, text},
      {0x0bad0120, text},
      {1, text},
      {0x11f, text},
      {0x10bad011f, text},
  };
  for (const Row& row : rows) {
    FailNothing();
    Fail(Fault{.operation = Operation::kReadFileRules, .number = EIO, .status = row.status});
    const Outcome outcome = Run([] { return RulesHeldBy(0); });
    EXPECT_EQ(outcome.error, row.error) << row.status;
  }
}

TEST_F(FilePolicyReadingTest, TheStatusOfTooLittleRoomMeansNothingElsewhere) {
  Fail(Fault{.operation = Operation::kCountFileRules, .number = ENOSPC, .status = 0x0bad011f});
  EXPECT_EQ(Run([] { return SecPolicy::RetrieveNumberOfFilePolicies(7); }).error,
            "Failed to get number of file policies for domain :: 7:No space left on device");
}

TEST_F(FilePolicyReadingTest, AnUnknownDomainIsNamed) {
  EXPECT_EQ(Run([] { return SecPolicy::RetrieveNumberOfFilePolicies(4294967295u); }).error,
            "Failed to get number of file policies for domain :: 4294967295:No such file or "
            "directory");
  EXPECT_EQ(Run([] { SecPolicy::RetrieveFilePolicies(7, nullptr, 0); }).error,
            "Failed to retrieve policies from domain:: 7 : No such file or directory");
}

}  // namespace
}  // namespace SecPolicyTest
