#include <array>
#include <ostream>

#include "tools/query/difference_report.h"
#include "tools/query/label_folding.h"

namespace SecPolicyTool {

namespace {

// Prints the lines of a difference under their headings.
class DifferencePrinter {
 public:
  DifferencePrinter(const Painter& painter, std::ostream& out) : painter_(painter), out_(out) {}

  void Heading(const std::string& text) {
    Separate();
    out_ << painter_.Paint(Colour::kBold, text).EndLine();
  }

  // A domain that is new or gone says so itself.
  void Heading(const ChangedDomain& domain) {
    const std::string text = "domain " + domain.name;
    if (domain.kind == Change::kChanged) {
      Heading(text);
    } else {
      Separate();
      Line(domain.kind, text, domain.place);
    }
  }

  void Line(Change change, const std::string& text, const std::optional<Place>& place) {
    const Mark& mark = MarkOf(change);
    const std::string at = place ? "  (" + PlaceText(place) + ")" : "";
    out_ << (painter_.Paint(mark.colour, mark.sign + text) + at).EndLine();
  }

 private:
  struct Mark {
    std::string sign;
    Colour colour;
  };
  static const Mark& MarkOf(Change change) {
    static const std::array<Mark, 3> kMarks{
        {{"+ ", Colour::kGreen}, {"- ", Colour::kRed}, {"~ ", Colour::kYellow}}};
    return kMarks.at(static_cast<std::size_t>(change));
  }

  void Separate() {
    if (hasHeading_) out_ << "\n";
    hasHeading_ = true;
  }

  const Painter& painter_;
  std::ostream& out_;
  bool hasHeading_ = false;
};

std::string DecisionText(const PolicyRule& rule) {
  const std::string decision = DecisionOf(rule);
  return decision.empty() ? "nothing" : decision;
}

// The words of a rule as its line has them; of those that have changed, both.
std::string RuleLine(const ChangedRule& change) {
  if (change.Kind() != Change::kChanged) return LineOf(change.Latest());
  const RuleKey& before = change.before->key;
  const RuleKey& after = change.after->key;
  std::string text = InfoOf(before.type).keyword;
  const auto add = [&](const std::string& old, const std::string& now) {
    text += " " + (old == now ? old : old + " -> " + now);
  };
  for (std::size_t i = 0; i < before.words.size(); ++i) add(before.words[i], after.words[i]);
  add(DecisionText(*change.before), DecisionText(*change.after));
  if (before.world != 0) text += " # world " + std::to_string(before.world);
  return text;
}

// The kernel has no name for the label of a file whose object was removed.
std::string LabelText(const LabelledFile& file) {
  return file.label.empty() ? "(a label without a name)" : file.label;
}

std::string LabelLine(const std::string& name, const Changed<LabelledFile>& change) {
  const std::string latest = LabelText(change.Latest());
  if (change.Kind() != Change::kChanged) return name + " " + latest;
  return name + " " + LabelText(*change.before) + " -> " + latest;
}

std::string FileName(const FoldedLabel& file) {
  return file.files == 1 ? file.path : file.path + " (" + std::to_string(file.files) + " files)";
}

}  // namespace

void PrintDifference(const Difference& difference, const std::vector<std::string>& files,
                     const Painter& painter, std::ostream& out) {
  DifferencePrinter printer(painter, out);
  for (const ChangedDomain& domain : difference.domains) {
    printer.Heading(domain);
    for (const ChangedRule& rule : domain.rules) {
      printer.Line(rule.Kind(), RuleLine(rule), rule.Latest().place);
    }
  }
  if (!difference.objects.empty()) printer.Heading("objects");
  for (const auto& [name, change] : difference.objects) {
    printer.Line(change.Kind(), name, change.Latest().place);
  }
  if (!difference.tardisks.empty()) printer.Heading("tardisks");
  for (const auto& [name, change] : difference.tardisks) {
    printer.Line(change.Kind(), LabelLine(name, change), change.Latest().place);
  }
  if (!difference.files.empty()) printer.Heading("file labels");
  for (const FoldedLabel& file : FoldLabels(difference.files, files)) {
    const Changed<LabelledFile>& change = file.change.change;
    printer.Line(change.Kind(), LabelLine(FileName(file), change), change.Latest().place);
  }
}

}  // namespace SecPolicyTool
