// Ways to name the policy directory of a load.
#include <unistd.h>

#include <filesystem>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using testing::Contains;
using testing::HasSubstr;

class PolicyPathTest : public CommandTest {
 protected:
  void SetUp() override { MakeHost(); }

  // The directory that the load of `given`, from the test's directory, says it uses.
  std::string Used(const std::string& given) const {
    const Result result = Command({"load", "--host", Host(), "--", given},
                                  [&] { EXPECT_EQ(chdir(Path("").c_str()), 0); });
    EXPECT_EQ(result.status, 0) << given << ": " << result.err;
    const std::string first = result.Errors().empty() ? "" : result.Errors().front();
    return first.starts_with(kUsing) ? first.substr(sizeof kUsing - 1) : first;
  }

  static constexpr char kUsing[] = "Using policy dir ";
};

TEST_F(PolicyPathTest, IsUsedAsAnAbsolutePathWithoutDotsAndLastSlash) {
  for (const std::string& given :
       {Path("policy"), Path("policy/"), Path("policy///"), Path("policy/."), Path("./policy/"),
        Path("state/../policy"), Path("policy/domains/.."), Path("policy/domains/../"),
        std::string("policy"), std::string("./policy/"), std::string("policy/../policy")})
    EXPECT_EQ(Used(given), Path("policy")) << given;
}

TEST_F(PolicyPathTest, LinkStaysALink) {
  fs::create_directory_symlink("policy", Path("link"));
  EXPECT_EQ(Used(Path("link")), Path("link"));
  EXPECT_EQ(Used("link/"), Path("link"));
}

TEST_F(PolicyPathTest, DotsBehindALinkLeadWhereTheLinkLeads) {
  fs::create_directories(Path("elsewhere/deep"));
  fs::rename(Path("policy"), Path("elsewhere/policy"));
  fs::create_directory_symlink("elsewhere/deep", Path("link"));
  EXPECT_EQ(Used(Path("link/../policy")), Path("elsewhere/policy"));
}

TEST_F(PolicyPathTest, EntriesKeepTheirKinds) {
  StandIn::WriteBytes(Path("elsewhere"), "-s opne grant\n");
  fs::create_symlink(Path("elsewhere"), PolicyDir() + "/domains/linkedDom");
  EXPECT_EQ(Used("policy"), Path("policy"));
  EXPECT_THAT(Shown(), testing::Not(HasSubstr("linkedDom")));  // links are no policy files
}

TEST_F(PolicyPathTest, MessagesNameTheFileThatItsAuthorEdits) {
  fs::create_directory_symlink("policy", Path("link"));
  Policy("fileLabels/bad", "/motd\n");
  const Result result = Command({"load", "--host", Host(), Path("link")});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.Errors(), Contains(HasSubstr(Path("link") + "/fileLabels/bad:1 : ")));
}

TEST_F(PolicyPathTest, FileIsNoPolicy) {
  StandIn::WriteBytes(Path("file"), "");
  const Result result = Command({"load", "--host", Host(), Path("file")});
  EXPECT_EQ(result.status, 3);
  EXPECT_THAT(result.Errors(),
              Contains("Error: Unable to open policy directory " + Path("file") + "/objects"));
}

}  // namespace
}  // namespace SecPolicyTool
