// The engine on random rules and operations, beside its rules written down once more.
#include <gtest/gtest.h>

#include <random>

#include "host/engine/engine.h"
#include "tests/host/engine/naive_engine.h"

namespace StandIn::Naive {
namespace {

using Words = std::vector<std::string>;

constexpr unsigned int kPolicies = 400;
constexpr std::size_t kMostRules = 40;
constexpr int kOperationsForEach = 100;

// Few words, so that rules often meet.
const Words kLabels{"conf", "logs", "tool"};
const Words kAccesses{"read",   "write",  "exec",    "append",  "create",
                      "delete", "rename", "getattr", "setattr", "connect"};
const Words kPaths{"/", "/a", "/a/b", "/a/bc", "/a/b/c", "/ab", "/d/e"};
const Words kTargets{"oneDom", "twoDom"};
const Words kEvents{"exec", "fork"};
const Words kFileTypes{"file", "dir"};
const Words kSocketTypes{"stream", "dgram"};
const Words kCapabilities{"sys_admin", "chown"};
const Words kParameters{"mount", "tcp/80"};
const Words kSyscalls{"open", "close", "read"};
const Words kLetters{"", "r", "w", "x", "rw", "rx", "rwx"};

class Chance {
 public:
  explicit Chance(unsigned int seed) : engine_(seed) {}

  std::size_t Below(std::size_t bound) { return engine_() % bound; }
  const std::string& Of(const Words& words) { return words[Below(words.size())]; }
  std::optional<std::string> MaybeOf(const Words& words) {
    const std::size_t choice = Below(words.size() + 1);
    return choice == words.size() ? std::nullopt : std::optional(words[choice]);
  }

 private:
  std::mt19937 engine_;
};

Words RandomWords(RuleType type, Chance& chance) {
  switch (type) {
    case RuleType::kObjectAccess:
      return {chance.Of(kLabels), chance.Of(kAccesses)};
    case RuleType::kCapability:
      return {chance.Of(kCapabilities)};
    case RuleType::kTransition:
      return {chance.Of(kLabels), chance.Of(kTargets), chance.Of(kEvents)};
    case RuleType::kFileCreation:
      return {chance.Of(kLabels), chance.Of(kLabels), chance.Of(kFileTypes)};
    case RuleType::kCapabilityParam:
      return {chance.Of(kCapabilities), chance.Of(kParameters)};
    case RuleType::kPath:
      return {chance.Of(kPaths)};
    case RuleType::kSyscall:
      return {chance.Of(kSyscalls)};
    case RuleType::kUnixSocket:
      return {chance.Of(kLabels), chance.Of(kSocketTypes)};
  }
  ADD_FAILURE() << "a type without words";
  return {};
}

PlainRules RandomRules(Chance& chance) {
  PlainRules rules(chance.Below(kMostRules + 1));
  for (PlainRule& rule : rules) {
    rule.type = static_cast<RuleType>(chance.Below(ZekCtl::Security::kRuleTypes.size()));
    rule.words = RandomWords(rule.type, chance);
    rule.isGranted = rule.type != RuleType::kPath && chance.Below(2) == 0;
    if (rule.type == RuleType::kPath) rule.letters = chance.Of(kLetters);
  }
  return rules;
}

std::uint32_t BitsOf(const std::string& letters) {
  std::uint32_t bits = 0;
  for (const PermissionBit& each : kPermissionBits) {
    if (letters.find(each.letter) != std::string::npos) bits |= each.bit;
  }
  return bits;
}

DomainRules Indexed(const PlainRules& rules) {
  DomainRules indexed;
  for (std::size_t i = 0; i < rules.size(); ++i) {
    indexed.Add(rules[i].type, rules[i].words, {rules[i].isGranted, BitsOf(rules[i].letters), i});
  }
  return indexed;
}

std::string Text(const PlainRules& rules) {
  std::string text;
  for (const PlainRule& rule : rules) {
    text += InfoOf(rule.type).keyword;
    for (const std::string& word : rule.words) text += " " + word;
    text += (rule.type == RuleType::kPath ? " " + rule.letters
             : rule.isGranted             ? " grant"
                                          : " revoke") +
            "\n";
  }
  return text;
}

std::string Text(bool isGranted, const std::optional<std::size_t>& rule,
                 const std::string& result) {
  return std::string(isGranted ? "granted" : "not granted") + " by " +
         (rule ? std::to_string(*rule) : "none") + " -> " + result;
}
std::string Text(const Outcome& outcome) {
  return Text(outcome.isGranted, outcome.rule, outcome.result);
}
std::string Text(const Verdict& verdict, const std::optional<std::string>& result = std::nullopt) {
  EXPECT_EQ(verdict.isAllowed, !verdict.isDenial);
  return Text(verdict.isAllowed, verdict.rule, result.value_or(""));
}

// One operation of each kind: what the engine says of it, and what the restatement says.
void CompareOnce(const PlainRules& plain, const DomainRules& rules, Chance& chance) {
  const Subject subject{rules};
  const FileObject file{chance.Of(kPaths), chance.MaybeOf(kLabels)};
  const std::string& access = chance.Of(kAccesses);
  EXPECT_EQ(Text(DecideAccess(subject, access, file)),
            Text(Access(plain, access, file.path, file.label)))
      << access << " " << file.path;
  EXPECT_EQ(Text(DecideConnection(subject, file)),
            Text(Access(plain, "connect", file.path, file.label)));
  const std::string& type = chance.Of(kFileTypes);
  const CreationVerdict created = DecideCreation(subject, type, file);
  EXPECT_EQ(Text(created, created.label), Text(Creation(plain, type, file.path, file.label)));
  const TransitionVerdict executed = DecideExec(subject, file);
  EXPECT_EQ(Text(executed, executed.domain), Text(Exec(plain, file.path, file.label)));
  const TransitionVerdict forked = DecideFork(subject, file);
  EXPECT_EQ(Text(forked, forked.domain), Text(Fork(plain, file.label)));
  const std::string& capability = chance.Of(kCapabilities);
  const std::optional<std::string> parameter = chance.MaybeOf(kParameters);
  EXPECT_EQ(Text(DecideCapability(subject, capability, parameter)),
            Text(Capability(plain, capability, parameter)));
  const Words socket = RandomWords(RuleType::kUnixSocket, chance);
  EXPECT_EQ(Text(DecideSocket(subject, socket[1], socket[0])),
            Text(ByWords(plain, RuleType::kUnixSocket, socket)));
  const std::string& call = chance.Of(kSyscalls);
  EXPECT_EQ(Text(DecideSystemCall(subject, call)),
            Text(ByWords(plain, RuleType::kSyscall, {call})));
}

TEST(RandomPolicyTest, TheEngineDecidesAsItsRestatement) {
  for (unsigned int seed = 1; seed <= kPolicies; ++seed) {
    Chance chance(seed);
    const PlainRules plain = RandomRules(chance);
    const DomainRules rules = Indexed(plain);
    for (int i = 0; i < kOperationsForEach; ++i) CompareOnce(plain, rules, chance);
    ASSERT_FALSE(testing::Test::HasFailure()) << "seed " << seed << "\n" << Text(plain);
  }
}

}  // namespace
}  // namespace StandIn::Naive
