#include "tests/host/module/module_fixture.h"

#include "host/module/word_lists.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

ModuleDescription Read(const std::string& text) { return ReadDescription(text, "host.json"); }

const LabelSpace& Objects(const ModuleDescription& description) {
  return description.labels[static_cast<std::size_t>(LabelType::kObject)];
}

void ExpectDefaults(const ModuleDescription& description) {
  EXPECT_EQ(description.limits.domains, 1024U);
  EXPECT_EQ(description.limits.labels, 65536U);
  EXPECT_EQ(description.limits.fileRulesPerDomain, 1048576U);
  EXPECT_EQ(description.enforcementLevel, "enforcing");
  for (const WordListInfo& info : kWordLists) {
    const auto words = description.words.find(info.list);
    EXPECT_EQ(words != description.words.end(), info.key != nullptr) << info.title;
    if (words != description.words.end()) {
      EXPECT_EQ(words->second, DefaultWords(info.list)) << info.title;
    }
  }
  EXPECT_THAT(Objects(description).predefined, ElementsAre("default", "tardisk"));
  EXPECT_THAT(Objects(description).invalid, IsEmpty());
  EXPECT_THAT(description.labels[0].predefined, IsEmpty());
  EXPECT_THAT(description.privilegedVms, IsEmpty());
  EXPECT_THAT(description.worlds, IsEmpty());
  EXPECT_EQ(description.tardisk.launchDomain, "rootDom");
  EXPECT_EQ(description.tardisk.execEvent, "exec");
  EXPECT_EQ(description.tardisk.defaultLabel, "tardisk");
  EXPECT_EQ(description.tardisk.defaultDomain, "appDom");
}

TEST(ReadDescription, WhatIsLeftOutIsTheDefault) {
  ExpectDefaults(Read(R"({"format": 1})"));
  ExpectDefaults(Read(
      R"({"format": 1, "limits": {}, "words": {}, "labels": {"object": {}}, "tardisks": {}})"));
}

TEST(ReadDescription, TheDefaultTextSaysTheDefaults) {
  ExpectDefaults(Read(DefaultDescriptionText()));
}

TEST(DefaultDescriptionText, NamesEverythingThatCanBeSaid) {
  EXPECT_EQ(DefaultDescriptionText(), R"({
  "format": 1,
  "limits": {
    "domains": 1024,
    "labels": 65536,
    "fileRulesPerDomain": 1048576
  },
  "enforcementLevel": "enforcing",
  "words": {
    "capabilities": "default",
    "paramCapabilities": "default",
    "objectAccesses": "default",
    "transitionEvents": "default",
    "fileTypes": "default",
    "socketTypes": "default",
    "systemCalls": "default"
  },
  "labels": {
    "domain": {
      "predefined": [],
      "invalid": []
    },
    "object": {
      "predefined": ["default", "tardisk"],
      "invalid": []
    }
  },
  "privilegedVms": [],
  "worlds": [],
  "tardisks": {
    "launchDomain": "rootDom",
    "execEvent": "exec",
    "defaultLabel": "tardisk",
    "defaultDomain": "appDom"
  }
}
)");
}

