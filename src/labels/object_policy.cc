#include "labels/object_policy.h"

#include "core/diagnostics.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;
using ZekCtl::Security::kObjectKeyword;
using ZekCtl::Security::kObjectLabel;

namespace {

// The kernel's own reason is dropped: the summary is all that this stage says of it.
void SetObjectsOrFail(ObjectPolicy& policy, ZekAccessInterfaceImpl& iface) try {
  policy.SetObjects(iface);
} catch (const TavonException&) {
  SecpolicyError("Error in defining some objects");
  throw TavonException("Failure in object policy");
}

}  // namespace

void ObjectPolicy::ParsePolicy(std::string path) {
  std::map<unsigned int, std::queue<std::string>> lines;
  ParseFile(path, lines);
  for (const auto& [line, words] : lines) {
    if (words.size() != 1) {
      throw TavonException(AtLine(path, line, "cannot define more than one object per line"));
    }
    objects_.push_back(words.front());
  }
}

void ObjectPolicy::SetObjects(ZekAccessInterfaceImpl& iface) {
  SyncLabelsFromPolicy(objects_, iface.GetKeywordsMap(kObjectKeyword), kObjectLabel, iface);
}

void LoadPolicyObjects(std::string dir, ZekAccessInterfaceImpl& iface) {
  ObjectPolicy policy;
  std::map<std::string, std::string> files;
  GetFileList(dir, files);
  bool allParsed = true;
  for (const auto& file : files) {
    allParsed &= SucceedsOrLogs([&] { policy.ParsePolicy(file.first); });
  }
  LogSummary(allParsed, "Parsed all objects", "Error in parsing some object files");
  SetObjectsOrFail(policy, iface);
  SecpolicyInfo("Objects defined and obsolete objects removed");
  if (!allParsed) throw TavonException("Failure in object policy");
}

void DisplayPolicyObjects(ZekAccessInterfaceImpl& iface) {
  DisplayHeader("Objects Defined: Name (Kernel Id)", "");
  for (const auto& [name, id] : iface.GetKeywordsMap(kObjectKeyword)) {
    PrintLine(StrCat(name, " (", id, ")"));
  }
}

}  // namespace SecPolicy
