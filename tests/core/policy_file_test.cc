// From a policy file to its numbered lines.
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "secpolicy/secpolicy.h"
#include "tests/core/descriptors.h"
#include "tests/core/words.h"
#include "tests/support/counted_memory.h"
#include "tests/support/failing_allocations.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

using StandIn::MessageOf;
using Tavon::Lib::TavonException;
using Lines = std::map<unsigned int, Words>;

class ParseFileTest : public testing::Test {
 protected:
  std::string Write(const std::string& text) {
    const std::string file = directory_ / "policy";
    StandIn::WriteBytes(file, text);
    return file;
  }

  Lines Parsed(const std::string& text) { return ParsedFile(Write(text)); }

  static Lines ParsedFile(const std::string& file) {
    std::map<unsigned int, std::queue<std::string>> lines;
    SecPolicy::ParseFile(file, lines);
    return LinesOf(lines);
  }

  static std::string Refusal(const std::string& file) {
    return MessageOf<TavonException>([&] { ParsedFile(file); });
  }

  StandIn::TemporaryDirectory directory_;
};

// ---- Lines -------------------------------------------------------------------------------------

TEST_F(ParseFileTest, NumbersOnlyLinesWithWords) {
  EXPECT_EQ(Parsed("# header\n\ngrant /bin/ls rx\n"), (Lines{{3, {"grant", "/bin/ls", "rx"}}}));
}

TEST_F(ParseFileTest, TenthPhysicalLineIsLineTen) {
  EXPECT_EQ(Parsed("#\n\n  \n#\n\n#\n\n#\n\nrule # ten\n"), (Lines{{10, {"rule"}}}));
}

TEST_F(ParseFileTest, FilesWithoutAWordAreEmpty) {
  for (const char* text : {"", "\n", "\n\n\n", "   ", "#", "# only\n# comments\n", " # \n \n"}) {
    EXPECT_EQ(Parsed(text), Lines()) << '"' << text << '"';
  }
}

TEST_F(ParseFileTest, LastLineNeedsNoNewline) {
  EXPECT_EQ(Parsed("a\nb c"), (Lines{{1, {"a"}}, {2, {"b", "c"}}}));
}

TEST_F(ParseFileTest, SingleLineNeedsNoNewline) { EXPECT_EQ(Parsed("a"), (Lines{{1, {"a"}}})); }

TEST_F(ParseFileTest, WhiteSpaceOtherThanTheSpaceBelongsToTheWord) {
  EXPECT_EQ(Parsed("grant\t/bin/ls rx\nrevoke /tmp w\r\n\r\n"),
            (Lines{{1, {"grant\t/bin/ls", "rx"}}, {2, {"revoke", "/tmp", "w\r"}}, {3, {"\r"}}}));
}

TEST_F(ParseFileTest, CarriageReturnAloneEndsNoLine) {
  EXPECT_EQ(Parsed("a\rb\n"), (Lines{{1, {"a\rb"}}}));
}

TEST_F(ParseFileTest, ByteOrderMarkBelongsToTheFirstWord) {
  EXPECT_EQ(Parsed("\xef\xbb\xbf"
                   "a b\n"),
            (Lines{{1,
                    {"\xef\xbb\xbf"
                     "a",
                     "b"}}}));
}

TEST_F(ParseFileTest, BytesAreKeptAsTheyAre) {
  EXPECT_EQ(Parsed("\xff\xfe \x80\x01\n"), (Lines{{1, {"\xff\xfe", "\x80\x01"}}}));
}

// ---- NUL bytes ---------------------------------------------------------------------------------

TEST_F(ParseFileTest, NulEndsItsLineAndNotTheFile) {
  EXPECT_EQ(Parsed(std::string("a b\0c d\ne\n", 10)), (Lines{{1, {"a", "b"}}, {2, {"e"}}}));
}

TEST_F(ParseFileTest, LineThatBeginsWithANulHasNoWords) {
  EXPECT_EQ(Parsed(std::string("\0a\nb\n", 5)), (Lines{{2, {"b"}}}));
}

