// The verbs over a domain's file rules.
#include "tests/tools/group_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;

class FilesTest : public GroupTest {
 protected:
  FilesTest() : GroupTest("files") {}

  void SetUp() override { MakeHost(); }
};

TEST_F(FilesTest, AddedRulesAreListedAndCounted) {
  EXPECT_EQ(Out({"add", "rootDom", "/etc", "xr"}), "");
  EXPECT_EQ(Out({"add", "0", "/tmp", "-"}), "");
  EXPECT_EQ(Out({"list", "rootDom"}), "rx /etc\n- /tmp\n");
  EXPECT_EQ(Out({"count", "rootDom"}), "2\n");
}

TEST_F(FilesTest, UpdateChangesThePermission) {
  Out({"add", "rootDom", "/etc", "r"});
  Out({"update", "rootDom", "/etc", "rw"});
  EXPECT_EQ(Out({"list", "rootDom"}), "rw /etc\n");
}

TEST_F(FilesTest, RemovedRuleIsGone) {
  Out({"add", "rootDom", "/etc", "r"});
  Out({"remove", "rootDom", "/etc"});
  EXPECT_EQ(Out({"list", "rootDom"}), "");
}

TEST_F(FilesTest, RenameIsForAllDomains) {
  Done({"domain", "create", "--host", Host(), "guestDom"});
  Out({"add", "rootDom", "/a", "r"});
  Out({"add", "guestDom", "/a", "w"});
  Out({"rename", "/a", "/b"});
  EXPECT_EQ(Out({"list", "rootDom"}) + Out({"list", "guestDom"}), "r /b\nw /b\n");
}

TEST_F(FilesTest, RuleMayBeForOneProcess) {
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "worlds": [{"id": 4711, "domain": "rootDom"}]})");
  Out({"add", "rootDom", "/a", "r", "--world", "4711"});
  Out({"add", "rootDom", "/a", "w"});
  EXPECT_EQ(Out({"count", "rootDom"}), "2\n");
  Out({"remove", "rootDom", "/a", "--world", "4711"});
  EXPECT_EQ(Out({"list", "rootDom"}), "w /a\n");
}

TEST_F(FilesTest, RefusalsAreTheKernels) {
  const std::string enoent = "No such file or directory";
  ExpectRefusal({"remove", "rootDom", "/a"},
                "Failed to remove file policy from domain :0 : world id :0:" + enoent);
  ExpectRefusal({"remove", "rootDom", ""}, "file path is empty");
  ExpectRefusal({"update", "rootDom", "", "r"}, "File path is empty");
  ExpectRefusal({"update", "rootDom", "/a", "r"}, "Failed to update file policy: /a: " + enoent);
  ExpectRefusal({"rename", "", ""}, "Old path is empty");
  ExpectRefusal({"rename", "/a", "/b"}, "Failed to replace file policy: /a to: /b: " + enoent);
  ExpectRefusal({"add", "rootDom", "a", "r"},
                "Failed to add file policies to domain :0: world ID :0:Invalid argument");
  ExpectRefusal({"add", "rootDom", "/a", "r", "--world", "999999999"},
                "Failed to add file policies to domain :0: world ID :999999999:No such process");
  ExpectRefusal({"list", "7"}, "Failed to get number of file policies for domain :: 7:" + enoent);
  ExpectRefusal({"list", "rooDom"}, R"(unknown domain "rooDom" (nearest: rootDom))");
}

TEST_F(FilesTest, LongestPathIsTaken) {
  const std::string longest = "/" + std::string(1982, 'a');
  Out({"add", "rootDom", longest, "r"});
  EXPECT_EQ(Out({"list", "rootDom"}), "r " + longest + "\n");
  ExpectRefusal({"add", "rootDom", longest + "a", "r"}, "the path is longer than 1983 bytes");
}

TEST_F(FilesTest, PermissionThatIsNoneIsWrongUsage) {
  for (const char* wrong : {"q", "rr", "rwxr", "R", ""}) {
    const Result result = Use({"add", "rootDom", "/a", wrong});
    EXPECT_EQ(result.status, 2) << wrong;
    EXPECT_THAT(result.err, HasSubstr("is no permission: it takes letters of \"rwx\", each once"))
        << wrong;
  }
  EXPECT_EQ(Out({"count", "rootDom"}), "0\n");
}

TEST_F(FilesTest, JsonIsAsDescribed) {
  Out({"add", "rootDom", "/a", "xw"});
  Out({"add", "rootDom", "/b", "-"});
  for (const char* verb : {"list", "count"}) {
    const std::string text = Out({verb, "rootDom", "--json"});
    EXPECT_EQ(JsonProblem(text, std::string("files-") + verb), "") << text;
  }
  EXPECT_THAT(Out({"list", "rootDom", "--json"}), HasSubstr("\"permission\": \"wx\""));
}

}  // namespace
}  // namespace SecPolicyTool
