#include "tools/report/report_parts.h"

#include <utility>

namespace SecPolicyTool {

namespace {

Html LinkTo(const std::string& id, const std::string& name) {
  return id.empty() ? Html(name) : Element("a", {{"href", "#" + id}}, name);
}

}  // namespace

bool IsLabel(RuleType type, std::size_t word) {
  return InfoOf(type).Words()[word].list == ZekCtl::Security::kObjectKeyword;
}

Anchors::Anchors(const Policy& policy, const TransitionGraph& graph) : graph_(graph) {
  AddLabels(policy);
  std::size_t number = 0;
  for (auto& [name, place] : labels_) place = number++;
}

void Anchors::AddLabels(const Policy& policy) {
  for (const auto& [name, object] : policy.objects) labels_[name];
  for (const auto& [name, domain] : policy.domains) {
    for (const PolicyRule& rule : domain.rules) {
      for (std::size_t word = 0; word < rule.key.words.size(); ++word) {
        if (IsLabel(rule.key.type, word)) labels_[rule.key.words[word]];
      }
    }
  }
  for (const auto* files : {&policy.files, &policy.tardisks}) {
    for (const auto& [path, file] : *files) {
      if (!file.label.empty()) labels_[file.label];
    }
  }
}

std::string Anchors::OfDomain(const std::string& name) const {
  const auto domain = graph_.Find(name);
  return domain ? "domain-" + std::to_string(*domain) : "";
}

std::string Anchors::OfLabel(const std::string& name) const {
  const auto label = labels_.find(name);
  return label == labels_.end() ? "" : "label-" + std::to_string(label->second);
}

std::string Anchors::OfFiles(const std::string& label) const {
  const auto known = labels_.find(label);
  return known == labels_.end() ? "files-unnamed" : "files-" + std::to_string(known->second);
}

Html Anchors::Domain(const std::string& name) const { return LinkTo(OfDomain(name), name); }

Html Anchors::Label(const std::string& name) const { return LinkTo(OfLabel(name), name); }

Html PlaceHtml(const std::optional<Place>& place, const std::string& file) {
  if (!place) return {};
  Place shown = *place;
  if (shown.line != 0 && shown.file == file) {
    shown.file = {};
    shown.column = 0;
  }
  return Element("small", PlaceText(shown));
}

Html Section(const char* id, const std::string& title, Html content) {
  const std::string heading = std::string(id) + "-title";
  Html whole = Element("h2", {{"id", heading}}, title);
  whole += content;
  content = {};
  return Element("section", {{"id", id}, {"aria-labelledby", heading}}, std::move(whole));
}

Html Entry(const std::string& id, const Html& summary, const Html& content) {
  return Element("details", {{"class", "entry"}, {"id", id}},
                 Element("summary", summary) + content);
}

}  // namespace SecPolicyTool
