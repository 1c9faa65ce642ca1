// A line for every kernel operation.
#include "host/trace/trace_log.h"

#include <stdexcept>

#include "tests/host/trace/trace_fixture.h"

namespace StandIn {
namespace {

using testing::ElementsAre;

// An operation and its line.
struct TraceLine {
  const char* line;
  std::function<void(SecurityModule&)> call;
};

class TraceLogTest : public TraceTest {
 protected:
  // A domain "netDom" with the id 1, and "logDom" with the id 2.
  TraceLogTest() {
    Make("netDom");
    Make("logDom");
  }

  void ExpectLines(const std::vector<TraceLine>& rows) {
    for (const TraceLine& row : rows) EXPECT_EQ(TraceOf([&] { row.call(observed_); }), row.line);
  }
};

TEST_F(TraceLogTest, Domains) {
  ExpectLines({
      {"find-domain netDom", [](auto& m) { m.FindDomain("netDom"); }},
      {"find-domain noDom", [](auto& m) { m.FindDomain("noDom"); }},
      {"create-domain oneDom policy", [](auto& m) { m.CreateDomain("oneDom", {}); }},
      {"create-domain twoDom run-time",
       [](auto& m) { m.CreateDomain("twoDom", DomainOrigin::kRunTime); }},
      {"domain-name 1", [](auto& m) { m.DomainName(1); }},
      {"domain-info 1", [](auto& m) { m.GetDomainInfo(1); }},
      {"domain-info 77", [](auto& m) { m.GetDomainInfo(77); }},
      {"max-domains", [](auto& m) { m.MaxDomains(); }},
      {"leaked-domains", [](auto& m) { m.LeakedDomains(); }},
      {"set-global-vm-domain netDom", [](auto& m) { m.SetDomainRole(DomainRole::kGlobalVM, 1); }},
      {"set-io-filter-domain logDom", [](auto& m) { m.SetDomainRole(DomainRole::kIoFilter, 2); }},
      {"add-service netDom console", [](auto& m) { m.AddService(1, "console"); }},
      {"world-domain 100", [](auto& m) { m.WorldDomain(100); }},
      {"place-world 9 netDom", [](auto& m) { m.PlaceWorld(9, 1); }},
      {"destroy-domain logDom", [](auto& m) { m.DestroyDomain(2); }},
  });
}

TEST_F(TraceLogTest, WordsAndRules) {
  const Rule open{4, {"open"}, 0, Decision::kGrant};
  const Rule bind{2, {"net_bind", "80"}, 0, Decision::kRevoke};
  ExpectLines({
      {"validate-word syscall open", [](auto& m) { m.ValidateWord(WordList::kSyscalls, "open"); }},
      {"words file-type", [](auto& m) { m.Words(WordList::kFileTypes); }},
      {"set-rule netDom -s open grant # line 4",
       [&](auto& m) { m.SetRule(RuleType::kSyscall, 1, open); }},
      {"get-rules netDom -s", [](auto& m) { m.Rules(RuleType::kSyscall, 1); }},
      {"check-capability-params netDom", [](auto& m) { m.CheckCapabilityParams("netDom", {}); }},
      {"check-capability-params netDom; -p net_bind 80 revoke # line 2; "
       "-p net_bind 80 revoke # line 2",
       [&](auto& m) {
         m.CheckCapabilityParams("netDom", {bind, bind});
       }},
  });
}

TEST_F(TraceLogTest, Labels) {
  ExpectLines({
      {"invalid-labels object", [](auto& m) { m.InvalidLabels(LabelType::kObject); }},
      {"add-labels object conf data",
       [](auto& m) {
         m.AddLabels({"conf", "data"}, kObject);
       }},
      {"add-labels domain", [](auto& m) { m.AddLabels({}, kDomain); }},
      {"remove-labels object data", [](auto& m) { m.RemoveLabels({"data"}, kObject); }},
      {"predefined-label object conf", [](auto& m) { m.IsPredefinedLabel("conf", kObject); }},
      {"privileged-vm control", [](auto& m) { m.IsPrivilegedVm("control"); }},
      {"lookup-label object conf", [](auto& m) { m.LookupLabel("conf", kObject); }},
      {"label-name object 1", [](auto& m) { m.LabelName(1, kObject); }},
      {"set-file-label /etc/motd tardisk", [](auto& m) { m.SetFileLabel("/etc/motd", 2); }},
      {"get-file-label /etc/motd", [](auto& m) { m.FileLabel("/etc/motd"); }},
  });
}

TEST_F(TraceLogTest, FileRules) {
  std::uint32_t taken = 0;
  module_.PlaceWorld(9, 1);
  ExpectLines({
      {"add-file-rules netDom", [&](auto& m) { m.AddFileRules(1, {}, taken); }},
      {"add-file-rules netDom -r /a rw; -r /b x # world 9",
       [&](auto& m) {
         m.AddFileRules(1, {{0, "/a", 0x3}, {9, "/b", 0x10}}, taken);
       }},
      {"count-file-rules netDom", [](auto& m) { m.CountFileRules(1); }},
      {"read-file-rules netDom", [](auto& m) { m.FileRules(1); }},
      {"update-file-rule netDom -r /a r", [](auto& m) { m.UpdateFileRule(1, "/a", 0x1); }},
      {"replace-path /a /c", [](auto& m) { m.ReplacePath("/a", "/c"); }},
      {"remove-file-rule netDom /c", [](auto& m) { m.RemoveFileRule(0, 1, "/c"); }},
      {"remove-file-rule netDom /b # world 9", [](auto& m) { m.RemoveFileRule(9, 1, "/b"); }},
  });
}

TEST_F(TraceLogTest, TardiskWords) {
  ExpectLines({
      {"tardisk-launch-domain", [](auto& m) { m.Tardisk(TardiskWord::kLaunchDomain); }},
      {"tardisk-exec-event", [](auto& m) { m.Tardisk(TardiskWord::kExecEvent); }},
      {"default-tardisk-label", [](auto& m) { m.Tardisk(TardiskWord::kDefaultLabel); }},
      {"default-tardisk-domain", [](auto& m) { m.Tardisk(TardiskWord::kDefaultDomain); }},
  });
}

TEST_F(TraceLogTest, RefusalStandsBehindTheOperation) {
  ExpectLines({
      {"create-domain netDom policy ! a domain named \"netDom\" exists already",
       [](auto& m) { m.CreateDomain("netDom", {}); }},
      {"destroy-domain #77 ! no domain has the id 77", [](auto& m) { m.DestroyDomain(77); }},
      {"validate-word syscall opne ! unknown system call \"opne\" (nearest: open)",
       [](auto& m) { m.ValidateWord(WordList::kSyscalls, "opne"); }},
      {"set-file-label /a #77 ! no object label has the id 77",
       [](auto& m) { m.SetFileLabel("/a", 77); }},
      {"world-domain -1 ! no world has the id -1", [](auto& m) { m.WorldDomain(-1); }},
  });
}

TEST_F(TraceLogTest, RequestedRefusalIsTracedAsARefusal) {
  faults_.Add({.operation = Operation::kMaxDomains, .call = 2});
  faults_.Add({.operation = Operation::kFindDomain, .kind = Fault::Kind::kOutOfMemory});
  EXPECT_EQ(TraceOf([&] { observed_.MaxDomains(); }), "max-domains");
  EXPECT_EQ(TraceOf([&] { observed_.MaxDomains(); }),
            "max-domains ! refused on request: max-domains, call 2");
  EXPECT_EQ(TraceOf([&] { observed_.FindDomain("netDom"); }),
            "find-domain netDom ! std::bad_alloc");
}

TEST_F(TraceLogTest, LineIsWrittenWhenTheOperationHasEnded) {
  const auto action = [&] { lines_.push_back("the operation"); };
  point_.Pass(
      Operation::kMaxDomains, [] { return std::string("words"); }, action);
  EXPECT_THAT(lines_, ElementsAre("the operation", "max-domains words"));
}

TEST_F(TraceLogTest, TracingAddsNoOperations) {
  const Rule rule{1, {"open"}, 0, Decision::kGrant};
  observed_.SetRule(RuleType::kSyscall, 1, rule);
  observed_.SetFileLabel("/a", 1);
  EXPECT_EQ(lines_.size(), 2u);
}

TEST(SilentTraceLogTest, WithoutASinkNoWordsArePutTogether) {
  TraceLog trace;
  OperationPoint point;
  point.Add(trace);
  const auto words = []() -> std::string { throw std::logic_error("asked for"); };
  EXPECT_EQ(point.Pass(Operation::kMaxDomains, words, [] { return 7; }), 7);
}

}  // namespace
}  // namespace StandIn
