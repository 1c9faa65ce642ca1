// Reading of JSON documents that says where a value is wrong.
#pragma once

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <memory>
#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace StandIn {

// Parses `text`, the content of `file`. Throws HostError "FILE:LINE:COLUMN: " and what the parser
// found there; "FILE: " and why when a member is given twice or the nesting is too deep.
nlohmann::json ParseJson(const std::string& text, const std::string& file);

// Throws "FILE:LINE:COLUMN: ..." as ParseJson does, but keeps nothing of the document.
void RequireJson(const std::string& text, const std::string& file);

// Throws HostError "FILE:LINE:COLUMN: WHAT" for the last of the first `bytes` bytes of `text`, the
// content of `file`; editors count lines and columns in this way.
[[noreturn]] void FailAtByte(const std::string& text, std::size_t bytes, const std::string& file,
                             const std::string& what);

// Where a tree of values comes from.
struct JsonOrigin {
  std::string file;
  // The JSON pointer, escaped for a terminal, of a tree that is a part of its document. Called only
  // when something is wrong.
  std::function<std::string()> place = [] { return std::string(); };
};

// A value within a document. Every reading function throws HostError "FILE: PLACE: " and what is
// wrong, where PLACE is the value's JSON pointer ("/" for the whole). A cursor refers to the tree
// of values that it was made from, which must outlive it and stay unchanged; cursors are cheap to
// copy and do not depend on one another.
class JsonCursor {
 public:
  JsonCursor(const nlohmann::json& document, std::string file);
  JsonCursor(const nlohmann::json&& document, std::string file) = delete;  // would dangle
  // The root of a tree that is a part of its document.
  JsonCursor(const nlohmann::json& tree, std::shared_ptr<const JsonOrigin> origin);

  // The member `key`, which must be there / may be there. The value must be an object.
  [[nodiscard]] JsonCursor Member(const std::string& key) const;
  [[nodiscard]] std::optional<JsonCursor> Find(const std::string& key) const;
  // Refuses members other than these, so that a misspelt key is not passed over.
  void AllowOnly(std::initializer_list<const char*> keys) const;
  // Refuses what is no array.
  void ExpectArray() const;
  // The elements of an array; the members of an object with their keys, in the keys' byte order.
  [[nodiscard]] std::vector<JsonCursor> Items() const;
  [[nodiscard]] std::vector<std::pair<std::string, JsonCursor>> Members() const;

  // The value as the type named. Numbers must lie between `least` and `most`, both included.
  [[nodiscard]] std::string String() const;
  [[nodiscard]] std::uint64_t Unsigned(std::uint64_t least, std::uint64_t most) const;
  [[nodiscard]] std::vector<std::string> Strings() const;
  [[nodiscard]] bool IsString() const;

  // Throws the HostError for this value with the text `what`.
  [[noreturn]] void Fail(const std::string& what) const;

 private:
  JsonCursor(const nlohmann::json& value, const JsonCursor& from);

  const nlohmann::json* value_;
  const nlohmann::json* tree_;
  std::shared_ptr<const JsonOrigin> origin_;
};

// Refuses a document whose member "format" is not the number `known`.
void ExpectFormat(const JsonCursor& document, std::uint64_t known);

// Names and paths are bytes, JSON strings are Unicode: bytes from 0x80 and the percent sign are
// kept as %XX, so that any name survives. DecodeBytes throws HostError through `place.Fail` at a
// malformed escape.
std::string EncodeBytes(const std::string& bytes);
std::string DecodeBytes(const JsonCursor& place);

}  // namespace StandIn
