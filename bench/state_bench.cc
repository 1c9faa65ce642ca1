// Reading and writing of what a simulated module holds.
#include <benchmark/benchmark.h>
#include <fcntl.h>

#include <fstream>
#include <map>
#include <sstream>
#include <tuple>

#include "bench/support/host_process.h"
#include "bench/support/rules.h"
#include "host/files/file_io.h"
#include "host/module/description_json.h"
#include "host/module/simulated_module.h"
#include "tests/support/memory_host.h"

namespace SecPolicyBench {
namespace {

using StandIn::SimulatedModule;

class SavedModule {
 public:
  [[nodiscard]] SimulatedModule* operator->() { return &module_; }

  void Set(StandIn::DomainId domain, const std::string& line) {
    std::istringstream stream(line);
    std::string keyword;
    stream >> keyword;
    const auto& info = ZekCtl::Security::InfoOf(*ZekCtl::Security::TypeOfKeyword(keyword));
    StandIn::Rule rule;
    std::string word;
    while (rule.words.size() < info.wordCount && stream >> word) rule.words.push_back(word);
    if (const auto position = info.DomainWord()) {
      rule.targetDomain = *module_.FindDomain(rule.words[*position]);
    }
    module_.SetRule(info.type, domain, rule);
  }

 private:
  SecPolicyTest::OneProcess processes_;
  SimulatedModule module_{StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json"),
                          processes_};
};

void MakeState(const std::string& path, std::size_t rules) {
  SavedModule module;
  for (const std::string& name : DomainNames()) {
    module->CreateDomain(name, StandIn::DomainOrigin::kPolicy);
  }
  module->AddLabels(ObjectNames(), StandIn::LabelType::kObject);
  for (const std::string& name : DomainNames()) {
    const StandIn::DomainId domain = *module->FindDomain(name);
    for (const std::string& line : RuleLines(rules / kDomains)) module.Set(domain, line);
  }
  std::ofstream file(path, std::ios::binary);
  module->Save([&file](std::string_view part) { file << part; });
}

// A file with the state of a module that holds so many rules. It is made in another process: this
// one's memory counts.
const std::string& State(std::int64_t rules) {
  static std::map<std::int64_t, std::string> states;
  std::string& path = states[rules];
  if (path.empty()) {
    path = Scratch() + "/state-" + std::to_string(rules);
    std::ignore = BenchHost::Outside().Run("", [&] {
      MakeState(path, static_cast<std::size_t>(rules));
      return Cost();
    });
  }
  return path;
}

void Restore(SavedModule& module, const std::string& path) {
  const StandIn::UniqueFd fd(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  module->Restore(StandIn::ReaderOf(fd.Get(), path), path);
}

void ForStates(benchmark::internal::Benchmark* bench) {
  for (const int rules : {100'000, 1'000'000}) bench->Arg(rules);
  bench->UseManualTime()->Unit(benchmark::kMillisecond);
}

// The peak has the module's own memory in it.
void ReadState(benchmark::State& state) {
  const std::string& path = State(state.range(0));
  RunEach(state, BenchHost::Outside(), "", static_cast<double>(state.range(0)), [&] {
    SavedModule module;
    return Measure([&] { Restore(module, path); });
  });
}
BENCHMARK(ReadState)->Name("state/read")->Apply(ForStates);

void SaveState(benchmark::State& state) {
  const std::string& path = State(state.range(0));
  RunEach(state, BenchHost::Outside(), "", static_cast<double>(state.range(0)), [&] {
    SavedModule module;
    Restore(module, path);
    return Measure([&] {
      std::ofstream file(path + ".new", std::ios::binary);
      module->Save([&file](std::string_view part) { file << part; });
    });
  });
}
BENCHMARK(SaveState)->Name("state/write")->Apply(ForStates);

}  // namespace
}  // namespace SecPolicyBench
