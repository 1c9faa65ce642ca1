// Parsing of each rule type: from a line's words to a rule that has been checked.
#include <benchmark/benchmark.h>

#include "bench/support/host_process.h"
#include "bench/support/rules.h"
#include "domain/domain_policy.h"
#include "fuzz/support/scratch_directory.h"
#include "host/module/description_json.h"
#include "tests/support/memory_host.h"

namespace SecPolicyBench {
namespace {

constexpr std::size_t kRulesEach = 10'000;

// Lines of one type; where its words give fewer, they come again.
std::string FileOf(char type) {
  std::vector<std::string> different;
  for (std::size_t i = 0; i < kRulesEach; ++i) {
    std::string line =
        type == 'r' ? "-r /srv/data/" + std::to_string(i) + " rw" : RuleLine(type, i);
    if (line.empty()) break;
    different.push_back(std::move(line));
  }
  std::string text;
  for (std::size_t i = 0; i < kRulesEach; ++i) text += different[i % different.size()] + "\n";
  const std::string path = Scratch() + "/rules-" + type;
  Fuzz::WriteFile(path, text);
  return path;
}

void ParseType(benchmark::State& state, char type) {
  const std::string file = FileOf(type);
  const auto description = StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json");
  SecPolicyTest::MemoryHost host(description);
  host.Module().AddLabels(ObjectNames(), StandIn::LabelType::kObject);
  for (const std::string& domain : DomainNames()) {
    host.Module().CreateDomain(domain, StandIn::DomainOrigin::kPolicy);
  }
  ZekCtl::Security::ZekAccessInterfaceImpl iface;
  for (auto _ : state) {
    SecPolicy::DomainPolicy policy("appDom", 1);
    policy.SetPolicyFile(file);
    policy.ParsePolicy(iface);
  }
  state.counters["items"] = kRulesEach;
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(kRulesEach));
}
BENCHMARK_CAPTURE(ParseType, a, 'a')->Name("parse/-a")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, c, 'c')->Name("parse/-c")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, d, 'd')->Name("parse/-d")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, f, 'f')->Name("parse/-f")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, p, 'p')->Name("parse/-p")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, r, 'r')->Name("parse/-r")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, s, 's')->Name("parse/-s")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(ParseType, u, 'u')->Name("parse/-u")->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace SecPolicyBench
