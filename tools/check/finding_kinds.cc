#include "tools/check/finding_kinds.h"

#include <algorithm>

namespace SecPolicyTool {

namespace {

constexpr Severity kError = Severity::kError;
constexpr Severity kWarning = Severity::kWarning;

}  // namespace

const std::array<FindingKind, kFindingKinds>& FindingKinds() {
  static constexpr std::array<FindingKind, kFindingKinds> kKinds{{
      {"bad-decision", kError, "A rule ends in something else than a decision.",
       "End the rule in grant or revoke, in small letters."},
      {"bad-permission", kError, "The letters of a path rule are no permission.",
       "Write each of r, w and x at most once, or nothing for no permission."},
      {"contradictory-parameter", kError,
       "A capability is granted and revoked for the same parameter in one domain.",
       "Keep one of the two lines; until then none of the domain's rules are installed."},
      {"label-refused", kError, "A file or tree cannot be labelled.",
       "Mend the path; what was labelled before the refusal keeps the label."},
      {"load-error", kError, "A load reports an error that nothing else here explains.",
       "Look the text up in messages.md."},
      {"missing-domain", kError, "A domain without which a load is terminated does not exist.",
       "Make a file of its name in domains/; it may be empty."},
      {"no-backing-tardisk", kError, "A tardisk policy file comes from no tardisk.",
       "Pack the file into the tardisk that it is about."},
      {"refused-name", kError, "The kernel refuses the name of a domain or of an object.",
       "Choose a name that the kernel takes: 1 to 127 bytes on the stand-in host."},
      {"second-exception", kError, "A tardisk policy file has more than one exception.",
       "Keep one -E line."},
      {"tree-pattern", kError, "A file label has \"/*\" somewhere but at its path's end.",
       "Name the directory whose tree is meant; there are no other wildcards."},
      {"unknown-domain", kError, "A rule names a domain that does not exist.",
       "Correct the name, or make a file of that name in domains/."},
      {"unknown-rule-type", kError, "A line begins with a word that is no rule type.",
       "Begin the line with a rule type of its kind of file."},
      {"unknown-word", kError, "The kernel does not know a word.",
       "Correct the word; an object has to be defined in objects/."},
      {"unreadable", kError, "A policy file or directory cannot be opened.",
       "Make it, or make it readable."},
      {"word-count", kError, "A line has too few or too many words.",
       "Compare the line with the form of its rule type; look for tabs and quotation marks."},

      {"backup-file", kWarning, "A file looks like a copy that an editor or a tool left behind.",
       "Remove it: a load reads every regular file, whatever its name."},
      {"carriage-return", kWarning, "A carriage return is part of a word.",
       "Save the file with line ends of a newline alone."},
      {"contradictory-rule", kWarning,
       "Two lines of a domain decide differently on the same thing.",
       "Keep the one that is meant; as it stands the later one wins."},
      {"duplicate-tardisk-policy", kWarning, "Two policy files come from one tardisk.",
       "Keep one file in each tardisk."},
      {"empty-domain", kWarning, "A domain has no rules.", "Write its rules, or remove the file."},
      {"long-line", kWarning, "A line has more than 1,023 bytes, which end its file.",
       "Break the line up: neither its rest nor the lines below it are read."},
      {"missing-path", kWarning, "A path does not exist in the host's root.",
       "Correct the path, or put up with a rule that waits for it."},
      {"nul-byte", kWarning, "A NUL byte ends a line early.", "Remove the byte."},
      {"overridden-label", kWarning,
       "A later line gives everything that a line labels another label.",
       "Remove the line, or put it behind the one that overrides it."},
      {"relative-path", kWarning, "A path does not begin with a slash.",
       "Write the path from the root on."},
      {"repeated-rule", kWarning, "A line says again what an earlier one says.",
       "Remove one of the two."},
      {"root-label", kWarning, "\"/*\" alone labels nothing.",
       "Name the directories below the root one by one."},
      {"skipped-entry", kWarning, "A load passes over an entry of the policy directory.",
       "Replace a link by the file itself; move anything else out of the policy."},
      {"tab", kWarning, "A tab is part of a word.", "Separate words by spaces."},
      {"undefined-tardisk-label", kWarning, "The label of a tardisk's exception is not defined.",
       "Define the label in objects/."},
      {"unlabelled-file", kWarning, "A file does not carry the attribute that holds its label.",
       "Leave it out of the labelled trees: labels are replaced, never added."},
      {"unreachable-domain", kWarning, "No program can come into a domain.",
       "Grant a transition into it from a domain in which programs run, or remove its file."},
      {"unused-object", kWarning, "Nothing refers to an object.", "Use it, or remove its line."},
  }};
  return kKinds;
}

const FindingKind& InfoOf(Kind kind) { return FindingKinds().at(static_cast<std::size_t>(kind)); }

bool IsWarningId(const std::string& id) {
  const auto& kinds = FindingKinds();
  return std::any_of(kinds.begin(), kinds.end(), [&](const FindingKind& kind) {
    return kind.severity == kWarning && kind.id == id;
  });
}

std::string WarningIds() {
  std::string ids;
  for (const FindingKind& kind : FindingKinds()) {
    if (kind.severity == kWarning) ids += (ids.empty() ? "" : ", ") + std::string(kind.id);
  }
  return ids;
}

}  // namespace SecPolicyTool
