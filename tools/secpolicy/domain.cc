// secpolicy domain list|create|destroy|name|of|leaked
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "secpolicy/secpolicy.h"
#include "tools/kernel/tables.h"
#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/host_use.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

using nlohmann::json;
using SecPolicy::ZekAccessInterfaceImpl;

namespace {

struct DomainArguments {
  std::string host;
  StandIn::ChangeOptions changes;
  bool isJson = false;
  std::string domain;  // a name or an id
  int world = 0;
};

void List(const DomainArguments& arguments) {
  ZekAccessInterfaceImpl iface;
  json rows = json::array();
  for (const DomainRow& row : ReadDomains(iface)) {
    if (arguments.isJson) {
      rows.push_back(ToJson(row));
    } else {
      std::cout << row.id << " " << TerminalText(row.name).EndLine();
    }
  }
  if (arguments.isJson) PrintJson({{"domains", rows}});
}

// One domain: its id and its name.
void Print(const DomainArguments& arguments, unsigned int id, const std::string& name) {
  if (arguments.isJson) {
    PrintJson({{"id", id}, {"name", name}});
  } else {
    std::cout << id << " " << TerminalText(name).EndLine();
  }
}

void Create(const DomainArguments& arguments) {
  Print(arguments, SecPolicy::CreateDomain(arguments.domain), arguments.domain);
}

void Destroy(const DomainArguments& arguments) {
  ZekAccessInterfaceImpl iface;
  SecPolicy::DestroyDomain(DomainOf(arguments.domain, iface));
}

void Name(const DomainArguments& arguments) {
  ZekAccessInterfaceImpl iface;
  const unsigned int id = DomainOf(arguments.domain, iface);
  Print(arguments, id, SecPolicy::GetDomainNameForID(id));
}

void Of(const DomainArguments& arguments) {
  const unsigned int id = SecPolicy::GetDomainIDForWorld(arguments.world);
  Print(arguments, id, SecPolicy::GetDomainNameForID(id));
}

void Leaked(const DomainArguments& arguments) {
  json rows = json::array();
  for (const unsigned int id : ReadLeakedDomains()) {
    const std::string name = SecPolicy::GetDomainNameForID(id);
    if (arguments.isJson) {
      rows.push_back({{"id", id}, {"name", name}});
    } else {
      Print(arguments, id, name);
    }
  }
  if (arguments.isJson) PrintJson({{"leaked", rows}});
}

using SharedDomainArguments = std::shared_ptr<DomainArguments>;

// A verb below "domain" which does `run` in the host.
CommandLine DomainVerbOf(const char* name, const char* description,
                         const SharedDomainArguments& arguments,
                         void (*run)(const DomainArguments&),
                         std::vector<CommandOption> operands = {}) {
  return {.name = name,
          .description = description,
          .options = {HostOption(arguments->host)},
          .operands = std::move(operands),
          .run = [arguments, run] {
            return ReadHost(arguments->host, [&](StandIn::Kernel&) {
              run(*arguments);
              return kDone;
            });
          }};
}

// The same for one that changes the host.
CommandLine DomainChangeOf(CommandLine verb, const SharedDomainArguments& arguments,
                           void (*change)(const DomainArguments&)) {
  AddChangeOptions(verb, arguments->changes);
  verb.run = [arguments, change] {
    return ChangeHost(arguments->host, arguments->changes, [&](StandIn::Kernel&) {
      change(*arguments);
      return kDone;
    });
  };
  return verb;
}

CommandOption DomainOperand(const SharedDomainArguments& arguments, const char* name,
                            const char* description) {
  return {.names = {name},
          .description = description,
          .store = Into(arguments->domain),
          .isRequired = true};
}

CommandOption WorldOperand(const SharedDomainArguments& arguments) {
  return {.names = {"WORLD"},
          .description = "The world: a process id",
          .store = [arguments](const std::string& text) { arguments->world = WorldId(text); },
          .isRequired = true};
}

}  // namespace

CommandLine DomainVerb() {
  const auto arguments = std::make_shared<DomainArguments>();
  const CommandOption domain = DomainOperand(arguments, "DOMAIN", "The domain: its name or its id");
  CommandLine verb{
      .name = "domain",
      .description = "List, make and destroy a kernel's domains",
      .verbs = {
          DomainVerbOf("list", "List the domains with their ids", arguments, List),
          DomainChangeOf(
              DomainVerbOf("create", "Make an empty domain, as host services do", arguments, Create,
                           {DomainOperand(arguments, "NAME", "The new domain's name")}),
              arguments, Create),
          DomainChangeOf(DomainVerbOf("destroy", "Destroy a domain", arguments, Destroy, {domain}),
                         arguments, Destroy),
          DomainVerbOf("name", "Print a domain's id and name", arguments, Name, {domain}),
          DomainVerbOf("of", "Print the domain that a process runs in", arguments, Of,
                       {WorldOperand(arguments)}),
          DomainVerbOf("leaked", "List the domains that their makers left behind", arguments,
                       Leaked)}};
  for (CommandLine& below : verb.verbs) {
    if (below.name != "destroy") below.options.push_back(JsonOption(arguments->isJson));
  }
  return verb;
}

}  // namespace SecPolicyTool
