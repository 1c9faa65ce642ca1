#include "tests/host/module/persistence_fixture.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST_F(PersistenceTest, AnEmptyModuleComesBackTheSame) {
  ExpectTheSameText();
  EXPECT_EQ(copy_.FindDomain("rootDom"), 0U);
}

TEST_F(PersistenceTest, EveryKindOfStateComesBackTheSame) {
  Fill();
  ExpectTheSameText();
}

TEST_F(PersistenceTest, TheTextIsReadableAndInAFixedOrder) {
  Fill();
  EXPECT_EQ(module_.Save(), R"({
  "format": 1,
  "domains": [
    {
      "id": 0,
      "name": "rootDom",
      "origin": "policy",
      "services": ["log"],
      "rules": [
        ["-d", 4294967295, "default", "app%25Dom %FF%80", "exec", 1, "grant"]
      ]
    },
    {
      "id": 1,
      "name": "app%25Dom %FF%80",
      "origin": "policy",
      "services": ["con\"sole", "%90"],
      "rules": [
        ["-a", 0, "l%C3%A4", "read", "grant"],
        ["-c", 1, "sys_boot", "grant"],
        ["-f", 1, "default", "tardisk", "dir", "grant"],
        ["-p", 1, "net_bind", "\u0001%FF 80%25", "grant"],
        ["-s", 4, "read", "grant"],
        ["-s", 5, "open", "revoke"],
        ["-u", 1, "default", "stream", "grant"]
      ],
      "fileRules": [
        [0, "/z", "rwx"],
        [70, "/a%81", ""],
        [0, "/a", "w"]
      ]
    },
    {
      "id": 3,
      "name": "vm",
      "origin": "runTime",
      "maker": {"pid": 100, "startTime": 5000}
    }
  ],
  "roles": {"globalVM": 3, "ioFilter": 0},
  "worlds": [
    [9, 3],
    [70, 1]
  ],
  "labels": {
    "domain": {
      "next": 3,
      "defined": [
        [1, "any"],
        [2, "dom"]
      ],
      "removed": []
    },
    "object": {
      "next": 6,
      "defined": [
        [1, "default"],
        [2, "tardisk"],
        [3, "l%C3%A4"]
      ],
      "removed": ["old", "stale"]
    }
  },
  "fileLabels": [
    ["/a", 3],
    ["/b%FE", 5]
  ]
}
)");
}

TEST_F(PersistenceTest, ARestoredModuleAnswersAsTheSavedOne) {
  Fill();
  SimulatedModule& copy = Restored();
  EXPECT_EQ(copy.FindDomain("app%Dom \xff\x80"), 1U);
  EXPECT_EQ(copy.WorldDomain(9), 3U);
  EXPECT_EQ(copy.GetDomainInfo(1)->refCount, 2U) << "a world and a transition";
  EXPECT_EQ(copy.Rules(RuleType::kTransition, 0)[0].targetDomain, 1U);
  EXPECT_EQ(copy.Rules(RuleType::kSyscall, 1)[1].decision, Decision::kRevoke);
  EXPECT_EQ(copy.FileRules(1)[1].path, "/a\x81");
  EXPECT_EQ(copy.LabelName(3, kObject), "l\xc3\xa4");
  EXPECT_EQ(copy.FileLabel("/b\xfe"), 5U);
  EXPECT_EQ(copy.CreateDomain("next", DomainOrigin::kPolicy), 2U) << "the lowest free slot";
}

TEST_F(PersistenceTest, ALeakedDomainIsKnownByItsMakerAfterARestart) {
  MakeAtRunTime("vm");
  SimulatedModule& copy = Restored();
  EXPECT_THAT(copy.LeakedDomains(), IsEmpty());
  processes_.ended = {100};
  EXPECT_THAT(copy.LeakedDomains(), ElementsAre(1U));
}

TEST_F(PersistenceTest, IdsOfRemovedLabelsAreNotGivenAgain) {
  module_.AddLabels({"a"}, kObject);
  module_.RemoveLabels({"a"}, kObject);
  SimulatedModule& copy = Restored();
  copy.AddLabels({"a"}, kObject);
  EXPECT_EQ(copy.LookupLabel("a", kObject), 4U);
}

TEST_F(PersistenceTest, IdsOfLabelsCanBeUsedUp) {
  module_.Restore(R"({"format": 1, "labels": {"object": {"next": 4294967294,
    "defined": [[1, "default"], [2, "tardisk"]]}}})",
                  "kernel.json");
  EXPECT_EQ(RefusalOf([&] {
              module_.AddLabels({"last", "more"}, kObject);
            }),
            "ENOSPC: no id is free for the object label \"more\": all 4294967295 are taken");
  EXPECT_EQ(module_.LookupLabel("last", kObject), 4294967294U);
  ExpectTheSameText();
}

