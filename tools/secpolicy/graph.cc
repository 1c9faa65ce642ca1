// secpolicy graph [--host DIR] [--format FORMAT | --json] [--event EVENT] [-o FILE] SOURCE
#include <unistd.h>

#include <iostream>
#include <memory>
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
  return GraphText(graph, Painter(arguments.file.empty() && WantsColour(STDOUT_FILENO)));
}

void PrintGraph(const GraphArguments& arguments) {
  RequireEvent(arguments.host, arguments.event);
  const Policy policy = ReadPolicy(arguments.host, arguments.source, OnErrors::kWarn);
  const std::string text = Formatted(arguments, TransitionGraph(policy, arguments.event));
  if (arguments.file.empty()) {
    std::cout << text;
  } else {
    WriteOutputFile(arguments.file, text);
  }
}

}  // namespace

void AddGraph(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand("graph", "Show which domain goes where");
  const auto arguments = std::make_shared<GraphArguments>();
  AddHostOption(*verb, arguments->host);
  CLI::Option* format =
      verb->add_option("--format", arguments->format,
                       "text, json, dot (the language of Graphviz) or svg (drawn by Graphviz)")
          ->type_name("FORMAT")
          ->check(CLI::IsMember({"text", "json", "dot", "svg"}))
          ->capture_default_str();
  verb->add_flag("--json", arguments->isJson, "The same as --format json")->excludes(format);
  AddEventOption(*verb, arguments->event);
  verb->add_option("-o,--output", arguments->file, "Write to this file, whole or not at all")
      ->type_name("FILE");
  AddSourceOption(*verb, arguments->source);
  verb->callback([arguments] { PrintGraph(*arguments); });
}

}  // namespace SecPolicyTool
