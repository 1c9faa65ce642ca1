// secpolicy digest [--host DIR] [--json] SOURCE
#include "tools/query/digest.h"

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/policy/output.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct DigestArguments {
  std::string host;
  std::string source;
  bool isJson = false;
};

ExitStatus PrintDigest(const DigestArguments& arguments) {
  const std::string digest =
      Digest(ReadPolicy(arguments.host, arguments.source, OnErrors::kRefuse));
  if (arguments.isJson) {
    PrintJson({{"source", arguments.source}, {"sha256", digest}});
  } else {
    std::cout << digest << "\n";
  }
  return kDone;
}

}  // namespace

CommandLine DigestVerb() {
  const auto arguments = std::make_shared<DigestArguments>();
  return {.name = "digest",
          .description = "Print one word for what a policy means",
          .options = {HostOption(arguments->host), JsonOption(arguments->isJson)},
          .operands = {SourceOperand(arguments->source)},
          .run = [arguments] { return PrintDigest(*arguments); }};
}

}  // namespace SecPolicyTool
