// The private system calls with whatever numbers, addresses and lengths: answers within what is
// documented, no byte written but to where the call's results go, nothing changed by a call that
// is refused, and a state that can be saved and restored.
#include <array>
#include <cstring>

#include "fuzz/support/caller_memory.h"
#include "fuzz/support/private_call_facts.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "host/gate/user_memory.h"
#include "platform/zek_access.h"

namespace {

using StandIn::CallArguments;
using StandIn::PrivateAnswer;
using ZekCtl::Kernel::PrivateCall;
using ZekCtl::Security::ZekAccess_FileRule;

constexpr std::size_t kMostCalls = 16;

// Two file rules, two domains whose makers have ended, and one slot that is free.
constexpr char kState[] = R"({"format": 1, "domains": [
  {"id": 0, "name": "rootDom", "origin": "policy"},
  {"id": 1, "name": "appDom", "origin": "policy",
   "fileRules": [[0, "/held", "rw"], [0, "/other", "x"]]},
  {"id": 2, "name": "netDom", "origin": "policy"},
  {"id": 3, "name": "goneDom", "origin": "runTime", "maker": {"pid": 812, "startTime": 1}},
  {"id": 4, "name": "lostDom", "origin": "runTime", "maker": {"pid": 813, "startTime": 2}}]})";

const std::array<std::string, 8> kTexts{"appDom", "netDom", "newDom",   "",
                                        "/held",  "/new",   "relative", std::string(2100, '/')};

class Caller {
 public:
  Caller(Fuzz::Input& input, Fuzz::CallerMemory& memory) : input_(input), memory_(memory) {}

  // A number that is one of the calls, or near.
  PrivateCall Number() { return static_cast<PrivateCall>(16470 + input_.Byte() % 22); }

  // One argument: a small number, an address, a text, records, or a length.
  std::uint64_t Argument() {
    switch (input_.Byte() % 6) {
      case 0:
        return memory_.PutText(input_, kTexts[input_.Byte() % kTexts.size()]);
      case 1:
        return memory_.Address(input_);
      case 2:
        return Records();
      case 3:
        return Harmless(input_.Long());
      default:
        return input_.Byte() % 9;
    }
  }

  CallArguments Arguments() {
    CallArguments arguments{};
    for (std::uint64_t& argument : arguments) argument = Argument();
    return arguments;
  }

 private:
  // Any number but one that may be an address of this process's own.
  static std::uint64_t Harmless(std::uint64_t number) {
    return number < 0x8000'0000'0000 ? number & 0x3fff'ffff : number;
  }

  std::uint64_t Records() {
    const std::uint64_t address = memory_.Address(input_);
    const std::uint8_t count = input_.Byte() % 4;
    for (std::uint8_t i = 0; i < count; ++i) {
      memory_.PutRecord(address + i * sizeof(ZekAccess_FileRule),
                        kTexts[input_.Byte() % kTexts.size()], input_.Byte() % 0x22);
    }
    return address;
  }

  Fuzz::Input& input_;
  Fuzz::CallerMemory& memory_;
};

// The values that a call that is done leaves behind.
void RequireResult(StandIn::SecurityModule& module, PrivateCall call,
                   const CallArguments& arguments, const Fuzz::CallerMemory& memory) {
  const auto valueAt = [&](std::uint64_t address) {
    std::uint32_t value = 0;
    const std::string bytes = memory.Bytes(address, sizeof value);
    Fuzz::Require(bytes.size() == sizeof value, "a result is written to memory that is there");
    std::memcpy(&value, bytes.data(), sizeof value);
    return value;
  };
  const auto domain = static_cast<StandIn::DomainId>(arguments[0]);
  if (call == PrivateCall::kCountRules) {
    Fuzz::Require(valueAt(arguments[1]) == module.FileRules(domain).size(), "rules are counted");
  } else if (call == PrivateCall::kCreateDomain) {
    Fuzz::Require(module.GetDomainInfo(valueAt(arguments[2])).has_value(), "a domain is made");
  } else if (call == PrivateCall::kAddRules) {
    Fuzz::Require(valueAt(arguments[4]) == static_cast<std::uint32_t>(arguments[3]),
                  "all records are taken");
  } else if (call == PrivateCall::kLeakedDomains) {
    Fuzz::Require(valueAt(arguments[0]) == module.LeakedDomains().size(),
                  "leaked ones are counted");
  } else if (call == PrivateCall::kDomainName) {
    const std::string name = module.DomainName(domain);
    Fuzz::RequireEqual(memory.Bytes(arguments[1], name.size() + 1), name + std::string(1, '\0'),
                       "the name is written with its end");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static Fuzz::CallerMemory memory;
  memory.Reset();
  SecPolicyTest::MemoryHost host(Fuzz::SmallDescription());
  StandIn::SimulatedModule& module = host.Module();
  module.Restore(kState, "kernel.json");

  Fuzz::Input input(data, size);
  Caller caller(input, memory);
  std::string saved = module.Save();
  for (std::size_t calls = 0; calls < kMostCalls && !input.IsEmpty(); ++calls) {
    const PrivateCall call = caller.Number();
    const CallArguments arguments = caller.Arguments();
    memory.Remember();
    StandIn::UserMemory userMemory;
    const PrivateAnswer answer =
        StandIn::AnswerPrivateCall(host.Host(), static_cast<long>(call), arguments, userMemory);
    Fuzz::RequireDocumented(call, answer);
    const Fuzz::Results results = Fuzz::ResultsOf(call, arguments);
    Fuzz::Require(memory.IsUnchangedBut(results.address, results.size, results.cell),
                  "only results are written");
    std::string now = module.Save();
    // Of a batch, the records before the refused one are taken.
    if (answer.status != 0 && call != PrivateCall::kAddRules) {
      Fuzz::RequireEqual(now, saved, "a refused call changes nothing");
    }
    saved = std::move(now);
    if (answer.status == 0) RequireResult(module, call, arguments, memory);
  }
  module.Restore(saved, "kernel.json");
  Fuzz::RequireEqual(module.Save(), saved, "the state can be saved and restored");
  return 0;
}
