#include "tools/secpolicy/source_option.h"

#include <iostream>
#include <stdexcept>

#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

CommandOption SourceOperand(std::string& source, const std::string& name) {
  return {.names = {name},
          .value = "DIR|kernel",
          .description = "A policy directory, or \"kernel\" for what the host's kernel holds",
          .store = Into(source),
          .isRequired = true};
}

CommandOption OwnPolicyOperand(std::string& dir, const std::string& name) {
  return {.names = {name},
          .value = "DIR",
          .description = "The policy directory; without it, the host's own /etc/olvane/secpolicy",
          .store = Into(dir)};
}

CommandOption PolicyOption(std::string& source) {
  source = kKernelSource;
  return {.names = {"--policy"},
          .value = "DIR|kernel",
          .description =
              "The policy that is asked: a directory, or \"kernel\", as without it, for "
              "what the host's kernel holds",
          .store = Into(source)};
}

Policy ReadPolicy(const std::string& host, const std::string& source, OnErrors onErrors) {
  SourcePolicy read = ReadSource(OpenHost(host), source);
  if (read.errors.empty()) return std::move(read.policy);
  const std::string& first = read.errors.front();
  if (onErrors == OnErrors::kWarn) {
    PrintLine(std::cerr,
              "Warning: a load of " + source + " reports errors, the first of them: " + first);
    PrintLine(std::cerr,
              "Warning: what follows is what such a load installs; for all findings, \"secpolicy "
              "check " +
                  source + "\"");
    return std::move(read.policy);
  }
  for (const std::string& error : read.errors) ReportError(error);
  throw std::runtime_error(source + " cannot be loaded without errors");
}

}  // namespace SecPolicyTool
