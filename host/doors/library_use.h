// The library's use of a kernel of this process.
#pragma once

#include <cerrno>
#include <string>
#include <utility>

#include "core/well_known_domains.h"
#include "host/kernel/kernel.h"
#include "platform/tavon_exception.h"

namespace StandIn {

// Gets what the library says.
class LibraryOutput {
 public:
  virtual ~LibraryOutput() = default;

  // Progress, as it goes to the system log.
  virtual void OnInfo(const std::string& message) = 0;
  // An error. `failure` is the exception that reports it; null where none does.
  virtual void OnError(const std::string& message, const Tavon::Lib::TavonException* failure) = 0;
  // A line of a display, without its end.
  virtual void OnPrint(const std::string& line) = 0;
};

// While it lives, the library in this thread works on `kernel`: private calls, labels and resolved
// paths are the kernel's, files are those of its root, and what the library says goes to `output`.
// Other threads may use other kernels at the same time. Nested uses end in reverse order, in the
// thread that began them.
//
// `policyDir`, unless it is empty, is a policy directory of the machine. The library finds its
// sub-directories "objects", "domains" and "fileLabels" there, and everything else in the kernel's
// root, so that the same path in both hides nothing.
class LibraryUse {
 public:
  LibraryUse(Kernel& kernel, LibraryOutput& output, std::string policyDir = {});
  ~LibraryUse();
  LibraryUse(const LibraryUse&) = delete;
  LibraryUse& operator=(const LibraryUse&) = delete;

  // That of this thread; null when there is none.
  static LibraryUse* Current() noexcept;

  [[nodiscard]] Kernel& UsedKernel() noexcept { return kernel_; }
  [[nodiscard]] LibraryOutput& Output() noexcept { return output_; }
  [[nodiscard]] SecPolicy::WellKnownDomains& Domains() noexcept { return domains_; }
  // Whether a file could not be opened, since this process has as many open as it may, after the
  // last call of this.
  [[nodiscard]] bool TakeDescriptorShortage() noexcept {
    return std::exchange(isShortOfDescriptors_, false);
  }
  // To be called with the errno of a failure.
  void NoteFailure(int number) noexcept { isShortOfDescriptors_ |= number == EMFILE; }

  // Whether a policy file or a directory of such is the machine's, and not the root's.
  [[nodiscard]] bool IsOnMachine(const std::string& path) const noexcept;

 private:
  Kernel& kernel_;
  LibraryOutput& output_;
  std::string policyDir_;
  SecPolicy::WellKnownDomains domains_;
  bool isShortOfDescriptors_ = false;
  ThreadAttachment attachment_;
  LibraryUse* before_;
};

enum class LoadEnd {
  kDone,
  kFailed,      // with errors, all of which were reported
  kTerminated,  // a domain that the host needs is missing; tardisks and file labels were not set
};

// LoadPolicy of `dir` in the present use of the library. The exception that ends a load is reported
// to the use's output as an error too. Throws what is no TavonException.
LoadEnd RunLoad(const std::string& dir);

}  // namespace StandIn
