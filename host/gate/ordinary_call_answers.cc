#include "host/gate/ordinary_call_answers.h"

#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/xattr.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <optional>
#include <string>

#include "host/gate/passthrough.h"
#include "host/gate/user_memory.h"
#include "host/module/module_error.h"
#include "platform/private_calls.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

// Runs `answer`; what it throws becomes a negative errno.
template <typename Answer>
long AsResult(const Answer& answer) noexcept try {
  return answer();
} catch (const ModuleError& refusal) {
  return refusal.Number() != 0 ? -refusal.Number() : -EIO;
} catch (const BadArgument& argument) {
  return -argument.number;
} catch (const std::bad_alloc&) {
  return -ENOMEM;
} catch (...) {
  return -EIO;
}

[[noreturn]] void RefuseToResolve(const std::string& path, int number) {
  throw ModuleError(number, StrCat("\"", path, "\" cannot be resolved: ", std::strerror(number)));
}

std::string RealPath(const std::string& path) {
  const std::unique_ptr<char, decltype(&std::free)> found(realpath(path.c_str(), nullptr),
                                                          &std::free);
  if (!found) RefuseToResolve(path, errno);
  std::string resolved = found.get();
  if (resolved.size() >= ZekCtl::Kernel::kPathBytes) RefuseToResolve(path, ENAMETOOLONG);
  return resolved;
}

// Whether the caller means the label's attribute. A name that cannot be read is left to the kernel
// to refuse.
bool NamesLabel(const MemoryAhead& memory, std::uint64_t name) {
  try {
    return memory.String(name, XATTR_NAME_MAX + 1) == ZekCtl::Kernel::kLabelAttribute;
  } catch (const BadArgument&) {
    return false;
  }
}

// Whether `path`, which holds no links, is one of the directories made visible, or below one.
bool IsMadeVisible(const AttachedHost& host, const std::string& path) {
  return std::any_of(host.visible.begin(), host.visible.end(), [&](const std::string& dir) {
    return path == dir || path.starts_with(dir + "/");
  });
}

// The path under which the label of the file that the caller names is kept; nothing for a file that
// carries none. Beside the files of the image, what is made visible carries one, since on a machine
// of its own it would lie in the same file system; and so do directories that no archive brought,
// since the host itself makes such for what is to be visible.
std::optional<std::string> LabelledPath(const AttachedHost& host, const MemoryAhead& memory,
                                        std::uint64_t address) {
  const std::string path = memory.String(address, PATH_MAX);
  struct stat status {};
  if (stat(path.c_str(), &status) != 0) throw BadArgument{errno};
  auto inImage = host.files.PathOf(status.st_dev, status.st_ino);
  if (inImage) return inImage;
  std::string resolved = RealPath(path);
  if (S_ISDIR(status.st_mode) || IsMadeVisible(host, resolved)) return resolved;
  return std::nullopt;
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
  return AsResult([&]() -> long {
    std::string path = ReadString(arguments[1], ZekCtl::Kernel::kPathBytes);
    const std::string resolved = host.point.Pass(
        Operation::kResolvePath, [&] { return path; }, [&] { return RealPath(path); });
    WriteMemory(arguments[2], resolved.c_str(), resolved.size() + 1);
    return 0;
  });
}

long AnswerSetAttribute(const AttachedHost& host, const CallArguments& arguments) noexcept {
  const std::uint64_t path = arguments[0];
  const std::uint64_t name = arguments[1];
  const std::uint64_t value = arguments[2];
  const std::uint64_t size = arguments[3];
  const std::uint64_t flags = arguments[4];
  return AsResult([&]() -> long {
    LabelId label = 0;
    const MemoryAhead memory({{name, XATTR_NAME_MAX + 1}, {path, PATH_MAX}, {value, sizeof label}});
    if (!NamesLabel(memory, name)) {
      return SecpolicyGatePassThrough(SYS_setxattr, arguments.data());
    }
    const auto labelledPath = LabelledPath(host, memory, path);
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
  return AsResult([&]() -> long {
    const MemoryAhead memory({{name, XATTR_NAME_MAX + 1}, {path, PATH_MAX}});
    if (!NamesLabel(memory, name)) return SecpolicyGatePassThrough(SYS_getxattr, arguments.data());
    const auto labelledPath = LabelledPath(host, memory, path);
    if (!labelledPath) throw BadArgument{ENODATA};
    const LabelId label = host.module.FileLabel(*labelledPath);
    if (size == 0) return sizeof label;
    if (size < sizeof label) throw BadArgument{ERANGE};
    WriteMemory(value, &label, sizeof label);
    return sizeof label;
  });
}

}  // namespace StandIn
