// Permission letters of file rules.
#include <gtest/gtest.h>

#include "domain/file_path_access_rules.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::FilePathAccessRules;
using StandIn::MessageOf;

TEST(PermissionTest, LettersAreBitsInAnyOrder) {
  struct Row {
    const char* letters;
    std::uint32_t bits;
  };
  const Row rows[] = {
      {"", 0x0},    {"r", 0x1},   {"w", 0x2},   {"x", 0x10},   {"rw", 0x3},   {"wr", 0x3},
      {"rx", 0x11}, {"xr", 0x11}, {"wx", 0x12}, {"rwx", 0x13}, {"xwr", 0x13},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(FilePathAccessRules::GetPermission(row.letters), row.bits) << row.letters;
  }
}

TEST(PermissionTest, BadLettersAreNamed) {
  struct Row {
    std::string letters;
    const char* text;
  };
  const Row rows[] = {
      {"rr", "Read access already specified."},
      {"ww", "Write access already specified."},
      {"xx", "Exec access already specified."},
      {"rwr", "Read access already specified."},
      {"xwx", "Exec access already specified."},
      {"R", "Unknown access privilege specified."},
      {"W", "Unknown access privilege specified."},
      {"X", "Unknown access privilege specified."},
      {"-", "Unknown access privilege specified."},
      {"rw\r", "Unknown access privilege specified."},
      {std::string(1, '\0'), "Unknown access privilege specified."},
      // The first bad letter is reported.
      {"rrR", "Read access already specified."},
      {"Rrr", "Unknown access privilege specified."},
      // The length is looked at before the letters.
      {"rwxr", "Please enter the permissions from [rwx]."},
      {"RRRR", "Please enter the permissions from [rwx]."},
      {"read,write", "Please enter the permissions from [rwx]."},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(MessageOf<Tavon::Lib::TavonException>(
                  [&] { FilePathAccessRules::GetPermission(row.letters); }),
              row.text)
        << row.letters;
  }
}

}  // namespace
}  // namespace SecPolicyTest
