// Lines of tardisk policy files.
#include "tests/corpus/corpus.h"
#include "tests/corpus/line_parts.h"
#include "tests/corpus/word_table.h"

namespace SecPolicyTest {

std::vector<CorpusLine> TardiskLines() {
  std::vector<CorpusLine> lines;
  const std::string tardisk = "/tardisks/base.tar";
  for (std::size_t id = 0; id < kCorpusDomains.size(); ++id) {
    const std::string& domain = kCorpusDomains[id];
    for (const std::string& label : TableOf("object label").words) {
      const std::string refusal = kAtLine + "Tardisk: " + tardisk +
                                  " : Unable to set file label (" + label + ") for file " +
                                  tardisk + ": No such file or directory";
      const std::string rule =
          kLine + " -d|" + label + "|" + domain + "=" + std::to_string(id) + "|exec|grant";
      lines.push_back({{"-E", label, domain}, "", rule + "\n" + refusal});
    }
    for (const std::string& label : Misspelt(TableOf("object label"), "logs")) {
      lines.push_back(
          {{"-E", label, domain},
           "",
           kAtLine + "Tardisk: " + tardisk + " : no object label is named \"" + label + "\""});
    }
    for (const std::string& bad : Misspelt({"", kCorpusDomains}, domain)) {
      for (const std::string label : {"logs", "nothing"}) {
        lines.push_back(
            BadLine({"-E", label, bad}, kInTardisk + "Failed to fetch domain id for " + bad));
      }
    }
  }
  for (const std::size_t count : {0U, 1U, 3U, 4U, 6U}) {
    for (const std::string word : {"logs", "appDom", "grant", "nothing"}) {
      lines.push_back(BadLine(Behind("-E", Words(count, word)), kInTardisk + kWrongCount));
    }
  }
  for (const std::string type :
       {"-e", "-s", "E", "-", "--E", "-E\t", "-E\r", "\t-E", "-EE", "-d"}) {
    lines.push_back(BadLine({type, "logs", "appDom"},
                            kInTardisk + "invalid tardisk policy rule type (" + type + ")"));
  }
  return lines;
}

std::vector<CorpusLine> SecondTardiskLines() {
  std::vector<CorpusLine> lines;
  for (CorpusLine line : TardiskLines()) {
    if (line.words[0] == "-E")
      line = BadLine(line.words, kInTardisk + "Only one rule of this type is allowed");
    lines.push_back(line);
  }
  return lines;
}

}  // namespace SecPolicyTest
