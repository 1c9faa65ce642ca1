// What a caller in C++ did to the streams and the locale of its process.
#include <iostream>
#include <locale>
#include <sstream>

#include "secpolicy/secpolicy_c.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

// Writes 1234 as 1,234.
class Grouping : public std::numpunct<char> {
 protected:
  char do_thousands_sep() const override { return ','; }
  std::string do_grouping() const override { return "\3"; }
};

class StreamsTest : public testing::Test {
 protected:
  StreamsTest() {
    const std::string path = directory_ / "host";
    EXPECT_EQ(secpolicy_host_create(path.c_str(), nullptr), SECPOLICY_OK);
    EXPECT_EQ(secpolicy_host_open(path.c_str(), &host_, nullptr), SECPOLICY_OK);
    EXPECT_EQ(secpolicy_host_assemble(host_, nullptr), SECPOLICY_OK);
    for (const char* const part : {"objects", "domains", "fileLabels"}) {
      std::filesystem::create_directories(policy_ + "/" + part);
    }
    for (const char* const domain : {"appDom", "globalVMDom", "ioFilterDom"}) {
      std::ofstream(policy_ + "/domains/" + domain) << std::string(1233, '\n') << "-s opne grant\n";
    }
  }
  ~StreamsTest() override { secpolicy_host_free(host_); }

  void ExpectErrorsOfALoad() {
    secpolicy_error* error = nullptr;
    EXPECT_EQ(secpolicy_load(host_, policy_.c_str(), nullptr, &error), SECPOLICY_LOAD_FAILED);
    EXPECT_STREQ(secpolicy_error_message(error),
                 "Error in parsing policy for domain: appDom: 1234 : unknown system call \"opne\" "
                 "(nearest: open)");
    EXPECT_EQ(secpolicy_error_line(error), 1234u);
    secpolicy_error_free(error);
  }

  StandIn::TemporaryDirectory directory_;
  std::string policy_ = directory_ / "policy";
  secpolicy_host* host_ = nullptr;
};

TEST_F(StreamsTest, ErrorsAreFoundThoughTheCallersGoElsewhere) {
  std::ostringstream elsewhere;
  std::streambuf* const before = std::cerr.rdbuf(elsewhere.rdbuf());
  ExpectErrorsOfALoad();
  std::cerr.rdbuf(before);
  EXPECT_EQ(elsewhere.str(), "");
}

TEST_F(StreamsTest, ErrorsAreFoundInALocaleThatGroupsDigits) {
  const std::locale before = std::locale::global(std::locale(std::locale(), new Grouping));
  ExpectErrorsOfALoad();
  std::ostringstream number;
  number << 1234;
  EXPECT_EQ(number.str(), "1,234");
  std::locale::global(before);
}

}  // namespace
}  // namespace SecPolicyTest
