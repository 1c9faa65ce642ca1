// Writing of JSON documents that people read and compare: what belongs together stands on one line.
#pragma once

#include <cstdint>
#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>
#include <vector>

#include "host/json/text_reader.h"

namespace StandIn {

// Builds a document from its beginning to its end. Objects and arrays that are begun have each of
// their entries on a line of its own, indented by two blanks a level, unless they are begun on one
// line; values given whole are written on one line. Members stand in the order in which they are
// given. Strings must be valid UTF-8.
class JsonWriter {
 public:
  enum class Kind { kObject, kArray };

  JsonWriter() = default;  // keeps the document
  // Hands the document over in parts, each longer than 64 KiB but the last.
  explicit JsonWriter(TextSink sink) : sink_(std::move(sink)) {}

  // Begins an object or an array: as the document or an entry of an array, or as a member.
  void Begin(Kind kind);
  void Begin(const std::string& key, Kind kind);
  // The same on one line.
  void BeginLine(Kind kind);
  void BeginLine(const std::string& key, Kind kind);
  // Ends the one begun last.
  void End();
  // A whole value, as an entry of an array or as a member.
  void Item(const nlohmann::json& value);
  void Member(const std::string& key, const nlohmann::json& value);
  // A string or a number as an entry of an array: the same as Item, and faster.
  void String(std::string_view value);
  void Number(std::uint64_t value);

  // Ends the document, in which everything begun must be ended, with a line end, and hands over the
  // rest. Throws what the sink throws, as all functions above do.
  void Finish();
  // The document that was kept, with a line end. Everything begun must be ended.
  [[nodiscard]] std::string Text() const { return text_ + "\n"; }

 private:
  struct Level {
    Kind kind;
    bool empty = true;
    bool onOneLine = false;
  };

  void Open(Kind kind, bool onOneLine);
  void StartEntry();
  void StartMember(const std::string& key);
  void Indent();
  void HandOver();

  TextSink sink_;
  std::string text_;  // what has not been handed over
  std::vector<Level> open_;
};

}  // namespace StandIn
