#include "tools/secpolicy/source_option.h"

#include <iostream>
#include <stdexcept>

#include "tools/policy/output.h"
#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

void AddSourceOption(CLI::App& verb, std::string& source, const std::string& name) {
  verb.add_option(name, source,
                  "A policy directory, or \"kernel\" for what the host's kernel holds")
      ->type_name("DIR|kernel")
      ->required();
}

void AddPolicyOption(CLI::App& verb, std::string& source) {
  source = kKernelSource;
  verb.add_option("--policy", source,
                  "The policy that is asked: a directory, or \"kernel\", as without it, for what "
                  "the host's kernel holds")
      ->type_name("DIR|kernel");
}

Policy ReadPolicy(const std::string& host, const std::string& source, OnErrors onErrors) {
  SourcePolicy read = ReadSource(OpenHost(host), source);
  if (read.errors.empty()) return std::move(read.policy);
  const std::string& first = read.errors.front();
  if (onErrors == OnErrors::kWarn) {
    std::cerr << "Warning: a load of " + source + " reports errors, the first of them: " + first +
                     "\nWarning: what follows is what such a load installs; for all findings, "
                     "\"secpolicy "
                     "check " +
                     source + "\"\n";
    return std::move(read.policy);
  }
  for (const std::string& error : read.errors) ReportError(error);
  throw std::runtime_error(source + " cannot be loaded without errors");
}

}  // namespace SecPolicyTool
