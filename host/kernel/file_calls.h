// The kernel's operations on files: paths resolved, and labels stored with files.
#pragma once

#include <sys/stat.h>

#include <cerrno>
#include <new>
#include <optional>
#include <string>

#include "host/attached_host.h"
#include "host/kernel/caller_memory.h"
#include "host/module/module_error.h"

namespace StandIn {

// The files that a caller of the kernel sees. Both leave the reason of a failure in errno.
class CallerFiles {
 public:
  virtual ~CallerFiles() = default;

  // realpath(3) and stat(2).
  [[nodiscard]] virtual std::optional<std::string> Resolve(const std::string& path) const = 0;
  [[nodiscard]] virtual bool Status(const std::string& path, struct stat& status) const = 0;
};

// The path as the kernel sees it, an operation of its own. ModuleError with the errno where it
// cannot be resolved.
std::string ResolvedPath(const AttachedHost& host, const CallerFiles& files,
                         const std::string& path);

// The path under which the label of the file `path` is kept; nothing for a file that carries none.
// BadArgument with the errno where there is no such file.
std::optional<std::string> LabelledPath(const AttachedHost& host, const CallerFiles& files,
                                        const std::string& path);

// Runs `call`, which returns a number that is not negative; what it throws becomes a negative
// errno.
template <typename Call>
long AsCallResult(const Call& call) noexcept try {
  return call();
} catch (const ModuleError& refusal) {
  return refusal.Number() != 0 ? -refusal.Number() : -EIO;
} catch (const BadArgument& argument) {
  return -argument.number;
} catch (const std::bad_alloc&) {
  return -ENOMEM;
} catch (...) {
  return -EIO;
}

}  // namespace StandIn
