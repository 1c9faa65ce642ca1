// The memory that calls take: that they give it back, and what they say when there is none.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "secpolicy/secpolicy_c.h"
#include "tests/support/counted_memory.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

class MemoryTest : public testing::Test {
 protected:
  MemoryTest() {
    EXPECT_EQ(secpolicy_host_create(path_.c_str(), nullptr), SECPOLICY_OK);
    EXPECT_EQ(secpolicy_host_open(path_.c_str(), &host_, nullptr), SECPOLICY_OK);
    EXPECT_EQ(secpolicy_host_assemble(host_, nullptr), SECPOLICY_OK);
    std::filesystem::create_directory(empty_);
  }
  ~MemoryTest() override { secpolicy_host_free(host_); }

  // Calls that succeed and calls that fail, each with its result and its error.
  void CallAndFree() const {
    secpolicy_host* host = nullptr;
    secpolicy_policy* policy = nullptr;
    secpolicy_text* text = nullptr;
    secpolicy_error* error = nullptr;
    const char* words[] = {"syscall", "open"};
    const secpolicy_search_terms terms{
        sizeof terms, nullptr, nullptr, nullptr, nullptr, nullptr, SECPOLICY_ANY_DECISION};
    EXPECT_EQ(secpolicy_host_open(path_.c_str(), &host, &error), SECPOLICY_OK);
    EXPECT_EQ(secpolicy_policy_read(host, "kernel", &policy, &error), SECPOLICY_OK);
    EXPECT_EQ(secpolicy_search(policy, &terms, &text, &error), SECPOLICY_OK);
    secpolicy_text_free(text);
    EXPECT_EQ(secpolicy_show(host, SECPOLICY_ALL_DOMAINS, &text, &error), SECPOLICY_OK);
    secpolicy_text_free(text);
    EXPECT_EQ(secpolicy_who(policy, words, 2, &text, &error), SECPOLICY_OK);
    secpolicy_text_free(text);
    EXPECT_EQ(secpolicy_load(host, empty_.c_str(), &text, &error), SECPOLICY_LOAD_TERMINATED);
    secpolicy_text_free(text);
    secpolicy_error_free(error);
    EXPECT_EQ(secpolicy_load(host, "/none", &text, &error), SECPOLICY_FAILED);
    secpolicy_text_free(text);
    secpolicy_error_free(error);
    EXPECT_EQ(secpolicy_may(policy, "none", words, 2, &text, &error), SECPOLICY_BAD_REQUEST);
    secpolicy_error_free(error);
    EXPECT_EQ(secpolicy_check(host, "/none", &text, &error), SECPOLICY_FAILED);
    secpolicy_error_free(error);
    EXPECT_EQ(secpolicy_check(host, "/none", &text, nullptr), SECPOLICY_FAILED);
    secpolicy_policy_free(policy);
    secpolicy_host_free(host);
  }

  StandIn::TemporaryDirectory directory_;
  std::string path_ = directory_ / "host";
  std::string empty_ = directory_ / "policy";
  secpolicy_host* host_ = nullptr;
};

TEST_F(MemoryTest, EverythingThatIsFreedIsGivenBack) {
  CallAndFree();  // what is kept for the next time is there now
  const MemoryUse before = LiveMemory();
  for (int i = 0; i < 5; ++i) CallAndFree();
  const MemoryUse after = LiveMemory();
  EXPECT_EQ(after.blocks, before.blocks);
  EXPECT_EQ(after.bytes, before.bytes);
}

TEST_F(MemoryTest, AnErrorThatIsNotFreedIsSeen) {
  const MemoryUse before = LiveMemory();
  secpolicy_error* error = nullptr;
  EXPECT_EQ(secpolicy_host_create("", &error), SECPOLICY_INVALID_ARGUMENT);
  EXPECT_GT(LiveMemory().blocks, before.blocks);
  secpolicy_error_free(error);
  EXPECT_EQ(LiveMemory().blocks, before.blocks);
}

// Has each allocation of `call` fail in turn, in this process or in the child, until it succeeds
// without one. The call returns its status, and frees what it made.
void ExpectOutOfMemoryInEveryPlace(
    const std::function<secpolicy_status(secpolicy_error** error)>& call, Shortage shortage) {
  unsigned int refused = 0;
  for (unsigned int number = 0; number < 2000; ++number) {
    secpolicy_error* error = nullptr;
    const MemoryUse before = LiveMemory();
    FailAllocation(number, shortage);
    const secpolicy_status status = call(&error);
    const bool isFailed = AllocationFailed();
    FailNoAllocation();
    if (status == SECPOLICY_OK) {
      EXPECT_FALSE(isFailed) << "allocation " << number;
      EXPECT_GT(refused, 0u);
      return;
    }
    ++refused;
    if (isFailed) {
      EXPECT_EQ(status, SECPOLICY_OUT_OF_MEMORY) << "allocation " << number;
      EXPECT_STREQ(secpolicy_error_message(error), "out of memory");
    } else {
      // A child cannot always say that it has no memory.
      EXPECT_THAT(status, testing::AnyOf(SECPOLICY_OUT_OF_MEMORY, SECPOLICY_SYSTEM)) << number;
    }
    secpolicy_error_free(error);
    EXPECT_EQ(LiveMemory().blocks, before.blocks) << "allocation " << number;
  }
  ADD_FAILURE() << "there is no end of allocations";
}

TEST_F(MemoryTest, WithoutMemoryNoHostIsOpened) {
  for (const Shortage shortage : {Shortage::kOne, Shortage::kLasting}) {
    ExpectOutOfMemoryInEveryPlace(
        [&](secpolicy_error** error) {
          secpolicy_host* host = nullptr;
          const secpolicy_status status = secpolicy_host_open(path_.c_str(), &host, error);
          EXPECT_EQ(host == nullptr, status != SECPOLICY_OK);
          secpolicy_host_free(host);
          return status;
        },
        shortage);
  }
}

}  // namespace
}  // namespace SecPolicyTest
