#include "tools/policy/output_file.h"

#include <fcntl.h>

#include <cerrno>
#include <filesystem>

#include "host/files/file_io.h"
#include "host/files/system_failure.h"
#include "host/files/unique_fd.h"
#include "host/text/escaped.h"
#include "secpolicy/host/host_error.h"

namespace SecPolicyTool {

namespace fs = std::filesystem;
using StandIn::Escaped;

namespace {

// The file that `path` is, or leads to.
fs::path FileBehind(const std::string& path) {
  std::error_code error;
  const fs::file_status status = fs::status(path, error);
  if (fs::exists(status) && !fs::is_regular_file(status)) {
    throw StandIn::HostError(Escaped(path).Text() + ": not a regular file");
  }
  fs::path file = fs::weakly_canonical(path, error);
  return error ? fs::path(path) : file;
}

}  // namespace

void WriteOutputFile(const std::string& path, const std::string& text) {
  const fs::path file = FileBehind(path);
  const fs::path parent = file.has_parent_path() ? file.parent_path() : ".";
  const StandIn::UniqueFd directory(open(parent.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
  if (!directory.IsOpen()) throw StandIn::SystemFailure(Escaped(path).Text(), "written", errno);
  StandIn::ReplaceFile({directory.Get(), Escaped(parent.string()).Text()}, file.filename().string(),
                       text);
}

}  // namespace SecPolicyTool