TEST_F(ParseFileTest, CharactersBehindANulCountForTheLineBound) {
  const std::string nul(1, '\0');
  EXPECT_EQ(Parsed("a" + nul + std::string(1021, 'x') + "\nb\n"), (Lines{{1, {"a"}}, {2, {"b"}}}));
  EXPECT_EQ(Parsed("a" + nul + std::string(1022, 'x') + "\nb\n"), (Lines{{1, {"a"}}}));
}

// ---- Long lines --------------------------------------------------------------------------------

TEST_F(ParseFileTest, LineOf1023CharactersIsReadWholeAndTheNextOneToo) {
  const std::string line(1023, 'w');
  EXPECT_EQ(Parsed(line + "\nnext\n"), (Lines{{1, {line}}, {2, {"next"}}}));
}

TEST_F(ParseFileTest, LineOf1024CharactersEndsTheFile) {
  EXPECT_EQ(Parsed("first\n" + std::string(1024, 'w') + "\nnext\n"),
            (Lines{{1, {"first"}}, {2, {std::string(1023, 'w')}}}));
}

TEST_F(ParseFileTest, LastLineOf1023CharactersWithoutANewlineIsReadWhole) {
  EXPECT_EQ(Parsed(std::string(1023, 'w')), (Lines{{1, {std::string(1023, 'w')}}}));
}

TEST_F(ParseFileTest, LastLineOf1024CharactersWithoutANewlineIsCut) {
  EXPECT_EQ(Parsed(std::string(1024, 'w')), (Lines{{1, {std::string(1023, 'w')}}}));
}

TEST_F(ParseFileTest, CutFallsInsideAWord) {
  const std::string line = "-r " + std::string(1018, '/') + " rwx";
  ASSERT_EQ(line.size(), 1025U);
  EXPECT_EQ(Parsed(line + "\nnext\n"), (Lines{{1, {"-r", std::string(1018, '/'), "r"}}}));
}

TEST_F(ParseFileTest, LongCommentAndLongRunOfSpacesEndTheFileToo) {
  for (const char filler : {'#', ' '}) {
    EXPECT_EQ(Parsed("a\n" + std::string(1023, filler) + "\nb\n"), (Lines{{1, {"a"}}, {3, {"b"}}}))
        << '"' << filler << '"';
    EXPECT_EQ(Parsed("a\n" + std::string(1024, filler) + "\nb\n"), (Lines{{1, {"a"}}}))
        << '"' << filler << '"';
  }
}

TEST_F(ParseFileTest, ManyLongLinesAreReadWhole) {
  std::string text;
  Lines lines;
  for (unsigned int number = 1; number <= 50; ++number) {
    text += std::string(1023, 'w') + "\n";
    lines[number] = {std::string(1023, 'w')};
  }
  EXPECT_EQ(Parsed(text), lines);
}

// The reader takes a file in blocks: wherever a line lies in them, it is the same line.
TEST_F(ParseFileTest, PlaceInTheFileMakesNoDifferenceToALongLine) {
  constexpr std::size_t kBlock = 8192;
  const std::string longest(1023, 'w');
  // From a line that ends at the block's end to one that begins there.
  for (std::size_t before = kBlock - 1030; before <= kBlock + 5; before += 5) {
    std::string text = std::string(before % 1000, ' ') + "\n";
    unsigned int number = 2;
    for (; text.size() + 1000 <= before; ++number) text += std::string(999, ' ') + "\n";
    EXPECT_EQ(Parsed(text + longest + "\na b\n"),
              (Lines{{number, {longest}}, {number + 1, {"a", "b"}}}))
        << before;
    EXPECT_EQ(Parsed(text + longest + "w\na b\n"), (Lines{{number, {longest}}})) << before;
  }
}

// ---- The map -----------------------------------------------------------------------------------

