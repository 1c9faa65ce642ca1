// Which tardisk carries a policy file.
#include "tardisk/tardisk_policy.h"

#include <unistd.h>

#include "tests/support/file_system_answers.h"
#include "tests/support/open_descriptors.h"
#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::TardiskPolicy;
using testing::ElementsAre;
using testing::IsEmpty;

class BackingTardiskTest : public TardiskTest {
 protected:
  Outcome Backing(const std::string& path) {
    return Run([&] { return TardiskPolicy(path).GetBackingTardiskPath(); });
  }

  // How many descriptors asking for the tardisk of `path` leaves open, and its failure.
  Outcome LeftOpen(
      const std::string& path, const std::function<void()>& prepare = [] {}) {
    return Run([&] {
      TardiskPolicy policy(path);
      prepare();
      const int before = OpenDescriptors();
      std::string failure = "none";
      try {
        policy.GetBackingTardiskPath();
      } catch (const std::exception& caught) {
        failure = caught.what();
      }
      return std::to_string(OpenDescriptors() - before) + ": " + failure;
    });
  }
};

TEST_F(BackingTardiskTest, IsThePathOfTheTardiskThatBroughtTheFile) {
  TardiskPolicyFile("base", "one", "");
  TardiskPolicyFile("vendor.tgz", "two", "");
  const Outcome outcome = Backing(PolicyFilePath("two"));
  EXPECT_EQ(outcome.value, "/tardisks/vendor.tgz");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: backing-tardisk vendor.tgz"));
  EXPECT_EQ(Backing(PolicyFilePath("one")).value, "/tardisks/base");
}

TEST_F(BackingTardiskTest, IsAskedForTheFileOfWhateverName) {
  Tardisk("base").File("etc/plain", "").Symlink("etc/link", "plain");
  EXPECT_EQ(Backing("/etc/plain").value, "/tardisks/base");
  EXPECT_EQ(Backing("/etc/link").value, "/tardisks/base");
}

TEST_F(BackingTardiskTest, ProgramMayHaveClosedItsStandardInput) {
  Tardisk("base").File("etc/plain", "");
  const Outcome outcome = Run([] {
    close(STDIN_FILENO);  // so that the file is opened as descriptor 0
    return TardiskPolicy("/etc/plain").GetBackingTardiskPath();
  });
  EXPECT_EQ(outcome.value, "/tardisks/base") << outcome.error;
}

TEST_F(BackingTardiskTest, IsEmptyForAFileThatNoTardiskBrought) {
  EmptyPolicyDirectory("base");
  Assemble();
  StandIn::WriteBytes(InRoot(PolicyFilePath("own")), "");
  const Outcome outcome = Backing(PolicyFilePath("own"));
  EXPECT_EQ(outcome.value, "");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: backing-tardisk"));
}

TEST_F(BackingTardiskTest, LongestFileNameIsGivenWhole) {
  const std::string longest(255, 'n');  // the longest name that a file can have
  TardiskPolicyFile(longest, "one", "");
  EXPECT_EQ(Backing(PolicyFilePath("one")).value, "/tardisks/" + longest);
}

TEST_F(BackingTardiskTest, UnopenableFileIsNamedAndTheServiceIsNotAsked) {
  const Outcome outcome = Backing("/etc/none");
  EXPECT_EQ(outcome.error, "Unable to open policy file /etc/none");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(BackingTardiskTest, FileWithoutAttributesIsNamedAndTheServiceIsNotAsked) {
  TardiskPolicyFile("base", "one", "");
  const Outcome outcome = Run([&] {
    FailFstat(EIO);
    return TardiskPolicy(PolicyFilePath("one")).GetBackingTardiskPath();
  });
  EXPECT_EQ(outcome.error, "Unable to get attributes for policy file " + PolicyFilePath("one"));
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(BackingTardiskTest, RefusalOfTheServicePassesUnchanged) {
  TardiskPolicyFile("base", "one", "");
  Fail(Operation::kBackingTardisk);
  EXPECT_EQ(Backing(PolicyFilePath("one")).error, "refused on request: backing-tardisk, call 1");
}

TEST_F(BackingTardiskTest, OutOfMemoryPassesThrough) {
  TardiskPolicyFile("base", "one", "");
  Fail(Fault{.operation = Operation::kBackingTardisk, .kind = Fault::Kind::kOutOfMemory});
  EXPECT_EQ(Backing(PolicyFilePath("one")).error, "other: std::bad_alloc");
}

TEST_F(BackingTardiskTest, FileIsClosedOnEveryWayOut) {
  TardiskPolicyFile("base", "one", "");
  const std::string path = PolicyFilePath("one");
  EXPECT_EQ(LeftOpen(path).value, "0: none");
  EXPECT_EQ(LeftOpen("/none").value, "0: Unable to open policy file /none");
  EXPECT_EQ(LeftOpen(path, [] { FailFstat(EIO); }).value,
            "0: Unable to get attributes for policy file " + path);
  Fail(Operation::kBackingTardisk);
  EXPECT_EQ(LeftOpen(path).value, "0: refused on request: backing-tardisk, call 1");
  FailNothing();
  Fail(Fault{.operation = Operation::kBackingTardisk, .kind = Fault::Kind::kOutOfMemory});
  EXPECT_EQ(LeftOpen(path).value, "0: std::bad_alloc");
}

TEST_F(BackingTardiskTest, PolicyIsMadeWithoutOpeningItsFile) {
  const Outcome outcome = Run([] { return TardiskPolicy("/no/such/file").PolicyFile(); });
  EXPECT_EQ(outcome.value, "/no/such/file");
  EXPECT_THAT(outcome.events, IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTest
