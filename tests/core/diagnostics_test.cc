// What is logged, what is printed, and the messages that all rule types share.
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <limits>

#include "core/diagnostics.h"
#include "tests/support/host_test.h"
#include "tests/support/system_log.h"

namespace SecPolicyTest {
namespace {

using StandIn::MessageOf;
using Tavon::Lib::TavonException;
using testing::ElementsAre;
using testing::IsEmpty;

class DiagnosticsTest : public HostTest {
 protected:
  Outcome Info(const std::string& text) {
    return Run([&] { SecPolicy::SecpolicyInfo(text); });
  }
  Outcome Error(const std::string& text) {
    return Run([&] { SecPolicy::SecpolicyError(text); });
  }
  std::string Header(const std::string& first, const std::string& second) {
    return Run([&] { SecPolicy::DisplayHeader(first, second); }).out;
  }
};

// ---- Logging -----------------------------------------------------------------------------------

// Texts that a careless format would take apart.
const char* const kTexts[] = {"x",       "",          "%d", "%s%s%s%n", "100%",
                              " spaced", "ends in :", "%%", "Error: x", "\xff\xfe\x01 bytes",
                              "\ttab\r", "a::b : c"};

TEST_F(DiagnosticsTest, InfoGoesToTheSystemLogAloneAndLiterally) {
  for (const std::string text : kTexts) {
    SCOPED_TRACE(text);
    const Outcome outcome = Info(text);
    EXPECT_THAT(outcome.events, ElementsAre("info: " + text));
    EXPECT_EQ(outcome.err, "");
    EXPECT_EQ(outcome.out, "");
  }
}

TEST_F(DiagnosticsTest, ErrorGoesToStandardErrorAndTheSystemLogLiterally) {
  for (const std::string text : kTexts) {
    SCOPED_TRACE(text);
    const Outcome outcome = Error(text);
    EXPECT_EQ(outcome.err, "Error: " + text + "\n");
    EXPECT_THAT(outcome.events, ElementsAre("error: Error: " + text));
    EXPECT_EQ(outcome.out, "");
  }
}

TEST_F(DiagnosticsTest, ErrorOfSeveralLinesIsOneMessage) {
  const Outcome outcome = Error("one\ntwo");
  EXPECT_EQ(outcome.err, "Error: one\ntwo\n");
  EXPECT_THAT(outcome.events, ElementsAre("error: Error: one", "two"));
}

TEST_F(DiagnosticsTest, LongMessageIsNotCut) {
  const std::string text(100000, 'm');
  const Outcome outcome = Error(text);
  EXPECT_EQ(outcome.err, "Error: " + text + "\n");
  EXPECT_THAT(outcome.events, ElementsAre("error: Error: " + text));
}

TEST_F(DiagnosticsTest, ErrorIsOnStandardErrorBeforeItIsInTheSystemLog) {
  const Outcome outcome = Run([] {
    CaptureSystemLog(STDERR_FILENO);
    SecPolicy::SecpolicyError("x");
    SecPolicy::SecpolicyError("y");
  });
  EXPECT_EQ(outcome.err, "Error: x\nerror: Error: x\nError: y\nerror: Error: y\n");
}

TEST_F(DiagnosticsTest, LoggingPassesNoKernelOperation) {
  EXPECT_THAT(Error("x").Operations(), IsEmpty());
  EXPECT_THAT(Info("x").Operations(), IsEmpty());
}

TEST_F(DiagnosticsTest, SummaryIsAnInfoOrAnError) {
  const Outcome outcome = Run([] {
    SecPolicy::LogSummary(true, "all well", "not all well");
    SecPolicy::LogSummary(false, "all well", "not all well");
  });
  EXPECT_THAT(outcome.events, ElementsAre("info: all well", "error: Error: not all well"));
}

// ---- Items of a stage --------------------------------------------------------------------------

TEST_F(DiagnosticsTest, ItemThatSucceedsIsNotLogged) {
  const Outcome outcome = Run([] { return SecPolicy::SucceedsOrLogs([] {}) ? "done" : "failed"; });
  EXPECT_EQ(outcome.value, "done");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(DiagnosticsTest, ItemThatFailsIsLoggedOnce) {
  const Outcome outcome = Run([] {
    return SecPolicy::SucceedsOrLogs([] { throw TavonException("cause"); }) ? "done" : "failed";
  });
  EXPECT_EQ(outcome.value, "failed");
  EXPECT_THAT(outcome.events, ElementsAre("error: Error: cause"));
}

TEST_F(DiagnosticsTest, ItemThatIsToBeRepeatedFailsAsAnyOther) {
  const Outcome outcome = Run([] {
    return SecPolicy::SucceedsOrLogs([] { throw SecPolicy::SecPolicyRetryException("small"); })
               ? "done"
               : "failed";
  });
  EXPECT_EQ(outcome.value, "failed");
  EXPECT_THAT(outcome.events, ElementsAre("error: Error: small"));
}

TEST_F(DiagnosticsTest, OtherExceptionsOfAnItemPassThroughUnlogged) {
  const Outcome outcome =
      Run([] { (void)SecPolicy::SucceedsOrLogs([] { throw std::bad_alloc(); }); });
  EXPECT_EQ(outcome.error, "other: std::bad_alloc");
  EXPECT_THAT(outcome.events, IsEmpty());
}

// ---- The banner --------------------------------------------------------------------------------

struct Banner {
  std::string first;
  std::string second;
  std::size_t dashes;
};

TEST_F(DiagnosticsTest, BannerIsAsWideAsTheLongerText) {
  const Banner banners[] = {{"", "", 0},         {"ab", "sixsix", 6},
                            {"sixsix", "ab", 6}, {"Nineteen characters", "shorter", 19},
                            {"x", "", 1},        {"", "y", 1},
                            {"same", "size", 4}, {"\xc3\xa9", "", 2},  // bytes, not characters
                            {"%d", "%s", 2},     {std::string(3000, 'w'), "-", 3000}};
  for (const Banner& banner : banners) {
    const std::string dashes(banner.dashes, '-');
    EXPECT_EQ(Header(banner.first, banner.second),
              "\n\n" + dashes + "\n" + banner.first + "\n" + banner.second + "\n" + dashes + "\n");
  }
}

TEST_F(DiagnosticsTest, BannerOfTwoEmptyTextsIsSixEmptyLines) {
  EXPECT_EQ(Header("", ""), "\n\n\n\n\n\n");
}

TEST_F(DiagnosticsTest, BannerIsPrintedOnly) {
  const Outcome outcome = Run([] { SecPolicy::DisplayHeader("a", "b"); });
  EXPECT_EQ(outcome.err, "");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(DiagnosticsTest, BannerIsFlushed) {
  const Outcome outcome = Run([] {
    SecPolicy::DisplayHeader("a", "b");
    raise(SIGKILL);
  });
  EXPECT_EQ(outcome.signal, SIGKILL);
  EXPECT_EQ(outcome.out, "\n\n-\na\nb\n-\n");
}

// ---- Messages that all rule types share --------------------------------------------------------

struct DomainFailure {
  unsigned int line;
  const char* domain;
  const char* cause;
  const char* tail;  // behind "for domain: "
};

constexpr DomainFailure kDomainFailures[] = {
    {17, "appDom", "invalid keyword allow", "appDom: 17 : invalid keyword allow"},
    {0, "appDom", "x", "appDom: 0 : x"},
    {1, "", "", ": 1 : "},
    {std::numeric_limits<unsigned int>::max(), "d", "c", "d: 4294967295 : c"},
    {2147483648U, "d", "c", "d: 2147483648 : c"},
    {1000000, "d", "c", "d: 1000000 : c"},
    {3, "a b:c", "%d : %s", "a b:c: 3 : %d : %s"},
};

TEST(DomainFailureTest, ParseErrorNamesDomainLineAndCause) {
  for (const DomainFailure& row : kDomainFailures) {
    EXPECT_EQ(MessageOf<TavonException>(
                  [&] { SecPolicy::ThrowDomainParseError(row.line, row.domain, row.cause); }),
              std::string("Error in parsing policy for domain: ") + row.tail);
  }
}

TEST(DomainFailureTest, SetErrorNamesDomainLineAndCause) {
  for (const DomainFailure& row : kDomainFailures) {
    EXPECT_EQ(MessageOf<TavonException>(
                  [&] { SecPolicy::ThrowDomainSetError(row.line, row.domain, row.cause); }),
              std::string("Error in setting policy for domain: ") + row.tail);
  }
}

TEST(RuleSizeErrorTest, HasAMessageOfItsOwn) {
  EXPECT_EQ(MessageOf<TavonException>([] { SecPolicy::RuleSizeError(); }),
            "incorrect number of arguments for this rule type");
}

TEST(AtLineTest, PutsFileAndLineBeforeTheCause) {
  EXPECT_EQ(SecPolicy::AtLine("/p/objects/main", 4294967295U, "cause"),
            "/p/objects/main:4294967295 : cause");
  EXPECT_EQ(SecPolicy::AtLine("", 0, ""), ":0 : ");
}

TEST(SystemReasonTest, IsTheTextOfErrno) {
  errno = ENOENT;
  EXPECT_EQ(SecPolicy::SystemReason(), "No such file or directory");
  errno = 0;
  EXPECT_EQ(SecPolicy::SystemReason(), "Success");
}

}  // namespace
}  // namespace SecPolicyTest