TEST_F(ParseFileTest, AddsToTheMapAndReplacesLinesOfTheSameNumber) {
  std::map<unsigned int, std::queue<std::string>> lines{
      {1, QueueOf({"old", "one"})}, {2, QueueOf({"old"})}, {7, QueueOf({"seven"})}};
  SecPolicy::ParseFile(Write("new\n# no words\nthree\n"), lines);
  EXPECT_EQ(LinesOf(lines), (Lines{{1, {"new"}}, {2, {"old"}}, {3, {"three"}}, {7, {"seven"}}}));
}

TEST_F(ParseFileTest, FileThatCannotBeOpenedLeavesTheMapAsItIs) {
  std::map<unsigned int, std::queue<std::string>> lines{{1, QueueOf({"old"})}};
  EXPECT_THROW(SecPolicy::ParseFile(directory_ / "absent", lines), TavonException);
  EXPECT_EQ(LinesOf(lines), (Lines{{1, {"old"}}}));
}

// ---- Files -------------------------------------------------------------------------------------

TEST_F(ParseFileTest, MissingFileIsRefused) {
  EXPECT_EQ(Refusal(directory_ / "absent"),
            "Unable to open policy file " + directory_.Path() + "/absent");
  EXPECT_EQ(Refusal(""), "Unable to open policy file ");
  EXPECT_EQ(Refusal(Write("a\n") + "/"),
            "Unable to open policy file " + directory_.Path() + "/policy/");
}

TEST_F(ParseFileTest, FileThatMayNotBeReadIsRefused) {
  const std::string file = Write("a\n");
  ASSERT_EQ(chmod(file.c_str(), 0), 0);
  if (access(file.c_str(), R_OK) == 0) GTEST_SKIP() << "this user may read every file";
  EXPECT_EQ(Refusal(file), "Unable to open policy file " + file);
}

TEST_F(ParseFileTest, DirectoryReadsAsAnEmptyFile) {
  EXPECT_EQ(ParsedFile(directory_.Path()), Lines());
}

TEST_F(ParseFileTest, LinkToAFileIsFollowed) {
  const std::string link = directory_ / "link";
  ASSERT_EQ(symlink(Write("a\n").c_str(), link.c_str()), 0);
  EXPECT_EQ(ParsedFile(link), (Lines{{1, {"a"}}}));
}

TEST_F(ParseFileTest, LeavesNoDescriptorOpen) {
  const int before = LowestFreeDescriptor();
  Parsed("a\n");
  Parsed(std::string(2000, 'w'));
  ParsedFile(directory_.Path());
  Refusal(directory_ / "absent");
  EXPECT_EQ(LowestFreeDescriptor(), before);
}

TEST_F(ParseFileTest, ExhaustedMemoryPassesThroughAndTheFileIsClosed) {
  const std::string file = Write("one line of words that are long enough to be allocated " +
                                 std::string(100, 'w') + "\n");
  const int before = LowestFreeDescriptor();
  const unsigned int failures = FailEveryAllocationInTurn([&] { ParsedFile(file); });
  EXPECT_GT(failures, 4U);
  EXPECT_EQ(LowestFreeDescriptor(), before);
}

TEST_F(ParseFileTest, ExhaustedMemoryLeavesWholeLinesOnly) {
  const std::string file = Write("a b\n" + std::string(100, 'v') + " " + std::string(100, 'w'));
  const std::queue<std::string> old({"old"});
  FailEveryAllocationInTurn([&] {
    std::map<unsigned int, std::queue<std::string>> lines;
    try {
      lines[1] = old;
      SecPolicy::ParseFile(file, lines);
    } catch (const std::bad_alloc&) {
      const OwnMemory uncounted;
      for (const auto& [number, words] : LinesOf(lines)) {
        EXPECT_TRUE(number == 1 &&
                    (words.empty() || words == Words{"old"} || words == Words{"a", "b"}))
            << number;
      }
      throw;
    }
  });
}

}  // namespace
}  // namespace SecPolicyTest
