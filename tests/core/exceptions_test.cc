// The two exception types and the structured message that they carry.
#include <gtest/gtest.h>

#include <type_traits>

#include "secpolicy/secpolicy.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::SecPolicyRetryException;
using Tavon::Lib::KestMessage;
using Tavon::Lib::TavonException;

static_assert(std::is_base_of_v<std::exception, TavonException>);
static_assert(std::is_convertible_v<TavonException*, std::exception*>, "publicly");
static_assert(std::is_convertible_v<SecPolicyRetryException*, TavonException*>, "publicly");
static_assert(std::is_constructible_v<TavonException, const std::string&>);
static_assert(std::is_constructible_v<TavonException, const char*>);
static_assert(!std::is_default_constructible_v<TavonException>);
static_assert(std::is_copy_constructible_v<TavonException>);
static_assert(std::is_constructible_v<SecPolicyRetryException, const std::string&>);
static_assert(
    std::is_constructible_v<SecPolicyRetryException, const std::string&, const KestMessage&>);
static_assert(!std::is_default_constructible_v<SecPolicyRetryException>);
static_assert(std::is_copy_constructible_v<SecPolicyRetryException>);
static_assert(sizeof(SecPolicyRetryException) == sizeof(TavonException), "adds nothing");
static_assert(noexcept(std::declval<const TavonException&>().what()));
static_assert(std::has_virtual_destructor_v<TavonException>);
static_assert(std::is_nothrow_default_constructible_v<KestMessage>);

KestMessage Message() { return KestMessage(std::make_shared<const int>(7)); }

// ---- Texts -------------------------------------------------------------------------------------

TEST(TavonExceptionTest, KeepsACopyOfItsText) {
  auto text = std::make_unique<std::string>("a text that is too long for a short string");
  const TavonException fromString(*text);
  const TavonException fromCharacters(text->c_str());
  text.reset();
  EXPECT_STREQ(fromString.what(), "a text that is too long for a short string");
  EXPECT_STREQ(fromCharacters.what(), "a text that is too long for a short string");
}

TEST(TavonExceptionTest, TextIsTakenLiterally) {
  EXPECT_STREQ(TavonException("%d %s").what(), "%d %s");
  EXPECT_STREQ(TavonException("").what(), "");
  EXPECT_STREQ(TavonException(std::string(100000, 'm')).what(), std::string(100000, 'm').c_str());
}

TEST(TavonExceptionTest, IsCaughtAsAStandardException) {
  EXPECT_EQ(StandIn::MessageOf<std::exception>([] { throw TavonException("text"); }), "text");
}

TEST(TavonExceptionTest, CopyHasTheTextOfTheOriginal) {
  auto original = std::make_unique<TavonException>("text");
  const TavonException copy(*original);
  original.reset();
  EXPECT_STREQ(copy.what(), "text");
}

TEST(TavonExceptionTest, StructuredMessageIsEmptyUnlessGiven) {
  EXPECT_TRUE(TavonException("text").StructuredMessage().Empty());
  EXPECT_TRUE(TavonException(std::string("text")).StructuredMessage().Empty());
}

// ---- The exception that asks for a repetition --------------------------------------------------

TEST(RetryExceptionTest, IsCaughtAsTheLibrarysException) {
  EXPECT_EQ(StandIn::MessageOf<TavonException>([] { throw SecPolicyRetryException("again"); }),
            "again");
}

TEST(RetryExceptionTest, IsToldApartByAHandlerOfItsOwn) {
  const auto caughtBy = [](auto raise) -> std::string {
    try {
      raise();
    } catch (const SecPolicyRetryException&) {
      return "retry";
    } catch (const TavonException&) {
      return "failure";
    }
    return "nothing";
  };
  EXPECT_EQ(caughtBy([] { throw SecPolicyRetryException("text"); }), "retry");
  EXPECT_EQ(caughtBy([] { throw TavonException("text"); }), "failure");
}

TEST(RetryExceptionTest, KeepsTextAndStructuredMessage) {
  const KestMessage message = Message();
  const SecPolicyRetryException failure("again", message);
  EXPECT_STREQ(failure.what(), "again");
  EXPECT_FALSE(failure.StructuredMessage().Empty());
  EXPECT_EQ(message.ShareCount(), 2);
}

TEST(RetryExceptionTest, StructuredMessageIsEmptyUnlessGiven) {
  EXPECT_TRUE(SecPolicyRetryException("again").StructuredMessage().Empty());
}

TEST(RetryExceptionTest, CopyOutlivesTheOriginalWithTextAndMessage) {
  auto original = std::make_unique<SecPolicyRetryException>("again", Message());
  const SecPolicyRetryException copy(*original);
  EXPECT_EQ(copy.StructuredMessage().ShareCount(), 2);
  original.reset();
  EXPECT_STREQ(copy.what(), "again");
  EXPECT_EQ(copy.StructuredMessage().ShareCount(), 1);
}

TEST(RetryExceptionTest, CopyOfTheBaseKeepsTextAndMessage) {
  const KestMessage message = Message();
  const TavonException base = SecPolicyRetryException("again", message);
  EXPECT_STREQ(base.what(), "again");
  EXPECT_EQ(message.ShareCount(), 2);
}

TEST(RetryExceptionTest, MessageIsReleasedWithTheLastCopy) {
  const auto content = std::make_shared<const int>(7);
  try {
    throw SecPolicyRetryException("again", KestMessage(content));
  } catch (const TavonException& failure) {
    EXPECT_GT(content.use_count(), 1);
    const TavonException copy = failure;
    EXPECT_EQ(copy.StructuredMessage().ShareCount(), content.use_count());
  }
  EXPECT_EQ(content.use_count(), 1);
}

// ---- The structured message --------------------------------------------------------------------

TEST(KestMessageTest, DefaultSharesNothing) {
  const KestMessage empty;
  const KestMessage copy = empty;
  EXPECT_TRUE(empty.Empty());
  EXPECT_EQ(empty.ShareCount(), 0);
  EXPECT_EQ(copy.ShareCount(), 0);
}

TEST(KestMessageTest, CopiesShareTheContent) {
  const KestMessage message = Message();
  {
    const KestMessage copy = message;  // NOLINT(performance-unnecessary-copy-initialization)
    EXPECT_EQ(message.ShareCount(), 2);
    EXPECT_EQ(copy.ShareCount(), 2);
  }
  EXPECT_EQ(message.ShareCount(), 1);
}

TEST(KestMessageTest, NullContentMakesAnEmptyMessage) {
  EXPECT_TRUE(KestMessage(std::shared_ptr<const void>()).Empty());
}

}  // namespace
}  // namespace SecPolicyTest
