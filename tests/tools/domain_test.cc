// The verbs over a kernel's domains.
#include <unistd.h>

#include "tests/tools/group_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;

class DomainTest : public GroupTest {
 protected:
  DomainTest() : GroupTest("domain") {}

  void SetUp() override { MakeHost(); }
};

TEST_F(DomainTest, CreatedOneIsListed) {
  EXPECT_EQ(Out({"create", "guestDom"}), "1 guestDom\n");
  EXPECT_EQ(Out({"list"}), "0 rootDom\n1 guestDom\n");
}

TEST_F(DomainTest, IsFoundByItsNameAndByItsId) {
  Out({"create", "guestDom"});
  EXPECT_EQ(Out({"name", "1"}), "1 guestDom\n");
  EXPECT_EQ(Out({"name", "guestDom"}), "1 guestDom\n");
}

TEST_F(DomainTest, NameThatIsANumberGoesBeforeTheId) {
  Out({"create", "0"});
  EXPECT_EQ(Out({"name", "0"}), "1 0\n");
}

TEST_F(DomainTest, DestroyedOneIsGone) {
  Out({"create", "guestDom"});
  EXPECT_EQ(Out({"destroy", "guestDom"}), "");
  EXPECT_EQ(Out({"list"}), "0 rootDom\n");
}

TEST_F(DomainTest, RefusalsAreTheKernels) {
  ExpectRefusal({"destroy", "rootDom"}, "Failed to destroy domain:Device or resource busy");
  ExpectRefusal({"destroy", "7"}, "Failed to destroy domain:No such file or directory");
  ExpectRefusal({"create", "rootDom"}, "Failed to create domain:rootDom :File exists");
  ExpectRefusal({"create", ""}, "Must specify domain name");
  ExpectRefusal({"name", "7"}, "Unable to get domain name: No such file or directory");
  ExpectRefusal({"of", "999999999"}, "Unable to get domain ID: No such process");
}

TEST_F(DomainTest, UnknownNameIsSaidWithTheNearest) {
  Out({"create", "guestDom"});
  ExpectRefusal({"destroy", "gusetDom"}, R"(unknown domain "gusetDom" (nearest: guestDom))");
  ExpectRefusal({"destroy", "1x"}, R"(unknown domain "1x")");
}

// The process that made it has ended, and nothing runs in it.
TEST_F(DomainTest, LeftBehindOneIsLeaked) {
  EXPECT_EQ(Out({"leaked"}), "");
  Out({"create", "guestDom"});
  EXPECT_EQ(Out({"leaked"}), "1 guestDom\n");
}

TEST_F(DomainTest, MoreLeakedOnesThanFirstFitAreAllListed) {
  for (int i = 0; i < 66; ++i) Out({"create", "guest" + std::to_string(i)});
  const std::string leaked = Out({"leaked"});
  EXPECT_EQ(std::count(leaked.begin(), leaked.end(), '\n'), 66);
  EXPECT_THAT(leaked, HasSubstr("66 guest65\n"));
}

TEST_F(DomainTest, ProcessRunsInItsDomain) {
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "worlds": [{"id": 4711, "domain": "rootDom"}]})");
  EXPECT_EQ(Out({"of", "4711"}), "0 rootDom\n");
}

TEST_F(DomainTest, ControlCharactersDoNotReachTheTerminal) {
  EXPECT_EQ(Out({"create", "a\x1b[31mb"}), "1 a\\x1b[31mb\n");
}

TEST_F(DomainTest, JsonIsAsDescribed) {
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "worlds": [{"id": 4711, "domain": "rootDom"}]})");
  const std::map<std::string, Arguments> verbs{{"create", {"create", "guestDom"}},
                                               {"list", {"list"}},
                                               {"name", {"name", "0"}},
                                               {"leaked", {"leaked"}},
                                               {"of", {"of", "4711"}}};
  for (auto [verb, arguments] : verbs) {
    arguments.emplace_back("--json");
    const std::string text = Out(arguments);
    EXPECT_EQ(JsonProblem(text, "domain-" + verb), "") << text;
  }
  EXPECT_THAT(Out({"list", "--json"}), HasSubstr("\"name\": \"guestDom\""));
}

}  // namespace
}  // namespace SecPolicyTool
