// The verbs over the labels of files.
#include "tests/tools/group_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;

class LabelTest : public GroupTest {
 protected:
  LabelTest() : GroupTest("label") {}

  void SetUp() override {
    StandIn::Archive base;
    base.Directory("etc").File("etc/hosts", "").File("etc/motd", "").Directory("etc/net");
    base.File("etc/net/conf", "").Symlink("etc/link", "motd").Fifo("etc/pipe");
    MakeHost({{"base.tar", base}});
    Policy("objects/base", "conf\nnetConf\n");
    ASSERT_EQ(Load().status, 0);
  }
};

TEST_F(LabelTest, FileCarriesWhatWasSet) {
  EXPECT_EQ(Out({"get", "/etc/motd"}), "default /etc/motd\n");
  EXPECT_EQ(Out({"set", "/etc/motd", "conf"}), "");
  EXPECT_EQ(Out({"get", "/etc/motd"}), "conf /etc/motd\n");
}

TEST_F(LabelTest, TreeIsLabelledButForItsLinks) {
  Out({"set", "-R", "/etc", "conf"});
  EXPECT_EQ(Out({"get", "-R", "/etc"}),
            "conf /etc\nconf /etc/hosts\nconf /etc/motd\nconf /etc/net\nconf /etc/net/conf\n"
            "conf /etc/pipe\n");
  EXPECT_EQ(Out({"get", "/"}), "default /\n");
}

TEST_F(LabelTest, PathWithASlashAtItsEndIsShownWell) {
  EXPECT_EQ(Out({"get", "-R", "/etc/net/"}), "default /etc/net/\ndefault /etc/net/conf\n");
}

TEST_F(LabelTest, DryRunShowsWhatWouldChangeAndChangesNothing) {
  Out({"set", "/etc/motd", "conf"});
  EXPECT_EQ(Out({"set", "-R", "--dry-run", "/etc", "conf"}),
            "/etc: default -> conf\n/etc/hosts: default -> conf\n/etc/net: default -> conf\n"
            "/etc/net/conf: default -> conf\n/etc/pipe: default -> conf\n");
  EXPECT_EQ(Out({"get", "/etc"}), "default /etc\n");
}

TEST_F(LabelTest, UnknownLabelIsRefused) {
  const std::string refusal = "Error: no object label is named \"nconf\"\n";
  for (const Arguments& more : std::vector<Arguments>{{}, {"--dry-run"}, {"-R"}}) {
    Arguments arguments{"set", "/etc", "nconf"};
    arguments.insert(arguments.end(), more.begin(), more.end());
    const Result result = Use(arguments);
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.err, refusal);
  }
}

TEST_F(LabelTest, MissingFileIsReported) {
  EXPECT_EQ(Use({"get", "/none"}).err,
            "Error: Unable to get file label for file /none:No such file or directory\n");
  const Result result = Use({"set", "/none", "conf"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err,
            "Error: Unable to set file label (conf) for file /none: No such file or directory\n");
}

TEST_F(LabelTest, PathHasToBeAbsolute) {
  const Result result = Use({"get", "etc"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err, "Error: \"etc\" is not absolute: a path in the host begins with /\n");
}

TEST_F(LabelTest, TreeThatThePolicyLabelledIsVerified) {
  Policy("fileLabels/base", "/etc/* conf\n  /etc/net/* netConf # later\n");
  ASSERT_EQ(Load().status, 0);
  EXPECT_EQ(Out({"verify", "-R", "--policy", PolicyDir(), "/"}), "");
}

TEST_F(LabelTest, DifferencesAreListedWithTheLineThatDecides) {
  Policy("fileLabels/base", "/etc/* conf\n  /etc/net/* netConf # later\n");
  Out({"set", "/etc/motd", "conf"});
  Out({"set", "/etc/net/conf", "conf"});
  const Result result = Use({"verify", "-R", "--policy", PolicyDir(), "/etc"});
  EXPECT_EQ(result.status, 1);
  const std::string file = PolicyDir() + "/fileLabels/base";
  EXPECT_EQ(result.out, "/etc: default, not conf (" + file +
                            ":1:1)\n"
                            "/etc/hosts: default, not conf (" +
                            file +
                            ":1:1)\n"
                            "/etc/net: default, not netConf (" +
                            file +
                            ":2:3)\n"
                            "/etc/net/conf: conf, not netConf (" +
                            file +
                            ":2:3)\n"
                            "/etc/pipe: default, not conf (" +
                            file + ":1:1)\n");
  EXPECT_EQ(Use({"verify", "--policy", PolicyDir(), "/etc/motd"}).status, 0);
}

TEST_F(LabelTest, PolicyWithoutFileLabelsIsSaid) {
  const Result result = Use({"verify", "/etc"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(result.err,
            "Error: Unable to open policy directory /etc/olvane/secpolicy/fileLabels\n");
}

TEST_F(LabelTest, JsonIsAsDescribed) {
  Policy("fileLabels/base", "/etc/* conf\n");
  const std::string files = Out({"get", "-R", "--json", "/etc"});
  EXPECT_EQ(JsonProblem(files, "label-get"), "") << files;
  EXPECT_THAT(files, HasSubstr("\"path\": \"/etc/net/conf\""));
  const Result result = Use({"verify", "-R", "--json", "--policy", PolicyDir(), "/etc"});
  EXPECT_EQ(result.status, 1);
  EXPECT_EQ(JsonProblem(result.out, "label-verify"), "") << result.out;
  EXPECT_THAT(result.out, HasSubstr("\"expected\": \"conf\""));
}

}  // namespace
}  // namespace SecPolicyTool
