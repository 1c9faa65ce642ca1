#include <map>

#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

using LabelledFiles = std::map<std::string, LabelledFile>;

const char kUnnamed[] = "a label that has no name any more";

Html LabelName(const Anchors& anchors, const std::string& label) {
  return label.empty() ? Html(kUnnamed) : anchors.Label(label);
}

Html FilesHtml(const ReportContext& context, const std::string& label,
               const std::vector<LabelledFiles::const_pointer>& files) {
  Html lines;
  for (const auto* file : files) {
    lines += Element("li", Element("code", file->first) + " " + PlaceHtml(file->second.place));
  }
  const Html link =
      label.empty() ? Html() : Element("p", "Rules that name it: " + context.anchors.Label(label));
  return Entry(context.anchors.OfFiles(label),
               Element("h3", label.empty() ? kUnnamed : label) + " " +
                   Element("span", {{"class", "count"}}, Counted(files.size(), "file")),
               link + Element("ul", {{"class", "rules"}}, lines));
}

}  // namespace

Html FilesSection(const ReportContext& context) {
  std::map<std::string, std::vector<LabelledFiles::const_pointer>> byLabel;
  for (const auto& file : context.report.policy.files) byLabel[file.second.label].push_back(&file);
  Html entries;
  for (const auto& [label, files] : byLabel) entries += FilesHtml(context, label, files);
  if (entries.IsEmpty()) entries = Element("p", "No file carries another label than default.");
  return Section("files", "File labels", entries);
}

Html TardisksSection(const ReportContext& context) {
  Html entries;
  for (const auto& [name, tardisk] : context.report.policy.tardisks) {
    entries +=
        Element("li", {{"class", "entry"}},
                Element("code", name) + " carries " + LabelName(context.anchors, tardisk.label) +
                    " " + PlaceHtml(tardisk.place));
  }
  return Section("tardisks", "Tardisks",
                 entries.IsEmpty() ? Element("p", "No tardisk carries another label than default.")
                                   : Element("ul", {{"class", "list"}}, entries));
}

}  // namespace SecPolicyTool
