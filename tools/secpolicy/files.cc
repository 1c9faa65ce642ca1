// secpolicy files list|add|update|remove|rename|count
#include <algorithm>
#include <iostream>
#include <memory>
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
  bool isJson = false;
  std::string domain;  // a name or an id
  std::string path;
  std::string newPath;
  std::string permission;
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
      std::cout << letters << " " << Printable(rule.path) << "\n";
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
  rule.permission = ParsePermission(arguments.permission);
  unsigned int taken = 0;
  SecPolicy::AddFilePolicyBatch(arguments.world, DomainOf(arguments), &rule, 1, &taken);
}

void Update(const FilesArguments& arguments) {
  SecPolicy::UpdateFilePolicy(DomainOf(arguments), arguments.path,
                              ParsePermission(arguments.permission));
}

void Remove(const FilesArguments& arguments) {
  SecPolicy::RemoveFilePolicy(arguments.world, DomainOf(arguments), arguments.path);
}

void Rename(const FilesArguments& arguments) {
  SecPolicy::ReplaceFilePolicyVMs(arguments.path, arguments.newPath);
}

// For CLI11: the text of what is wrong with a permission, or nothing.
std::string PermissionProblem(const std::string& letters) try {
  ParsePermission(letters);
  return {};
} catch (const std::invalid_argument& problem) {
  return problem.what();
}

// Puts the verbs below "files" together.
class Verbs {
 public:
  explicit Verbs(CLI::App& files) : files_(files) {}

  // A verb which does `run` in the host; the options below are added to the last one.
  Verbs& Add(const char* name, const char* description, void (*run)(const FilesArguments&)) {
    verb_ = files_.add_subcommand(name, description);
    AddHostOption(*verb_, arguments_->host);
    verb_->callback([arguments = arguments_, run] {
      const auto session = EnterHost(arguments->host);
      run(*arguments);
    });
    return *this;
  }
  Verbs& Domain() { return Required("DOMAIN", arguments_->domain, "Its name or its id"); }
  Verbs& Path(const char* name = "PATH") {
    return Required(name, arguments_->path, "The path that the rule is for");
  }
  Verbs& NewPath() { return Required("NEW", arguments_->newPath, "The path that it gets"); }
  Verbs& Permission() {
    verb_->add_option("PERMISSION", arguments_->permission, R"(Letters of "rwx", or "-" for none)")
        ->required()
        ->check(PermissionProblem);
    return *this;
  }
  Verbs& World() {
    verb_->add_option("--world", arguments_->world,
                      "The one process that the rule is for; without it, the whole domain");
    return *this;
  }
  Verbs& Json() {
    AddJsonOption(*verb_, arguments_->isJson);
    return *this;
  }

 private:
  Verbs& Required(const char* name, std::string& value, const char* description) {
    verb_->add_option(name, value, description)->required();
    return *this;
  }

  CLI::App& files_;
  CLI::App* verb_ = nullptr;
  std::shared_ptr<FilesArguments> arguments_ = std::make_shared<FilesArguments>();
};

}  // namespace

void AddFiles(CLI::App& app, ExitStatus&) {
  CLI::App* files = app.add_subcommand("files", "Read and change a domain's file rules directly");
  files->require_subcommand(1);
  Verbs verbs(*files);
  verbs.Add("list", "List a domain's file rules", List).Domain().Json();
  verbs.Add("add", "Add a rule, or give an existing one another permission", Add)
      .Domain()
      .Path()
      .Permission()
      .World();
  verbs.Add("update", "Give the rules of a path another permission", Update)
      .Domain()
      .Path()
      .Permission();
  verbs.Add("remove", "Remove a rule", Remove).Domain().Path().World();
  verbs.Add("rename", "Rename a path in the rules of all domains", Rename).Path("OLD").NewPath();
  verbs.Add("count", "Print the number of a domain's file rules", Count).Domain().Json();
}

}  // namespace SecPolicyTool
