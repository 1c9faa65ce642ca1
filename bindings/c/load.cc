// Loading a policy into a host's kernel.
#include <syslog.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <utility>

#include "bindings/c/text.h"
#include "tools/check/load_errors.h"
#include "tools/policy/held_policy.h"
#include "tools/policy/host_work.h"
#include "tools/policy/policy_path.h"
#include "tools/requests/batch_load.h"
#include "tools/requests/held_json.h"

using nlohmann::json;
using SecPolicyC::Failure;
using SecPolicyC::Fields;
using SecPolicyTool::HostWork;
using SecPolicyTool::LoadEnd;
using SecPolicyTool::PolicyPath;
using StandIn::HostDirectory;
using StandIn::Session;

namespace {

// A load says where in a domain's file an error is by the domain's name.
std::string FileOf(const SecPolicyTool::LoadError& error, const PolicyPath& policy) {
  if (error.file.empty() || error.file.starts_with('/')) return error.file;
  return policy.path + "/domains/" + error.file;
}

json ErrorsJson(const std::vector<std::string>& texts, const PolicyPath& policy) {
  json errors = json::array();
  for (const std::string& text : texts) {
    const SecPolicyTool::LoadError error = SecPolicyTool::ParseLoadError(text);
    json entry{{"message", text}};
    if (error.line != 0) {
      entry["file"] = FileOf(error, policy);
      entry["line"] = error.line;
    }
    errors.push_back(std::move(entry));
  }
  return errors;
}

secpolicy_status StatusOf(const HostWork& outcome) {
  if (outcome.wasTerminated) return SECPOLICY_LOAD_TERMINATED;
  return outcome.result.at("isDone").get<bool>() ? SECPOLICY_OK : SECPOLICY_LOAD_FAILED;
}

const char* NameOf(secpolicy_status status) {
  if (status == SECPOLICY_OK) return "done";
  return status == SECPOLICY_LOAD_FAILED ? "failed" : "terminated";
}

// In a process of the host's, whose kernel keeps what is installed.
HostWork LoadInHost(HostDirectory host, const PolicyPath& policy) {
  // Before the root directory changes: the connection to the system log stays.
  openlog("secpolicy", LOG_NDELAY, LOG_USER);
  const StandIn::ImageIndex image = SecPolicyTool::ImageOf(host);
  StandIn::SessionOptions options;
  options.visible = policy.visible;
  LoadEnd end = LoadEnd::kFailed;
  return SecPolicyTool::WorkInHost(
      std::move(host), options,
      [&](Session& session) {
        SecPolicyTool::RequireDirectory(policy);
        end = SecPolicyTool::LoadInBatch(session, policy.path);
      },
      [&](Session& session) -> json {
        session.Commit();
        return {{"isDone", end == LoadEnd::kDone},
                {"installed", SecPolicyTool::HeldJson(session.Module(), image, std::nullopt)}};
      });
}

// The error that stands for all: the first that names a line.
json ToldOf(const json& errors) {
  const auto isPlaced = [](const json& error) { return error.contains("line"); };
  const auto told = std::find_if(errors.begin(), errors.end(), isPlaced);
  if (told != errors.end()) return *told;
  if (errors.empty()) return {{"message", ""}};
  return errors.front();
}

// What a load gives to the calling process.
enum Field : std::size_t { kStatus, kText, kMessage, kFile, kLine };

Fields Load(const std::string& hostPath, const std::string& dir) {
  const PolicyPath policy = SecPolicyTool::LocatePolicy(dir);
  HostWork outcome = LoadInHost(HostDirectory(hostPath), policy);
  const secpolicy_status status = StatusOf(outcome);
  const json errors = ErrorsJson(outcome.errors, policy);
  const json told = ToldOf(errors);
  return {std::to_string(status),
          SecPolicyTool::TextOfJson({{"source", dir},
                                     {"outcome", NameOf(status)},
                                     {"errors", errors},
                                     {"installed", std::move(outcome.result["installed"])}}),
          told["message"], told.value("file", ""), std::to_string(told.value("line", 0U))};
}

Failure LoadFailure(secpolicy_status status, Fields& loaded) {
  return {status, std::move(loaded[kMessage]), std::move(loaded[kFile]),
          static_cast<std::uint32_t>(std::stoul(loaded[kLine]))};
}

}  // namespace

extern "C" secpolicy_status secpolicy_load(const secpolicy_host* host, const char* directory,
                                           secpolicy_text** result, secpolicy_error** error) {
  if (result != nullptr) *result = nullptr;
  return SecPolicyC::Guarded(error, [&] {
    SecPolicyC::RequireSet(host, "host");
    const std::string dir = SecPolicyC::PolicyDirOf(directory, "directory");
    Fields loaded = SecPolicyC::InChild([&] { return Load(host->path, dir); });
    const auto status = static_cast<secpolicy_status>(std::stoi(loaded.at(kStatus)));
    auto text = std::make_unique<secpolicy_text>(std::move(loaded.at(kText)));
    Failure failure = LoadFailure(status, loaded);
    if (result != nullptr) *result = text.release();
    if (status != SECPOLICY_OK) throw Failure(std::move(failure));
  });
}
