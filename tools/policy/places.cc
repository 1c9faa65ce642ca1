#include "tools/policy/places.h"

#include <algorithm>

#include "host/module/permission_letters.h"
#include "platform/zek_access.h"
#include "secpolicy/secpolicy.h"
#include "tools/policy/label_lines.h"
#include "tools/policy/policy_text.h"

namespace SecPolicyTool {

namespace {

using Lines = std::vector<PolicyLine>;

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
std::string ResolvedPath(const StandIn::FileTree& root, const std::string& path) {
  constexpr std::size_t kMost = ZekCtl::Kernel::kPathBytes - 1;
  const auto resolved = root.Resolve(path);
  return resolved && resolved->size() <= kMost ? *resolved : path.substr(0, kMost);
}

// ---- Rules ----

void PlaceKeywordRules(const SharedName& file, const Lines& lines, DomainContent& domain) {
  for (PolicyRule& rule : domain.rules) {
    if (!rule.place) continue;
    const std::size_t index = rule.place->line - 1;
    if (index < lines.size() && Says(lines[index], rule.key)) {
      rule.place = PlaceOf(file, lines[index]);
    }
  }
}

void PlacePathRules(const SharedName& file, const Lines& lines, const StandIn::FileTree& root,
                    DomainContent& domain) {
  std::map<std::string, PolicyRule*> rules;
  for (PolicyRule& rule : domain.rules) {
    if (rule.key.type == RuleType::kPath && rule.key.world == 0) rules[rule.key.words[0]] = &rule;
  }
  if (rules.empty()) return;
  for (const PolicyLine& line : lines) {
    const std::vector<std::string> words = WordsFrom(line, 0, 4);
    if (words.size() < 2 || words.size() > 3 || words[0] != "-r") continue;
    const auto rule = rules.find(ResolvedPath(root, words[1]));
    if (rule == rules.end()) continue;
    // Of several lines for a path, the later ones that the kernel took.
    std::string letters = words.size() == 3 ? words[2] : "";
    std::string held = DecisionOf(*rule->second);
    std::sort(letters.begin(), letters.end());
    std::sort(held.begin(), held.end());
    if (letters == held) rule->second->place = PlaceOf(file, line);
  }
}

void PlaceDomains(const PolicyFiles& files, const StandIn::FileTree& root, Policy& policy) {
  for (const std::string& name : PolicyFileNames(files.tree, files.path + "/domains")) {
    const auto domain = policy.domains.find(name);
    if (domain == policy.domains.end()) continue;
    const std::string file = files.shown + "/domains/" + name;
    const Lines lines = PolicyLines(files.tree, files.path + "/domains/" + name);
    domain->second.place = Place{file, 0, 0};
    PlaceKeywordRules(file, lines, domain->second);
    PlacePathRules(file, lines, root, domain->second);
  }
}

// ---- Objects ----

void PlaceObjects(const PolicyFiles& files, Policy& policy) {
  for (const std::string& name : PolicyFileNames(files.tree, files.path + "/objects")) {
    const std::string file = files.shown + "/objects/" + name;
    for (const PolicyLine& line : PolicyLines(files.tree, files.path + "/objects/" + name)) {
      if (line.words.size() != 1) continue;
      const auto object = policy.objects.find(line.words[0].text);
      if (object == policy.objects.end() || object->second.place) continue;
      object->second.place = PlaceOf(file, line);
    }
  }
}

// ---- File labels ----

void PlaceFileLabels(const PolicyFiles& files, const StandIn::FileTree& root, Policy& policy) {
  if (policy.files.empty()) return;
  const LabelLines lines(files, root);
  for (auto& [path, file] : policy.files) {
    if (const LabelLine* line = lines.LineFor(path, file.label)) file.place = line->place;
  }
}

// ---- Tardisks ----

// The archive that brought a path.
std::string TardiskOf(const StandIn::ImageIndex& image, const std::string& path) {
  for (const StandIn::TardiskContent& tardisk : image.tardisks) {
    if (std::binary_search(tardisk.paths.begin(), tardisk.paths.end(), path)) return tardisk.name;
  }
  return {};
}

void PlaceTardisk(const StandIn::FileTree& root, const std::string& path,
                  const std::string& tardisk, Policy& policy) {
  for (const PolicyLine& line : PolicyLines(root, path)) {
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

void PlaceTardisks(const StandIn::RootIndex& files, Policy& policy) {
  for (const std::string& name : PolicyFileNames(files.Tree(), kTardiskPolicyDir)) {
    const std::string path = std::string(kTardiskPolicyDir) + "/" + name;
    PlaceTardisk(files.Tree(), path, TardiskOf(files.Image(), path), policy);
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

void AddPlaces(const PolicyFiles& files, const StandIn::RootIndex& root, Policy& policy) {
  PlaceDomains(files, root.Tree(), policy);
  PlaceObjects(files, policy);
  PlaceFileLabels(files, root.Tree(), policy);
  PlaceTardisks(root, policy);
  ForgetLinesAlone(policy);
}

}  // namespace SecPolicyTool
