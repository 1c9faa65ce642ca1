#include "host/gate/private_call_answers.h"

#include <algorithm>
#include <cerrno>
#include <new>
#include <string>
#include <utility>
#include <vector>

#include "host/gate/user_memory.h"
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

template <typename Value>
void WriteValue(std::uint64_t address, const Value& value) {
  WriteMemory(address, &value, sizeof value);
}

// Results are written last; an address that would refuse them is found first, so that no call is
// carried out whose caller does not learn of it.
void RequireCell(std::uint64_t address) { ProbeWritable(address, sizeof(std::uint32_t)); }

FileRule ReadRecord(std::uint64_t address, WorldId world) {
  const std::uint64_t permissionAddress = address + offsetof(ZekAccess_FileRule, permission);
  std::uint32_t permission = 0;
  const MemoryAhead memory({{permissionAddress, sizeof permission}, {address, kPathBytes}});
  memory.Read(permissionAddress, &permission, sizeof permission);
  return {world, memory.String(address, kPathBytes), permission};
}

std::vector<FileRule> ReadRecords(std::uint64_t address, std::uint32_t count, WorldId world) {
  std::vector<FileRule> rules;
  for (std::uint32_t i = 0; i < count; ++i) {
    rules.push_back(ReadRecord(address + i * sizeof(ZekAccess_FileRule), world));
  }
  return rules;
}

void WriteRecord(std::uint64_t address, const FileRule& rule) {
  ZekAccess_FileRule record{};
  rule.path.copy(record.path, sizeof record.path - 1);
  record.permission = rule.permission;
  WriteValue(address, record);
}

// ---- One function a call; the arguments are those of PrivateCall ------------------------------

void CreateDomain(SecurityModule& module, const CallArguments& arguments) {
  const auto& [name, origin, id, unused1, unused2, unused3] = arguments;
  RequireCell(id);
  if (origin > static_cast<std::uint64_t>(DomainOrigin::kRunTime)) throw BadArgument{EINVAL};
  const std::string text = ReadString(name, kDomainNameBytes);
  WriteValue(id, module.CreateDomain(text, static_cast<DomainOrigin>(origin)));
}

void DestroyDomain(SecurityModule& module, const CallArguments& arguments) {
  module.DestroyDomain(ToDomain(arguments[0]));
}

void UpdateRule(SecurityModule& module, const CallArguments& arguments) {
  const auto& [domain, path, permission, unused1, unused2, unused3] = arguments;
  module.UpdateFileRule(ToDomain(domain), ReadString(path, kPathBytes), ToUnsigned(permission));
}

void RemoveRule(SecurityModule& module, const CallArguments& arguments) {
  const auto& [world, domain, path, unused1, unused2, unused3] = arguments;
  module.RemoveFileRule(ToWorld(world), ToDomain(domain), ReadString(path, kPathBytes));
}

void CountRules(SecurityModule& module, const CallArguments& arguments) {
  WriteValue(arguments[1], module.CountFileRules(ToDomain(arguments[0])));
}

// How many of a call's records have been taken.
struct Progress {
  std::uint32_t inEarlierPortions = 0;
  std::uint32_t inThisPortion = 0;

  [[nodiscard]] std::uint32_t Total() const { return inEarlierPortions + inThisPortion; }
};

// Adds the records portion by portion. The first portion may be empty: the module judges the domain
// of an empty batch as well.
void AddPortions(SecurityModule& module, const CallArguments& arguments, Progress& progress) {
  const auto& [world, domain, records, count, result, unused] = arguments;
  do {
    progress.inEarlierPortions += std::exchange(progress.inThisPortion, 0);
    const std::uint32_t start = progress.Total();
    const std::uint32_t size = std::min(ToUnsigned(count) - start, kRecordsAtATime);
    const auto rules =
        ReadRecords(records + start * sizeof(ZekAccess_FileRule), size, ToWorld(world));
    module.AddFileRules(ToDomain(domain), rules, progress.inThisPortion);
  } while (progress.Total() < ToUnsigned(count));
}

