#include "host/gate/ordinary_call_answers.h"

#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/xattr.h>

#include <array>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <optional>
#include <string>

#include "host/gate/passthrough.h"
#include "host/gate/user_memory.h"
#include "host/kernel/file_calls.h"
#include "platform/private_calls.h"

namespace StandIn {

namespace {

// The files of this process, whose root directory is the host's.
class ProcessFiles final : public CallerFiles {
 public:
  [[nodiscard]] std::optional<std::string> Resolve(const std::string& path) const override {
    return FileTree::Machine().Resolve(path);
  }
  [[nodiscard]] bool Status(const std::string& path, struct stat& status) const override {
    return stat(path.c_str(), &status) == 0;
  }
};

// Whether the caller means the label's attribute. A name that cannot be read is left to the kernel
// to refuse.
bool NamesLabel(const UserMemory& memory, std::uint64_t name) {
  try {
    return memory.String(name, XATTR_NAME_MAX + 1) == ZekCtl::Kernel::kLabelAttribute;
  } catch (const BadArgument&) {
    return false;
  }
}

// A file that carries the label does so from the start, every other file never.
void CheckFlags(std::uint64_t flags, bool carriesLabel) {
  if ((flags & ~static_cast<std::uint64_t>(XATTR_CREATE | XATTR_REPLACE)) != 0 ||
      flags == (XATTR_CREATE | XATTR_REPLACE)) {
    throw BadArgument{EINVAL};
  }
  if (carriesLabel && flags == XATTR_CREATE) throw BadArgument{EEXIST};
  if (!carriesLabel) throw BadArgument{flags == XATTR_REPLACE ? ENODATA : EOPNOTSUPP};
}

}  // namespace

bool ConcernsModule(long number, const CallArguments& arguments) noexcept {
  if (number == SYS_prctl) return true;
  std::array<char, std::size(ZekCtl::Kernel::kLabelAttribute)> name{};
  return TryReadMemory(arguments[1], name.data(), name.size()) &&
         std::memcmp(name.data(), ZekCtl::Kernel::kLabelAttribute, name.size()) == 0;
}

long AnswerResolvePath(const AttachedHost& host, const CallArguments& arguments) noexcept {
  return AsCallResult([&]() -> long {
    UserMemory memory;
    const std::string path = memory.String(arguments[1], ZekCtl::Kernel::kPathBytes);
    const std::string resolved = ResolvedPath(host, ProcessFiles(), path);
    memory.Write(arguments[2], resolved.c_str(), resolved.size() + 1);
    return 0;
  });
}

long AnswerSetAttribute(const AttachedHost& host, const CallArguments& arguments) noexcept {
  const std::uint64_t path = arguments[0];
  const std::uint64_t name = arguments[1];
  const std::uint64_t value = arguments[2];
  const std::uint64_t size = arguments[3];
  const std::uint64_t flags = arguments[4];
  return AsCallResult([&]() -> long {
    LabelId label = 0;
    UserMemory memory;
    memory.Expect({{name, XATTR_NAME_MAX + 1}, {path, PATH_MAX}, {value, sizeof label}});
    if (!NamesLabel(memory, name)) {
      return SecpolicyGatePassThrough(SYS_setxattr, arguments.data());
    }
    const auto labelledPath = LabelledPath(host, ProcessFiles(), memory.String(path, PATH_MAX));
    CheckFlags(flags, labelledPath.has_value());
    if (size != sizeof label) throw BadArgument{EINVAL};
    memory.Read(value, &label, sizeof label);
    host.module.SetFileLabel(*labelledPath, label);
    return 0;
  });
}

long AnswerGetAttribute(const AttachedHost& host, const CallArguments& arguments) noexcept {
  const std::uint64_t path = arguments[0];
  const std::uint64_t name = arguments[1];
  const std::uint64_t value = arguments[2];
  const std::uint64_t size = arguments[3];
  return AsCallResult([&]() -> long {
    UserMemory memory;
    memory.Expect({{name, XATTR_NAME_MAX + 1}, {path, PATH_MAX}});
    if (!NamesLabel(memory, name)) return SecpolicyGatePassThrough(SYS_getxattr, arguments.data());
    const auto labelledPath = LabelledPath(host, ProcessFiles(), memory.String(path, PATH_MAX));
    if (!labelledPath) throw BadArgument{ENODATA};
    const LabelId label = host.module.FileLabel(*labelledPath);
    if (size == 0) return sizeof label;
    if (size < sizeof label) throw BadArgument{ERANGE};
    memory.Write(value, &label, sizeof label);
    return sizeof label;
  });
}

}  // namespace StandIn
