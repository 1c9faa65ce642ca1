// secpolicy paths [--host DIR] [--policy SOURCE] [--event EVENT] [--max N | --all] [--json] FROM TO
#include <unistd.h>

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <stdexcept>

#include "tools/graph/domain_paths.h"
#include "tools/graph/path_forms.h"
#include "tools/policy/output.h"
#include "tools/secpolicy/event_option.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

// There can be more of them than anybody could read, or wait for.
constexpr std::size_t kMostPaths = 1000;

struct PathsArguments {
  std::string host;
  std::string source;
  std::string from;
  std::string to;
  std::optional<std::string> event;
  std::size_t most = 10;
  bool isAll = false;
  bool isJson = false;
};

ExitStatus PrintPaths(const PathsArguments& arguments) {
  RequireEvent(arguments.host, arguments.event);
  const Policy policy = ReadPolicy(arguments.host, arguments.source, OnErrors::kWarn);
  const TransitionGraph graph(policy, arguments.event);
  const PathQuestion question{RequireDomain(graph, arguments.from),
                              RequireDomain(graph, arguments.to), arguments.event};
  const FoundPaths found =
      FindPaths(graph, question.from, question.to, arguments.isAll ? kMostPaths : arguments.most);
  if (arguments.isJson) {
    PrintJson(PathsJson(graph, question, found));
  } else {
    std::cout << PathsText(graph, question, found, Painter(WantsColour(STDOUT_FILENO)));
  }
  return found.paths.empty() ? kFailed : kDone;
}

}  // namespace

CommandLine PathsVerb() {
  const auto arguments = std::make_shared<PathsArguments>();
  return {
      .name = "paths",
      .description = "Say how one domain is reached from another",
      .footer = "Exit status: 0 it is reached, 1 it is not, or the request failed, 2 wrong usage.",
      .options = {HostOption(arguments->host),
                  JsonOption(arguments->isJson),
                  EventOption(arguments->event),
                  PolicyOption(arguments->source),
                  {.names = {"--max"},
                   .value = "N",
                   .description = "At most so many paths, from 1 to 1000",
                   .store =
                       [arguments](const std::string& text) {
                         arguments->most =
                             static_cast<std::size_t>(WholeNumber(text, 1, kMostPaths));
                       },
                   .defaultValue = std::to_string(arguments->most),
                   .excludes = "--all"},
                  {.names = {"--all"},
                   .description = "All paths, but at most 1000",
                   .store = Into(arguments->isAll)}},
      .operands = {{.names = {"FROM"},
                    .description = "The domain that programs come from",
                    .store = Into(arguments->from),
                    .isRequired = true},
                   {.names = {"TO"},
                    .description = "The domain that they go to",
                    .store = Into(arguments->to),
                    .isRequired = true}},
      .run = [arguments] { return PrintPaths(*arguments); }};
}

}  // namespace SecPolicyTool
