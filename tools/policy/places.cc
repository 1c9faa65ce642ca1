#include "tools/policy/places.h"

#include <sys/prctl.h>

#include <algorithm>
#include <filesystem>

#include "host/module/permission_letters.h"
#include "platform/zek_access.h"
#include "secpolicy/secpolicy.h"
#include "tools/policy/policy_text.h"

namespace SecPolicyTool {

namespace {

namespace fs = std::filesystem;

// Tardisk policy is read from here, whatever directory is loaded.
constexpr char kTardiskPolicyDir[] = "/etc/olvane/secpolicy/tardisks";

using Lines = std::vector<PolicyLine>;

Lines LinesOf(const std::string& path) try {
  return ReadPolicyFile(path).lines;
} catch (const std::runtime_error&) {
  return {};
}

// The policy files of `dir` in the order of a load, by name. None when it cannot be listed.
std::vector<std::string> FilesOf(const std::string& dir) {
  std::map<std::string, std::string> files;
  try {
    SecPolicy::GetFileList(dir, files);
  } catch (const Tavon::Lib::TavonException&) {
  }
  std::vector<std::string> names;
  for (const auto& [path, name] : files) names.push_back(name);
  return names;
}

Place PlaceOf(const std::string& file, const PolicyLine& line) {
  return {file, line.number, line.words.empty() ? 0 : line.words.front().column};
}

// The line's words, from the one at `first` on, as far as there are so many.
std::vector<std::string> WordsFrom(const PolicyLine& line, std::size_t first, std::size_t count) {
  std::vector<std::string> words;
  for (std::size_t i = first; i < line.words.size() && words.size() < count; ++i) {
    words.push_back(line.words[i].text);
  }
  return words;
}

// Whether the line says what the rule decides on.
bool Says(const PolicyLine& line, const RuleKey& key) {
  return !line.words.empty() && line.words.front().text == InfoOf(key.type).keyword &&
         WordsFrom(line, 1, key.words.size()) == key.words;
}

// The path as the kernel resolves it, or as a load sends it when it cannot.
std::string ResolvedPath(const std::string& path) {
  SecPolicy::ZekAccess_FileRule rule{};
  if (prctl(ZekCtl::Kernel::kPrctlResolvePath, path.c_str(), rule.path) == 0) return rule.path;
  return path.substr(0, sizeof rule.path - 1);
}

// A path within the host, by which the kernel knows a file.
std::string WithoutLinks(const std::string& path) {
  std::error_code error;
  const fs::path resolved = fs::canonical(path, error);
  return error ? path : resolved.string();
}

// ---- Rules ----

void PlaceKeywordRules(const std::string& file, const Lines& lines, DomainContent& domain) {
  for (PolicyRule& rule : domain.rules) {
    if (!rule.place) continue;
    const std::size_t index = rule.place->line - 1;
    if (index < lines.size() && Says(lines[index], rule.key)) {
      rule.place = PlaceOf(file, lines[index]);
    }
  }
}

void PlacePathRules(const std::string& file, const Lines& lines, DomainContent& domain) {
  std::map<std::string, PolicyRule*> rules;
  for (PolicyRule& rule : domain.rules) {
    if (rule.key.type == RuleType::kPath && rule.key.world == 0) rules[rule.key.words[0]] = &rule;
  }
  if (rules.empty()) return;
  for (const PolicyLine& line : lines) {
    const std::vector<std::string> words = WordsFrom(line, 0, 4);
    if (words.size() < 2 || words.size() > 3 || words[0] != "-r") continue;
    const auto rule = rules.find(ResolvedPath(words[1]));
    if (rule == rules.end()) continue;
    // Of several lines for a path, the later ones that the kernel took.
    std::string letters = words.size() == 3 ? words[2] : "";
    std::string held = DecisionOf(*rule->second);
    std::sort(letters.begin(), letters.end());
    std::sort(held.begin(), held.end());
    if (letters == held) rule->second->place = PlaceOf(file, line);
  }
}

void PlaceDomains(const PolicyFiles& files, Policy& policy) {
  for (const std::string& name : FilesOf(files.path + "/domains")) {
    const auto domain = policy.domains.find(name);
    if (domain == policy.domains.end()) continue;
    const std::string file = files.shown + "/domains/" + name;
    const Lines lines = LinesOf(files.path + "/domains/" + name);
    domain->second.place = Place{file, 0, 0};
    PlaceKeywordRules(file, lines, domain->second);
    PlacePathRules(file, lines, domain->second);
  }
}

// ---- Objects ----

void PlaceObjects(const PolicyFiles& files, Policy& policy) {
  for (const std::string& name : FilesOf(files.path + "/objects")) {
    const std::string file = files.shown + "/objects/" + name;
    for (const PolicyLine& line : LinesOf(files.path + "/objects/" + name)) {
      if (line.words.size() != 1) continue;
      const auto object = policy.objects.find(line.words[0].text);
      if (object == policy.objects.end() || object->second.place) continue;
      object->second.place = PlaceOf(file, line);
    }
  }
}

// ---- File labels ----

struct LabelLine {
  std::size_t order;  // among all lines of all files
  bool isRecursive;
  std::string label;
  Place place;
};

// By the path that the kernel knows, in their order.
std::map<std::string, std::vector<LabelLine>> LabelLines(const PolicyFiles& files) {
  constexpr std::string_view kBelow = "/*";
  std::map<std::string, std::vector<LabelLine>> found;
  std::size_t order = 0;
  for (const std::string& name : FilesOf(files.path + "/fileLabels")) {
    for (const PolicyLine& line : LinesOf(files.path + "/fileLabels/" + name)) {
      if (line.words.size() != 2) continue;
      std::string path = line.words[0].text;
      const bool isRecursive = path.ends_with(kBelow);
      if (isRecursive) path.erase(path.size() - kBelow.size());
      found[WithoutLinks(path)].push_back({order++, isRecursive, line.words[1].text,
                                           PlaceOf(files.shown + "/fileLabels/" + name, line)});
    }
  }
  return found;
}

// The last of the lines that labelled the file.
std::optional<Place> PlaceOfLabel(const std::string& path, const std::string& label,
                                  const std::map<std::string, std::vector<LabelLine>>& lines) {
  const LabelLine* last = nullptr;
  for (fs::path above = path;; above = above.parent_path()) {
    if (const auto at = lines.find(above.string()); at != lines.end()) {
      for (const LabelLine& line : at->second) {
        const bool covers = line.isRecursive || above == path;
        const bool isLater = last == nullptr || line.order > last->order;
        if (covers && line.label == label && isLater) last = &line;
      }
    }
    if (above == above.parent_path()) break;
  }
  return last == nullptr ? std::nullopt : std::optional(last->place);
}

void PlaceFileLabels(const PolicyFiles& files, Policy& policy) {
  if (policy.files.empty()) return;
  const auto lines = LabelLines(files);
  for (auto& [path, file] : policy.files) file.place = PlaceOfLabel(path, file.label, lines);
}

// ---- Tardisks ----

// The archive that brought a path.
std::string TardiskOf(const StandIn::ImageIndex& image, const std::string& path) {
  for (const StandIn::TardiskContent& tardisk : image.tardisks) {
    if (std::binary_search(tardisk.paths.begin(), tardisk.paths.end(), path)) return tardisk.name;
  }
  return {};
}

void PlaceTardisk(const std::string& path, const std::string& tardisk, Policy& policy) {
  for (const PolicyLine& line : LinesOf(path)) {
    if (line.words.size() != 3 || line.words[0].text != "-E") continue;
    const std::string& label = line.words[1].text;
    const auto labelled = policy.tardisks.find(tardisk);
    if (labelled == policy.tardisks.end() || labelled->second.label != label) continue;
    labelled->second.place = PlaceOf(path, line);
    const RuleKey key{
        RuleType::kTransition, {label, line.words[2].text, policy.words.execEvent}, 0};
    for (PolicyRule& rule : policy.domains[policy.words.launchDomain].rules) {
      if (rule.key == key && rule.place && rule.place->line == line.number) {
        rule.place = PlaceOf(path, line);
      }
    }
  }
}

void PlaceTardisks(const StandIn::ImageIndex& image, Policy& policy) {
  for (const std::string& name : FilesOf(kTardiskPolicyDir)) {
    const std::string path = std::string(kTardiskPolicyDir) + "/" + name;
    PlaceTardisk(path, TardiskOf(image, path), policy);
  }
}

// A line without a file is no place.
void ForgetLinesAlone(Policy& policy) {
  for (auto& [name, domain] : policy.domains) {
    for (PolicyRule& rule : domain.rules) {
      if (rule.place && rule.place->file.empty()) rule.place.reset();
    }
  }
}

}  // namespace

void AddPlaces(const PolicyFiles& files, const StandIn::ImageIndex& image, Policy& policy) {
  PlaceDomains(files, policy);
  PlaceObjects(files, policy);
  PlaceFileLabels(files, policy);
  PlaceTardisks(image, policy);
  ForgetLinesAlone(policy);
}

}  // namespace SecPolicyTool
