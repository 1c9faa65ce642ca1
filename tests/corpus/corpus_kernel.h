// What policy files come to when the library reads them.
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "tests/support/memory_file.h"
#include "tests/support/memory_host.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {

// What a file came to: the text of the exception that ended it, and what it left behind, in byte
// order; each in the words of CorpusCase.
struct CorpusOutcome {
  std::string error;
  std::vector<std::string> records;
};

// A kernel that is the same before each file.
class CorpusKernel {
 public:
  CorpusKernel();

  // A file that can be labelled, in a root file system of its own.
  [[nodiscard]] std::string Held() const { return root_ / "held"; }

  // Each reads a file of that text, and installs what was read of it.
  CorpusOutcome Domain(const std::string& text);
  CorpusOutcome Objects(const std::string& text);
  CorpusOutcome FileLabels(const std::string& text);
  CorpusOutcome Tardisk(const std::string& text);

 private:
  void Write(const std::string& text);
  void OverwriteTardiskFile(const std::string& text);
  void AddRules(std::vector<std::string>& records);
  void AddPathRules(std::vector<std::string>& records);
  void SetExceptions(const std::string& file, std::vector<std::string>& records);

  StandIn::TemporaryDirectory root_;
  StandIn::UniqueFd tardiskFile_;
  MemoryFile file_;
  MemoryFile log_;
  MemoryHost host_;
  StandIn::LabelId firstLabel_ = 0;  // of the held file, before each file of labels
  std::string fresh_;                // the state before each tardisk policy file
};

}  // namespace SecPolicyTest
