// Whole loads into the simulated module, and what they are made of.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <map>

#include "bench/support/host_process.h"
#include "bench/support/rules.h"
#include "domain/domain_policy.h"
#include "domain/keyword_rules.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyBench {
namespace {

using SecPolicy::ZekAccessInterfaceImpl;

const std::string& Policy(std::int64_t rules) {
  static std::map<std::int64_t, std::string> policies;
  std::string& dir = policies[rules];
  if (dir.empty()) dir = WritePolicy(Scratch(), static_cast<std::size_t>(rules));
  return dir;
}

void ForCounts(benchmark::internal::Benchmark* bench) {
  for (const int rules : {1'000, 10'000, 100'000, 1'000'000}) bench->Arg(rules);
  bench->UseManualTime()->Unit(benchmark::kMillisecond);
}

void Load(benchmark::State& state) {
  const std::string& policy = Policy(state.range(0));
  RunEach(state, BenchHost::Plain(), policy, static_cast<double>(state.range(0)),
          [&] { return Measure([&] { SecPolicy::LoadPolicy(policy); }); });
}
BENCHMARK(Load)->Name("load/whole")->Apply(ForCounts);

// The reading of the same files.
void ReadAll(benchmark::State& state) {
  const std::string& policy = Policy(state.range(0));
  RunEach(state, BenchHost::Plain(), policy, static_cast<double>(state.range(0)), [&] {
    return Measure([&] {
      std::map<std::string, std::string> files;
      SecPolicy::GetFileList(policy + "/domains", files);
      for (const auto& [path, name] : files) {
        std::map<unsigned int, std::queue<std::string>> lines;
        SecPolicy::ParseFile(path, lines);
      }
    });
  });
}
BENCHMARK(ReadAll)->Name("load/reader")->Apply(ForCounts);

// What the fields of such rules take by themselves, on an average.
double FieldBytes(const std::vector<std::string>& lines) {
  constexpr std::size_t kShared = 2 * sizeof(unsigned int) + sizeof(std::string) + sizeof(bool);
  std::size_t bytes = 0;
  for (const std::string& line : lines) {
    const auto words = static_cast<std::size_t>(std::count(line.begin(), line.end(), ' ') - 1);
    bytes += kShared + words * sizeof(std::string);
    if (line.starts_with("-d")) bytes += sizeof(unsigned int);
  }
  return static_cast<double>(bytes) / static_cast<double>(lines.size());
}

// The rules of the whole policy as the library holds them before it sets any.
void Records(benchmark::State& state) {
  const std::string& policy = Policy(state.range(0));
  RunEach(state, BenchHost::Plain(), policy, static_cast<double>(state.range(0)), [&] {
    ZekAccessInterfaceImpl iface;
    SecPolicy::LoadPolicyObjects(policy + "/objects", iface);
    std::list<SecPolicy::DomainPolicy> domains;
    for (const std::string& domain : DomainNames()) {
      domains.emplace_back(domain, SecPolicy::CreateDomain(domain));
      domains.back().SetPolicyFile(policy + "/domains/" + domain);
    }
    return Measure([&] {
      for (SecPolicy::DomainPolicy& domain : domains) domain.ParsePolicy(iface);
    });
  });
  const auto count = static_cast<std::size_t>(state.range(0));
  state.counters["field_bytes_each"] = FieldBytes(RuleLines(count / kDomains));
}
BENCHMARK(Records)->Name("load/records")->Apply(ForCounts);

// ---- The kernel operations of the same load, with nothing around them --------------------------

// The rules of one type in one domain, ready for the kernel.
template <typename Record>
class Prepared {
 public:
  void Add(std::queue<std::string> words, unsigned int domain) {
    Record rule;
    rule.domainId = domain;
    for (const auto& word : kRow.Words()) {
      rule.*word.field = words.front();
      words.pop();
    }
    rule.grant = words.front() == "grant";
    rules_.push_back(std::move(rule));
  }

  void Validate(ZekAccessInterfaceImpl& iface) {
    for (Record& rule : rules_) {
      for (const auto& word : kRow.Words()) {
        if (word.domainId != nullptr) iface.FindDomain(rule.*word.field, &(rule.*word.domainId));
        if (word.info.list) iface.ValidateKeyword(*word.info.list, rule.*word.field);
      }
    }
  }

  void Set(ZekAccessInterfaceImpl& iface) const {
    for (const Record& rule : rules_) (iface.*kRow.set)(rule);
  }

  [[nodiscard]] const std::list<Record>& Rules() const { return rules_; }

 private:
  static constexpr const auto& kRow = ZekCtl::Security::kRuleRow<Record>;

  std::list<Record> rules_;
};

class PreparedDomain {
 public:
  PreparedDomain(const std::string& name, const std::vector<std::string>& lines)
      : name_(name), id_(SecPolicy::CreateDomain(name)) {
    for (const std::string& line : lines) Add(SecPolicy::ParsePolicyLine(line));
  }

  void Check(ZekAccessInterfaceImpl& iface) {
    ForEachType([&](auto& rules) { rules.Validate(iface); });
    iface.CheckCapabilityParamRuleConstraints(name_, parameters_.Rules());
  }

  void Set(ZekAccessInterfaceImpl& iface) {
    ForEachType([&](auto& rules) { rules.Set(iface); });
  }

 private:
  template <typename Step>
  void ForEachType(Step step) {
    step(objects_);
    step(capabilities_);
    step(transitions_);
    step(files_);
    step(parameters_);
    step(systemCalls_);
    step(sockets_);
  }

  void Add(std::queue<std::string> words) {
    const char type = words.front()[1];
    words.pop();
    switch (type) {
      case 'a':
        return objects_.Add(std::move(words), id_);
      case 'c':
        return capabilities_.Add(std::move(words), id_);
      case 'd':
        return transitions_.Add(std::move(words), id_);
      case 'f':
        return files_.Add(std::move(words), id_);
      case 'p':
        return parameters_.Add(std::move(words), id_);
      case 's':
        return systemCalls_.Add(std::move(words), id_);
      default:
        return sockets_.Add(std::move(words), id_);
    }
  }

  std::string name_;
  unsigned int id_;
  Prepared<ZekCtl::Security::ZekAccess_ObjectAccessRule> objects_;
  Prepared<ZekCtl::Security::ZekAccess_CapabilityRule> capabilities_;
  Prepared<ZekCtl::Security::ZekAccess_DomTransRule> transitions_;
  Prepared<ZekCtl::Security::ZekAccess_FileCreationRule> files_;
  Prepared<ZekCtl::Security::ZekAccess_CapabilityParamRule> parameters_;
  Prepared<ZekCtl::Security::ZekAccess_SyscallRule> systemCalls_;
  Prepared<ZekCtl::Security::ZekAccess_UnixSockCreationRule> sockets_;
};

void Module(benchmark::State& state) {
  const std::string& policy = Policy(state.range(0));
  const auto count = static_cast<std::size_t>(state.range(0));
  RunEach(state, BenchHost::Plain(), policy, static_cast<double>(count), [&] {
    ZekAccessInterfaceImpl iface;
    SecPolicy::LoadPolicyObjects(policy + "/objects", iface);
    const std::vector<std::string> lines = RuleLines(count / kDomains);
    std::list<PreparedDomain> domains;
    for (const std::string& name : DomainNames()) domains.emplace_back(name, lines);
    return Measure([&] {
      for (PreparedDomain& domain : domains) domain.Check(iface);
      for (PreparedDomain& domain : domains) domain.Set(iface);
    });
  });
}
BENCHMARK(Module)->Name("load/module")->Apply(ForCounts);

}  // namespace
}  // namespace SecPolicyBench
