// secpolicy label get|set|verify
#include <unistd.h>

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "host/doors/library_use.h"
#include "secpolicy/secpolicy.h"
#include "tools/labels/descriptor_limit.h"
#include "tools/labels/label_tree.h"
#include "tools/policy/label_lines.h"
#include "tools/policy/output.h"
#include "tools/policy/policy_json.h"
#include "tools/policy/policy_path.h"
#include "tools/policy/progress.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/host_use.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

using nlohmann::json;
using SecPolicy::ZekAccessInterfaceImpl;
using StandIn::FileTree;

namespace {

struct LabelArguments {
  std::string host;
  StandIn::ChangeOptions changes;
  bool isJson = false;
  std::string path;
  std::string label;
  std::string policy;
  bool isTree = false;
  bool isDryRun = false;

  [[nodiscard]] Extent Reach() const { return isTree ? Extent::kTree : Extent::kFile; }
};

// What was found out about the files that a verb visits.
struct Results {
  json rows = json::array();
  ExitStatus status = kDone;

  void Fail(const std::string& text) {
    ReportError(text);
    status = kFailed;
  }
};

// Files are the host's, whose working directory is its root.
void RequireAbsolute(const std::string& path) {
  if (!path.starts_with('/')) {
    throw std::runtime_error("\"" + path + "\" is not absolute: a path in the host begins with /");
  }
}

// Hands the label of each file to `use`; one that cannot be read is reported.
template <typename Use>
void ForEachLabel(const FileTree& root, const LabelArguments& arguments, Results& results,
                  const Use& use) {
  ZekAccessInterfaceImpl iface;
  Progress progress("Reading labels");
  ForEachLabelled(root, arguments.path, arguments.Reach(), [&](const std::string& path) {
    progress.Step();
    std::string label;
    try {
      label = SecPolicy::GetFileLabel(path, iface);
    } catch (const Tavon::Lib::TavonException& failure) {
      progress.Clear();
      return results.Fail(failure.what());
    }
    use(path, label);
  });
}

void Get(const FileTree& root, const LabelArguments& arguments, Results& results) {
  ForEachLabel(root, arguments, results, [&](const std::string& path, const std::string& label) {
    if (arguments.isJson) {
      results.rows.push_back({{"path", path}, {"label", label}});
    } else {
      std::cout << (TerminalText(label) + " " + path).EndLine();
    }
  });
  if (arguments.isJson) PrintJson({{"files", results.rows}});
}

// What Set would change.
void ShowChanges(const FileTree& root, const LabelArguments& arguments, Results& results) {
  ZekAccessInterfaceImpl iface;
  iface.LookupLabel(arguments.label, ZekCtl::Security::kObjectLabel);
  ForEachLabel(root, arguments, results, [&](const std::string& path, const std::string& label) {
    if (label == arguments.label) return;
    std::cout << (TerminalText(path) + ": " + label + " -> " + arguments.label).EndLine();
  });
}

void SetLabels(const LabelArguments& arguments) {
  ZekAccessInterfaceImpl iface;
  if (arguments.isTree) {
    SecPolicy::SetDirLabelRecursive(arguments.path, arguments.label, iface);
  } else {
    SecPolicy::SetFileLabel(arguments.path, arguments.label, iface);
  }
}

// `path`, which is `dir` or lies below it, by way of `resolved` in place of `dir`.
std::string Below(const std::string& resolved, const std::string& dir, const std::string& path) {
  std::string below = path.substr(dir.size());
  if (!below.empty() && !below.starts_with('/') && !resolved.ends_with('/')) below.insert(0, "/");
  return resolved + below;
}

// Compares the files' labels with those that the policy gives them.
void Verify(const FileTree& root, const LabelArguments& arguments, const PolicyFiles& files,
            Results& results) {
  const LabelLines lines(files, root);
  // Links are looked for once: there are none between a tree's root and its files.
  const std::string resolved = root.ResolvedOrSame(arguments.path);
  ForEachLabel(root, arguments, results, [&](const std::string& path, const std::string& label) {
    const LabelLine* line = lines.LineFor(Below(resolved, arguments.path, path));
    if (line == nullptr || line->label == label) return;
    results.status = kFailed;
    if (arguments.isJson) {
      results.rows.push_back({{"path", path},
                              {"label", label},
                              {"expected", line->label},
                              {"place", ToJson(line->place)}});
    } else {
      std::cout << (TerminalText(path) + ": " + label + ", not " + line->label + " (" +
                    PlaceText(line->place) + ")")
                       .EndLine();
    }
  });
  if (arguments.isJson) PrintJson({{"differences", results.rows}});
}

ExitStatus RunGet(const LabelArguments& arguments) {
  return ReadHost(arguments.host, [&](StandIn::Kernel& kernel) {
    Results results;
    Get(kernel.Files().Tree(), arguments, results);
    return results.status;
  });
}

ExitStatus RunDry(const LabelArguments& arguments) {
  return ReadHost(arguments.host, [&](StandIn::Kernel& kernel) {
    Results results;
    ShowChanges(kernel.Files().Tree(), arguments, results);
    return results.status;
  });
}

ExitStatus RunSet(const LabelArguments& arguments) {
  if (arguments.isDryRun) return RunDry(arguments);
  StandIn::KernelOptions options;
  Progress progress("Setting labels");
  // One operation sets one label; their lines are put together only for who is shown the progress.
  if (isatty(STDERR_FILENO) == 1) options.trace = [&](const std::string&) { progress.Step(); };
  const auto set = [&](StandIn::Kernel&) {
    Results results;
    try {
      SetLabels(arguments);
    } catch (const std::exception& failure) {
      // What was set before a failure stays set.
      results.Fail(failure.what());
      if (StandIn::LibraryUse::Current()->TakeDescriptorShortage()) {
        results.Fail(DescriptorLimitReason());
      }
    }
    return results.status;
  };
  return ChangeHost(arguments.host, arguments.changes, set, options);
}

// Throws as a load does of a directory of file labels that cannot be opened.
void RequireFileLabels(const PolicyFiles& files) {
  const std::string dir = files.path + "/fileLabels";
  if (!files.tree.IsDirectory(dir)) {
    throw std::runtime_error("Unable to open policy directory " + dir);
  }
}

ExitStatus RunVerify(const LabelArguments& arguments) {
  const PolicyPath policy = LocatePolicy(arguments.policy);
  return ReadHost(arguments.host, [&](StandIn::Kernel& kernel) {
    Results results;
    const PolicyFiles files = policy.Files(kernel);
    RequireFileLabels(files);
    Verify(kernel.Files().Tree(), arguments, files, results);
    return results.status;
  });
}

using SharedLabelArguments = std::shared_ptr<LabelArguments>;

// A verb below "label" which does `run` with the files below PATH.
CommandLine LabelVerbOf(const char* name, const char* description,
                        const SharedLabelArguments& arguments,
                        ExitStatus (*run)(const LabelArguments&)) {
  return {.name = name,
          .description = description,
          .options = {HostOption(arguments->host),
                      {.names = {"-R", "--recursive"},
                       .description =
                           "The directory and everything below it, links and sockets excepted",
                       .store = Into(arguments->isTree)}},
          .operands = {{.names = {"PATH"},
                        .description = "An absolute path in the host",
                        .store = Into(arguments->path),
                        .isRequired = true}},
          .run = [arguments, run] {
            RequireAbsolute(arguments->path);
            return run(*arguments);
          }};
}

CommandLine GetVerb(const SharedLabelArguments& arguments) {
  CommandLine verb = LabelVerbOf("get", "Print the labels of files", arguments, RunGet);
  verb.options.push_back(JsonOption(arguments->isJson));
  return verb;
}

CommandLine SetVerb(const SharedLabelArguments& arguments) {
  CommandLine verb = LabelVerbOf("set", "Set the labels of files", arguments, RunSet);
  verb.operands.push_back({.names = {"LABEL"},
                           .description = "The object label",
                           .store = Into(arguments->label),
                           .isRequired = true});
  verb.options.push_back({.names = {"-n", "--dry-run"},
                          .description = "Only show what would change",
                          .store = Into(arguments->isDryRun)});
  AddChangeOptions(verb, arguments->changes);
  return verb;
}

CommandLine VerifyVerb(const SharedLabelArguments& arguments) {
  CommandLine verb =
      LabelVerbOf("verify", "List the files that carry another label than a policy gives them",
                  arguments, RunVerify);
  verb.options.push_back(
      {.names = {"--policy"},
       .value = "DIR",
       .description = "The policy directory; without it, the host's own /etc/olvane/secpolicy",
       .store = Into(arguments->policy)});
  verb.options.push_back(JsonOption(arguments->isJson));
  return verb;
}

}  // namespace

CommandLine LabelVerb() {
  const auto arguments = std::make_shared<LabelArguments>();
  return {.name = "label",
          .description = "Read, set and compare the labels of files",
          .verbs = {GetVerb(arguments), SetVerb(arguments), VerifyVerb(arguments)}};
}

}  // namespace SecPolicyTool
