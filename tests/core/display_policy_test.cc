// What a display of the whole policy prints, in which order, and what ends it.
#include "tests/core/load_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

constexpr char kDomainsBanner[] =
    "\n\n------------------------\nPolicy set in the kernel\n\n------------------------\n";
constexpr char kAppDom[] =
    "\n\n-------------------------------------------------------------\n"
    "Domain Name: appDom Domain ID :1 Enforcement Level: enforcing\n"
    "State: 1 RefCount: 1 WorldRefCount: 0\n"
    "-------------------------------------------------------------\n"
    "-s read grant\n\n";
constexpr char kObjects[] =
    "\n\n---------------------------------\nObjects Defined: Name (Kernel Id)\n\n"
    "---------------------------------\napps (3)\ndefault (1)\ntardisk (2)\n";
constexpr char kTardiskBanner[] =
    "\n\n--------------------\nTardisk Path (label)\n\n--------------------\n";
constexpr char kTardisks[] = "/tardisks/base.tgz (default)\n";

class DisplayPolicyTest : public LoadTest {
 protected:
  // Displays, and expects what is printed before the exception and that nothing follows it.
  void ExpectEnds(const std::string& selector, const std::string& error, const std::string& out) {
    const Outcome outcome = Display(selector);
    EXPECT_EQ(outcome.error, error);
    EXPECT_EQ(outcome.out, out);
    ExpectClosedInterface(outcome);
  }
};

TEST_F(DisplayPolicyTest, PrintsDomainsThenObjectsThenTardisks) {
  Load();
  const Outcome outcome = Display("1");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out,
            std::string(kDomainsBanner) + kAppDom + kObjects + kTardiskBanner + kTardisks);
  EXPECT_EQ(outcome.err, "");
}

TEST_F(DisplayPolicyTest, UsesOneInterfaceForAllThree) {
  Load();
  const Outcome outcome = Display("1");
  ExpectClosedInterface(outcome);
  EXPECT_THAT(
      outcome.Operations(),
      ElementsAre("open-interface", "domain-info 1", "get-rules appDom -a", "get-rules appDom -c",
                  "get-rules appDom -d", "get-rules appDom -f", "get-rules appDom -p",
                  "read-file-rules appDom", "get-rules appDom -s", "get-rules appDom -u",
                  "words object", "get-file-label /tardisks/base.tgz", "label-name object 1",
                  "close-interface"));
}

TEST_F(DisplayPolicyTest, LogsNothing) {
  Load();
  const Outcome outcome = Display();
  EXPECT_THAT(outcome.Infos(), IsEmpty());
  EXPECT_THAT(outcome.Errors(), IsEmpty());
}

TEST_F(DisplayPolicyTest, EmptySelectorPrintsEveryDomain) {
  Load();
  const Outcome outcome = Display("");
  for (const char* name : {"rootDom", "appDom", "globalVMDom", "ioFilterDom"}) {
    EXPECT_THAT(outcome.out, HasSubstr(std::string("Domain Name: ") + name + " "));
  }
  EXPECT_THAT(outcome.Operations({"max-domains"}), ElementsAre("max-domains"));
}

TEST_F(DisplayPolicyTest, SelectorIsHandedOnUnchanged) {
  struct Row {
    const char* selector;
    const char* operation;
  };
  for (const Row& row : {Row{"1", "domain-info 1"}, Row{" 2x", "domain-info 2"},
                         Row{"appDom", "domain-info 0"}, Row{" ", "domain-info 0"}}) {
    EXPECT_THAT(Display(row.selector).Operations({"domain-info", "max-domains"}),
                ElementsAre(row.operation))
        << '"' << row.selector << '"';
  }
}

TEST_F(DisplayPolicyTest, UnknownDomainDoesNotHideTheRest) {
  Load();
  const Outcome outcome = Display("999");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out, std::string(kDomainsBanner) + kObjects + kTardiskBanner + kTardisks);
}

TEST_F(DisplayPolicyTest, FailureInTheDomainsEndsIt) {
  Load();
  Fail(Operation::kDomainInfo);
  ExpectEnds("1", "refused on request: domain-info, call 1", kDomainsBanner);
}

TEST_F(DisplayPolicyTest, FailureInOneOfAllDomainsEndsItBehindTheLastDomain) {
  Load();
  Fail(Operation::kDomainInfo);
  const Outcome outcome = Display();
  EXPECT_EQ(outcome.error, "Error in displaying the policy for some domains");
  EXPECT_THAT(outcome.out, HasSubstr("Domain Name: ioFilterDom "));
  EXPECT_THAT(outcome.out, Not(HasSubstr("Domain Name: rootDom ")));
  EXPECT_THAT(outcome.out, Not(HasSubstr("Objects Defined")));
  ExpectClosedInterface(outcome);
}

TEST_F(DisplayPolicyTest, FailureInTheObjectsEndsIt) {
  Load();
  Fail(Operation::kWords);
  ExpectEnds("1", "refused on request: words, call 1",
             std::string(kDomainsBanner) + kAppDom +
                 "\n\n---------------------------------\nObjects Defined: Name (Kernel Id)\n\n"
                 "---------------------------------\n");
}

TEST_F(DisplayPolicyTest, MissingTardiskDirectoryEndsIt) {
  Load();
  std::filesystem::remove_all(InRoot("/tardisks"));
  ExpectEnds("1", "Could not open tardisk dir /tardisks/",
             std::string(kDomainsBanner) + kAppDom + kObjects + kTardiskBanner);
}

TEST_F(DisplayPolicyTest, TardiskWithoutAReadableLabelIsLogged) {
  Load();
  Fail(Operation::kGetFileLabel);
  const Outcome outcome = Display("1");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Error in reading tardisk label: (/tardisks/base.tgz): Unable to get "
                          "file label for file /tardisks/base.tgz:Input/output error"));
}

TEST_F(DisplayPolicyTest, ExhaustedMemoryPassesThroughFromAllThree) {
  Load();
  for (const Operation operation :
       {Operation::kDomainInfo, Operation::kGetRules, Operation::kWords, Operation::kLabelName}) {
    SCOPED_TRACE(StandIn::InfoOf(operation).name);
    FailNothing();
    Fail(Fault{.operation = operation, .kind = Fault::Kind::kOutOfMemory});
    const Outcome outcome = Display();
    EXPECT_EQ(outcome.error, "other: std::bad_alloc");
    EXPECT_EQ(outcome.err, "");
    ExpectClosedInterface(outcome);
  }
}

TEST_F(DisplayPolicyTest, InterfaceThatCannotBeOpenedEndsItBeforeAnythingIsPrinted) {
  Fail(Operation::kOpenInterface);
  const Outcome outcome = Display();
  EXPECT_EQ(outcome.error, "refused on request: open-interface, call 1");
  EXPECT_EQ(outcome.out, "");
}

}  // namespace
}  // namespace SecPolicyTest
