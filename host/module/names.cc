#include "host/module/names.h"

#include <cerrno>

#include "host/module/module_error.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

NameFault TooLong(std::size_t longest) {
  return {ENAMETOOLONG, StrCat("is longer than ", longest, " bytes")};
}

void Require(const char* what, const std::string& name, const std::optional<NameFault>& fault) {
  if (fault) {
    throw ModuleError(fault->number, StrCat("the ", what, " \"", Shown(name), "\" ", fault->text));
  }
}

}  // namespace

std::optional<NameFault> FaultOfName(const std::string& name) {
  if (name.size() > kLongestName) {
    return TooLong(kLongestName);
  }
  return FaultOfFreeWord(name);
}

std::optional<NameFault> FaultOfPath(const std::string& path) {
  if (!path.starts_with('/')) {
    return NameFault{EINVAL, "is not absolute"};
  }
  if (path.size() > kLongestPath) {
    return TooLong(kLongestPath);
  }
  return FaultOfFreeWord(path);
}

std::optional<NameFault> FaultOfFreeWord(const std::string& word) {
  if (word.empty()) {
    return NameFault{EINVAL, "is empty"};
  }
  if (word.find('\0') != std::string::npos) {
    return NameFault{EINVAL, "holds a NUL byte"};
  }
  return std::nullopt;
}

std::string Shown(const std::string& name) {
  std::string shown;
  for (const char c : name) {
    if (c == '\0') {
      shown += "\\0";
    } else {
      shown += c;
    }
  }
  return shown;
}

void RequireName(const char* what, const std::string& name) {
  Require(what, name, FaultOfName(name));
}

void RequirePath(const char* what, const std::string& path) {
  Require(what, path, FaultOfPath(path));
}

void RequireFreeWord(const char* what, const std::string& word) {
  Require(what, word, FaultOfFreeWord(word));
}

}  // namespace StandIn
