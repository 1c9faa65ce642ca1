#include "host/kernel/private_call_answers.h"

#include <algorithm>
#include <cerrno>
#include <new>
#include <string>
#include <utility>
#include <vector>

#include "host/trace/fault_plan.h"
#include "platform/private_calls.h"
#include "platform/zek_access.h"

namespace StandIn {

using ZekCtl::Kernel::kDomainNameBytes;
using ZekCtl::Kernel::kPathBytes;
using ZekCtl::Kernel::PrivateCall;
using ZekCtl::Security::ZekAccess_FileRule;

namespace {

constexpr long kRefusedStatus = 0x0bad0000;

// Records taken from the caller at a time: the number of them is the caller's word alone.
constexpr std::uint32_t kRecordsAtATime = 256;

DomainId ToDomain(std::uint64_t argument) { return static_cast<DomainId>(argument); }
WorldId ToWorld(std::uint64_t argument) { return static_cast<WorldId>(argument); }
std::uint32_t ToUnsigned(std::uint64_t argument) { return static_cast<std::uint32_t>(argument); }

// A call on its way: the module that it is for, and the memory of its caller.
struct Callee {
  SecurityModule& module;
  CallerMemory& memory;

  template <typename Value>
  void Write(std::uint64_t address, const Value& value) const {
    memory.Write(address, &value, sizeof value);
  }
};

// Results are written last; an address that would refuse them is found first, so that no call is
// carried out whose caller does not learn of it.
void RequireCell(const Callee& callee, std::uint64_t address) {
  callee.memory.RequireWritable(address, sizeof(std::uint32_t));
}

FileRule ReadRecord(const Callee& callee, std::uint64_t address, WorldId world) {
  const std::uint64_t permissionAddress = address + offsetof(ZekAccess_FileRule, permission);
  std::uint32_t permission = 0;
  callee.memory.Expect({{permissionAddress, sizeof permission}, {address, kPathBytes}});
  callee.memory.Read(permissionAddress, &permission, sizeof permission);
  return {world, callee.memory.String(address, kPathBytes), permission};
}

std::vector<FileRule> ReadRecords(const Callee& callee, std::uint64_t address, std::uint32_t count,
                                  WorldId world) {
  std::vector<FileRule> rules;
  for (std::uint32_t i = 0; i < count; ++i) {
    rules.push_back(ReadRecord(callee, address + i * sizeof(ZekAccess_FileRule), world));
  }
  return rules;
}

void WriteRecord(const Callee& callee, std::uint64_t address, const FileRule& rule) {
  ZekAccess_FileRule record{};
  rule.path.copy(record.path, sizeof record.path - 1);
  record.permission = rule.permission;
  callee.Write(address, record);
}

// ---- One function a call; the arguments are those of PrivateCall ------------------------------

void CreateDomain(const Callee& callee, const CallArguments& arguments) {
  const auto& [name, origin, id, unused1, unused2, unused3] = arguments;
  RequireCell(callee, id);
  if (origin > static_cast<std::uint64_t>(DomainOrigin::kRunTime)) throw BadArgument{EINVAL};
  const std::string text = callee.memory.String(name, kDomainNameBytes);
  callee.Write(id, callee.module.CreateDomain(text, static_cast<DomainOrigin>(origin)));
}

void DestroyDomain(const Callee& callee, const CallArguments& arguments) {
  callee.module.DestroyDomain(ToDomain(arguments[0]));
}

void UpdateRule(const Callee& callee, const CallArguments& arguments) {
  const auto& [domain, path, permission, unused1, unused2, unused3] = arguments;
  callee.module.UpdateFileRule(ToDomain(domain), callee.memory.String(path, kPathBytes),
                               ToUnsigned(permission));
}

void RemoveRule(const Callee& callee, const CallArguments& arguments) {
  const auto& [world, domain, path, unused1, unused2, unused3] = arguments;
  callee.module.RemoveFileRule(ToWorld(world), ToDomain(domain),
                               callee.memory.String(path, kPathBytes));
}

void CountRules(const Callee& callee, const CallArguments& arguments) {
  callee.Write(arguments[1], callee.module.CountFileRules(ToDomain(arguments[0])));
}

// How many of a call's records have been taken.
struct Progress {
  std::uint32_t inEarlierPortions = 0;
  std::uint32_t inThisPortion = 0;

