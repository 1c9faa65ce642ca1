#include "labels/file_label_policy.h"

#include <string_view>
#include <utility>

#include "core/diagnostics.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

constexpr std::string_view kTreeSuffix = "/*";

// Fills path and recursive from `text`; false when "/*" stands anywhere but at its end.
bool ReadPath(const std::string& text, FileLabelPolicy::FileLabel& mapping) {
  const std::size_t wildcard = text.find(kTreeSuffix);
  mapping.recursive = wildcard != std::string::npos;
  mapping.path = text.substr(0, wildcard);
  return !mapping.recursive || wildcard == text.size() - kTreeSuffix.size();
}

void Apply(const FileLabelPolicy::FileLabel& mapping, ZekAccessInterfaceImpl& iface) try {
  if (mapping.recursive) {
    SetDirLabelRecursive(mapping.path, mapping.label, iface);
  } else {
    SetFileLabel(mapping.path, mapping.label, iface);
  }
} catch (const TavonException& failure) {
  throw TavonException(AtLine(mapping.file, mapping.line, failure.what()));
}

}  // namespace

void FileLabelPolicy::ParsePolicy(std::string path, ZekAccessInterfaceImpl& iface) {
  std::map<unsigned int, std::queue<std::string>> lines;
  ParseFile(path, lines);
  for (const auto& [line, words] : lines) {
    if (words.size() != 2) throw TavonException(AtLine(path, line, "incorrect no of parameters"));
    FileLabel mapping{"", words.back(), false, path, line};
    iface.ValidateKeyword(ZekCtl::Security::kObjectKeyword, mapping.label);
    if (!ReadPath(words.front(), mapping)) {
      throw TavonException(AtLine(path, line, "Unrecognized format for file/dir specification"));
    }
    labels_.push_back(std::move(mapping));
  }
}

void FileLabelPolicy::SetFileLabels(ZekAccessInterfaceImpl& iface) {
  bool allSet = true;
  while (!labels_.empty()) {
    // Taken out first, so that it is gone after its attempt however that ends.
    const FileLabel mapping = std::move(labels_.front());
    labels_.pop_front();
    allSet &= SucceedsOrLogs([&] { Apply(mapping, iface); });
  }
  if (!allSet) throw TavonException("There was a failure in setting file labels");
}

void LoadPolicyFileLabels(std::string dir, ZekAccessInterfaceImpl& iface) {
  FileLabelPolicy policy;
  std::map<std::string, std::string> files;
  GetFileList(dir, files);
  bool allParsed = true;
  for (const auto& [path, name] : files) {
    try {
      policy.ParsePolicy(path, iface);
    } catch (const TavonException& failure) {
      SecpolicyError("Error parsing file " + path);
      SecpolicyError(failure.what());
      allParsed = false;
    }
  }
  LogSummary(allParsed, "Parsed all file label mappings",
             "Error in parsing some file label mappings.");
  const bool allSet = SucceedsOrLogs([&] { policy.SetFileLabels(iface); });
  LogSummary(allSet, "Set all file labels", "Error in setting some file labels.");
  if (!allParsed || !allSet) throw TavonException("Failure in file labels policy");
}

}  // namespace SecPolicy
