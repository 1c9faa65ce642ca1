#include "tools/check/policy_directory.h"

#include <sys/stat.h>

#include <algorithm>
#include <array>
#include <optional>
#include <stdexcept>
#include <string_view>
#include <utility>

#include "core/directory_stream.h"
#include "host/module/nearest_word.h"
#include "tools/check/file_oddities.h"
#include "tools/check/findings.h"

namespace SecPolicyTool {

namespace {

const char* NameOfType(mode_t type) {
  switch (type) {
    case S_IFLNK:
      return "a symbolic link";
    case S_IFDIR:
      return "a directory";
    default:
      return "no regular file";
  }
}

void AddSkipped(const DirectoryToRead& directory, const std::string& name, Findings& findings) {
  const Spot spot = SpotOf(directory.shown + "/" + name);
  const std::string message =
      std::string(NameOfType(directory.tree.LinkType(directory.path + "/" + name))) +
      ", which a load passes over";
  const std::string help = "put the file itself here, or remove the entry";
  if (directory.isTardiskPolicy) {
    findings.AddError(Kind::kSkippedEntry, spot, message, "Skipping directory " + name, help);
  } else {
    findings.AddWarning(Kind::kSkippedEntry, spot, message, help);
  }
}

void AddBackup(const std::string& shown, Findings& findings) {
  findings.AddWarning(Kind::kBackupFile, SpotOf(shown),
                      "the name is that of a copy that was left behind, and a load reads the file",
                      "remove it");
}

// The regular files, by name unless the directory's own order counts. Nothing when the directory
// cannot be opened.
std::optional<std::vector<std::string>> FilesToRead(const DirectoryToRead& directory,
                                                    Findings& findings) {
  SecPolicy::DirectoryStream stream(directory.tree.OpenDirectory(directory.path));
  if (!stream.IsOpen()) return std::nullopt;
  std::vector<SecPolicy::DirectoryEntry> entries;
  while (auto entry = stream.Next()) entries.push_back(std::move(*entry));
  if (!directory.isTardiskPolicy) {
    std::sort(entries.begin(), entries.end(),
              [](const auto& a, const auto& b) { return a.name < b.name; });
  }
  std::vector<std::string> names;
  for (SecPolicy::DirectoryEntry& entry : entries) {
    if (entry.type == DT_REG) {
      names.push_back(std::move(entry.name));
    } else {
      AddSkipped(directory, entry.name, findings);
    }
  }
  return names;
}

void AddUnreadable(const DirectoryToRead& directory, Findings& findings) {
  const char* text = directory.isTardiskPolicy ? "Unable to open policy directory for tardisks "
                                               : "Unable to open policy directory ";
  findings.AddError(Kind::kUnreadable, SpotOf(directory.shown), "the directory cannot be opened",
                    text + directory.path, "make it; it may be empty");
}

}  // namespace

bool IsBackupName(const std::string& name) {
  static constexpr std::array<std::string_view, 18> kEnds{
      "~",         ".bak",       ".orig",     ".rej",     ".old",     ".save",
      ".swp",      ".swo",       ".swn",      ".tmp",     ".backup",  ".dpkg-old",
      ".dpkg-new", ".dpkg-dist", ".dpkg-bak", ".rpmsave", ".rpmorig", ".rpmnew"};
  if (name.starts_with(".#") || (name.starts_with("#") && name.ends_with("#"))) return true;
  return std::any_of(kEnds.begin(), kEnds.end(),
                     [&](std::string_view end) { return name.ends_with(end); });
}

CheckedDirectory ReadDirectory(const DirectoryToRead& directory, Findings& findings) {
  CheckedDirectory read{directory.path, directory.shown, {}};
  const auto names = FilesToRead(directory, findings);
  if (!names) {
    AddUnreadable(directory, findings);
    return read;
  }
  for (const std::string& name : *names) {
    CheckedFile file{name, directory.path + "/" + name, directory.shown + "/" + name, {}};
    if (IsBackupName(name)) AddBackup(file.shown, findings);
    try {
      file.text = ReadPolicyFile(directory.tree, file.path);
    } catch (const std::runtime_error& failure) {
      findings.AddError(Kind::kUnreadable, SpotOf(file), "the file cannot be opened",
                        failure.what(), "make it readable");
      continue;
    }
    CheckOddities(file, findings);
    read.files.push_back(std::move(file));
  }
  return read;
}

void CheckTopEntries(const PolicyFiles& policy, Findings& findings) {
  static const std::vector<std::string> kRead{"objects", "domains", "fileLabels", "tardisks"};
  const std::string prefix = policy.shown + "/";
  std::vector<std::string> names;
  SecPolicy::DirectoryStream stream(policy.tree.OpenDirectory(policy.path));
  while (auto entry = stream.IsOpen() ? stream.Next() : std::nullopt) {
    names.push_back(std::move(entry->name));
  }
  std::sort(names.begin(), names.end());
  for (const std::string& name : names) {
    if (name.starts_with(".") || std::find(kRead.begin(), kRead.end(), name) != kRead.end()) {
      continue;
    }
    const auto nearest = StandIn::NearestWord(name, kRead);
    const bool isBeside =
        !nearest || std::find(names.begin(), names.end(), *nearest) != names.end();
    findings.AddWarning(Kind::kSkippedEntry, SpotOf(prefix + name),
                        "a load reads nothing of this name",
                        isBeside ? "what is read is objects, domains and fileLabels"
                                 : "did you mean \"" + *nearest + "\"?");
  }
}

}  // namespace SecPolicyTool
