// secpolicy domain list|create|destroy|name|of|leaked
#include <iostream>
#include <memory>

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
      std::cout << row.id << " " << Printable(row.name) << "\n";
    }
  }
  if (arguments.isJson) PrintJson({{"domains", rows}});
}

// One domain: its id and its name.
void Print(const DomainArguments& arguments, unsigned int id, const std::string& name) {
  if (arguments.isJson) {
    PrintJson({{"id", id}, {"name", name}});
  } else {
    std::cout << id << " " << Printable(name) << "\n";
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

using Arguments = std::shared_ptr<DomainArguments>;

// A verb below "domain" which does `run` in the host.
CLI::App* AddVerb(CLI::App& domain, const char* name, const char* description,
                  const Arguments& arguments, void (*run)(const DomainArguments&)) {
  CLI::App* verb = domain.add_subcommand(name, description);
  AddHostOption(*verb, arguments->host);
  verb->callback([arguments, run] {
    const auto session = EnterHost(arguments->host);
    run(*arguments);
  });
  return verb;
}

}  // namespace

void AddDomain(CLI::App& app, ExitStatus&) {
  CLI::App* domain = app.add_subcommand("domain", "List, make and destroy a kernel's domains");
  domain->require_subcommand(1);
  const auto arguments = std::make_shared<DomainArguments>();
  const auto add = [&](const char* name, const char* description, auto run) {
    return AddVerb(*domain, name, description, arguments, run);
  };
  const auto addDomain = [&](CLI::App* verb, const char* name, const char* description) {
    verb->add_option(name, arguments->domain, description)->required();
    return verb;
  };
  constexpr char kDomain[] = "The domain: its name or its id";
  AddJsonOption(*add("list", "List the domains with their ids", List), arguments->isJson);
  AddJsonOption(*addDomain(add("create", "Make an empty domain, as host services do", Create),
                           "NAME", "The new domain's name"),
                arguments->isJson);
  addDomain(add("destroy", "Destroy a domain", Destroy), "DOMAIN", kDomain);
  AddJsonOption(*addDomain(add("name", "Print a domain's id and name", Name), "DOMAIN", kDomain),
                arguments->isJson);
  CLI::App* of = add("of", "Print the domain that a process runs in", Of);
  of->add_option("WORLD", arguments->world, "The world: a process id")->required();
  AddJsonOption(*of, arguments->isJson);
  AddJsonOption(*add("leaked", "List the domains that their makers left behind", Leaked),
                arguments->isJson);
}

}  // namespace SecPolicyTool
