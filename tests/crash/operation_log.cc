#include "tests/crash/operation_log.h"

namespace CrashTest {

void Account::Add(const std::string& file) {
  std::ifstream stream(file);
  std::string operation;
  std::string name;
  unsigned int number = 0;
  while (stream >> operation >> name >> number) {
    ++operations;
    bool isPossible = true;
    if (operation == "create") isPossible = domains.emplace(name, number).second;
    if (operation == "destroy") isPossible = domains.erase(name) == 1;
    if (operation == "add") rules[name] = number;
    if (operation == "remove") isPossible = rules.erase(name) == 1;
    if (!isPossible && contradiction.empty()) {
      contradiction = file + ": " + operation + " " + name;
    }
  }
}

}  // namespace CrashTest
