// The joining of texts that messages are built with.
#include <gtest/gtest.h>

#include <cstdint>
#include <limits>

#include "platform/tavon_strcat.h"

namespace {

using Tavon::Misc::StrCat;

TEST(StrCatTest, NoPartsAreAnEmptyText) { EXPECT_EQ(StrCat(), ""); }

TEST(StrCatTest, TextsStandBehindOneAnother) {
  EXPECT_EQ(StrCat(std::string("a b"), "", " c", std::string_view("d")), "a b cd");
}

TEST(StrCatTest, CharactersAreThemselves) { EXPECT_EQ(StrCat("a", ':', '7'), "a:7"); }

TEST(StrCatTest, NumbersAreDecimal) {
  EXPECT_EQ(StrCat(-1, " ", std::numeric_limits<std::uint32_t>::max(), " ", 0UL),
            "-1 4294967295 0");
}

}  // namespace
