// What the users of one host report of their operations.
#pragma once

#include <cstddef>
#include <fstream>
#include <map>
#include <string>

namespace CrashTest {

// The log of one process: a line for each operation that reported success.
class OperationLog {
 public:
  explicit OperationLog(const std::string& file) : stream_(file, std::ios::app) {}

  void Created(const std::string& domain, unsigned int id) { Line("create", domain, id); }
  void Destroyed(const std::string& domain, unsigned int id) { Line("destroy", domain, id); }
  void Added(const std::string& path, unsigned int permission) { Line("add", path, permission); }
  void Removed(const std::string& path) { Line("remove", path, 0); }

 private:
  void Line(const char* operation, const std::string& name, unsigned int number) {
    stream_ << operation << ' ' << name << ' ' << number << std::endl;
  }

  std::ofstream stream_;
};

// What logs add up to.
struct Account {
  std::map<std::string, unsigned int> domains;  // and their ids
  std::map<std::string, unsigned int> rules;    // paths and permissions
  std::size_t operations = 0;
  std::string contradiction;  // the first line that cannot be true after those above it

  // Adds one process's log; nobody else may have used its names at the same time.
  void Add(const std::string& file);
};

}  // namespace CrashTest
