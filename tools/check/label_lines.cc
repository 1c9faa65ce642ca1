#include "tools/check/label_lines.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <string_view>

#include "host/doors/library_use.h"
#include "secpolicy/secpolicy.h"
#include "tools/check/label_mappings.h"
#include "tools/labels/descriptor_limit.h"

namespace SecPolicyTool {

namespace {

constexpr std::string_view kTree = "/*";

// What a mapping that cannot be applied comes to.
struct Trouble {
  int reason;
  Kind kind;
  const char* help;
};
constexpr std::array<Trouble, 2> kTroubles{{
    {ENOENT, Kind::kMissingPath, "correct the path"},
    {ENODATA, Kind::kUnlabelledFile,
     "labels are replaced, never added: leave the file out, it is no part of the image"},
}};
constexpr Trouble kOther{0, Kind::kLabelRefused,
                         "\"/*\" at the end is for directories that can be read"};
constexpr Trouble kWholeRoot{0, Kind::kRootLabel, "name the directories below the root one by one"};

const Trouble& TroubleOf(const std::string& path, std::string_view cause) {
  if (path == kTree) return kWholeRoot;
  for (const Trouble& trouble : kTroubles) {
    if (cause.ends_with(std::string(": ") + std::strerror(trouble.reason))) return trouble;
  }
  return kOther;
}

// The path without links, and without a slash where it is the root alone: it is put in front of
// names.
std::string ResolvedAbove(const StandIn::FileTree& root, const std::string& path) {
  const std::string resolved = root.ResolvedOrSame(path.empty() ? "/" : path);
  return resolved == "/" ? std::string() : resolved;
}

class LabelFile {
 public:
  LabelFile(const CheckedFile& file, CheckContext& context) : file_(file), context_(context) {}

  void Check(std::vector<LabelMapping>& mappings) {
    for (const PolicyLine& line : file_.text.lines) {
      if (line.words.empty() || !IsWellFormed(line)) continue;
      const std::string& word = line.words[0].text;
      const bool isTree = word.ends_with(kTree);
      const std::string path = word.substr(0, word.size() - (isTree ? kTree.size() : 0));
      if (!Applies(line, path, isTree)) continue;
      if (!path.starts_with('/')) AddRelative(line);
      mappings.push_back({&file_, &line, ResolvedAbove(context_.root.Tree(), path), isTree});
    }
  }

 private:
  bool IsWellFormed(const PolicyLine& line);
  bool Applies(const PolicyLine& line, const std::string& path, bool isTree);
  std::string Apply(const PolicyLine& line, const std::string& path, bool isTree) const;
  void AddRelative(const PolicyLine& line) {
    context_.findings.AddWarning(
        Kind::kRelativePath, SpotOf(file_, line, line.words[0]),
        "the path leads from the loading process's own directory, wherever that is",
        "write the path from the root on");
  }

  const CheckedFile& file_;
  CheckContext& context_;
  bool isRefused_ = false;  // a load reads no further
};

bool LabelFile::IsWellFormed(const PolicyLine& line) {
  const auto atLine = [&](const std::string& cause) {
    return AtLine(file_.path, line.number, cause);
  };
  bool isGood = true;
  const Effort effort = isRefused_ ? Effort::kBounded : Effort::kExact;
  if (line.words.size() != 2) {
    const std::string cause = "incorrect no of parameters";
    context_.findings.AddError(Kind::kWordCount, SpotOf(file_, line), cause, atLine(cause),
                               "write: PATH LABEL");
    isRefused_ = true;
    return false;
  }
  const LineWord& label = line.words[1];
  context_.references.objects.insert(label.text);
  const auto refusal = context_.judge.Refusal(StandIn::WordList::kObjects, label.text, effort);
  if (refusal) {
    context_.findings.AddError(Kind::kUnknownWord, SpotOf(file_, line, label), *refusal, *refusal,
                               context_.judge.HelpFor(StandIn::WordList::kObjects, *refusal));
    isGood = false;
  }
  const LineWord& path = line.words[0];
  const std::size_t tree = path.text.find(kTree);
  if (tree != std::string::npos && tree + kTree.size() != path.text.size()) {
    const std::string cause = "Unrecognized format for file/dir specification";
    context_.findings.AddError(Kind::kTreePattern, SpotOf(file_, line, path), cause, atLine(cause),
                               "\"/*\" is possible at the end only");
    isGood = false;
  }
  isRefused_ = isRefused_ || !isGood;
  return isGood;
}

// What the library says of a line that the load did not come to.
std::string LabelFile::Apply(const PolicyLine& line, const std::string& path, bool isTree) const {
  ZekCtl::Security::ZekAccessInterfaceImpl iface;
  const std::string& label = line.words[1].text;
  return TextOfRefusal([&] {
    if (isTree) {
      SecPolicy::SetDirLabelRecursive(path, label, iface);
    } else {
      SecPolicy::SetFileLabel(path, label, iface);
    }
  });
}

bool LabelFile::Applies(const PolicyLine& line, const std::string& path, bool isTree) {
  std::string cause;
  bool isShortage = false;
  if (isRefused_ || context_.isTerminated) {
    cause = Apply(line, path, isTree);
    isShortage = StandIn::LibraryUse::Current()->TakeDescriptorShortage();
  } else if (const LoadError* error = context_.load.At(file_.path, line.number)) {
    cause = error->cause;
    isShortage = context_.shortages.contains(error->text);
  }
  if (cause.empty()) return true;
  const Trouble& trouble = TroubleOf(line.words[0].text, cause);
  context_.findings.AddError(trouble.kind, SpotOf(file_, line, line.words[0]), cause,
                             AtLine(file_.path, line.number, cause),
                             isShortage ? DescriptorLimitReason() : trouble.help);
  return false;
}

}  // namespace

void CheckLabelFiles(const CheckedDirectory& labels, CheckContext& context) {
  std::vector<LabelMapping> mappings;
  for (const CheckedFile& file : labels.files) LabelFile(file, context).Check(mappings);
  CheckOverrides(mappings, context.findings);
}

}  // namespace SecPolicyTool
