// The direct calls that change file rules.
#include <cstring>

#include "host/attached_host.h"
#include "tests/kernel/file_rules.h"
#include "tests/support/host_test.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// The domain with id 1, guestDom, in which the world 4711 runs, has rules.
class FilePolicyTest : public HostTest {
 protected:
  FilePolicyTest() {
    Describe(R"({"format": 1, "worlds": [{"id": 4711, "domain": "guestDom"}]})");
    Run([] { SecPolicy::CreateDomain("guestDom"); });
  }

  // Adds the rules and returns the result cell.
  Outcome Add(std::vector<SecPolicy::ZekAccess_FileRule> rules, int world = 0,
              unsigned int domain = 1) {
    return Run([&] {
      unsigned int result = 99;
      SecPolicy::AddFilePolicyBatch(world, domain, rules.data(),
                                    static_cast<unsigned int>(rules.size()), &result);
      return result;
    });
  }

  std::string Held() {
    return Run([] { return RulesHeldBy(1); }).value;
  }
};

// ---- AddFilePolicyBatch -----------------------------------------------------------------------

TEST_F(FilePolicyTest, ABatchIsAddedInOneCall) {
  const Outcome outcome = Add({FileRule("/a", 0x1), FileRule("/b", 0x13)});
  EXPECT_EQ(outcome.value, "2");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: add-file-rules guestDom -r /a r; -r /b rwx"));
  EXPECT_EQ(Held(), "/a 1, /b 19");
}

TEST_F(FilePolicyTest, AnEmptyBatchIsPassedOnAsItIs) {
  const Outcome outcome = Add({});
  EXPECT_EQ(outcome.value, "0");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: add-file-rules guestDom"));
}

TEST_F(FilePolicyTest, ARuleMayBeOfOneWorld) {
  EXPECT_THAT(Add({FileRule("/a", 0x1)}, 4711).events,
              ElementsAre("kernel: add-file-rules guestDom -r /a r # world 4711"));
}

TEST_F(FilePolicyTest, ARefusedBatchKeepsWhatTheKernelTook) {
  const Outcome outcome = Run([] {
    SecPolicy::ZekAccess_FileRule rules[] = {FileRule("/a", 1), FileRule("relative", 1),
                                             FileRule("/c", 1)};
    unsigned int result = 99;
    try {
      SecPolicy::AddFilePolicyBatch(0, 1, rules, 3, &result);
    } catch (const Tavon::Lib::TavonException& failure) {
      return std::to_string(result) + " " + failure.what();
    }
    return std::string();
  });
  EXPECT_EQ(outcome.value,
            "1 Failed to add file policies to domain :1: world ID :0:Invalid argument");
  EXPECT_EQ(Held(), "/a 1");
}