  [[nodiscard]] std::uint32_t Total() const { return inEarlierPortions + inThisPortion; }
};

// Adds the records portion by portion. The first portion may be empty: the module judges the domain
// of an empty batch as well.
void AddPortions(const Callee& callee, const CallArguments& arguments, Progress& progress) {
  const auto& [world, domain, records, count, result, unused] = arguments;
  do {
    progress.inEarlierPortions += std::exchange(progress.inThisPortion, 0);
    const std::uint32_t start = progress.Total();
    const std::uint32_t size = std::min(ToUnsigned(count) - start, kRecordsAtATime);
    const auto rules =
        ReadRecords(callee, records + start * sizeof(ZekAccess_FileRule), size, ToWorld(world));
    callee.module.AddFileRules(ToDomain(domain), rules, progress.inThisPortion);
  } while (progress.Total() < ToUnsigned(count));
}

void AddRules(const Callee& callee, const CallArguments& arguments) {
  const std::uint64_t result = arguments[4];
  RequireCell(callee, result);
  Progress progress;
  try {
    AddPortions(callee, arguments, progress);
  } catch (...) {
    callee.Write(result, progress.Total());
    throw;
  }
  callee.Write(result, progress.Total());
}

void LeakedDomains(const Callee& callee, const CallArguments& arguments) {
  const auto& [count, ids, capacity, unused1, unused2, unused3] = arguments;
  RequireCell(callee, count);
  const std::vector<DomainId> leaked = callee.module.LeakedDomains();
  const std::size_t fitting = std::min<std::uint64_t>(leaked.size(), capacity);
  callee.memory.Write(ids, leaked.data(), fitting * sizeof(DomainId));
  callee.Write(count, static_cast<std::uint32_t>(leaked.size()));
}

void WorldDomain(const Callee& callee, const CallArguments& arguments) {
  callee.Write(arguments[1], callee.module.WorldDomain(ToWorld(arguments[0])));
}

void DomainName(const Callee& callee, const CallArguments& arguments) {
  const auto& [domain, buffer, size, unused1, unused2, unused3] = arguments;
  const std::string name = callee.module.DomainName(ToDomain(domain));
  if (name.size() >= size) throw BadArgument{ERANGE};
  callee.memory.Write(buffer, name.c_str(), name.size() + 1);
}

void ReplacePath(const Callee& callee, const CallArguments& arguments) {
  const std::string oldPath = callee.memory.String(arguments[0], kPathBytes);
  callee.module.ReplacePath(oldPath, callee.memory.String(arguments[1], kPathBytes));
}

PrivateAnswer ReadRules(const Callee& callee, const CallArguments& arguments) {
  const auto& [domain, records, capacity, unused1, unused2, unused3] = arguments;
  const std::vector<FileRule> rules = callee.module.FileRules(ToDomain(domain));
  if (rules.size() > ToUnsigned(capacity)) return {ZekCtl::Kernel::kStatusTableTooSmall, -ENOSPC};
  std::uint64_t address = records;
  for (const FileRule& rule : rules) {
    WriteRecord(callee, address, rule);
    address += sizeof(ZekAccess_FileRule);
  }
  return {};
}

template <void (*call)(const Callee&, const CallArguments&)>
PrivateAnswer Carry(const Callee& callee, const CallArguments& arguments) {
  call(callee, arguments);
  return {};
}

PrivateAnswer CarryOut(const Callee& callee, PrivateCall call, const CallArguments& arguments) {
  switch (call) {
    case PrivateCall::kCreateDomain:
      return Carry<CreateDomain>(callee, arguments);
    case PrivateCall::kDestroyDomain:
      return Carry<DestroyDomain>(callee, arguments);
    case PrivateCall::kUpdateRule:
      return Carry<UpdateRule>(callee, arguments);
    case PrivateCall::kRemoveRule:
      return Carry<RemoveRule>(callee, arguments);
    case PrivateCall::kReadRules:
      return ReadRules(callee, arguments);
    case PrivateCall::kCountRules:
      return Carry<CountRules>(callee, arguments);
    case PrivateCall::kAddRules:
      return Carry<AddRules>(callee, arguments);
    case PrivateCall::kLeakedDomains:
      return Carry<LeakedDomains>(callee, arguments);
    case PrivateCall::kWorldDomain:
      return Carry<WorldDomain>(callee, arguments);
    case PrivateCall::kDomainName:
      return Carry<DomainName>(callee, arguments);
    case PrivateCall::kReplacePath:
      return Carry<ReplacePath>(callee, arguments);
  }
  return Refusal(ENOSYS);
}

}  // namespace

bool IsPrivateCall(long number) noexcept {
  return number >= static_cast<long>(PrivateCall::kFirst) &&
         number <= static_cast<long>(PrivateCall::kLast);
}

PrivateAnswer Refusal(int number) noexcept { return {kRefusedStatus + number, -number}; }

PrivateAnswer AnswerPrivateCall(const AttachedHost& host, long number,
                                const CallArguments& arguments, CallerMemory& memory) noexcept try {
  return CarryOut({host.module, memory}, static_cast<PrivateCall>(number), arguments);
} catch (const InjectedRefusal& refusal) {
  PrivateAnswer answer = Refusal(refusal.Number());
  if (refusal.Status()) answer.status = *refusal.Status();
  return answer;
} catch (const ModuleError& refusal) {
  return Refusal(refusal.Number());
} catch (const BadArgument& argument) {
  return Refusal(argument.number);
} catch (const std::bad_alloc&) {
  return Refusal(ENOMEM);
} catch (...) {
  return Refusal(EIO);
}

}  // namespace StandIn
