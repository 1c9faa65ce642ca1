// Writing of JSON documents that people read and compare: what belongs together stands on one line.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

namespace StandIn {

// Builds a document from its beginning to its end. Objects and arrays that are begun have each of
// their entries on a line of its own, indented by two blanks a level; values given whole are
// written on one line. Members stand in the order in which they are given. Strings must be valid
// UTF-8.
class JsonWriter {
 public:
  enum class Kind { kObject, kArray };

  // Begins an object or an array: as the document or an entry of an array, or as a member.
  void Begin(Kind kind);
  void Begin(const std::string& key, Kind kind);
  // Ends the one begun last.
  void End();
  // A whole value, as an entry of an array or as a member.
  void Item(const nlohmann::json& value);
  void Member(const std::string& key, const nlohmann::json& value);

  // The document, with a line end behind it. Everything begun must be ended.
  [[nodiscard]] std::string Text() const { return text_ + "\n"; }

 private:
  struct Level {
    Kind kind;
    bool empty;
  };

  void StartEntry();
  void Indent();

  std::string text_;
  std::vector<Level> open_;
};

}  // namespace StandIn
