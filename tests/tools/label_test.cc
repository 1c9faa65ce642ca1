// The verbs over the labels of files.
#include <sys/resource.h>

#include "tests/tools/group_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::ContainsRegex;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

class LabelTest : public GroupTest {
 protected:
  LabelTest() : GroupTest("label") {}

  void SetUp() override {
    StandIn::Archive base;
    base.Directory("etc").File("etc/hosts", "").File("etc/motd", "").Directory("etc/net");
    base.File("etc/net/conf", "").Symlink("etc/link", "motd").Fifo("etc/pipe").Symlink("up", "etc");
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

TEST_F(LabelTest, TreeBelowALinkIsVerifiedByItsOwnPath) {
  Policy("fileLabels/base", "/etc/net/* conf\n");
  ASSERT_EQ(Load().status, 0);
  Out({"set", "/etc/net/conf", "netConf"});
  for (const std::string path : {"/up/net", "/up/net/", "/up", "/up/", "/"}) {
    const Result result = Use({"verify", "-R", "--policy", PolicyDir(), path});
    EXPECT_EQ(result.status, 1) << path;
    EXPECT_THAT(result.out, HasSubstr("net/conf: netConf, not conf (")) << path;
  }
}

// More levels of directories than files may be open.
class DeepTreeTest : public CommandTest {
 protected:
  static constexpr rlim_t kOpenFiles = 64;
  static constexpr int kLevels = 100;

  void SetUp() override {
    StandIn::Archive base;
    std::string path = "deep";
    for (int level = 0; level < kLevels; ++level, path += "/d") base.Directory(path);
    MakeHost({{"base.tar", base}});
    Policy("objects/base", "conf\n");
    ASSERT_EQ(Load().status, 0);
  }

  Result WithFewFiles(const Arguments& arguments) const {
    return Command(arguments, [] {
      const rlimit limit{kOpenFiles, kOpenFiles};
      setrlimit(RLIMIT_NOFILE, &limit);
    });
  }
};

const char kTooManyOpenFiles[] =
    "labelling a tree keeps a directory open for each of its levels, and the limit of open files "
    "is 64; raise it (ulimit -n)";

TEST_F(DeepTreeTest, LimitOfOpenFilesIsNamedWhereItEndsTheLabelling) {
  const Result result = WithFewFiles({"label", "set", "--host", Host(), "-R", "/deep", "conf"});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.Errors(), ElementsAre(ContainsRegex("^Error: Unable to .* /deep/d/d/d/"),
                                           std::string("Error: ") + kTooManyOpenFiles));
}

TEST_F(DeepTreeTest, LimitOfOpenFilesIsNamedOnceByALoad) {
  Policy("fileLabels/base", "/deep/* conf\n/deep/d/* conf\n");
  const Result result = WithFewFiles({"load", "--host", Host(), PolicyDir()});
  EXPECT_EQ(result.status, 1);
  std::vector<std::string> errors = result.Errors();
  std::erase_if(errors, [](const std::string& line) { return !line.starts_with("Error: "); });
  ASSERT_GE(errors.size(), 3U);
  EXPECT_THAT(errors[0], ContainsRegex("/fileLabels/base:1 : Unable to .* /deep/d/d/d/"));
  EXPECT_EQ(errors[1], std::string("Error: ") + kTooManyOpenFiles);
  EXPECT_THAT(errors[2], ContainsRegex("/fileLabels/base:2 : Unable to .* /deep/d/d/d/"));
  EXPECT_EQ(std::count(errors.begin(), errors.end(), errors[1]), 1);
}

TEST_F(DeepTreeTest, LimitOfOpenFilesIsTheHelpOfACheck) {
  Policy("fileLabels/base", "/deep/* conf\n");
  const Result result = WithFewFiles({"check", "--host", Host(), PolicyDir()});
  EXPECT_EQ(result.status, 1);
  EXPECT_THAT(result.out, HasSubstr(std::string("help: ") + kTooManyOpenFiles + "\n"));
}

TEST_F(DeepTreeTest, LimitOfOpenFilesIsNotBlamedForAFile) {
  const Result result =
      WithFewFiles({"label", "set", "--host", Host(), "-R", "/tardisks/base.tar", "conf"});
  EXPECT_THAT(result.Errors(), ElementsAre("Error: Unable to open directory /tardisks/base.tar"));
}

}  // namespace
}  // namespace SecPolicyTool
