// Discovery that fails: what the lists hold then, and what is left open.
#include <dirent.h>

#include "tests/support/file_system_answers.h"
#include "tests/support/open_descriptors.h"
#include "tests/tardisk/tardisk_lists_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class TardiskListsFailureTest : public TardiskListsTest {};

TEST_F(TardiskListsFailureTest, MissingPolicyDirectoryLeavesBothListsAsTheyAre) {
  PlainTardisks({"base", "vendor"});
  const Outcome outcome =
      Sort("/etc/none", [](Lists& lists) { lists.without = {"/tardisks/before"}; });
  EXPECT_EQ(outcome.value, "default /tardisks/before\n");
  EXPECT_THAT(outcome.events,
              ElementsAre("info: Skipping tardisk policy as /etc/none does not exist"));
}

TEST_F(TardiskListsFailureTest, PolicyDirectoryThatCannotBeOpenedIsAnotherMatter) {
  PlainTardisks({"base"});
  for (const std::string dir : {"/opt/base", "/opt/base/tardisks"}) {  // a file in its place
    const Outcome outcome = Sort(dir, [](Lists& lists) { lists.without = {"/tardisks/before"}; });
    EXPECT_EQ(outcome.value,
              "default /tardisks/before\n"
              "thrown: Unable to open policy directory for tardisks " +
                  dir);
    EXPECT_THAT(outcome.events, IsEmpty());
  }
}

TEST_F(TardiskListsFailureTest, OverlongDirectoryNameIsNoMissingDirectory) {
  const std::string dir = "/" + std::string(300, 'n');
  EXPECT_EQ(Sort(dir).value, "thrown: Unable to open policy directory for tardisks " + dir);
}

TEST_F(TardiskListsFailureTest, MissingTardiskDirectoryFailsBeforeThePolicyDirectoryIsOpened) {
  Assemble();
  std::filesystem::remove_all(InRoot("/tardisks"));
  const Outcome outcome = Sort("/etc/none");
  EXPECT_EQ(outcome.value, "thrown: Could not open tardisk dir /tardisks/");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(TardiskListsFailureTest, ThrownFailureKeepsWhatWasAcceptedAndHandsOutNoDefaults) {
  TardiskPolicyFile("alpha", "one", "");
  TardiskPolicyFile("beta", "two", "");
  PlainTardisks({"base"});
  Fail(Operation::kBackingTardisk, 2);  // the second file's own
  EXPECT_EQ(Sort().value, "policy " + PolicyFilePath(PolicyFiles()[0]) +
                              "\nthrown: refused on request: backing-tardisk, call 2");
  FailNothing();
  Fail(Operation::kBackingTardisk, 3);  // the first one's, asked once more
  EXPECT_EQ(Sort().value, "policy " + PolicyFilePath(PolicyFiles()[0]) +
                              "\nthrown: refused on request: backing-tardisk, call 3");
}

TEST_F(TardiskListsFailureTest, UnopenablePolicyFileEndsTheWholeOperation) {
  EmptyPolicyDirectory("base");
  Tardisk("base").Symlink("etc/olvane/secpolicy/tardisks/gone", "nowhere");
  const Outcome outcome = Sort(kTardiskPolicyDir, [](Lists&) { ReportType("gone", DT_REG); });
  EXPECT_EQ(outcome.value, "thrown: Unable to open policy file " + PolicyFilePath("gone"));
}

TEST_F(TardiskListsFailureTest, PolicyFileWithoutAttributesEndsTheWholeOperation) {
  TardiskPolicyFile("base", "one", "");
  const Outcome outcome = Sort(kTardiskPolicyDir, [](Lists&) { FailFstat(EIO); });
  EXPECT_EQ(outcome.value,
            "thrown: Unable to get attributes for policy file " + PolicyFilePath("one"));
}

TEST_F(TardiskListsFailureTest, NothingStaysOpenOnAnyWayOut) {
  TardiskPolicyFile("alpha", "one", "");
  TardiskPolicyFile("beta", "two", "");
  for (const std::uint64_t failing : {0U, 1U, 2U, 3U}) {
    FailNothing();
    Fail(Operation::kBackingTardisk, failing);
    const Outcome outcome = Run([] {
      const int before = OpenDescriptors();
      Lists lists;
      try {
        SecPolicy::GetTardiskLists(kTardiskPolicyDir, lists.with, lists.without);
      } catch (const Tavon::Lib::TavonException&) {
      }
      return OpenDescriptors() - before;
    });
    EXPECT_EQ(outcome.value, "0") << "question " << failing << " refused";
  }
}

TEST_F(TardiskListsFailureTest, OutOfMemoryPassesThrough) {
  TardiskPolicyFile("alpha", "one", "");
  Fail(Fault{.operation = Operation::kBackingTardisk, .kind = Fault::Kind::kOutOfMemory});
  EXPECT_EQ(Sort().error, "other: std::bad_alloc");
}

}  // namespace
}  // namespace SecPolicyTest
