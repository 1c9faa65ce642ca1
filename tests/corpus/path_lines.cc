// Lines of path rules, and of rule types that are none.
#include "tests/corpus/corpus.h"
#include "tests/corpus/line_parts.h"

namespace SecPolicyTest {

namespace {

const std::string kSetError = "Error in setting policy for domain: appDom: " + kLine + " : ";

struct Letters {
  std::string text;
  unsigned int bits = 0;
  std::string cause = "";
};

const std::string kRepeatedEnd = " access already specified.";
const std::string kUnknown = "Unknown access privilege specified.";
const std::string kTooMany = "Please enter the permissions from [rwx].";

const std::vector<Letters>& AllLetters() {
  static const std::vector<Letters> all{
      {"", 0},
      {"r", 0x1},
      {"w", 0x2},
      {"x", 0x10},
      {"rw", 0x3},
      {"wr", 0x3},
      {"rx", 0x11},
      {"xr", 0x11},
      {"wx", 0x12},
      {"xw", 0x12},
      {"rwx", 0x13},
      {"rxw", 0x13},
      {"wrx", 0x13},
      {"wxr", 0x13},
      {"xrw", 0x13},
      {"xwr", 0x13},
      {"rr", 0, "Read" + kRepeatedEnd},
      {"rwr", 0, "Read" + kRepeatedEnd},
      {"ww", 0, "Write" + kRepeatedEnd},
      {"xww", 0, "Write" + kRepeatedEnd},
      {"xx", 0, "Exec" + kRepeatedEnd},
      {"xrx", 0, "Exec" + kRepeatedEnd},
      {"rrX", 0, "Read" + kRepeatedEnd},
      {"R", 0, kUnknown},
      {"rW", 0, kUnknown},
      {"X", 0, kUnknown},
      {"-", 0, kUnknown},
      {"r\t", 0, kUnknown},
      {"rw\r", 0, kUnknown},
      {"a", 0, kUnknown},
      {"r,w", 0, kUnknown},
      {"rwxr", 0, kTooMany},
      {"grant", 0, kTooMany},
      {"rwx\r", 0, kTooMany},
      {"\"rwx\"", 0, kTooMany},
      {"RWXX", 0, kTooMany},
  };
  return all;
}

}  // namespace

std::vector<CorpusLine> PathLines() {
  std::vector<CorpusLine> lines;
  const Words paths{"/etc/hosts",  "/",          "/a/../b",   "//x",
                    "/with\ttab",  "/var/lib/*", "/\xc3\xa4", "/x\r",
                    "/etc/hosts/", "/\"q\"",     "/-s",       "/" + std::string(900, 'p')};
  for (const std::string& path : paths) {
    for (const Letters& letters : AllLetters()) {
      Words words{"-r", path};
      if (!letters.text.empty()) words.push_back(letters.text);
      const bool isGood = letters.cause.empty();
      lines.push_back({words, isGood ? "" : kSetError + letters.cause,
                       isGood ? "-r|" + path + "|" + std::to_string(letters.bits) : ""});
    }
  }
  for (const std::string path : {"relative", "etc/hosts", "*", "r", "\t/etc"}) {
    lines.push_back(
        {{"-r", path, "r"},
         kSetError + "Failed to add file policies to domain :1: world ID :0:Invalid argument",
         ""});
  }
  for (const std::size_t count : {0U, 3U, 4U, 5U, 9U}) {
    for (const std::string word : {"/etc", "r", "grant", "-r"}) {
      lines.push_back(BadLine(Behind("-r", Words(count, word)), kInDomain + kWrongCount));
    }
  }
  return lines;
}

std::vector<CorpusLine> LinesOfUnknownType() {
  std::vector<CorpusLine> lines;
  const Words types{
      "-S",   "-C",  "-P",     "-A",    "-D",     "-F",  "-U", "-R",   "-e",    "-E",
      "-x",   "-b",  "s",      "-",     "--s",    "-ss", "s-", "-s\t", "-s\r",  "\t-s",
      "-s-c", "-a,", "\"-s\"", "grant", "revoke", "\t",  "\r", "/etc", "-\xff", "\xe2\x88\x92s",
      "-1",   "*"};
  for (const std::string& type : types) {
    for (const Words& rest : std::vector<Words>{
             {}, {"openat", "grant"}, {"logs", "read", "grant"}, {"a", "b", "c", "d", "e"}}) {
      lines.push_back(
          BadLine(Behind(type, rest), kInDomain + "invalid policy rule type (" + type + ")"));
    }
  }
  return lines;
}

}  // namespace SecPolicyTest
