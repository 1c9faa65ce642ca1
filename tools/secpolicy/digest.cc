// secpolicy digest [--host DIR] [--json] SOURCE
#include "tools/query/digest.h"

#include <iostream>
#include <memory>

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

void PrintDigest(const DigestArguments& arguments) {
  const std::string digest =
      Digest(ReadPolicy(arguments.host, arguments.source, OnErrors::kRefuse));
  if (arguments.isJson) {
    PrintJson({{"source", arguments.source}, {"sha256", digest}});
  } else {
    std::cout << digest << "\n";
  }
}

}  // namespace

void AddDigest(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand("digest", "Print one word for what a policy means");
  const auto arguments = std::make_shared<DigestArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  AddSourceOption(*verb, arguments->source);
  verb->callback([arguments] { PrintDigest(*arguments); });
}

}  // namespace SecPolicyTool
