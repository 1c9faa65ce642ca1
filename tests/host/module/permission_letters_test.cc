#include "host/module/permission_letters.h"

#include <gtest/gtest.h>

namespace StandIn {
namespace {

TEST(PermissionLetters, LettersAndBitsBelongTogether) {
  struct Row {
    std::uint32_t permission;
    const char* letters;
  };
  const Row rows[] = {{0, ""},   {1, "r"},     {2, "w"},     {0x10, "x"},
                      {3, "rw"}, {0x11, "rx"}, {0x12, "wx"}, {0x13, "rwx"}};
  for (const Row& row : rows) {
    EXPECT_EQ(PermissionLetters(row.permission), row.letters);
    EXPECT_EQ(PermissionOfLetters(row.letters), row.permission);
  }
}

TEST(PermissionLetters, OtherTextsAreNoPermission) {
  for (const char* letters : {"wr", "rr", "R", "rwxr", "a", "r ", "xr"}) {
    EXPECT_EQ(PermissionOfLetters(letters), std::nullopt) << letters;
  }
}

}  // namespace
}  // namespace StandIn