TEST(ReadDescription, TakesWhatTheFileSays) {
  const ModuleDescription description = Read(R"({
    "format": 1,
    "limits": {"domains": 65536, "labels": 3, "fileRulesPerDomain": 1},
    "enforcementLevel": "learning",
    "words": {"systemCalls": ["open", "a%FF"], "fileTypes": [], "socketTypes": "default"},
    "labels": {"object": {"predefined": ["default", "gr%C3%B6n"], "invalid": ["stale"]},
               "domain": {"predefined": ["any"], "invalid": ["a b"]}},
    "privilegedVms": ["one", "two"],
    "worlds": [{"id": 2147483647, "domain": "x"}, {"id": 1, "domain": "x"}],
    "tardisks": {"launchDomain": "l", "execEvent": "e", "defaultLabel": "d l",
                 "defaultDomain": "d"}})");
  EXPECT_EQ(description.limits.domains, 65536U);
  EXPECT_EQ(description.limits.labels, 3U);
  EXPECT_EQ(description.limits.fileRulesPerDomain, 1U);
  EXPECT_EQ(description.enforcementLevel, "learning");
  EXPECT_THAT(description.words.at(WordList::kSyscalls), ElementsAre("open", "a\xff"));
  EXPECT_THAT(description.words.at(WordList::kFileTypes), IsEmpty());
  EXPECT_EQ(description.words.at(WordList::kSocketTypes), DefaultWords(WordList::kSocketTypes));
  EXPECT_THAT(Objects(description).predefined, ElementsAre("default", "gr\xc3\xb6n"));
  EXPECT_THAT(Objects(description).invalid, ElementsAre("stale"));
  EXPECT_THAT(description.labels[0].predefined, ElementsAre("any"));
  EXPECT_THAT(description.labels[0].invalid, ElementsAre("a b"));
  EXPECT_THAT(description.privilegedVms, ElementsAre("one", "two"));
  EXPECT_THAT(description.worlds, ElementsAre(Pair(1, "x"), Pair(2147483647, "x")));
  EXPECT_EQ(description.tardisk.launchDomain, "l");
  EXPECT_EQ(description.tardisk.execEvent, "e");
  EXPECT_EQ(description.tardisk.defaultLabel, "d l");
  EXPECT_EQ(description.tardisk.defaultDomain, "d");
}

