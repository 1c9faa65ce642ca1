#include "tools/query/digest.h"
#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

Html Figure(const char* target, std::size_t count, const char* what) {
  const Html content = Element("b", std::to_string(count)) + Element("span", what);
  return Element("li", Element("a", {{"href", std::string("#") + target}}, content));
}

std::size_t CountRules(const Policy& policy) {
  std::size_t count = 0;
  for (const auto& [name, domain] : policy.domains) count += domain.rules.size();
  return count;
}

}  // namespace

Html OverviewSection(const ReportContext& context) {
  const Policy& policy = context.report.policy;
  Html figures = Figure("domains", policy.domains.size(), "domains") +
                 Figure("domains", CountRules(policy), "rules") +
                 Figure("graph", context.graph.Transitions().size(), "transitions") +
                 Figure("labels", context.anchors.Labels().size(), "labels") +
                 Figure("files", policy.files.size(), "labelled files") +
                 Figure("tardisks", policy.tardisks.size(), "labelled tardisks");
  if (context.report.findings) {
    figures += Figure("findings", context.report.findings->size(), "findings");
  }
  return Element("header",
                 Element("h1", "Security policy") +
                     Element("p", {{"class", "source"}}, Element("code", context.report.source)) +
                     Element("p", {{"class", "digest"}},
                             "SHA-256 of its meaning: " + Element("code", Digest(policy))) +
                     Element("ul", {{"class", "figures"}}, figures));
}

}  // namespace SecPolicyTool
