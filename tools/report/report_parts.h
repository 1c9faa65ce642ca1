// What the sections of a report share.
#pragma once

#include <map>
#include <string>

#include "tools/graph/transition_graph.h"
#include "tools/policy/counted.h"
#include "tools/policy/policy.h"
#include "tools/report/html.h"

namespace SecPolicyTool {

// Links to the entries of a page's domains and labels.
class Anchors {
 public:
  Anchors(const Policy& policy, const TransitionGraph& graph);

  // The entry's id; empty for what has none.
  [[nodiscard]] std::string OfDomain(const std::string& name) const;
  [[nodiscard]] std::string OfLabel(const std::string& name) const;
  // Of the files that carry a label.
  [[nodiscard]] std::string OfFiles(const std::string& label) const;

  // The name, linked when it has an entry.
  [[nodiscard]] Html Domain(const std::string& name) const;
  [[nodiscard]] Html Label(const std::string& name) const;

  // By name: all labels that objects, rules, files or tardisks name, and their numbers.
  [[nodiscard]] const std::map<std::string, std::size_t>& Labels() const { return labels_; }

 private:
  void AddLabels(const Policy& policy);

  const TransitionGraph& graph_;
  std::map<std::string, std::size_t> labels_;
};

// Whether a rule's word, by its number, is a label.
bool IsLabel(RuleType type, std::size_t word);

// A place, set apart; one within `file` by its line alone.
Html PlaceHtml(const std::optional<Place>& place, const std::string& file = "");

// A section with a heading and what it holds.
Html Section(const char* id, const std::string& title, Html content);

// A collapsed entry of a section that is found by searching, and opened by a link to its id.
Html Entry(const std::string& id, const Html& summary, const Html& content);

}  // namespace SecPolicyTool
