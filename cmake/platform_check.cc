// Linked, and never run, to see that a library holds a platform's classes.
#include "platform/sysinfo.h"
#include "platform/zek_access.h"

int main() {
  const ZekCtl::Security::ZekAccessInterfaceImpl access;
  const ZekCtl::Util::Sysinfo information(ZekCtl::Util::kInodeStatsNode);
}
