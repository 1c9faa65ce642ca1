// secpolicy files list|add|update|remove|rename|count
#include <algorithm>
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "secpolicy/secpolicy.h"
#include "tools/kernel/permission.h"
#include "tools/kernel/tables.h"
#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/host_use.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

using nlohmann::json;
using SecPolicy::ZekAccess_FileRule;

namespace {

struct FilesArguments {
  std::string host;
  StandIn::ChangeOptions changes;
  bool isJson = false;
  std::string domain;  // a name or an id
  std::string path;
  std::string newPath;
  std::uint32_t permission = 0;
  int world = 0;
};

unsigned int DomainOf(const FilesArguments& arguments) {
  SecPolicy::ZekAccessInterfaceImpl iface;
  return SecPolicyTool::DomainOf(arguments.domain, iface);
}

void List(const FilesArguments& arguments) {
  json rows = json::array();
  for (const ZekAccess_FileRule& rule : ReadFileRules(DomainOf(arguments))) {
    const std::string letters = PermissionText(rule.permission);
    if (arguments.isJson) {
      rows.push_back({{"path", rule.path}, {"permission", letters == "-" ? "" : letters}});
    } else {
      std::cout << letters << " " << TerminalText(rule.path).EndLine();
    }
  }
  if (arguments.isJson) PrintJson({{"files", rows}});
}

void Count(const FilesArguments& arguments) {
  const unsigned int count = SecPolicy::RetrieveNumberOfFilePolicies(DomainOf(arguments));
  if (arguments.isJson) {
    PrintJson({{"count", count}});
  } else {
    std::cout << count << "\n";
  }
}

void Add(const FilesArguments& arguments) {
  ZekAccess_FileRule rule{};
  if (arguments.path.size() >= sizeof rule.path) {
    throw std::runtime_error("the path is longer than " + std::to_string(sizeof rule.path - 1) +
                             " bytes");
  }
  std::copy(arguments.path.begin(), arguments.path.end(), rule.path);
  rule.permission = arguments.permission;
  unsigned int taken = 0;
  SecPolicy::AddFilePolicyBatch(arguments.world, DomainOf(arguments), &rule, 1, &taken);
}

void Update(const FilesArguments& arguments) {
  SecPolicy::UpdateFilePolicy(DomainOf(arguments), arguments.path, arguments.permission);
}

void Remove(const FilesArguments& arguments) {
  SecPolicy::RemoveFilePolicy(arguments.world, DomainOf(arguments), arguments.path);
}

void Rename(const FilesArguments& arguments) {
  SecPolicy::ReplaceFilePolicyVMs(arguments.path, arguments.newPath);
}

using SharedFilesArguments = std::shared_ptr<FilesArguments>;

CommandOption Required(const char* name, const char* description, Store store) {
  return {
      .names = {name}, .description = description, .store = std::move(store), .isRequired = true};
}

CommandOption RuleDomainOperand(const SharedFilesArguments& arguments) {
  return Required("DOMAIN", "Its name or its id", Into(arguments->domain));
}

CommandOption PathOperand(const SharedFilesArguments& arguments, const char* name = "PATH") {
  return Required(name, "The path that the rule is for", Into(arguments->path));
}

CommandOption PermissionOperand(const SharedFilesArguments& arguments) {
  return Required("PERMISSION", R"(Letters of "rwx", or "-" for none)",
                  [arguments](const std::string& letters) {
                    arguments->permission = ParsePermission(letters);
                  });
}

CommandOption WorldOption(const SharedFilesArguments& arguments) {
  return {.names = {"--world"},
          .value = "WORLD",
          .description = "The one process that the rule is for; without it, the whole domain",
          .store = [arguments](const std::string& text) { arguments->world = WorldId(text); }};
}

// A verb below "files" which does `run` in the host.
CommandLine FilesVerbOf(const char* name, const char* description,
                        const SharedFilesArguments& arguments, void (*run)(const FilesArguments&),
                        std::vector<CommandOption> operands,
                        const std::vector<CommandOption>& options = {}) {
  CommandLine verb{.name = name,
                   .description = description,
                   .options = {HostOption(arguments->host)},
                   .operands = std::move(operands),
                   .run = [arguments, run] {
                     return ReadHost(arguments->host, [&](StandIn::Kernel&) {
                       run(*arguments);
                       return kDone;
                     });
                   }};
  verb.options.insert(verb.options.end(), options.begin(), options.end());
  return verb;
}

// The same for one that changes the host.
CommandLine FilesChangeOf(const char* name, const char* description,
                          const SharedFilesArguments& arguments,
                          void (*change)(const FilesArguments&),
                          std::vector<CommandOption> operands,
                          const std::vector<CommandOption>& options = {}) {
  CommandLine verb =
      FilesVerbOf(name, description, arguments, change, std::move(operands), options);
  AddChangeOptions(verb, arguments->changes);
  verb.run = [arguments, change] {
    return ChangeHost(arguments->host, arguments->changes, [&](StandIn::Kernel&) {
      change(*arguments);
      return kDone;
    });
  };
  return verb;
}

}  // namespace

CommandLine FilesVerb() {
  const auto arguments = std::make_shared<FilesArguments>();
  const CommandOption domain = RuleDomainOperand(arguments);
  const CommandOption path = PathOperand(arguments);
  const CommandOption permission = PermissionOperand(arguments);
  const CommandOption jsonOption = JsonOption(arguments->isJson);
  const CommandOption world = WorldOption(arguments);
  return {
      .name = "files",
      .description = "Read and change a domain's file rules directly",
      .verbs = {
          FilesVerbOf("list", "List a domain's file rules", arguments, List, {domain},
                      {jsonOption}),
          FilesChangeOf("add", "Add a rule, or give an existing one another permission", arguments,
                        Add, {domain, path, permission}, {world}),
          FilesChangeOf("update", "Give the rules of a path another permission", arguments, Update,
                        {domain, path, permission}),
          FilesChangeOf("remove", "Remove a rule", arguments, Remove, {domain, path}, {world}),
          FilesChangeOf("rename", "Rename a path in the rules of all domains", arguments, Rename,
                        {PathOperand(arguments, "OLD"),
                         Required("NEW", "The path that it gets", Into(arguments->newPath))}),
          FilesVerbOf("count", "Print the number of a domain's file rules", arguments, Count,
                      {domain}, {jsonOption})}};
}

}  // namespace SecPolicyTool