TEST_F(FilePolicyTest, RefusalsOfABatchNameDomainAndWorld) {
  struct Row {
    unsigned int domain;
    int world;
    const char* text;
  };
  const Row rows[] = {
      {4294967295u, 0, "domain :4294967295: world ID :0:No such file or directory"},
      {1, -5, "domain :1: world ID :-5:No such process"},
      {1, -2147483647 - 1, "domain :1: world ID :-2147483648:No such process"},
      {0, 4711, "domain :0: world ID :4711:Invalid argument"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(Add({FileRule("/a", 1)}, row.world, row.domain).error,
              std::string("Failed to add file policies to ") + row.text);
  }
}

TEST_F(FilePolicyTest, APathOf1983CharactersFits) {
  const std::string path = "/" + std::string(1982, 'p');
  EXPECT_EQ(Add({FileRule(path, 0x10)}).value, "1");
  EXPECT_EQ(Held(), path + " 16");
}

// ---- RemoveFilePolicy -------------------------------------------------------------------------

TEST_F(FilePolicyTest, ARuleIsRemovedByItsPath) {
  Add({FileRule("/a", 1), FileRule("/b", 2)});
  const Outcome outcome = Run([] { SecPolicy::RemoveFilePolicy(0, 1, "/a"); });
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: remove-file-rule guestDom /a"));
  EXPECT_EQ(Held(), "/b 2");
}

TEST_F(FilePolicyTest, OneWorldsRuleIsRemovedAlone) {
  Add({FileRule("/a", 1)});
  Add({FileRule("/a", 2)}, 4711);
  EXPECT_THAT(Run([] { SecPolicy::RemoveFilePolicy(4711, 1, "/a"); }).events,
              ElementsAre("kernel: remove-file-rule guestDom /a # world 4711"));
  EXPECT_EQ(Held(), "/a 1");
}

TEST_F(FilePolicyTest, ARefusedRemovalNamesDomainAndWorld) {
  Add({FileRule("/a", 1)});
  EXPECT_EQ(Run([] { SecPolicy::RemoveFilePolicy(-5, 1, "/a"); }).error,
            "Failed to remove file policy from domain :1 : world id :-5:No such file or directory");
  EXPECT_EQ(Held(), "/a 1");
}

// ---- UpdateFilePolicy and ReplaceFilePolicyVMs ------------------------------------------------

TEST_F(FilePolicyTest, APermissionIsChangedWherever) {
  Add({FileRule("/a", 1), FileRule("/b", 1)});
  Add({FileRule("/a", 2)}, 4711);
  const Outcome outcome = Run([] { SecPolicy::UpdateFilePolicy(1, "/a", 0x11); });
  EXPECT_THAT(outcome.events, ElementsAre("kernel: update-file-rule guestDom -r /a rx"));
  EXPECT_EQ(Held(), "/a 17, /b 1, /a 17");
}

TEST_F(FilePolicyTest, ARefusedUpdateNamesThePath) {
  Add({FileRule("/a", 1)});
  EXPECT_EQ(Run([] { SecPolicy::UpdateFilePolicy(1, "/b", 2); }).error,
            "Failed to update file policy: /b: No such file or directory");
  EXPECT_EQ(Run([] { SecPolicy::UpdateFilePolicy(1, "/a", 4); }).error,
            "Failed to update file policy: /a: Invalid argument");
  EXPECT_EQ(Held(), "/a 1");
}

TEST_F(FilePolicyTest, APathIsRenamedInEveryDomain) {
  Add({FileRule("/a", 1), FileRule("/b", 2)});
  Add({FileRule("/a", 1)}, 0, 0);
  const Outcome outcome = Run([] { SecPolicy::ReplaceFilePolicyVMs("/a", "/c"); });
  EXPECT_THAT(outcome.events, ElementsAre("kernel: replace-path /a /c"));
  EXPECT_EQ(Held(), "/c 1, /b 2");
  EXPECT_EQ(Run([] { return RulesHeldBy(0); }).value, "/c 1");
}

TEST_F(FilePolicyTest, ARefusedReplacementNamesBothPaths) {
  EXPECT_EQ(Run([] { SecPolicy::ReplaceFilePolicyVMs("/a b", "/c"); }).error,
            "Failed to replace file policy: /a b to: /c: No such file or directory");
}

// ---- Empty paths ------------------------------------------------------------------------------

TEST_F(FilePolicyTest, EmptyPathsAreRefusedWithoutACall) {
  struct Row {
    void (*call)();
    const char* text;
  };
  const Row rows[] = {
      {[] { SecPolicy::RemoveFilePolicy(0, 1, ""); }, "file path is empty"},
      {[] { SecPolicy::UpdateFilePolicy(1, "", 1); }, "File path is empty"},
      {[] { SecPolicy::ReplaceFilePolicyVMs("", "/a"); }, "Old path is empty"},
      {[] { SecPolicy::ReplaceFilePolicyVMs("/a", ""); }, "New path is empty"},
      {[] { SecPolicy::ReplaceFilePolicyVMs("", ""); }, "Old path is empty"},
  };
  for (const Row& row : rows) {
    const Outcome outcome = Run(row.call);
    EXPECT_EQ(outcome.error, row.text);
    EXPECT_THAT(outcome.events, IsEmpty()) << row.text;
  }
}

}  // namespace
}  // namespace SecPolicyTest
