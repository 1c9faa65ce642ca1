// Reading of JSON documents of which the elements of long arrays are handed over one by one.
#pragma once

#include <cstddef>
#include <functional>
#include <memory>
#include <nlohmann/json_fwd.hpp>
#include <span>
#include <string>
#include <vector>

#include "host/json/json_cursor.h"
#include "host/json/text_reader.h"

namespace StandIn {

// Arrays whose elements are not kept.
struct JsonArrays {
  // The keys that lead to them from the document's root; each "*" stands for the elements of an
  // array.
  std::vector<std::string> path;
  // Gets each element. `indexes` are those of the arrays on the way, the element's own last. Both
  // arguments are valid during the call only.
  std::function<void(const JsonCursor& element, std::span<const std::size_t> indexes)> take =
      [](const JsonCursor&, std::span<const std::size_t>) {};
};

// A tree of values. To free one takes no memory, as it does otherwise: it never fails.
class JsonDocument {
 public:
  JsonDocument();
  ~JsonDocument();
  JsonDocument(JsonDocument&& other) noexcept;
  JsonDocument& operator=(JsonDocument&&) = delete;

  [[nodiscard]] nlohmann::json& Value() { return *value_; }
  [[nodiscard]] const nlohmann::json& Value() const { return *value_; }

 private:
  std::unique_ptr<nlohmann::json> value_;  // null when it was moved from
};

// Parses the content of `file` as ParseJson does, with its errors, and in addition throws those of
// `text` and of the `take` functions. The result lacks the elements of `arrays`, which are handed
// over in the order of the text; so what follows one of them in the text has not been checked yet.
// Needs memory for the result and the longest element.
JsonDocument ParseJsonBut(const std::vector<JsonArrays>& arrays, const TextReader& text,
                          const std::string& file);

}  // namespace StandIn
