#include "tools/secpolicy/host_option.h"

#include <cstdlib>
#include <filesystem>

#include "host/image/assemble.h"
#include "host/module/description_json.h"
#include "secpolicy/host/host_error.h"

namespace SecPolicyTool {

using StandIn::HostDirectory;
using StandIn::HostError;

namespace {

namespace fs = std::filesystem;

// An environment variable that holds an absolute path; others are to be ignored.
fs::path PathVariable(const char* name) {
  const char* value = std::getenv(name);
  const fs::path path = value == nullptr ? "" : value;
  return path.is_absolute() ? path : fs::path();
}

fs::path StateDirectory() {
  if (fs::path state = PathVariable("XDG_STATE_HOME"); !state.empty()) return state;
  const fs::path home = PathVariable("HOME");
  if (home.empty()) {
    throw HostError(
        "there is no directory for a host of your own: neither XDG_STATE_HOME nor HOME "
        "is set; name a host with --host DIR");
  }
  return home / ".local" / "state";
}

HostDirectory OpenOwnHost() {
  const fs::path dir = StateDirectory() / "secpolicy" / "host";
  if (!fs::exists(dir / StandIn::kDescriptionFile)) {
    HostDirectory::Create(dir.string(), StandIn::DefaultDescriptionText());
  }
  HostDirectory host(dir.string());
  if (!fs::exists(dir / StandIn::kIndexFile)) StandIn::Assemble(host);
  return host;
}

}  // namespace

void AddHostOption(CLI::App& verb, std::string& dir) {
  verb.add_option("--host", dir,
                  "The host directory; without it, one of your own is used, and made on first use")
      ->type_name("DIR");
}

void AddJsonOption(CLI::App& verb, bool& isJson) {
  verb.add_flag("--json", isJson, "Print JSON, for programs");
}

HostDirectory OpenHost(const std::string& dir) {
  return dir.empty() ? OpenOwnHost() : HostDirectory(dir);
}

}  // namespace SecPolicyTool
