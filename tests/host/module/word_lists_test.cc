#include "host/module/word_lists.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/syscall.h>

#include <set>

namespace StandIn {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

TEST(DefaultWords, FixedListsAreAsDesigned) {
  EXPECT_THAT(DefaultWords(WordList::kObjectAccesses),
              ElementsAre("read", "write", "exec", "append", "create", "delete", "rename",
                          "getattr", "setattr", "connect"));
  EXPECT_THAT(DefaultWords(WordList::kTransitionEvents), ElementsAre("exec", "fork"));
  EXPECT_THAT(DefaultWords(WordList::kFileTypes),
              ElementsAre("file", "dir", "symlink", "chardev", "blockdev", "fifo", "socket"));
  EXPECT_THAT(DefaultWords(WordList::kSocketTypes), ElementsAre("stream", "dgram", "seqpacket"));
  EXPECT_THAT(DefaultWords(WordList::kObjects), IsEmpty());
}

TEST(DefaultWords, SystemCallsAreThoseOfThisArchitecture) {
  const std::vector<std::string> calls = DefaultWords(WordList::kSyscalls);
  EXPECT_GT(calls.size(), 250U);
  for (const char* name : {"read", "openat", "execve", "getxattr", "prctl", "clone3"}) {
    EXPECT_THAT(calls, Contains(name));
  }
#ifdef SYS_open
  EXPECT_THAT(calls, Contains("open"));
#else
  EXPECT_THAT(calls, Not(Contains("open")));
#endif
  EXPECT_THAT(calls, Not(Contains("socketcall"))) << "another architecture's";
}

TEST(DefaultWords, CapabilitiesHaveNoPrefixAndNoNumbers) {
  const std::vector<std::string> capabilities = DefaultWords(WordList::kCapabilities);
  EXPECT_EQ(capabilities.at(0), "chown");
  EXPECT_THAT(capabilities, Contains("net_admin"));
  EXPECT_THAT(capabilities, Contains("sys_admin"));
  for (const std::string& capability : capabilities) {
    EXPECT_EQ(capability.find_first_not_of("abcdefghijklmnopqrstuvwxyz_"), std::string::npos)
        << capability;
    EXPECT_THAT(capability, Not(StartsWith("cap_")));
  }
  EXPECT_EQ(DefaultWords(WordList::kParamCapabilities), capabilities);
}

TEST(DefaultWords, NoWordStandsTwiceInAList) {
  for (const WordListInfo& info : kWordLists) {
    const std::vector<std::string> words = DefaultWords(info.list);
    EXPECT_EQ(std::set<std::string>(words.begin(), words.end()).size(), words.size()) << info.title;
  }
}

TEST(InfoOfWordList, KnowsEveryListAndNoOther) {
  for (unsigned number = 1; number <= 8; ++number) {
    const WordListInfo* const info = InfoOf(static_cast<WordList>(number));
    ASSERT_NE(info, nullptr) << number;
    EXPECT_EQ(static_cast<unsigned>(info->list), number);
  }
  EXPECT_EQ(InfoOf(static_cast<WordList>(0)), nullptr);
  EXPECT_EQ(InfoOf(static_cast<WordList>(9)), nullptr);
}

}  // namespace
}  // namespace StandIn
