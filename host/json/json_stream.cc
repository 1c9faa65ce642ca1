#include "host/json/json_stream.h"

#include <rapidjson/error/en.h>
#include <rapidjson/reader.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <new>
#include <nlohmann/json.hpp>
#include <string_view>
#include <utility>

#include "host/json/json_limits.h"
#include "host/text/escaped.h"

namespace StandIn {

using nlohmann::json;

namespace {

// Empties an array or object. The library's destructor does without recursion and needs memory for
// that, unless there is nothing in it.
void Clear(json& value) noexcept {
  if (!value.is_structured()) return;
  for (json& inner : value) Clear(inner);
  value.clear();
}

// The text as the parser's input. It ends with a NUL, as the parser expects.
class TextStream {
 public:
  using Ch = char;

  explicit TextStream(const TextReader& text) : text_(text) {
    Fill();
    constexpr std::string_view kByteOrderMark = "\xef\xbb\xbf";
    if (!std::string_view(next_, end_).starts_with(kByteOrderMark)) return;
    for (std::size_t i = 0; i < kByteOrderMark.size(); ++i) Take();
  }

  [[nodiscard]] Ch Peek() const { return *next_; }
  Ch Take() {
    const Ch taken = *next_;
    if (++next_ == end_) Fill();
    return taken;
  }
  [[nodiscard]] std::size_t Tell() const {
    return begin_ + static_cast<std::size_t>(next_ - block_.data());
  }
  // For parsing in place, which is not done; the parser compiles them all the same.
  Ch* PutBegin() { return nullptr; }
  std::size_t PutEnd(Ch*) { return 0; }
  void Put(Ch) {}

  // Whether nothing is left; the text itself may have a NUL before its end.
  [[nodiscard]] bool IsAtEnd() const { return isLast_; }

 private:
  void Fill() {
    begin_ = Tell();
    std::size_t size = text_(begin_, block_);
    isLast_ = size == 0;
    if (isLast_) block_[size++] = '\0';
    next_ = block_.data();
    end_ = next_ + size;
  }

  const TextReader& text_;
  std::array<Ch, 65536> block_;
  const Ch* next_ = block_.data();
  const Ch* end_ = next_;
  std::size_t begin_ = 0;  // of the block, in the text
  bool isLast_ = false;
};

// Gives memory to the parser, which does not look whether it got any.
class ParserMemory {
 public:
  static constexpr bool kNeedFree = true;

  void* Malloc(std::size_t size) { return size == 0 ? nullptr : ::operator new(size); }
  void* Realloc(void* old, std::size_t oldSize, std::size_t size) {
    void* const memory = Malloc(size);
    if (old != nullptr && memory != nullptr) std::memcpy(memory, old, std::min(oldSize, size));
    Free(old);
    return memory;
  }
  static void Free(void* memory) { ::operator delete(memory); }
};

// Makes the values that the parser meets. Its functions are named as the parser wants them; false
// ends parsing.
class ValueBuilder {
 public:
  ValueBuilder(const std::vector<JsonArrays>& arrays, const std::string& file)
      : arrays_(arrays),
        limits_(file),
        origin_(std::make_shared<const JsonOrigin>(JsonOrigin{file, [this] { return Place(); }})) {}

  bool Null() { return Scalar(nullptr); }
  bool Bool(bool value) { return Scalar(value); }
  bool Int(int value) { return Scalar(value); }
  bool Uint(unsigned int value) { return Scalar(value); }
  bool Int64(std::int64_t value) { return Scalar(value); }
  bool Uint64(std::uint64_t value) { return Scalar(value); }
  bool Double(double value) { return std::isfinite(value) && Scalar(value); }
  bool String(const char* bytes, std::size_t size, bool) {
    const std::string_view text(bytes, size);
    if (!IsUtf8(text)) return false;
    json& value = NewValue();
    if (value.is_string()) {
      value.get_ref<std::string&>().assign(text);
    } else {
      Replace(value, std::string(text));
    }
    EndValue();
    return true;
  }
  bool RawNumber(const char*, std::size_t, bool) { return false; }  // never called

  bool StartObject() {
    json& value = NewValue();
    Replace(value, json::object());
    open_.push_back({&value});
    limits_.BeginObject();
    return true;
  }
  bool Key(const char* bytes, std::size_t size, bool) {
    std::string& key = open_.back().key;
    key.assign(bytes, size);
    if (!IsUtf8(key)) return false;
    limits_.Check(open_.size());
    limits_.Key(key);
    return true;
  }
  bool EndObject(std::size_t) {
    limits_.EndObject();
    open_.pop_back();
    EndValue();
    return true;
  }

  bool StartArray() {
    json& value = NewValue();
    if (!value.is_array()) Replace(value, json::array());
    open_.push_back({&value});
    if (element_ == 0) open_.back().taken = ArraysHere();
    return true;
  }
  bool EndArray(std::size_t) {
    auto& items = open_.back().value->get_ref<json::array_t&>();
    for (std::size_t i = open_.back().used; i < items.size(); ++i) Clear(items[i]);
    items.resize(open_.back().used);
    open_.pop_back();
    EndValue();
    return true;
  }