TEST_F(PersistenceTest, ALabelAddedAnewStaysValid) {
  module_.AddLabels({"stale", "staler"}, kObject);
  module_.RemoveLabels({"stale"}, kObject);
  module_.AddLabels({"stale"}, kObject);
  EXPECT_THAT(Restored().InvalidLabels(kObject), ElementsAre("staler"));
}

TEST_F(PersistenceTest, APlacementStillWinsOverTheDescription) {
  const DomainId guest = Make("guestDom");
  module_.PlaceWorld(4711, 0);
  SimulatedModule& copy = Restored();
  EXPECT_EQ(copy.WorldDomain(4711), 0U);
  EXPECT_EQ(copy.GetDomainInfo(guest)->worldRefCount, 1U);
}

TEST_F(PersistenceTest, RestoringReplacesWhatTheModuleHeld) {
  const std::string empty = module_.Save();
  Fill();
  module_.Restore(empty, "kernel.json");
  EXPECT_EQ(module_.Save(), empty);
  EXPECT_EQ(module_.FindDomain("vm"), std::nullopt);
}

TEST_F(PersistenceTest, WordsThatLeftTheirListsAreKept) {
  const std::string text = R"({"format": 1, "domains": [{"id": 0, "name": "rootDom",
    "origin": "policy", "rules": [["-s", 1, "vanished", "grant"]]}]})";
  module_.Restore(text, "kernel.json");
  EXPECT_THAT(WordsOf(RuleType::kSyscall, 0), ElementsAre("vanished"));
}

TEST_F(PersistenceTest, APredefinedLabelThatIsMissingIsDefined) {
  module_.Restore(R"({"format": 1, "labels": {"object": {"next": 9,
    "defined": [[4, "logs"], [7, "default"]]}}})",
                  "kernel.json");
  EXPECT_EQ(module_.LookupLabel("default", kObject), 7U);
  EXPECT_EQ(module_.LookupLabel("logs", kObject), 4U);
  EXPECT_EQ(module_.LookupLabel("tardisk", kObject), 9U);
}

TEST_F(PersistenceTest, TheFormatAloneIsAnEmptyModule) {
  const std::string empty = module_.Save();
  Fill();
  module_.Restore(R"({"format": 1})", "kernel.json");
  EXPECT_EQ(module_.Save(), empty);
}

TEST_F(PersistenceTest, TheOrderOfDomainsInTheFileDoesNotMatter) {
  Fill();
  const std::string text = module_.Save();
  module_.Restore(R"({"format": 1, "domains": [
    {"id": 3, "name": "c", "origin": "policy",
     "rules": [["-d", 1, "default", "a", "exec", 1, "grant"]]},
    {"id": 1, "name": "a", "origin": "policy"}]})",
                  "kernel.json");
  EXPECT_EQ(module_.GetDomainInfo(1)->refCount, 1U);
  EXPECT_EQ(Make("b"), 2U);
}

TEST_F(PersistenceTest, TheOrderOfMembersInTheFileDoesNotMatter) {
  module_.Restore(R"({"fileLabels": [["/a", 3]],
    "labels": {"object": {"defined": [[3, "logs"]], "next": 4}},
    "domains": [{"fileRules": [[0, "/a", "r"]], "rules": [["-s", 1, "open", "grant"]],
                 "name": "a", "origin": "policy", "id": 1}],
    "format": 1})",
                  "kernel.json");
  EXPECT_EQ(module_.FileLabel("/a"), 3U);
  EXPECT_THAT(WordsOf(RuleType::kSyscall, 1), ElementsAre("open"));
  EXPECT_EQ(module_.CountFileRules(1), 1U);
}

TEST_F(PersistenceTest, AStateLongerThanABlockComesBackTheSame) {
  const DomainId app = Make("app");
  for (std::uint32_t i = 0; i < 10'000; ++i) {
    Set(RuleType::kCapabilityParam, app, {"net_bind", "parameter" + std::to_string(i)},
        Decision::kGrant, i);
  }
  ASSERT_GT(module_.Save().size(), 400'000U);
  ExpectTheSameText();
}

TEST_F(PersistenceTest, AModuleThatRefusedAFileGoesOnWorking) {
  Fill();
  EXPECT_NE(HostErrorOf([&] { module_.Restore("{", "kernel.json"); }), "(nothing was thrown)");
  EXPECT_EQ(Make("next"), 2U);
  ExpectTheSameText();
}

}  // namespace
}  // namespace StandIn
