// The objects that the policy names.
#pragma once

#include <string>
#include <vector>

#include "secpolicy/secpolicy.h"

namespace SecPolicy {

// Collects object names, in the order in which they are read, and makes them the kernel's objects.
class ObjectPolicy {
 public:
  // Appends the names in the policy file at `path`, one on a line. Throws at the first line with
  // more: path + ":" + line + " : cannot define more than one object per line". The names of the
  // lines before stay.
  void ParsePolicy(std::string path);

  // Makes the kernel's objects equal to the names; the kernel-access library's exceptions pass
  // through and leave what was done until then.
  void SetObjects(ZekAccessInterfaceImpl& iface);

 private:
  std::vector<std::string> objects_;
};

}  // namespace SecPolicy
