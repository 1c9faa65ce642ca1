// Every kind of line, good and broken in every way, in files of every shape: what comes of each is
// what was said beforehand, without the library.
#include <gtest/gtest.h>

#include <cstdio>
#include <set>

#include "host/gate/gate.h"
#include "tests/corpus/corpus.h"
#include "tests/corpus/corpus_kernel.h"

namespace SecPolicyTest {
namespace {

constexpr std::size_t kMostShown = 20;

// Of kinds with very many lines, each line stands in a third of the ways that there are.
constexpr std::size_t kStep = 3;

// The bytes of a file on one line.
std::string Escaped(const std::string& text) {
  std::string escaped;
  for (const char c : text) {
    char code[8];
    std::snprintf(code, sizeof code, "\\x%02x", static_cast<unsigned char>(c));
    escaped += c >= ' ' && c < '\x7f' ? std::string(1, c) : std::string(code);
  }
  return escaped;
}

std::string Shown(const std::string& error, const std::vector<std::string>& records) {
  std::string text = error.empty() ? "accepted" : Escaped(error);
  for (const std::string& record : records) text += "\n    " + Escaped(record);
  return text;
}

class CorpusTest : public testing::Test {
 protected:
  CorpusTest() { StandIn::EnterGate(); }

  using Reader = CorpusOutcome (CorpusKernel::*)(const std::string&);

  // Reads each file; there have to be `least` of them, not counting one twice.
  void Check(const std::string& what, const std::vector<CorpusCase>& cases, Reader read,
             std::size_t least) {
    std::set<std::string> texts;
    for (const CorpusCase& one : cases) texts.insert(one.text);
    std::printf("%-24s %zu files\n", what.c_str(), texts.size());
    EXPECT_GE(texts.size(), least) << what;
    std::size_t failures = 0;
    for (const CorpusCase& one : cases) {
      const CorpusOutcome outcome = (kernel_.*read)(one.text);
      if (outcome.error == one.error && outcome.records == one.records) continue;
      if (++failures > kMostShown) continue;
      ADD_FAILURE() << Escaped(one.text) << "\n  came to " << Shown(outcome.error, outcome.records)
                    << "\n  and not to " << Shown(one.error, one.records);
    }
    EXPECT_EQ(failures, 0U) << "of " << cases.size() << " files";
  }

  // Two rules that no other line has.
  static Neighbours Rules() {
    return {"-p kill corpus-first grant", "1 -p|kill|corpus-first|grant",
            "-p kill corpus-last revoke", kLine + " -p|kill|corpus-last|revoke"};
  }

  CorpusKernel kernel_;
};

TEST_F(CorpusTest, SystemCalls) {
  Check("-s", LayOut(KeywordLines("-s"), Rules(), kStep), &CorpusKernel::Domain, 8000);
}

TEST_F(CorpusTest, Capabilities) {
  Check("-c", LayOut(KeywordLines("-c"), Rules()), &CorpusKernel::Domain, 8500);
}

TEST_F(CorpusTest, CapabilityParameters) {
  Check("-p", LayOut(KeywordLines("-p"), Rules(), kStep), &CorpusKernel::Domain, 9500);
}

TEST_F(CorpusTest, ContradictingCapabilityParameters) {
  Check("-p contradictions", Contradictions(), &CorpusKernel::Domain, 1800);
}

TEST_F(CorpusTest, ObjectAccesses) {
  Check("-a", LayOut(KeywordLines("-a"), Rules(), kStep), &CorpusKernel::Domain, 5500);
}

TEST_F(CorpusTest, DomainTransitions) {
  Check("-d", LayOut(KeywordLines("-d"), Rules(), kStep), &CorpusKernel::Domain, 6000);
}

TEST_F(CorpusTest, FileCreations) {
  Check("-f", LayOut(KeywordLines("-f"), Rules(), kStep), &CorpusKernel::Domain, 10000);
}

TEST_F(CorpusTest, UnixSocketCreations) {
  Check("-u", LayOut(KeywordLines("-u"), Rules()), &CorpusKernel::Domain, 13000);
}

TEST_F(CorpusTest, Paths) {
  Check("-r", LayOut(PathLines(), Rules()), &CorpusKernel::Domain, 12000);
}

TEST_F(CorpusTest, UnknownRuleTypes) {
  Check("unknown rule types", LayOut(LinesOfUnknownType(), Rules()), &CorpusKernel::Domain, 3500);
}

TEST_F(CorpusTest, Objects) {
  Check("objects",
        LayOut(ObjectLines(), {"corpus-first", "corpus-first", "corpus-last", "corpus-last"}),
        &CorpusKernel::Objects, 8500);
}

TEST_F(CorpusTest, FileLabels) {
  const auto failure = [](const std::string& path) {
    return ":" + kLine + " : Unable to set file label (logs) for file " + path +
           ": No such file or directory";
  };
  Check("file labels",
        LayOut(FileLabelLines(kernel_.Held()),
               {"/absent/first logs", kFile + failure("/absent/first"), "/absent/last/* logs",
                kFile + failure("/absent/last")}),
        &CorpusKernel::FileLabels, 11500);
}

TEST_F(CorpusTest, Tardisks) {
  Check("tardisks", LayOut(TardiskLines(), {}), &CorpusKernel::Tardisk, 5500);
}

TEST_F(CorpusTest, SecondRulesOfTardisks) {
  const std::string refusal = kFile +
                              ":1 : Tardisk: /tardisks/base.tar : Unable to set file label "
                              "(logs) for file /tardisks/base.tar: No such file or directory";
  const std::string transition = "1 -d|logs|netDom=2|exec|grant";
  Check("second tardisk rules",
        LayOut(SecondTardiskLines(), {"-E logs netDom", transition + "\n" + refusal, "", "", true},
               kStep),
        &CorpusKernel::Tardisk, 2000);
}

}  // namespace
}  // namespace SecPolicyTest
