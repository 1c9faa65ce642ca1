// What discovery makes of the tardisks and policy files of a host.
#pragma once

#include <algorithm>
#include <functional>
#include <list>
#include <string>
#include <vector>

#include "tardisk/tardisk_discovery.h"
#include "tests/tardisk/tardisk_fixture.h"

namespace SecPolicyTest {

// What GetTardiskLists fills.
struct Lists {
  Lists() = default;
  Lists(const Lists&) = delete;
  Lists& operator=(const Lists&) = delete;
  ~Lists() {
    for (const SecPolicy::TardiskPolicy* policy : with) delete policy;
  }

  // A line each, in order.
  [[nodiscard]] std::string Text() const {
    std::string text;
    for (const auto* policy : with) text += "policy " + policy->PolicyFile() + "\n";
    for (const std::string& path : without) text += "default " + path + "\n";
    return text;
  }

  std::list<SecPolicy::TardiskPolicy*> with;
  std::list<std::string> without;
};

class TardiskListsTest : public TardiskTest {
 protected:
  // The value is the lists' text, to which a TavonException's text is added.
  Outcome Sort(
      const std::string& dir = kTardiskPolicyDir,
      const std::function<void(Lists&)>& prepare = [](Lists&) {}) {
    return Run([&] {
      Lists lists;
      prepare(lists);
      std::string failure;
      try {
        SecPolicy::GetTardiskLists(dir, lists.with, lists.without);
      } catch (const Tavon::Lib::TavonException& caught) {
        failure = std::string("thrown: ") + caught.what();
      }
      return lists.Text() + failure;
    });
  }

  // For each policy file its own tardisk and that of every file accepted before.
  std::vector<std::string> Questions() {
    std::vector<std::string> questions;
    std::vector<std::string> accepted;
    for (const std::string& file : PolicyFiles()) {
      const std::string own = "backing-tardisk " + TardiskOf(file);
      questions.push_back(own);
      questions.insert(questions.end(), accepted.begin(), accepted.end());
      if (std::count(accepted.begin(), accepted.end(), own) == 0) accepted.push_back(own);
    }
    return questions;
  }

  // The tardisks that the policy files are of, in listing order, repetitions in a row aside.
  std::vector<std::string> TardisksByFile() {
    std::vector<std::string> tardisks;
    for (const std::string& file : PolicyFiles()) tardisks.push_back(TardiskOf(file));
    tardisks.erase(std::unique(tardisks.begin(), tardisks.end()), tardisks.end());
    return tardisks;
  }

  // The mounted tardisks but those named, as the text of the list of those without a policy.
  std::string DefaultsBut(const std::vector<std::string>& names) {
    std::string text;
    for (const std::string& path : Mounted()) {
      const bool named = std::find(names.begin(), names.end(), path.substr(10)) != names.end();
      if (!named) text += "default " + path + "\n";
    }
    return text;
  }
};

}  // namespace SecPolicyTest
