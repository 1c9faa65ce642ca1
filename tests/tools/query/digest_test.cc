// One word for what a policy means.
#include <algorithm>

#include "tests/tools/command_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;

class DigestTest : public CommandTest {
 protected:
  DigestTest() {
    Policy("objects/base", "conf\nprogram\n");
    Policy("domains/appDom", "-s open grant\n-a conf read grant\n-r /etc/motd rw\n");
    Policy("fileLabels/base", "/etc/* conf\n");
  }
  void SetUp() override {
    StandIn::Archive base;
    base.Directory("etc").File("etc/motd", "hello");
    MakeHost({{"base.tar", base}});
  }

  [[nodiscard]] std::string Digest(const std::string& source) const {
    return Done({"digest", "--host", Host(), source}).out;
  }
  [[nodiscard]] std::string Digest() const { return Digest(PolicyDir()); }
};

TEST_F(DigestTest, IsStable) {
  // Published digests have to stay what they are.
  EXPECT_EQ(Digest(), "ee62c5b28be62ce0d67d742ebc7db15f274cb2daa3ebe43dbada503613239be7\n");
}

TEST_F(DigestTest, DirectoryAndKernelThatHoldsItAreEqual) {
  const std::string before = Digest("kernel");
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Digest("kernel"), Digest());
  EXPECT_NE(Digest("kernel"), before);
}

TEST_F(DigestTest, OrderAndCommentsDoNotCount) {
  const std::string before = Digest();
  Policy("domains/appDom",
         "# rewritten\n-r /etc/motd  wr\n-a conf read revoke\n-a conf read grant\n-s open grant\n");
  Policy("objects/base", "program\n");
  Policy("objects/other", "conf\n");
  EXPECT_EQ(Digest(), before);
}

TEST_F(DigestTest, EveryPartOfTheMeaningCounts) {
  struct Change {
    const char* file;
    const char* text;
  };
  std::vector<std::string> digests{Digest()};
  for (const Change& change : {
           Change{"objects/more", "another\n"},
           Change{"domains/extraDom", ""},
           Change{"domains/appDom", "-s open revoke\n-a conf read grant\n-r /etc/motd rw\n"},
           Change{"domains/appDom", "-s open revoke\n-a conf read grant\n-r /etc/motd r\n"},
           Change{"domains/ioFilterDom", "-s open grant\n"},
           Change{"fileLabels/base", "/etc program\n"},
       }) {
    Policy(change.file, change.text);
    digests.push_back(Digest());
  }
  std::sort(digests.begin(), digests.end());
  EXPECT_EQ(std::unique(digests.begin(), digests.end()), digests.end());
}

TEST_F(DigestTest, DirectoryWithErrorsHasNone) {
  Policy("domains/appDom", "-x open grant\n");
  const Result result = Command({"digest", "--host", Host(), PolicyDir()});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.out, "");
  EXPECT_THAT(result.err, HasSubstr("Error: Error in parsing policy for domain: appDom: 1 : "
                                    "invalid policy rule type (-x)\n"));
  EXPECT_THAT(result.err,
              HasSubstr("Error: " + PolicyDir() + " cannot be loaded without errors\n"));
}

TEST_F(DigestTest, JsonIsAsDescribed) {
  const std::string text = Done({"digest", "--host", Host(), "--json", PolicyDir()}).out;
  EXPECT_EQ(JsonProblem(text, "digest"), "");
  const std::string digest = Digest();
  EXPECT_THAT(text, HasSubstr(digest.substr(0, digest.size() - 1)));
}

TEST_F(DigestTest, SchemaRefusesWhatItDoesNotDescribe) {
  EXPECT_THAT(JsonProblem(R"({"source": "policy", "sha256": "short"})", "digest"),
              HasSubstr("1 errors"));
}

}  // namespace
}  // namespace SecPolicyTool
