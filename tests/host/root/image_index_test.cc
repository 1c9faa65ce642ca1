#include "host/root/image_index.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "secpolicy/host/host_error.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

TEST(ImageIndexTest, HasTheShapeThatItsHeaderShows) {
  EXPECT_EQ(ParseImageIndex(R"({"tardisks": [{"name": "base.tar", "paths": ["/etc", "/etc/motd"]},
                                             {"name": "empty.tar", "paths": []}]})",
                            "image.json"),
            (ImageIndex{{{"base.tar", {"/etc", "/etc/motd"}}, {"empty.tar", {}}}}));
}

TEST(ImageIndexTest, AnythingComesBackAsWritten) {
  const ImageIndex index{{{"\xff%.tar", {"/a\nb", "/\xc3\xa4", "/100%"}}, {"z", {}}}};
  EXPECT_EQ(ParseImageIndex(FormatImageIndex(index), "image.json"), index);
}

TEST(ImageIndexTest, WhatAssemblyWouldNotWriteIsRefused) {
  const struct {
    const char* text;
    const char* message;
  } cases[] = {
      {R"({"tardisks": [{"name": "a/b", "paths": []}]})",
       "f: /tardisks/0/name: \"a/b\" is not a file name"},
      {R"({"tardisks": [{"name": "..", "paths": []}]})",
       "f: /tardisks/0/name: \"..\" is not a file name"},
      {R"({"tardisks": [{"name": "", "paths": []}]})",
       "f: /tardisks/0/name: \"\" is not a file name"},
      {R"({"tardisks": [{"name": "a", "paths": []}, {"name": "a", "paths": []}]})",
       "f: /tardisks/1/name: \"a\" stands twice"},
      {R"({"tardisks": [{"name": "a", "paths": ["etc"]}]})",
       "f: /tardisks/0/paths/0: \"etc\" is not a path that an archive can bring"},
      {R"({"tardisks": [{"name": "a", "paths": ["/"]}]})",
       "f: /tardisks/0/paths/0: \"/\" is not a path that an archive can bring"},
      {R"({"tardisks": [{"name": "a", "paths": ["/a/../b"]}]})",
       "f: /tardisks/0/paths/0: \"/a/../b\" is not a path that an archive can bring"},
      {R"({"tardisks": [{"name": "a", "paths": ["/a%00b"]}]})",
       "f: /tardisks/0/paths/0: \"/a\\x00b\" is not a path that an archive can bring"},
      {R"({"tardisks": [{"name": "a", "paths": ["/tardisks"]}]})",
       "f: /tardisks/0/paths/0: \"/tardisks\" is not a path that an archive can bring"},
      {R"({"tardisks": [{"name": "a", "paths": ["/tardisks/a"]}]})",
       "f: /tardisks/0/paths/0: \"/tardisks/a\" is not a path that an archive can bring"},
      {R"({"tardisks": [{"name": "a", "paths": ["/x"]}, {"name": "b", "paths": ["/x"]}]})",
       "f: /tardisks/1/paths/0: \"/x\" stands twice"},
  };
  for (const auto& [text, message] : cases) {
    EXPECT_EQ(MessageOf<HostError>([t = text] { ParseImageIndex(t, "f"); }), message) << text;
  }
}

TEST(ImageIndexTest, DamagedTextIsRefusedWithItsPlace) {
  const struct {
    const char* text;
    const char* start;
  } cases[] = {
      {"{\"tardisks\": [", "f:1:1"},
      {"[]", "f: "},
      {"{}", "f: "},
      {R"({"tardisks": [], "root": 1})", "f: /root: "},
      {R"({"tardisks": [{"name": "a", "paths": [], "mode": 1}]})", "f: /tardisks/0/mode: "},
      {R"({"tardisks": [{"name": "a", "paths": ["/%zz"]}]})", "f: /tardisks/0/paths/0: "},
      {R"({"tardisks": [{"name": "a", "paths": [3]}]})", "f: /tardisks/0/paths/0: "},
  };
  for (const auto& [text, start] : cases) {
    EXPECT_THAT(MessageOf<HostError>([t = text] { ParseImageIndex(t, "f"); }),
                testing::StartsWith(start))
        << text;
  }
}

}  // namespace
}  // namespace StandIn
