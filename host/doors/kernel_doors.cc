// Private calls, resolved paths and labels, answered by the kernel that this thread uses.
#include <fcntl.h>

#include <algorithm>
#include <cerrno>

#include "core/well_known_domains.h"
#include "host/doors/library_use.h"
#include "host/kernel/file_calls.h"
#include "host/kernel/private_call_answers.h"
#include "kernel/path_resolution.h"
#include "kernel/system_call.h"
#include "labels/security_attribute.h"

namespace SecPolicy {

using StandIn::AttachedHost;
using StandIn::LibraryUse;

namespace {

class RootFiles final : public StandIn::CallerFiles {
 public:
  explicit RootFiles(const StandIn::FileTree& tree) : tree_(tree) {}

  [[nodiscard]] std::optional<std::string> Resolve(const std::string& path) const override {
    return tree_.Resolve(path);
  }
  [[nodiscard]] bool Status(const std::string& path, struct stat& status) const override {
    const StandIn::UniqueFd file = tree_.Open(path, O_PATH);
    return file.IsOpen() && fstat(file.Get(), &status) == 0;
  }

 private:
  const StandIn::FileTree& tree_;
};

// What `call` returns for the kernel in use and its files; a failure, with the reason in errno, is
// negative.
template <typename Call>
long Ask(const Call& call) {
  const AttachedHost* host = StandIn::Attached();
  const long result = host == nullptr ? -ENOSYS : StandIn::AsCallResult([&] {
    return call(*host, RootFiles(host->files.Tree()));
  });
  if (result >= 0) return result;
  const auto number = static_cast<int>(-result);
  if (LibraryUse* use = LibraryUse::Current()) use->NoteFailure(number);
  errno = number;
  return result;
}

}  // namespace

PrivateCallResult IssueSystemCall(long number, const PrivateCallArguments& arguments) {
  const AttachedHost* host = StandIn::Attached();
  if (host == nullptr || !StandIn::IsPrivateCall(number)) return {-ENOSYS, 0};
  StandIn::CallArguments widened{};
  std::copy(arguments.begin(), arguments.end(), widened.begin());
  StandIn::OwnMemory memory;
  const StandIn::PrivateAnswer answer = StandIn::AnswerPrivateCall(*host, number, widened, memory);
  return {answer.status, answer.error};
}

bool ResolvePath(const std::string& path, ZekAccess_FileRule& rule) {
  return Ask([&](const AttachedHost& host, const RootFiles& files) -> long {
           const std::string resolved = StandIn::ResolvedPath(host, files, path);
           resolved.copy(rule.path, resolved.size());
           rule.path[resolved.size()] = '\0';
           return 0;
         }) == 0;
}

int ReplaceLabelId(const std::string& path, std::uint32_t id) {
  const long result = Ask([&](const AttachedHost& host, const RootFiles& files) -> long {
    const auto labelled = StandIn::LabelledPath(host, files, path);
    if (!labelled) throw StandIn::BadArgument{ENODATA};
    host.module.SetFileLabel(*labelled, id);
    return 0;
  });
  return result < 0 ? -1 : 0;
}

std::optional<std::uint32_t> ReadLabelId(const std::string& path) {
  std::uint32_t id = 0;
  const long result = Ask([&](const AttachedHost& host, const RootFiles& files) -> long {
    const auto labelled = StandIn::LabelledPath(host, files, path);
    if (!labelled) throw StandIn::BadArgument{ENODATA};
    id = host.module.FileLabel(*labelled);
    return 0;
  });
  return result < 0 ? std::nullopt : std::optional(id);
}

WellKnownDomains& KnownDomains() noexcept {
  static thread_local WellKnownDomains ofNone;
  LibraryUse* use = LibraryUse::Current();
  return use != nullptr ? use->Domains() : ofNone;
}

}  // namespace SecPolicy
