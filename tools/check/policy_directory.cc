#include "tools/check/policy_directory.h"

#include <algorithm>
#include <array>
#include <filesystem>
#include <map>
#include <stdexcept>
#include <string_view>

#include "host/module/nearest_word.h"
#include "secpolicy/secpolicy.h"
#include "tools/check/file_oddities.h"
#include "tools/check/findings.h"

namespace SecPolicyTool {

namespace {

namespace fs = std::filesystem;

// All names, in the order in which the directory lists them. None when it cannot be listed.
std::vector<std::string> NamesIn(const std::string& path) {
  std::vector<std::string> names;
  std::error_code error;
  for (fs::directory_iterator entry(path, error), end; !error && entry != end;
       entry.increment(error)) {
    names.push_back(entry->path().filename().string());
  }
  return names;
}

const char* NameOfType(const std::string& path) {
  std::error_code ignored;
  switch (fs::symlink_status(path, ignored).type()) {
    case fs::file_type::symlink:
      return "a symbolic link";
    case fs::file_type::directory:
      return "a directory";
    default:
      return "no regular file";
  }
}

void AddSkipped(const DirectoryToRead& directory, const std::string& name, Findings& findings) {
  const Spot spot = SpotOf(directory.shown + "/" + name);
  const std::string message =
      std::string(NameOfType(directory.path + "/" + name)) + ", which a load passes over";
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

// The regular files, by name unless the directory's own order counts.
std::vector<std::string> FilesToRead(const DirectoryToRead& directory, Findings& findings) {
  std::map<std::string, std::string> files;
  SecPolicy::GetFileList(directory.path, files);
  std::vector<std::string> names = NamesIn(directory.path);
  if (!directory.isTardiskPolicy) std::sort(names.begin(), names.end());
  std::erase_if(names, [&](const std::string& name) {
    if (files.contains(directory.path + "/" + name)) return false;
    AddSkipped(directory, name, findings);
    return true;
  });
  return names;
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
  std::vector<std::string> names;
  try {
    names = FilesToRead(directory, findings);
  } catch (const Tavon::Lib::TavonException& failure) {
    findings.AddError(Kind::kUnreadable, SpotOf(directory.shown), "the directory cannot be opened",
                      directory.isTardiskPolicy
                          ? "Unable to open policy directory for tardisks " + directory.path
                          : failure.what(),
                      "make it; it may be empty");
    return read;
  }
  for (const std::string& name : names) {
    CheckedFile file{name, directory.path + "/" + name, directory.shown + "/" + name, {}};
    if (IsBackupName(name)) AddBackup(file.shown, findings);
    try {
      file.text = ReadPolicyFile(file.path);
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

void CheckTopEntries(const std::string& path, const std::string& shown, Findings& findings) {
  static const std::vector<std::string> kRead{"objects", "domains", "fileLabels", "tardisks"};
  const std::string prefix = shown + "/";
  std::vector<std::string> names = NamesIn(path);
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
