#include "tests/core/directory_reads.h"

#include <dirent.h>
#include <dlfcn.h>

#include <cerrno>

namespace {

constexpr long kEndless = -1;

std::string unreported;
long entriesLeft = kEndless;

}  // namespace

// Stands before the C library's function of this name.
extern "C" dirent64* readdir64(DIR* directory) {
  using Read = dirent64* (*)(DIR*);
  static const Read read = reinterpret_cast<Read>(dlsym(RTLD_NEXT, "readdir64"));
  if (entriesLeft == 0) {
    errno = EIO;
    return nullptr;
  }
  if (entriesLeft > 0) --entriesLeft;
  dirent64* entry = read(directory);
  if (entry != nullptr && !unreported.empty() && unreported == entry->d_name) {
    entry->d_type = DT_UNKNOWN;
  }
  return entry;
}

namespace SecPolicyTest {

UnreportedType::UnreportedType(const std::string& name) { unreported = name; }
UnreportedType::~UnreportedType() { unreported.clear(); }

FailingListing::FailingListing(long entries) { entriesLeft = entries; }
FailingListing::~FailingListing() { entriesLeft = kEndless; }

}  // namespace SecPolicyTest
