#include "tests/support/file_system_answers.h"

#include <dirent.h>
#include <dlfcn.h>
#include <sys/stat.h>

#include <cerrno>
#include <map>
#include <string_view>

namespace {

std::map<std::string_view, unsigned char> reportedTypes;
int fstatFailure = 0;

template <typename Function>
Function* NextFunction(const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace

namespace SecPolicyTest {

void ReportType(const char* name, unsigned char type) { reportedTypes[name] = type; }

void FailFstat(int number) { fstatFailure = number; }

}  // namespace SecPolicyTest

// These stand before the C library's functions of their names, so that the library under test
// needs no seam for what no file system at hand would answer.

extern "C" dirent64* readdir64(DIR* directory) {
  static auto* const real = NextFunction<dirent64*(DIR*)>("readdir64");
  dirent64* const entry = real(directory);
  if (entry != nullptr) {
    const auto reported = reportedTypes.find(entry->d_name);
    if (reported != reportedTypes.end()) entry->d_type = reported->second;
  }
  return entry;
}

extern "C" int fstat(int fd, struct stat* status) noexcept {
  static auto* const real = NextFunction<int(int, struct stat*)>("fstat");
  if (fstatFailure == 0) return real(fd, status);
  errno = fstatFailure;
  return -1;
}
