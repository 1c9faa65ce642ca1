#include "tests/crash/host_user.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <chrono>

namespace CrashTest {

namespace {

constexpr std::size_t kRulesEach = 25;
constexpr unsigned int kPermissions[] = {0x1, 0x3, 0x11, 0x13};

std::string NameOfDomain(std::size_t user, std::size_t domain) {
  return "dom" + std::to_string(user) + "-" + std::to_string(domain);
}

std::string ContestedName(std::size_t name) { return "contested" + std::to_string(name); }

// Tells everybody that a domain is being changed, as long as this lives.
class Changing {
 public:
  explicit Changing(Board::Domain& domain) : domain_(domain) { ++domain_.changes; }
  ~Changing() { ++domain_.changes; }
  Changing(const Changing&) = delete;
  Changing& operator=(const Changing&) = delete;

 private:
  Board::Domain& domain_;
};

}  // namespace

HostUser::HostUser(std::size_t number, unsigned int common, Board& board, OperationLog& log)
    : number_(number),
      common_(common),
      board_(board),
      log_(log),
      random_(static_cast<std::mt19937::result_type>(number)) {}

void HostUser::DoSomething() {
  using Action = void (HostUser::*)();
  static constexpr Action kActions[] = {
      &HostUser::ChangeOwnDomain,   &HostUser::ChangeOwnDomain,
      &HostUser::LookUpOwnDomain,   &HostUser::LookUpAnothersDomain,
      &HostUser::TakeContestedName, &HostUser::SetRule,
      &HostUser::SetRule,           &HostUser::RemoveRule,
      &HostUser::CountRules,        &HostUser::GiveBackContestedNames,
  };
  const auto start = std::chrono::steady_clock::now();
  (this->*kActions[Below(std::size(kActions))])();
  const std::int64_t taken = std::chrono::duration_cast<std::chrono::microseconds>(
                                 std::chrono::steady_clock::now() - start)
                                 .count();
  std::int64_t longest = board_.longestMicroseconds;
  while (taken > longest && !board_.longestMicroseconds.compare_exchange_weak(longest, taken)) {
    continue;
  }
}

unsigned int HostUser::Create(const std::string& name) {
  const unsigned int id = SecPolicy::CreateDomain(name);
  log_.Created(name, id);
  EXPECT_EQ(board_.holders.at(id).exchange(1), 0) << name << " was given a held id, " << id;
  return id;
}

void HostUser::Destroy(const std::string& name, unsigned int id) {
  board_.holders.at(id) = 0;  // from the next line on, somebody else may be given it
  SecPolicy::DestroyDomain(id);
  log_.Destroyed(name, id);
}

unsigned int HostUser::SlotOf(const std::string& name) {
  unsigned int id = 0;
  return interface_.FindDomain(name, &id) ? id + 1 : 0;
}

void HostUser::ChangeOwnDomain() {
  const std::size_t which = Below(kDomainsEach);
  Board::Domain& domain = board_.domains.at(number_).at(which);
  const std::string name = NameOfDomain(number_, which);
  const Changing changing(domain);
  if (domain.slot == 0) {
    domain.slot = Create(name) + 1;
  } else {
    Destroy(name, domain.slot - 1);
    domain.slot = 0;
  }
}

void HostUser::LookUpOwnDomain() {
  const std::size_t which = Below(kDomainsEach);
  const unsigned int slot = board_.domains.at(number_).at(which).slot;
  EXPECT_EQ(SlotOf(NameOfDomain(number_, which)), slot);
  if (slot == 0) return;
  EXPECT_EQ(SecPolicy::GetDomainNameForID(slot - 1), NameOfDomain(number_, which));
}

// Its owner may change it at any time; the answer is only known when it didn't.
void HostUser::LookUpAnothersDomain() {
  const std::size_t user = Below(kUsers);
  const std::size_t which = Below(kDomainsEach);
  Board::Domain& domain = board_.domains.at(user).at(which);
  const std::uint64_t changes = domain.changes;
  const unsigned int slot = domain.slot;
  const unsigned int found = SlotOf(NameOfDomain(user, which));
  if (changes % 2 == 0 && domain.changes == changes) {
    EXPECT_EQ(found, slot) << NameOfDomain(user, which);
  }
}

void HostUser::TakeContestedName() {
  const std::size_t name = Below(kContested);
  if (contested_.contains(name)) return;
  try {
    contested_[name] = Create(ContestedName(name));
    EXPECT_EQ(board_.creators.at(name).exchange(1), 0) << "two have " << ContestedName(name);
  } catch (const Tavon::Lib::TavonException& refusal) {
    contested_.erase(name);
    EXPECT_THAT(refusal.what(), testing::EndsWith("File exists"));
  }
}

void HostUser::GiveBackContestedNames() {
  for (const auto& [name, id] : contested_) {
    board_.creators.at(name) = 0;
    Destroy(ContestedName(name), id);
  }
  contested_.clear();
}

std::string HostUser::RandomPath() {
  return "/user" + std::to_string(number_) + "/" + std::to_string(Below(kRulesEach));
}

void HostUser::SetRule() {
  const std::string path = RandomPath();
  const unsigned int permission = kPermissions[Below(std::size(kPermissions))];
  if (rules_.contains(path)) {
    SecPolicy::UpdateFilePolicy(common_, path, permission);
  } else {
    SecPolicy::ZekAccess_FileRule rule{};
    path.copy(rule.path, sizeof rule.path - 1);
    rule.permission = permission;
    unsigned int taken = 0;
    SecPolicy::AddFilePolicyBatch(0, common_, &rule, 1, &taken);
    EXPECT_EQ(taken, 1U);
  }
  log_.Added(path, permission);
  rules_[path] = permission;
}

void HostUser::RemoveRule() {
  if (rules_.empty()) return;
  const auto rule = std::next(rules_.begin(), static_cast<std::ptrdiff_t>(Below(rules_.size())));
  SecPolicy::RemoveFilePolicy(0, common_, rule->first);
  log_.Removed(rule->first);
  rules_.erase(rule);
}

void HostUser::CountRules() {
  const unsigned int count = SecPolicy::RetrieveNumberOfFilePolicies(common_);
  EXPECT_GE(count, rules_.size());
  EXPECT_LE(count, kUsers * kRulesEach);
}

}  // namespace CrashTest
