#include "tests/host/module/persistence_fixture.h"

namespace StandIn {
namespace {

using testing::HasSubstr;

class BadStateTest : public PersistenceTest {
 protected:
  // What is wrong with a text; the module must hold what it held before.
  std::string Refused(const std::string& text) {
    const std::string before = module_.Save();
    const std::string message = HostErrorOf([&] { module_.Restore(text, "kernel.json"); });
    EXPECT_EQ(module_.Save(), before);
    return message;
  }
  // With the text put into a domain's object, an array of domains, or the whole.
  std::string RefusedMember(const std::string& member) {
    return Refused("{\"format\": 1, " + member + "}");
  }
  std::string RefusedDomain(const std::string& domain) {
    return RefusedMember("\"domains\": [{\"id\": 1, \"name\": \"a\", \"origin\": \"policy\"}, " +
                         domain + "]");
  }
  std::string RefusedInDomain(const std::string& members) {
    return RefusedDomain(R"({"id": 2, "name": "b", "origin": "policy", )" + members + "}");
  }
};

struct BadState {
  std::string text;
  std::string message;
};

TEST_F(BadStateTest, DocumentsThatAreNoState) {
  Fill();
  const BadState rows[] = {
      {"[]", "kernel.json: /: must be an object"},
      {"{}", "kernel.json: /: lacks the member \"format\""},
      {R"({"format": 2, "new": 1})",
       "kernel.json: /format: format 2 is not known here, only format 1"},
      {R"({"format": 1, "domain": []})", "kernel.json: /domain: unknown member"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(Refused(row.text), row.message);
  }
  EXPECT_EQ(Refused(""), "kernel.json:1:1: syntax error: the file is empty");
  const std::string text = module_.Save();
  EXPECT_THAT(Refused(text.substr(0, text.size() / 2)), HasSubstr("syntax error"));
}

TEST_F(BadStateTest, Domains) {
  const std::string tooLong(128, 'n');
  const BadState rows[] = {
      {"1", "/domains/1: must be an object"},
      {R"({"id": 2, "name": "b", "origin": "policy", "rule": []})",
       "/domains/1/rule: unknown member"},
      {R"({"name": "b", "origin": "policy"})", "/domains/1: lacks the member \"id\""},
      {R"({"id": 2, "origin": "policy"})", "/domains/1: lacks the member \"name\""},
      {R"({"id": 2, "name": "b"})", "/domains/1: lacks the member \"origin\""},
      {R"({"id": 5, "name": "b", "origin": "policy"})",
       "/domains/1/id: must be a whole number from 0 to 4"},
      {R"({"id": 1, "name": "b", "origin": "policy"})", "/domains/1/id: the id 1 is taken"},
      {R"({"id": 2, "name": "a", "origin": "policy"})",
       "/domains/1/name: a domain named \"a\" exists already"},
      {R"({"id": 2, "name": "", "origin": "policy"})", "/domains/1/name: is empty"},
      {R"({"id": 2, "name": ")" + tooLong + R"(", "origin": "policy"})",
       "/domains/1/name: is longer than 127 bytes"},
      {R"({"id": 2, "name": "b%0g", "origin": "policy"})",
       "/domains/1/name: holds \"%\" without two hexadecimal digits behind it"},
      {R"({"id": 2, "name": "b", "origin": "user"})",
       "/domains/1/origin: must be \"policy\" or \"runTime\""},
      {R"({"id": 0, "name": "b", "origin": "policy"})",
       "/domains/1: slot 0 is the predefined domain \"rootDom\""},
      {R"({"id": 2, "name": "rootDom", "origin": "policy"})",
       "/domains/1/name: a domain named \"rootDom\" exists already"},
      {R"({"id": 0, "name": "rootDom", "origin": "policy"},
          {"id": 0, "name": "rootDom", "origin": "policy"})",
       "/domains/2/id: the id 0 is taken"},
      {R"({"id": 2, "name": "b", "origin": "runTime"})", "/domains/1: lacks the member \"maker\""},
      {R"({"id": 2, "name": "b", "origin": "policy", "maker": {}})",
       "/domains/1/maker: only a domain made at run time has a maker"},
      {R"({"id": 2, "name": "b", "origin": "runTime", "maker": {"pid": 0, "startTime": 0}})",
       "/domains/1/maker/pid: must be a whole number from 1 to 2147483647"},
      {R"({"id": 2, "name": "b", "origin": "runTime", "maker": {"pid": 1, "startTime": -1}})",
       "/domains/1/maker/startTime: must be a whole number from 0 to 18446744073709551615"},
      {R"({"id": 2, "name": "b", "origin": "runTime", "maker": {"pid": 1, "time": 1}})",
       "/domains/1/maker/time: unknown member"},
      {R"({"id": 2, "name": "b", "origin": "policy", "services": [""]})",
       "/domains/1/services/0: is empty"},
      {R"({"id": 2, "name": "b", "origin": "policy", "services": ["s", "s"]})",
       "/domains/1/services/1: is listed twice"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(RefusedDomain(row.text), "kernel.json: " + row.message) << row.text;
  }
}

TEST_F(BadStateTest, Rules) {
  const BadState rows[] = {
      {R"({})", ": must be an array"},
      {R"([{}])", "/0: must be an array"},
      {R"([[]])", "/0: must begin with the keyword of a kind of rules"},
      {R"([["-r", 1, "/a", "grant"]])", "/0/0: no kind of rules has the keyword \"-r\""},
      {R"([[1]])", "/0/0: must be a string"},
      {R"([["-s", 1, "open"]])", "/0: must have 4 elements"},
      {R"([["-s", 1, "open", "read", "grant"]])", "/0: must have 4 elements"},
      {R"([["-d", 1, "default", "a", "exec", "grant"]])", "/0: must have 7 elements"},
      {R"([["-s", -1, "open", "grant"]])", "/0/1: must be a whole number from 0 to 4294967295"},
      {R"([["-s", 4294967296, "open", "grant"]])",
       "/0/1: must be a whole number from 0 to 4294967295"},
      {R"([["-s", 1, 2, "grant"]])", "/0/2: must be a string"},
      {R"([["-s", 1, "", "grant"]])", "/0/2: is empty"},
      {R"([["-s", 1, "a%00", "grant"]])", "/0/2: holds a NUL byte"},
      {R"([["-s", 1, "open", "deny"]])", "/0/3: must be \"grant\" or \"revoke\""},
      {R"([["-s", 1, "open", true]])", "/0/3: must be a string"},
      {R"([["-d", 1, "default", "c", "exec", 3, "grant"]])", "/0/5: no domain has the id 3"},
      {R"([["-d", 1, "default", "c", "exec", 5, "grant"]])",
       "/0/5: must be a whole number from 0 to 4"},
      {R"([["-s", 1, "open", "grant"], ["-s", 2, "open", "revoke"]])",
       "/1: the words of this rule are decided on already"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(RefusedInDomain("\"rules\": " + row.text),
              "kernel.json: /domains/1/rules" + row.message)
        << row.text;
  }
}

TEST_F(BadStateTest, FileRules) {
  const std::string tooLong = "/" + std::string(1983, 'p');
  const BadState rows[] = {
      {R"([[0, "/a"]])", "/0: must have 3 elements"},
      {R"([[-1, "/a", "r"]])", "/0/0: must be a whole number from 0 to 2147483647"},
      {R"([[0, "a", "r"]])", "/0/1: is not absolute"},
      {R"([[0, "/a%00", "r"]])", "/0/1: holds a NUL byte"},
      {R"([[0, ")" + tooLong + R"(", "r"]])", "/0/1: is longer than 1983 bytes"},
      {R"([[0, "/a", 1]])", "/0/2: must be a string"},
      {R"([[0, "/a", "rq"]])", "/0/2: must be letters of \"rwx\", in this order"},
      {R"([[0, "/a", "r"], [0, "/a", "w"]])", "/1: this path has a rule already"},
      {R"([[0, "/a", ""], [1, "/a", ""], [0, "/b", ""], [0, "/c", ""]])",
       "/3: the domain has more than 3 file rules"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(RefusedInDomain("\"fileRules\": " + row.text),
              "kernel.json: /domains/1/fileRules" + row.message)
        << row.text;
  }
}

TEST_F(BadStateTest, RolesWorldsAndFileLabels) {
  const BadState rows[] = {
      {R"("roles": [])", "/roles: must be an object"},
      {R"("roles": {"global": 0})", "/roles/global: unknown member"},
      {R"("roles": {"globalVM": 3})", "/roles/globalVM: no domain has the id 3"},
      {R"("worlds": {})", "/worlds: must be an array"},
      {R"("worlds": [[7]])", "/worlds/0: must have 2 elements"},
      {R"("worlds": [[0, 0]])", "/worlds/0/0: must be a whole number from 1 to 2147483647"},
      {R"("worlds": [[7, 3]])", "/worlds/0/1: no domain has the id 3"},
      {R"("worlds": [[7, 0], [7, 0]])", "/worlds/1/0: the world 7 is placed already"},
      {R"("fileLabels": [["/a"]])", "/fileLabels/0: must have 2 elements"},
      {R"("fileLabels": [["", 1]])", "/fileLabels/0/0: is empty"},
      {R"("fileLabels": [["/a", 0]])",
       "/fileLabels/0/1: must be a whole number from 1 to 4294967295"},
      {R"("fileLabels": [["/a", 3]])", "/fileLabels/0/1: no object label ever had the id 3"},
      {R"("fileLabels": [["/a", 1], ["/a", 2]])", "/fileLabels/1/0: is listed twice"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(RefusedMember(row.text), "kernel.json: " + row.message) << row.text;
  }
}

TEST_F(BadStateTest, Labels) {
  const BadState rows[] = {
      {R"([])", ": must be an object"},
      {R"({})", ": lacks the member \"next\""},
      {R"({"next": 0})", "/next: must be a whole number from 1 to 4294967295"},
      {R"({"next": 1, "names": []})", "/names: unknown member"},
      {R"({"next": 3, "defined": [[1]]})", "/defined/0: must have 2 elements"},
      {R"({"next": 3, "defined": [[0, "a"]]})",
       "/defined/0/0: must be a whole number from 1 to 4294967295"},
      {R"({"next": 3, "defined": [[3, "a"]]})", "/defined/0/0: is not below the next id, 3"},
      {R"({"next": 3, "defined": [[1, ""]]})", "/defined/0/1: is empty"},
      {R"({"next": 3, "defined": [[1, "a"], [1, "b"]]})", "/defined/1/0: the id 1 is taken"},
      {R"({"next": 3, "defined": [[1, "a"], [2, "a"]]})", "/defined/1/1: is listed twice"},
      {R"({"next": 9, "defined": [[1, "a"], [2, "b"], [3, "c"], [4, "d"], [5, "e"], [6, "f"],
                                  [7, "g"]]})",
       "/defined: has more than 6 labels"},
      {R"({"next": 9, "defined": [[1, "a"], [2, "b"], [3, "c"], [4, "d"], [5, "e"]]})",
       ": no id is free for the object label \"tardisk\": all 6 are taken"},
      {R"({"next": 1, "removed": [""]})", "/removed/0: is empty"},
      {R"({"next": 1, "removed": ["a", "a"]})", "/removed/1: is listed twice"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(RefusedMember("\"labels\": {\"object\": " + row.text + "}"),
              "kernel.json: /labels/object" + row.message)
        << row.text;
  }
  EXPECT_EQ(RefusedMember(R"("labels": {"objects": {}})"),
            "kernel.json: /labels/objects: unknown member");
}

TEST_F(BadStateTest, EveryBeginningOfAStateIsRefused) {
  Fill();
  const std::string text = module_.Save();
  for (std::size_t size = 0; size + 1 < text.size(); ++size) {  // the last byte is a line end
    EXPECT_THAT(Refused(text.substr(0, size)), HasSubstr(": syntax error")) << size;
  }
}

TEST_F(BadStateTest, MembersAreJudgedInWhicheverOrderTheyStand) {
  const BadState rows[] = {
      {R"({"fileLabels": [["/a", 3]], "format": 1})",
       "/fileLabels/0/1: no object label ever had the id 3"},
      {R"({"domains": [{"rules": [["-s", 1, "open", "deny"]], "origin": "policy", "name": "a",
                        "id": 1}], "format": 1})",
       "/domains/0/rules/0/3: must be \"grant\" or \"revoke\""},
      {R"({"domains": [{"rules": [["-s", 1, "open", "deny"]], "fileLabels": 1}], "format": 2})",
       "/format: format 2 is not known here, only format 1"},
  };
  for (const BadState& row : rows) {
    EXPECT_EQ(Refused(row.text), "kernel.json: " + row.message);
  }
}

TEST_F(BadStateTest, ATextThatGrowsWhileItIsRead) {
  const std::string before = R"({"format": 1, "domains": []})";
  const std::string after =
      R"({"format": 1, "domains": [{"rules": [["-s", 1, "open", "grant"]]}]})";
  int beginnings = 0;
  const TextReader text = [&](std::size_t offset, std::span<char> into) {
    beginnings += offset == 0 ? 1 : 0;
    return ReaderOf(beginnings == 1 ? before : after)(offset, into);
  };
  EXPECT_EQ(HostErrorOf([&] { module_.Restore(text, "kernel.json"); }),
            "kernel.json: /domains/0/rules/0: was added while the file was read");
}

}  // namespace
}  // namespace StandIn
