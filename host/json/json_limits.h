// What this host refuses in a JSON document that is otherwise well-formed.
#pragma once

#include <cstddef>
#include <set>
#include <string>
#include <vector>

namespace StandIn {

// How deeply arrays and objects may be nested.
inline constexpr std::size_t kDeepestNesting = 64;

// Follows a parser through a document. Throws HostError
//   "FILE: is nested more than 64 arrays and objects deep"
//   "FILE: gives the member "KEY" of one object twice"
class JsonLimits {
 public:
  // `file` must outlive this object.
  explicit JsonLimits(const std::string& file) : file_(file) {}

  // A value or a key that is within `depth` arrays and objects.
  void Check(std::size_t depth) const;
  void BeginObject() { keys_.emplace_back(); }
  void Key(const std::string& key);
  void EndObject() { keys_.pop_back(); }

 private:
  const std::string& file_;
  std::vector<std::set<std::string>> keys_;  // of the objects that are open
};

}  // namespace StandIn
