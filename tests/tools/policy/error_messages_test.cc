// Lines of standard error, and the messages that they are.
#include "tools/policy/error_messages.h"

#include <gmock/gmock.h>

#include <new>
#include <stdexcept>

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;

std::vector<std::string> MessagesOf(const std::vector<std::string>& lines) {
  std::vector<std::string> messages;
  for (const std::string& line : lines) AddMessageLine(messages, line);
  return messages;
}

TEST(AddMessageLineTest, MarkBeginsAMessage) {
  EXPECT_THAT(MessagesOf({"Error: one", "Error: two"}), ElementsAre("one", "two"));
}

TEST(AddMessageLineTest, AnyOtherLineGoesOnWithTheLastMessage) {
  EXPECT_THAT(MessagesOf({"Error: a name", "in two lines", "Error: two"}),
              ElementsAre("a name\nin two lines", "two"));
}

TEST(AddMessageLineTest, FirstLineIsNotLostForWantOfAMark) {
  EXPECT_THAT(MessagesOf({"no mark", "Error: one"}), ElementsAre("no mark", "one"));
}

TEST(MessageOfTest, MemoryThatEndsIsSaidInWords) {
  EXPECT_EQ(MessageOf(std::runtime_error("text")), "text");
  EXPECT_EQ(MessageOf(std::bad_alloc()), "there is not enough memory");
  EXPECT_EQ(MessageOf(std::bad_array_new_length()), "there is not enough memory");
}

}  // namespace
}  // namespace SecPolicyTool