  JsonDocument Document() && { return std::move(document_); }

 private:
  // An array or object that has begun.
  struct Level {
    json* value;
    std::size_t used = 0;               // how many elements the array has got
    std::size_t index = 0;              // of the element that is handed over
    std::string key = {};               // of the object's last member
    const JsonArrays* taken = nullptr;  // for an array whose elements are handed over
  };

  // The parser checks the bytes of strings, but not which characters are written as \uNNNN: half a
  // pair is what none of the valid sequences begins with.
  static bool IsUtf8(std::string_view text) {
    for (std::size_t at = text.find('\xed'); at != std::string_view::npos;
         at = text.find('\xed', at + 1)) {
      if (static_cast<unsigned char>(text[at + 1]) >= 0xa0) return false;
    }
    return true;
  }

  static void Replace(json& value, json replacement) {
    Clear(value);
    value = std::move(replacement);
  }

  template <typename Value>
  bool Scalar(Value value) {
    Replace(NewValue(), value);
    EndValue();
    return true;
  }

  // The place of the next value. In an array it may hold the value of an element before, whose
  // memory is used again.
  json& NewValue() {
    limits_.Check(open_.size());
    if (open_.empty()) return document_.Value();
    Level& level = open_.back();
    if (level.value->is_object()) return (*level.value)[level.key];
    auto& items = level.value->get_ref<json::array_t&>();
    if (level.taken != nullptr) element_ = open_.size();
    if (level.used == items.size()) items.emplace_back();
    return items[level.used++];
  }

  void EndValue() {
    if (open_.empty() || element_ != open_.size()) return;
    Level& level = open_.back();
    element_ = 0;
    level.used = 0;
    HandOver(level);
    ++level.index;
  }

  void HandOver(const Level& level) {
    indexes_.clear();
    for (const Level& open : open_) {
      if (open.value->is_array()) indexes_.push_back(IndexIn(open));
    }
    level.taken->take(JsonCursor(level.value->front(), origin_), indexes_);
  }

  static std::size_t IndexIn(const Level& level) {
    return level.taken != nullptr ? level.index : level.used - 1;
  }

  const JsonArrays* ArraysHere() const {
    for (const JsonArrays& arrays : arrays_) {
      if (IsPathHere(arrays.path)) return &arrays;
    }
    return nullptr;
  }

  bool IsPathHere(const std::vector<std::string>& path) const {
    return std::equal(path.begin(), path.end(), open_.begin(), open_.end() - 1,
                      [](const std::string& step, const Level& level) {
                        return level.value->is_array() ? step == "*" : step == level.key;
                      });
  }

  // The JSON pointer of the element that is handed over.
  std::string Place() const {
    json::json_pointer place;
    for (const Level& level : open_) {
      if (level.value->is_array()) {
        place /= IndexIn(level);
      } else {
        place /= level.key;
      }
    }
    return Escaped(place.to_string()).Text();
  }

  const std::vector<JsonArrays>& arrays_;
  JsonLimits limits_;
  std::shared_ptr<const JsonOrigin> origin_;
  JsonDocument document_;
  std::vector<Level> open_;
  std::size_t element_ = 0;  // how many levels the element that is being made is within; 0: none
  std::vector<std::size_t> indexes_;
};

// Says what is wrong in the words of ParseJson. Where that finds nothing, the two parsers differ:
// about 0e999, for one, and what follows a NUL.
[[noreturn]] void FailWithSyntax(const TextReader& text, const std::string& file,
                                 const rapidjson::ParseResult& result) {
  const std::string whole = WholeText(text);
  RequireJson(whole, file);
  FailAtByte(whole, result.Offset() + 1, file, rapidjson::GetParseError_En(result.Code()));
}

}  // namespace

JsonDocument::JsonDocument() : value_(std::make_unique<json>()) {}

JsonDocument::JsonDocument(JsonDocument&& other) noexcept = default;

JsonDocument::~JsonDocument() {
  if (value_ != nullptr) Clear(*value_);
}

JsonDocument ParseJsonBut(const std::vector<JsonArrays>& arrays, const TextReader& text,
                          const std::string& file) {
  using Reader = rapidjson::GenericReader<rapidjson::UTF8<>, rapidjson::UTF8<>, ParserMemory>;
  TextStream stream(text);
  ValueBuilder builder(arrays, file);
  Reader reader;
  auto result = reader.Parse<rapidjson::kParseValidateEncodingFlag>(stream, builder);
  if (!result.IsError() && !stream.IsAtEnd()) {
    result.Set(rapidjson::kParseErrorDocumentRootNotSingular, stream.Tell());
  }
  if (result.IsError()) FailWithSyntax(text, file, result);
  return std::move(builder).Document();
}

}  // namespace StandIn
