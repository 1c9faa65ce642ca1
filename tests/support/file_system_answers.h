// What the tests' process is told by the file system.
#pragma once

namespace SecPolicyTest {

// From here on, listings report the entries of this name with `type`, as a file system would that
// does not report types (DT_UNKNOWN), or whose entry was exchanged after the listing. For the body
// of a Run, whose process ends with it; `name` must live as long.
void ReportType(const char* name, unsigned char type);

// From here on, fstat fails.
void FailFstat(int number);

}  // namespace SecPolicyTest
