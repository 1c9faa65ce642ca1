// Files in which two capability parameter rules contradict each other.
#include "tests/corpus/corpus.h"
#include "tests/corpus/word_table.h"

namespace SecPolicyTest {

namespace {

CorpusCase Contradiction(const std::string& capability, const std::string& parameter,
                         bool grantsFirst, unsigned int distance) {
  const std::string rule = "-p " + capability + " " + parameter;
  const std::string first = rule + (grantsFirst ? " grant" : " revoke");
  const std::string second = rule + (grantsFirst ? " revoke" : " grant");
  const std::string place = grantsFirst ? "granted on line 1 and revoked on line "
                                        : "revoked on line 1 and granted on line ";
  return {first + std::string(distance, '\n') + second + "\n-c kill grant\n",
          "Policy constraint error for domain: appDom : the capability \"" + capability +
              "\" with the parameter \"" + parameter + "\" of the domain \"appDom\" is " + place +
              std::to_string(distance + 1),
          {}};
}

}  // namespace

std::vector<CorpusCase> Contradictions() {
  std::vector<CorpusCase> cases;
  for (const std::string& capability : TableOf("capability with parameter").words) {
    for (const std::string parameter : {"443", "*", "grant"}) {
      for (unsigned int distance = 1; distance <= 8; ++distance) {
        cases.push_back(Contradiction(capability, parameter, true, distance));
        cases.push_back(Contradiction(capability, parameter, false, distance));
      }
    }
  }
  return cases;
}

}  // namespace SecPolicyTest
