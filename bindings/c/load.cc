// Loading a policy into a host's kernel.
#include <algorithm>
#include <nlohmann/json.hpp>
#include <utility>

#include "bindings/c/text.h"
#include "tools/check/load_errors.h"
#include "tools/policy/batch_load.h"
#include "tools/policy/library_output.h"
#include "tools/policy/policy_path.h"
#include "tools/requests/held_json.h"

using nlohmann::json;
using SecPolicyC::Failure;
using SecPolicyTool::PolicyPath;
using StandIn::HostDirectory;
using StandIn::LoadEnd;

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

struct LoadResult {
  secpolicy_status status;
  const char* name;
};

LoadResult ResultOf(LoadEnd end) {
  switch (end) {
    case LoadEnd::kDone:
      return {SECPOLICY_OK, "done"};
    case LoadEnd::kFailed:
      return {SECPOLICY_LOAD_FAILED, "failed"};
    case LoadEnd::kTerminated:
      break;
  }
  return {SECPOLICY_LOAD_TERMINATED, "terminated"};
}

// Keeps the errors, and logs what a load logs under the caller's own name.
class LoggedErrors final : public StandIn::LibraryOutput {
 public:
  void OnInfo(const std::string& message) override { SecPolicyTool::LogProgress(message); }
  void OnError(const std::string& message, const Tavon::Lib::TavonException*) override {
    texts.push_back(message);
    SecPolicyTool::LogFailure(message);
  }
  void OnPrint(const std::string&) override {}

  std::vector<std::string> texts;
};

// The error that stands for all: the first that names a line.
json ToldOf(const json& errors) {
  const auto isPlaced = [](const json& error) { return error.contains("line"); };
  const auto told = std::find_if(errors.begin(), errors.end(), isPlaced);
  if (told != errors.end()) return *told;
  if (errors.empty()) return {{"message", ""}};
  return errors.front();
}

Failure LoadFailure(secpolicy_status status, const json& told) {
  return {status, told["message"], told.value("file", ""), told.value("line", 0U)};
}

// Stores the description of what came of the load in `text`. Throws Failure, with the description
// stored, for a load that was not done without errors.
void Load(const std::string& hostPath, const std::string& dir, std::string& text) {
  const PolicyPath policy = SecPolicyTool::LocatePolicy(dir);
  StandIn::Kernel kernel{HostDirectory(hostPath), {}};
  SecPolicyTool::RequireDirectory(policy.Files(kernel));
  LoggedErrors logged;
  const LoadResult result = ResultOf(SecPolicyTool::LoadInBatch(policy, kernel, logged));
  kernel.Commit();
  const json errors = ErrorsJson(logged.texts, policy);
  text = SecPolicyTool::TextOfJson({{"source", dir},
                                    {"outcome", result.name},
                                    {"errors", errors},
                                    {"installed", SecPolicyTool::HeldJson(kernel, std::nullopt)}});
  if (result.status != SECPOLICY_OK) throw LoadFailure(result.status, ToldOf(errors));
}

}  // namespace

extern "C" secpolicy_status secpolicy_load(const secpolicy_host* host, const char* directory,
                                           secpolicy_text** result, secpolicy_error** error) {
  if (result != nullptr) *result = nullptr;
  return SecPolicyC::Guarded(error, [&] {
    SecPolicyC::RequireSet(host, "host");
    const std::string dir = SecPolicyC::PolicyDirOf(directory, "directory");
    auto text = std::make_unique<secpolicy_text>("");
    const auto hand = [&] {
      if (result != nullptr) *result = text.release();
    };
    try {
      Load(host->path, dir, text->value);
    } catch (const Failure&) {
      hand();
      throw;
    }
    hand();
  });
}