// Each row is the text of one member beside "format", and what is wrong with it.
TEST(ReadDescription, RefusesABadMember) {
  const std::string tooLong(128, 'n');
  struct Row {
    std::string member;
    std::string message;
  };
  const Row rows[] = {
      {R"("limit": {})", "/limit: unknown member"},
      {R"("limits": [])", "/limits: must be an object"},
      {R"("limits": {"domain": 1})", "/limits/domain: unknown member"},
      {R"("limits": {"domains": 0})", "/limits/domains: must be a whole number from 1 to 65536"},
      {R"("limits": {"domains": 65537})",
       "/limits/domains: must be a whole number from 1 to 65536"},
      {R"("limits": {"domains": "8"})", "/limits/domains: must be a whole number from 1 to 65536"},
      {R"("limits": {"labels": 0})", "/limits/labels: must be a whole number from 1 to 16777216"},
      {R"("limits": {"labels": 4294967296})",
       "/limits/labels: must be a whole number from 1 to 16777216"},
      {R"("limits": {"fileRulesPerDomain": -1})",
       "/limits/fileRulesPerDomain: must be a whole number from 1 to 16777216"},
      {R"("limits": {"labels": 1})", "/: predefines 2 labels of one type, but the limit is 1"},
      {R"("enforcementLevel": 1)", "/enforcementLevel: must be a string"},
      {R"("enforcementLevel": "")", "/enforcementLevel: is empty"},
      {R"("enforcementLevel": "a b")", "/enforcementLevel: must be one word"},
      {R"("words": "default")", "/words: must be an object"},
      {R"("words": {"objects": []})", "/words/objects: unknown member"},
      {R"("words": {"systemCalls": "defaults"})",
       "/words/systemCalls: must be an array of words or \"default\""},
      {R"("words": {"systemCalls": {}})", "/words/systemCalls: must be an array"},
      {R"("words": {"systemCalls": ["open", 1]})", "/words/systemCalls/1: must be a string"},
      {R"("words": {"systemCalls": [""]})", "/words/systemCalls/0: is empty"},
      {R"("words": {"systemCalls": ["a b"]})", "/words/systemCalls/0: must be one word"},
      {R"("words": {"systemCalls": ["a\tb"]})", "/words/systemCalls/0: must be one word"},
      {R"("words": {"systemCalls": ["a\u0000"]})", "/words/systemCalls/0: must be one word"},
      {R"("words": {"systemCalls": ["a%2"]})",
       "/words/systemCalls/0: holds \"%\" without two hexadecimal digits behind it"},
      {R"("words": {"systemCalls": ["a", "b", "a"]})", "/words/systemCalls/2: is listed twice"},
      {R"("labels": {"objects": {}})", "/labels/objects: unknown member"},
      {R"("labels": {"object": {"valid": []}})", "/labels/object/valid: unknown member"},
      {R"("labels": {"object": {"predefined": ["tardisk"]}})",
       "/labels/object/predefined: must list \"default\", which files carry from the start"},
      {R"("labels": {"object": {"predefined": ["default", ""]}})",
       "/labels/object/predefined/1: is empty"},
      {R"("labels": {"domain": {"predefined": [")" + tooLong + R"("]}})",
       "/labels/domain/predefined/0: is longer than 127 bytes"},
      {R"("labels": {"domain": {"predefined": ["a\u0000b"]}})",
       "/labels/domain/predefined/0: holds a NUL byte"},
      {R"("labels": {"domain": {"predefined": ["a", "a"]}})",
       "/labels/domain/predefined/1: is listed twice"},
      {R"("labels": {"domain": {"predefined": "a"}})",
       "/labels/domain/predefined: must be an array"},
      {R"("labels": {"object": {"invalid": ["a", "tardisk"]}})",
       "/labels/object/invalid/1: is predefined, so that it could never become valid again"},
      {R"("labels": {"object": {"invalid": ["a", "a"]}})",
       "/labels/object/invalid/1: is listed twice"},
      {R"("privilegedVms": {})", "/privilegedVms: must be an array"},
      {R"("privilegedVms": [""])", "/privilegedVms/0: is empty"},
      {R"("privilegedVms": ["a", "a"])", "/privilegedVms/1: is listed twice"},
      {R"("worlds": {})", "/worlds: must be an array"},
      {R"("worlds": [4711])", "/worlds/0: must be an object"},
      {R"("worlds": [{"id": 4711}])", "/worlds/0: lacks the member \"domain\""},
      {R"("worlds": [{"domain": "a"}])", "/worlds/0: lacks the member \"id\""},
      {R"("worlds": [{"id": 1, "domain": "a", "name": ""}])", "/worlds/0/name: unknown member"},
      {R"("worlds": [{"id": 0, "domain": "a"}])",
       "/worlds/0/id: must be a whole number from 1 to 2147483647"},
      {R"("worlds": [{"id": 2147483648, "domain": "a"}])",
       "/worlds/0/id: must be a whole number from 1 to 2147483647"},
      {R"("worlds": [{"id": 1, "domain": ""}])", "/worlds/0/domain: is empty"},
      {R"("worlds": [{"id": 1, "domain": "a"}, {"id": 1, "domain": "b"}])",
       "/worlds/1/id: is listed twice"},
      {R"("tardisks": {"execEvents": "exec"})", "/tardisks/execEvents: unknown member"},
      {R"("tardisks": {"launchDomain": ""})", "/tardisks/launchDomain: is empty"},
      {R"("tardisks": {"execEvent": "a b"})", "/tardisks/execEvent: must be one word"},
      {R"("tardisks": {"defaultLabel": 1})", "/tardisks/defaultLabel: must be a string"},
      {R"("tardisks": {"defaultDomain": ")" + tooLong + R"("})",
       "/tardisks/defaultDomain: is longer than 127 bytes"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(HostErrorOf([&] { Read("{\"format\": 1, " + row.member + "}"); }),
              "host.json: " + row.message)
        << row.member;
  }
}

TEST(ReadDescription, RefusesATextThatIsNoHostFile) {
  struct Row {
    const char* text;
    const char* message;
  };
  const Row rows[] = {
      {"[]", "host.json: /: must be an object"},
      {"{}", "host.json: /: lacks the member \"format\""},
      {R"({"format": "1"})",
       "host.json: /format: must be a whole number from 0 to 18446744073709551615"},
      {R"({"format": 2, "limit": 1})",
       "host.json: /format: format 2 is not known here, only format 1"},
      {R"({"format": 1, "format": 1})",
       "host.json: gives the member \"format\" of one object twice"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(HostErrorOf([&] { Read(row.text); }), row.message);
  }
  EXPECT_THAT(HostErrorOf([&] { Read("{\n  \"format\" 1}"); }),
              testing::StartsWith("host.json:2:12: syntax error"));
}

}  // namespace
}  // namespace StandIn
