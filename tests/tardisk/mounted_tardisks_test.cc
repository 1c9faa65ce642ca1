// Listing the mounted tardisks.
#include <dirent.h>

#include <cerrno>

#include "tardisk/tardisk_discovery.h"
#include "tests/support/file_system_answers.h"
#include "tests/support/open_descriptors.h"
#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::IsEmpty;
using testing::UnorderedElementsAre;

class MountedTardisksTest : public TardiskTest {
 protected:
  // The value is the paths, each on a line, behind one that was in the list before.
  Outcome GetAll(const std::function<void()>& prepare = [] {}) {
    return Run([&] {
      prepare();
      std::list<std::string> tardisks{"/tardisks/before"};
      SecPolicy::GetAllTardisks(tardisks);
      return Lines(tardisks);
    });
  }

  template <typename Paths>
  static std::string Lines(const Paths& paths) {
    std::string text;
    for (const std::string& path : paths) text += path + "\n";
    return text;
  }
};

TEST_F(MountedTardisksTest, PathsAreAppendedInListingOrder) {
  PlainTardisks({"vendor", "base", "network", "a b"});
  const Outcome outcome = GetAll();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.value, "/tardisks/before\n" + Lines(Mounted()));
  EXPECT_THAT(Mounted(), UnorderedElementsAre("/tardisks/a b", "/tardisks/base",
                                              "/tardisks/network", "/tardisks/vendor"));
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(MountedTardisksTest, EmptyDirectoryHasNone) {
  const Outcome outcome = GetAll();
  EXPECT_EQ(outcome.value, "/tardisks/before\n");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(MountedTardisksTest, ErrnoStaysAsItIs) {
  PlainTardisks({"base"});
  const Outcome outcome = Run([] {
    std::list<std::string> tardisks;
    errno = EDOM;
    SecPolicy::GetAllTardisks(tardisks);
    return errno;
  });
  EXPECT_EQ(outcome.value, std::to_string(EDOM));
}

TEST_F(MountedTardisksTest, HiddenFileIsATardisk) {
  Assemble();
  StandIn::WriteBytes(InRoot("/tardisks/.hidden"), "");
  EXPECT_EQ(GetAll().value, "/tardisks/before\n/tardisks/.hidden\n");
}

TEST_F(MountedTardisksTest, EveryOtherEntryIsSkippedWithTheSameWord) {
  PlainTardisks({"base"});
  Assemble();
  std::filesystem::create_directory(InRoot("/tardisks/sub"));
  std::filesystem::create_symlink("base", InRoot("/tardisks/link"));
  ASSERT_EQ(mkfifo(InRoot("/tardisks/pipe").c_str(), 0600), 0);
  const Outcome outcome = GetAll();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.value, "/tardisks/before\n/tardisks/base\n");
  EXPECT_THAT(outcome.Errors(),
              UnorderedElementsAre("Skipping directory sub", "Skipping directory link",
                                   "Skipping directory pipe"));
  EXPECT_THAT(outcome.Infos(), IsEmpty());
}

TEST_F(MountedTardisksTest, TypeIsTakenFromTheListingAlone) {
  PlainTardisks({"base"});
  Assemble();
  std::filesystem::create_directory(InRoot("/tardisks/sub"));
  const Outcome unknown = GetAll([] { ReportType("base", DT_UNKNOWN); });
  EXPECT_EQ(unknown.value, "/tardisks/before\n");
  EXPECT_THAT(unknown.Errors(),
              UnorderedElementsAre("Skipping directory base", "Skipping directory sub"));
  const Outcome regular = GetAll([] {
    ReportType("base", DT_DIR);
    ReportType("sub", DT_REG);
  });
  EXPECT_EQ(regular.value, "/tardisks/before\n/tardisks/sub\n");
}

TEST_F(MountedTardisksTest, MissingDirectoryIsNamed) {
  Assemble();
  std::filesystem::remove_all(InRoot("/tardisks"));
  const Outcome outcome = GetAll();
  EXPECT_EQ(outcome.error, "Could not open tardisk dir /tardisks/");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(MountedTardisksTest, FileInThePlaceOfTheDirectoryIsNamedTheSame) {
  Assemble();
  std::filesystem::remove_all(InRoot("/tardisks"));
  StandIn::WriteBytes(InRoot("/tardisks"), "");
  EXPECT_EQ(GetAll().error, "Could not open tardisk dir /tardisks/");
}

TEST_F(MountedTardisksTest, DirectoryIsClosedAgain) {
  PlainTardisks({"base"});
  const Outcome outcome = Run([] {
    const int before = OpenDescriptors();
    std::list<std::string> tardisks;
    SecPolicy::GetAllTardisks(tardisks);
    return OpenDescriptors() - before;
  });
  EXPECT_EQ(outcome.value, "0");
}

}  // namespace
}  // namespace SecPolicyTest
