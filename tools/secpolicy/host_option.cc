#include "tools/secpolicy/host_option.h"

#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <filesystem>

#include "host/module/description_json.h"
#include "host/root/assemble.h"
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

HostDirectory OpenOwnHost(const StandIn::ChangeOptions& changes) {
  const fs::path dir = StateDirectory() / "secpolicy" / "host";
  if (!fs::exists(dir / StandIn::kDescriptionFile)) {
    HostDirectory::Create(dir.string(), StandIn::DefaultDescriptionText());
  }
  HostDirectory host(dir.string());
  host.SetChanges(changes);
  if (!fs::exists(dir / StandIn::kIndexFile)) StandIn::Assemble(host);
  return host;
}

}  // namespace

CommandOption HostOption(std::string& dir) {
  return {.names = {"--host"},
          .value = "DIR",
          .description =
              "The host directory; without it, one of your own is used, and made on first use",
          .store = Into(dir)};
}

CommandOption HostOperand(std::string& dir, const std::string& description) {
  return {.names = {"DIR"},
          .value = "DIR",
          .description = description,
          .store = Into(dir),
          .isRequired = true};
}

CommandOption JsonOption(bool& isJson) {
  return {.names = {"--json"}, .description = "Print JSON, for programs", .store = Into(isJson)};
}

void AddChangeOptions(CommandLine& verb, StandIn::ChangeOptions& changes) {
  constexpr std::int64_t kLongestWait = std::chrono::seconds(std::chrono::hours(24)).count();
  verb.options.push_back({.names = {"--wait"},
                          .value = "SECONDS",
                          .description = "Wait so long for another process that changes the host",
                          .store =
                              [&changes](const std::string& text) {
                                changes.wait =
                                    std::chrono::seconds(WholeNumber(text, 0, kLongestWait));
                              },
                          .defaultValue = std::to_string(StandIn::kLockWait.count())});
  verb.options.push_back(
      {.names = {"--trust-other-writers"},
       .description = "As root, work also in a directory that other users can write to",
       .store = [&changes](const std::string&) {
         changes.otherWriters = StandIn::OtherWriters::kTrusted;
       }});
}

HostDirectory OpenHost(const std::string& dir, const StandIn::ChangeOptions& changes) {
  HostDirectory host = dir.empty() ? OpenOwnHost(changes) : HostDirectory(dir);
  host.SetChanges(changes);
  return host;
}

}  // namespace SecPolicyTool
