#include "host/archives/entry_path.h"

#include <gtest/gtest.h>

#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

std::string Repeated(const std::string& text, std::size_t times) {
  std::string result;
  for (std::size_t i = 0; i < times; ++i) {
    result += text;
  }
  return result;
}

TEST(EntryPathTest, NamesBecomePathsFromTheRoot) {
  const struct {
    std::string name;
    std::string path;
  } cases[] = {
      {"etc/motd", "/etc/motd"},
      {"/etc/motd", "/etc/motd"},
      {"///etc", "/etc"},
      {"./etc/./motd", "/etc/motd"},
      {"etc//motd", "/etc/motd"},
      {"etc/", "/etc"},
      {".", "/"},
      {"./", "/"},
      {"/", "/"},
      {"..a/b..", "/..a/b.."},
      {"...", "/..."},
      {"\xff\x01", "/\xff\x01"},
      {std::string(255, 'a'), "/" + std::string(255, 'a')},
      {Repeated("/abcd", 819), Repeated("/abcd", 819)},  // 4095 bytes
  };
  for (const auto& [name, path] : cases) {
    EXPECT_EQ(EntryPath(name), path) << name;
  }
}

TEST(EntryPathTest, NamesThatLeadElsewhereAreRefused) {
  const struct {
    std::string name;
    std::string message;
  } cases[] = {
      {"", "the name is empty"},
      {"..", "the name has a \"..\" component"},
      {"a/../b", "the name has a \"..\" component"},
      {"a/..", "the name has a \"..\" component"},
      {"/../a", "the name has a \"..\" component"},
      {std::string("a\0b", 3), "the name has a NUL byte"},
      {"a/" + std::string(256, 'b'), "a component of the name is longer than 255 bytes"},
      {Repeated("/abcd", 818) + "/abcde", "the name is longer than 4095 bytes"},
  };
  for (const auto& [name, message] : cases) {
    EXPECT_EQ(MessageOf<BadEntry>([&n = name] { EntryPath(n); }), message) << name;
  }
}

TEST(EntryPathTest, HardLinkTargetsAreRelative) {
  EXPECT_EQ(HardLinkTarget("./etc/motd"), "/etc/motd");
  EXPECT_EQ(MessageOf<BadEntry>([] { HardLinkTarget("/etc/motd"); }), "the target is absolute");
  EXPECT_EQ(MessageOf<BadEntry>([] { HardLinkTarget("../etc"); }),
            "the target has a \"..\" component");
}

TEST(EntryPathTest, OnlyMadePathsAreBelowTheRoot) {
  for (const char* path : {"/a", "/a/b", "/a b", "/..."}) {
    EXPECT_TRUE(IsPathBelowRoot(path)) << path;
  }
  for (const char* path : {"", "/", "a", "/a/", "//a", "/a//b", "/./a", "/../a", "/a/.."}) {
    EXPECT_FALSE(IsPathBelowRoot(path)) << path;
  }
}

TEST(EntryPathTest, ParentIsThePathWithoutItsLastComponent) {
  EXPECT_EQ(ParentOf("/a"), "/");
  EXPECT_EQ(ParentOf("/a/b/c"), "/a/b");
}

}  // namespace
}  // namespace StandIn