void AddRules(SecurityModule& module, const CallArguments& arguments) {
  const std::uint64_t result = arguments[4];
  RequireCell(result);
  Progress progress;
  try {
    AddPortions(module, arguments, progress);
  } catch (...) {
    WriteValue(result, progress.Total());
    throw;
  }
  WriteValue(result, progress.Total());
}

void LeakedDomains(SecurityModule& module, const CallArguments& arguments) {
  const auto& [count, ids, capacity, unused1, unused2, unused3] = arguments;
  RequireCell(count);
  const std::vector<DomainId> leaked = module.LeakedDomains();
  const std::size_t fitting = std::min<std::uint64_t>(leaked.size(), capacity);
  WriteMemory(ids, leaked.data(), fitting * sizeof(DomainId));
  WriteValue(count, static_cast<std::uint32_t>(leaked.size()));
}

void WorldDomain(SecurityModule& module, const CallArguments& arguments) {
  WriteValue(arguments[1], module.WorldDomain(ToWorld(arguments[0])));
}

void DomainName(SecurityModule& module, const CallArguments& arguments) {
  const auto& [domain, buffer, size, unused1, unused2, unused3] = arguments;
  const std::string name = module.DomainName(ToDomain(domain));
  if (name.size() >= size) throw BadArgument{ERANGE};
  WriteMemory(buffer, name.c_str(), name.size() + 1);
}

void ReplacePath(SecurityModule& module, const CallArguments& arguments) {
  const std::string oldPath = ReadString(arguments[0], kPathBytes);
  module.ReplacePath(oldPath, ReadString(arguments[1], kPathBytes));
}

PrivateAnswer ReadRules(SecurityModule& module, const CallArguments& arguments) {
  const auto& [domain, records, capacity, unused1, unused2, unused3] = arguments;
  const std::vector<FileRule> rules = module.FileRules(ToDomain(domain));
  if (rules.size() > ToUnsigned(capacity)) return {ZekCtl::Kernel::kStatusTableTooSmall, -ENOSPC};
  std::uint64_t address = records;
  for (const FileRule& rule : rules) {
    WriteRecord(address, rule);
    address += sizeof(ZekAccess_FileRule);
  }
  return {};
}

template <void (*call)(SecurityModule&, const CallArguments&)>
PrivateAnswer Carry(SecurityModule& module, const CallArguments& arguments) {
  call(module, arguments);
  return {};
}

PrivateAnswer CarryOut(SecurityModule& module, PrivateCall call, const CallArguments& arguments) {
  switch (call) {
    case PrivateCall::kCreateDomain:
      return Carry<CreateDomain>(module, arguments);
    case PrivateCall::kDestroyDomain:
      return Carry<DestroyDomain>(module, arguments);
    case PrivateCall::kUpdateRule:
      return Carry<UpdateRule>(module, arguments);
    case PrivateCall::kRemoveRule:
      return Carry<RemoveRule>(module, arguments);
    case PrivateCall::kReadRules:
      return ReadRules(module, arguments);
    case PrivateCall::kCountRules:
      return Carry<CountRules>(module, arguments);
    case PrivateCall::kAddRules:
      return Carry<AddRules>(module, arguments);
    case PrivateCall::kLeakedDomains:
      return Carry<LeakedDomains>(module, arguments);
    case PrivateCall::kWorldDomain:
      return Carry<WorldDomain>(module, arguments);
    case PrivateCall::kDomainName:
      return Carry<DomainName>(module, arguments);
    case PrivateCall::kReplacePath:
      return Carry<ReplacePath>(module, arguments);
  }
  return Refusal(ENOSYS);
}

}  // namespace

PrivateAnswer Refusal(int number) noexcept { return {kRefusedStatus + number, -number}; }

PrivateAnswer AnswerPrivateCall(const AttachedHost& host, long number,
                                const CallArguments& arguments) noexcept try {
  return CarryOut(host.module, static_cast<PrivateCall>(number), arguments);
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
