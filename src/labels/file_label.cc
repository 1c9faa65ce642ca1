// Labels of single files and of directory trees.
#include <cerrno>

#include "core/diagnostics.h"
#include "core/directory_stream.h"
#include "core/file_access.h"
#include "labels/security_attribute.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;
using ZekCtl::Security::kObjectLabel;

namespace {

// Links, sockets and entries of unreported type are left alone.
bool IsLabelled(unsigned char type) {
  switch (type) {
    case DT_REG:
    case DT_DIR:
    case DT_CHR:
    case DT_BLK:
    case DT_FIFO:
      return true;
    default:
      return false;
  }
}

int LabelFile(const std::string& path, const std::string& label, ZekAccessInterfaceImpl& iface) {
  const unsigned int id = iface.LookupLabel(label, kObjectLabel);
  errno = 0;
  const int result = ReplaceLabelId(path, id);
  if (result < 0) {
    throw TavonException(
        StrCat("Unable to set file label (", label, ") for file ", path, ": ", SystemReason()));
  }
  return result;
}

}  // namespace

int SetFileLabel(std::string path, std::string label, ZekAccessInterfaceImpl& iface) {
  return LabelFile(path, label, iface);
}

void SetDirLabelRecursive(std::string dir, std::string label, ZekAccessInterfaceImpl& iface) {
  LabelFile(dir, label, iface);
  DirectoryStream directory(OpenRootDirectory(dir));
  if (!directory.IsOpen()) throw TavonException("Unable to open directory " + dir);
  std::string path = dir + "/";
  const std::size_t nameBegin = path.size();
  while (const auto entry = directory.Next()) {
    if (!IsLabelled(entry->type)) continue;
    path.resize(nameBegin);
    path += entry->name;
    LabelFile(path, label, iface);
    if (entry->type == DT_DIR) SetDirLabelRecursive(path, label, iface);
  }
}

std::string GetFileLabel(std::string path, ZekAccessInterfaceImpl& iface) {
  errno = 0;
  const auto id = ReadLabelId(path);
  if (!id) {
    throw TavonException(StrCat("Unable to get file label for file ", path, ":", SystemReason()));
  }
  return iface.GetLabel(*id, kObjectLabel);
}

}  // namespace SecPolicy
