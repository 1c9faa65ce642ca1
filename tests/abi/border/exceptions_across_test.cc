// Exceptions that are thrown on one side of a library's border and caught on the other. This
// program is linked with the shared library, and loads another that is linked with it too.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <memory>
#include <typeinfo>

#include "secpolicy/secpolicy.h"
#include "tests/abi/border/raising_plugin.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::SecPolicyRetryException;
using Tavon::Lib::TavonException;

struct Close {
  void operator()(void* library) const { dlclose(library); }
};

// The plug-in is loaded for itself: nothing that it defines is seen by the program or the library.
class ExceptionsAcrossTest : public testing::Test {
 protected:
  void SetUp() override {
    plugin_.reset(dlopen(SECPOLICY_RAISING_PLUGIN, RTLD_NOW | RTLD_LOCAL));
    ASSERT_TRUE(plugin_) << dlerror();
    raise_ = reinterpret_cast<RaiseFunction>(dlsym(plugin_.get(), kRaiseName));
    ASSERT_TRUE(raise_) << dlerror();
  }

  // The handler that took what the plug-in raised, and the text.
  [[nodiscard]] std::string CaughtFromPlugin(Raised raised) const {
    try {
      raise_(raised);
    } catch (const SecPolicyRetryException& failure) {
      return std::string("retry: ") + failure.what();
    } catch (const TavonException& failure) {
      return std::string("failure: ") + failure.what();
    } catch (const std::exception& failure) {
      return std::string("another type: ") + typeid(failure).name();
    }
    return "nothing";
  }

  // The exception itself, which lives in `kept`.
  const std::exception& Kept(Raised raised) {
    try {
      raise_(raised);
    } catch (const std::exception&) {
      kept_ = std::current_exception();
    }
    try {
      std::rethrow_exception(kept_);
    } catch (const std::exception& failure) {
      return failure;
    }
  }

  std::unique_ptr<void, Close> plugin_;
  RaiseFunction raise_ = nullptr;
  std::exception_ptr kept_;
};

TEST_F(ExceptionsAcrossTest, TypeOfTheLibrarysExceptionIsTheProgramsType) {
  std::string word = "allow";
  try {
    SecPolicy::IsGrant(word);
    FAIL() << "taken";
  } catch (const std::exception& failure) {
    EXPECT_EQ(typeid(failure), typeid(TavonException));
    EXPECT_EQ(typeid(failure).hash_code(), typeid(TavonException).hash_code());
    EXPECT_STREQ(failure.what(), "invalid keyword allow");
  }
}

TEST_F(ExceptionsAcrossTest, NamesOfTypes) {
  EXPECT_STREQ(typeid(TavonException).name(), "N5Tavon3Lib14TavonExceptionE");
  EXPECT_STREQ(typeid(SecPolicyRetryException).name(), "N9SecPolicy23SecPolicyRetryExceptionE");
}

TEST_F(ExceptionsAcrossTest, OnesOfAPluginAreCaughtByTheirTypes) {
  EXPECT_EQ(CaughtFromPlugin(Raised::kFailure), "failure: of the plug-in");
  EXPECT_EQ(CaughtFromPlugin(Raised::kRetry), "retry: again");
  EXPECT_EQ(CaughtFromPlugin(Raised::kOfTheLibrary), "failure: invalid keyword allow");
}

TEST_F(ExceptionsAcrossTest, OnesOfAPluginCanBeCast) {
  EXPECT_TRUE(dynamic_cast<const TavonException*>(&Kept(Raised::kRetry)));
  EXPECT_TRUE(dynamic_cast<const SecPolicyRetryException*>(&Kept(Raised::kRetry)));
  EXPECT_FALSE(dynamic_cast<const SecPolicyRetryException*>(&Kept(Raised::kFailure)));
  kept_ = nullptr;  // its destructor is the plug-in's
}

}  // namespace
}  // namespace SecPolicyTest
