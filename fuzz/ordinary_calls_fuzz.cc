// The ordinary system calls that the security module answers, with whatever addresses, lengths and
// flags: answers within what is documented, no byte written but to where the result goes, and a
// label that was set is read back.
#include <sys/xattr.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <initializer_list>

#include "fuzz/support/caller_memory.h"
#include "fuzz/support/require.h"
#include "fuzz/support/scratch_directory.h"
#include "fuzz/support/small_world.h"
#include "host/gate/ordinary_call_answers.h"
#include "platform/private_calls.h"

namespace {

using StandIn::CallArguments;

constexpr std::size_t kMostCalls = 24;
constexpr std::uint64_t kNobodys = 1ULL << 63;

// A root file system of few files, two of which an archive brought.
struct Root {
  Root() {
    const std::string path = directory.Path();
    Fuzz::WriteFile(path + "/held", "");
    Fuzz::WriteFile(path + "/foreign", "");
    std::filesystem::create_directory(path + "/dir");
    std::filesystem::create_symlink("held", path + "/link");
    std::filesystem::create_symlink("loop", path + "/loop");
    for (const char* name :
         {"/held", "/foreign", "/dir", "/link", "/loop", "/absent", "", "/held/x"}) {
      names.push_back(path + name);
    }
    names.push_back(std::string(5000, 'p'));
  }

  Fuzz::ScratchDirectory directory;
  std::vector<std::string> names;
};

void RequireOneOf(long answer, std::initializer_list<int> errors, const char* what) {
  if (answer >= 0 || answer == -EFAULT) return;
  for (const int error : errors) {
    if (answer == -error) return;
  }
  std::fprintf(stderr, "answer %ld\n", answer);
  Fuzz::Require(false, what);
}

class Caller {
 public:
  Caller(Fuzz::Input& input, Fuzz::CallerMemory& memory, const Root& root)
      : input_(input), memory_(memory), root_(root) {}

  std::uint64_t Path() {
    if (input_.Byte() % 4 == 0) return memory_.Address(input_);
    return memory_.PutText(input_, root_.names[input_.Byte() % root_.names.size()]);
  }

  // The label's attribute, or memory that no process has: every other name is the kernel's own.
  std::uint64_t Name() {
    if (input_.Byte() % 8 == 0) return kNobodys;
    return reinterpret_cast<std::uint64_t>(ZekCtl::Kernel::kLabelAttribute);
  }

  // An address; where it is good, a label's id stands there.
  std::uint64_t Value() {
    const std::uint64_t address = memory_.Address(input_);
    memory_.PutNumber(address, input_.Byte() % 6);
    return address;
  }

  std::uint64_t Size() {
    return input_.Byte() % 4 == 0 ? input_.Byte() % 8 : sizeof(std::uint32_t);
  }
  std::uint64_t Flags() { return input_.Byte() % 5 == 0 ? input_.Byte() % 8 : XATTR_REPLACE; }

 private:
  Fuzz::Input& input_;
  Fuzz::CallerMemory& memory_;
  const Root& root_;
};

class Calls {
 public:
  Calls(const StandIn::AttachedHost& host, Fuzz::CallerMemory& memory)
      : host_(host), memory_(memory) {}

  void ResolvePath(Caller& caller) {
    const CallArguments arguments{ZekCtl::Kernel::kPrctlResolvePath, caller.Path(), caller.Value()};
    memory_.Remember();
    const long answer = StandIn::AnswerResolvePath(host_, arguments);
    RequireOneOf(answer, {ENOENT, ENOTDIR, ELOOP, ENAMETOOLONG, EACCES},
                 "a path is resolved or refused as a kernel refuses it");
    Fuzz::Require(answer <= 0, "resolving gives no number");
    RequireOnlyWritten(arguments[2], ZekCtl::Kernel::kPathBytes);
    if (answer == 0) {
      Fuzz::Require(memory_.Bytes(arguments[2], 1) == "/", "a resolved path is absolute");
    }
  }

  void SetAttribute(Caller& caller) {
    const std::uint64_t path = caller.Path();
    const CallArguments arguments{path, caller.Name(), caller.Value(), caller.Size(),
                                  caller.Flags()};
    memory_.Remember();
    const std::string value = memory_.Bytes(arguments[2], sizeof(std::uint32_t));
    const long answer = StandIn::AnswerSetAttribute(host_, arguments);
    RequireOneOf(
        answer, {ENOENT, ENOTDIR, ELOOP, ENAMETOOLONG, EACCES, EINVAL, EEXIST, ENODATA, EOPNOTSUPP},
        "a label is set or refused as a kernel refuses it");
    Fuzz::Require(answer <= 0, "setting gives no number");
    RequireOnlyWritten(0, 0);
    if (answer == 0) RequireLabel(path, value);
  }

  void GetAttribute(Caller& caller) {
    const std::uint64_t path = caller.Path();
    const CallArguments arguments{path, caller.Name(), caller.Value(), caller.Size()};
    memory_.Remember();
    const long answer = StandIn::AnswerGetAttribute(host_, arguments);
    RequireOneOf(answer, {ENOENT, ENOTDIR, ELOOP, ENAMETOOLONG, EACCES, ENODATA, ERANGE},
                 "a label is read or refused as a kernel refuses it");
    Fuzz::Require(answer <= 0 || answer == sizeof(std::uint32_t), "a label has four bytes");
    RequireOnlyWritten(arguments[2], arguments[3] < sizeof(std::uint32_t) ? 0 : 4);
  }

 private:
  void RequireOnlyWritten(std::uint64_t address, std::size_t size) const {
    Fuzz::Require(memory_.IsUnchangedBut(address, size, ~0ULL - sizeof(std::uint32_t)),
                  "only the result is written");
  }

  // The file at `path` carries the label whose id has these bytes.
  void RequireLabel(std::uint64_t path, const std::string& bytes) {
    std::uint32_t label = 0;
    const CallArguments arguments{path,
                                  reinterpret_cast<std::uint64_t>(ZekCtl::Kernel::kLabelAttribute),
                                  reinterpret_cast<std::uint64_t>(&label), sizeof label};
    Fuzz::Require(StandIn::AnswerGetAttribute(host_, arguments) == sizeof label,
                  "a label that was set can be read");
    Fuzz::Require(std::memcmp(&label, bytes.data(), sizeof label) == 0,
                  "the label is the one that was set");
  }

  const StandIn::AttachedHost& host_;
  Fuzz::CallerMemory& memory_;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const Root root;
  static Fuzz::CallerMemory memory;
  memory.Reset();
  SecPolicyTest::MemoryHost host(Fuzz::SmallDescription(),
                                 StandIn::ImageIndex{{{"base.tar", {"/dir", "/held", "/link"}}}},
                                 root.directory.Path());
  Fuzz::Populate(host.Module());

  Fuzz::Input input(data, size);
  Caller caller(input, memory, root);
  Calls calls(host.Host(), memory);
  for (std::size_t count = 0; count < kMostCalls && !input.IsEmpty(); ++count) {
    switch (input.Byte() % 3) {
      case 0:
        calls.ResolvePath(caller);
        break;
      case 1:
        calls.SetAttribute(caller);
        break;
      default:
        calls.GetAttribute(caller);
    }
  }
  return 0;
}
