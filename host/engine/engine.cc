#include "host/engine/engine.h"

#include "host/engine/accesses.h"
#include "host/module/domain_table.h"

namespace StandIn {

namespace {

Verdict Judged(Level level, bool isGranted, const NumberedRule* rule) {
  if (level == Level::kUnconfined) return {true, false, std::nullopt};
  return {isGranted || level == Level::kPermissive, !isGranted,
          rule == nullptr ? std::nullopt : std::optional(rule->number)};
}

// What a rule that ends in a decision says, if there is one.
Verdict Judged(Level level, const NumberedRule* rule) {
  return Judged(level, rule != nullptr && rule->isGranted, rule);
}

TransitionVerdict WithTransition(const Subject& subject, const Verdict& verdict,
                                 const FileObject& program, const char* event) {
  TransitionVerdict moved{verdict, std::nullopt, std::nullopt};
  if (!verdict.isAllowed || !program.label) return moved;
  const auto [rule, target] = subject.rules.FindTransition(*program.label, event);
  if (rule != nullptr && rule->isGranted) {
    moved.domain = *target;
    moved.transition = rule->number;
  }
  return moved;
}

}  // namespace

Level StartingLevel(DomainId domain) {
  return domain == kRootDomain ? Level::kUnconfined : Level::kEnforcing;
}

Verdict DecideAccess(const Subject& subject, const std::string& access, const FileObject& file) {
  if (const auto permission = PermissionFor(access)) {
    if (const NumberedRule* const rule = subject.rules.FindForPath(file.path)) {
      return Judged(subject.level, (rule->permission & *permission) != 0, rule);
    }
  }
  return Judged(
      subject.level,
      file.label ? subject.rules.Find(RuleType::kObjectAccess, {*file.label, access}) : nullptr);
}

CreationVerdict DecideCreation(const Subject& subject, const std::string& fileType,
                               const FileObject& directory) {
  CreationVerdict verdict{DecideAccess(subject, kCreateAccess, directory), std::nullopt};
  const auto [rule, label] =
      directory.label ? subject.rules.FindCreation(*directory.label, fileType) : RuleWithResult{};
  // The rule that denies the access to the directory is the one to be told.
  if (!verdict.isDenial) static_cast<Verdict&>(verdict) = Judged(subject.level, rule);
  if (verdict.isAllowed && rule != nullptr && rule->isGranted) verdict.label = *label;
  return verdict;
}

Verdict DecideSocket(const Subject& subject, const std::string& socketType,
                     const std::string& label) {
  return Judged(subject.level, subject.rules.Find(RuleType::kUnixSocket, {label, socketType}));
}

Verdict DecideConnection(const Subject& subject, const FileObject& socket) {
  return DecideAccess(subject, kConnectAccess, socket);
}

Verdict DecideSystemCall(const Subject& subject, const std::string& name) {
  return Judged(subject.level, subject.rules.Find(RuleType::kSyscall, {name}));
}

Verdict DecideCapability(const Subject& subject, const std::string& capability,
                         const std::optional<std::string>& parameter) {
  const NumberedRule* rule =
      parameter ? subject.rules.Find(RuleType::kCapabilityParam, {capability, *parameter})
                : nullptr;
  if (rule == nullptr) rule = subject.rules.Find(RuleType::kCapability, {capability});
  return Judged(subject.level, rule);
}

TransitionVerdict DecideExec(const Subject& subject, const FileObject& program) {
  return WithTransition(subject, DecideAccess(subject, kExecAccess, program), program,
                        kExecTransition);
}

TransitionVerdict DecideFork(const Subject& subject, const FileObject& program) {
  return WithTransition(subject, {true, false, std::nullopt}, program, kForkTransition);
}

}  // namespace StandIn
