// Static Analysis Results Interchange Format, version 2.1.0.
#include <algorithm>
#include <cctype>
#include <filesystem>
#include <nlohmann/json.hpp>
#include <string_view>

#include "host/text/utf8_text.h"
#include "tools/check/finding_kinds.h"
#include "tools/check/report_forms.h"

namespace SecPolicyTool {

using StandIn::CharacterCount;
using StandIn::ValidText;

using nlohmann::json;

namespace {

constexpr char kPolicyBase[] = "POLICYDIR";
constexpr char kHostBase[] = "HOSTROOT";

// A path as a part of a URI: what is neither a letter nor a digit nor one of "-._~/" is encoded.
std::string UriOf(const std::string& path) {
  constexpr char kHex[] = "0123456789ABCDEF";
  constexpr std::string_view kPlain = "-._~/";
  std::string uri;
  for (const char c : path) {
    const auto byte = static_cast<unsigned char>(c);
    const bool isPlain =
        byte < 0x80 && (std::isalnum(byte) != 0 || kPlain.find(c) != std::string_view::npos);
    if (isPlain) {
      uri += c;
    } else {
      uri += std::string("%") + kHex[byte >> 4] + kHex[byte & 0xF];
    }
  }
  return uri;
}

const char* LevelOf(Severity severity) {
  return severity == Severity::kError ? "error" : "warning";
}

json Text(const std::string& text) { return {{"text", ValidText(text)}}; }

json Rules() {
  json rules = json::array();
  for (const FindingKind& kind : FindingKinds()) {
    rules.push_back({{"id", kind.id},
                     {"shortDescription", Text(kind.title)},
                     {"fullDescription", Text(kind.title)},
                     {"help", Text(kind.help)},
                     {"defaultConfiguration", {{"level", LevelOf(kind.severity)}}}});
  }
  return rules;
}

std::size_t RuleIndex(const std::string& id) {
  const auto& kinds = FindingKinds();
  std::size_t index = 0;
  while (index < kinds.size() && kinds[index].id != id) ++index;
  return index;
}

// Columns count characters, and from 1.
json RegionOf(const Finding& finding) {
  const std::string_view line = finding.source;
  const auto column = [&](std::size_t bytes) {
    return CharacterCount(line.substr(0, std::min(bytes, line.size()))) + 1;
  };
  const std::size_t begin = finding.place.column == 0 ? 0 : finding.place.column - 1;
  const std::size_t end = finding.length == 0 ? line.size() : begin + finding.length;
  return {{"startLine", finding.place.line},
          {"startColumn", column(begin)},
          {"endColumn", column(end)},
          {"snippet", Text(finding.source)}};
}

json ArtifactOf(const std::string& file, const std::string& dir) {
  if (!dir.empty() && file == dir) return {{"uri", ""}, {"uriBaseId", kPolicyBase}};
  if (!dir.empty() && file.starts_with(dir + "/")) {
    return {{"uri", UriOf(file.substr(dir.size() + 1))}, {"uriBaseId", kPolicyBase}};
  }
  return {{"uri", UriOf(file.substr(file.find_first_not_of('/')))}, {"uriBaseId", kHostBase}};
}

json LocationOf(const Finding& finding, const std::string& dir) {
  json physical{{"artifactLocation", ArtifactOf(finding.place.file, dir)}};
  if (finding.place.line != 0) physical["region"] = RegionOf(finding);
  return {{"physicalLocation", std::move(physical)}};
}

json ResultOf(const Finding& finding, const std::string& dir) {
  const std::string help = finding.help.empty() ? "" : "\nhelp: " + finding.help;
  json result{{"ruleId", finding.id},
              {"ruleIndex", RuleIndex(finding.id)},
              {"level", LevelOf(finding.severity)},
              {"message", Text(finding.message + help)}};
  if (!finding.place.file.empty()) result["locations"] = json::array({LocationOf(finding, dir)});
  if (!finding.loadMessage.empty()) {
    result["properties"] = {{"loadMessage", ValidText(finding.loadMessage)}};
  }
  return result;
}

json BasesOf(const std::string& dir) {
  json bases{{kHostBase, {{"description", Text("The root file system of the host.")}}}};
  if (!dir.empty()) {
    std::string path = std::filesystem::absolute(dir).lexically_normal().string();
    if (!path.ends_with('/')) path += '/';
    bases[kPolicyBase] = {{"uri", "file://" + UriOf(path)}};
  }
  return bases;
}

}  // namespace

json SarifForm(const CheckReport& report, const std::string& source) {
  std::string dir = source;
  while (dir.size() > 1 && dir.ends_with('/')) dir.pop_back();
  json results = json::array();
  for (const Finding& finding : report.findings) results.push_back(ResultOf(finding, dir));
  const json driver{{"name", "secpolicy"}, {"version", SECPOLICY_VERSION}, {"rules", Rules()}};
  json run{{"tool", {{"driver", driver}}},
           {"columnKind", "unicodeCodePoints"},
           {"originalUriBaseIds", BasesOf(dir)},
           {"results", std::move(results)}};
  // Compilers differ in what braces around one value make of it.
  return {{"$schema", "https://json.schemastore.org/sarif-2.1.0.json"},
          {"version", "2.1.0"},
          {"runs", json::array({std::move(run)})}};
}

}  // namespace SecPolicyTool
