// secpolicy graph [--host DIR] [--format FORMAT | --json] [--event EVENT] [-o FILE] SOURCE
#include <unistd.h>

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>

#include "tools/graph/graph_forms.h"
#include "tools/graph/graphviz.h"
#include "tools/policy/output.h"
#include "tools/policy/output_file.h"
#include "tools/secpolicy/event_option.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct GraphArguments {
  std::string host;
  std::string source;
  std::string format = "text";
  std::optional<std::string> event;
  std::string file;
  bool isJson = false;
};

std::string JsonText(const GraphArguments& arguments, const TransitionGraph& graph) {
  nlohmann::json content = GraphJson(graph);
  content["source"] = arguments.source;
  return TextOfJson(content);
}

std::string Formatted(const GraphArguments& arguments, const TransitionGraph& graph) {
  if (arguments.isJson || arguments.format == "json") return JsonText(arguments, graph);
  if (arguments.format == "dot") return GraphDot(graph);
  if (arguments.format == "svg") return RunGraphviz(GraphDot(graph), "svg");
  return GraphText(graph, Painter(false)).Text();
}

bool IsText(const GraphArguments& arguments) {
  return !arguments.isJson && arguments.format == "text";
}

ExitStatus PrintGraph(const GraphArguments& arguments) {
  RequireEvent(arguments.host, arguments.event);
  const Policy policy = ReadPolicy(arguments.host, arguments.source, OnErrors::kWarn);
  const TransitionGraph graph(policy, arguments.event);
  if (!arguments.file.empty()) {
    WriteOutputFile(arguments.file, Formatted(arguments, graph));
  } else if (IsText(arguments)) {
    std::cout << GraphText(graph, Painter(WantsColour(STDOUT_FILENO)));
  } else {
    std::cout << Formatted(arguments, graph);
  }
  return kDone;
}

}  // namespace

CommandLine GraphVerb() {
  const auto arguments = std::make_shared<GraphArguments>();
  return {.name = "graph",
          .description = "Show which domain goes where",
          .options = {HostOption(arguments->host),
                      {.names = {"--format"},
                       .value = "FORMAT",
                       .description =
                           "text, json, dot (the language of Graphviz) or svg (drawn by Graphviz)",
                       .store = Into(arguments->format),
                       .choices = {"text", "json", "dot", "svg"},
                       .defaultValue = arguments->format,
                       .excludes = "--json"},
                      {.names = {"--json"},
                       .description = "The same as --format json",
                       .store = Into(arguments->isJson)},
                      EventOption(arguments->event),
                      {.names = {"-o", "--output"},
                       .value = "FILE",
                       .description = "Write to this file, whole or not at all",
                       .store = Into(arguments->file)}},
          .operands = {SourceOperand(arguments->source)},
          .run = [arguments] { return PrintGraph(*arguments); }};
}

}  // namespace SecPolicyTool
