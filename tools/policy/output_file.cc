#include "tools/policy/output_file.h"

#include <fcntl.h>

#include <cerrno>
#include <filesystem>

#include "host/image/file_io.h"
#include "host/image/system_failure.h"
#include "host/image/unique_fd.h"
#include "secpolicy/host/host_error.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

namespace fs = std::filesystem;

namespace {

// The file that `path` is, or leads to.
fs::path FileBehind(const std::string& path) {
  std::error_code error;
  const fs::file_status status = fs::status(path, error);
  if (fs::exists(status) && !fs::is_regular_file(status)) {
    throw StandIn::HostError(Printable(path) + ": not a regular file");
  }
  fs::path file = fs::weakly_canonical(path, error);
  return error ? fs::path(path) : file;
}

}  // namespace

void WriteOutputFile(const std::string& path, const std::string& text) {
  const fs::path file = FileBehind(path);
  const fs::path parent = file.has_parent_path() ? file.parent_path() : ".";
  const StandIn::UniqueFd directory(open(parent.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
  if (!directory.IsOpen()) throw StandIn::SystemFailure(Printable(path), "written", errno);
  StandIn::ReplaceFile({directory.Get(), Printable(parent.string())}, file.filename().string(),
                       text);
}

}  // namespace SecPolicyTool
