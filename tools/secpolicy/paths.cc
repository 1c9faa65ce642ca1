// secpolicy paths [--host DIR] [--policy SOURCE] [--event EVENT] [--max N | --all] [--json] FROM TO
#include <unistd.h>

#include <iostream>
#include <memory>
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

void AddPaths(CLI::App& app, ExitStatus& status) {
  CLI::App* verb = app.add_subcommand("paths", "Say how one domain is reached from another");
  verb->footer("Exit status: 0 it is reached, 1 it is not, or the request failed, 2 wrong usage.");
  const auto arguments = std::make_shared<PathsArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  AddEventOption(*verb, arguments->event);
  AddPolicyOption(*verb, arguments->source);
  CLI::Option* most = verb->add_option("--max", arguments->most, "At most so many paths")
                          ->type_name("N")
                          ->check(CLI::Range(std::size_t{1}, kMostPaths))
                          ->capture_default_str();
  verb->add_flag("--all", arguments->isAll, "All paths, but at most 1000")->excludes(most);
  verb->add_option("FROM", arguments->from, "The domain that programs come from")->required();
  verb->add_option("TO", arguments->to, "The domain that they go to")->required();
  verb->callback([arguments, &status] { status = PrintPaths(*arguments); });
}

}  // namespace SecPolicyTool
