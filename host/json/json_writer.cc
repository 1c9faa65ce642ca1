#include "host/json/json_writer.h"

#include <algorithm>
#include <nlohmann/json.hpp>

namespace StandIn {

using nlohmann::json;

namespace {

constexpr std::size_t kPart = 65536;

bool IsPlain(char c) {
  const auto byte = static_cast<unsigned char>(c);
  return byte >= ' ' && byte < 0x80 && c != '"' && c != '\\';
}

// In the form of the library, which is left to it where anything is to be escaped.
void AppendQuoted(std::string& text, std::string_view value) {
  if (!std::all_of(value.begin(), value.end(), IsPlain)) {
    text += json(value).dump();
    return;
  }
  text += '"';
  text += value;
  text += '"';
}

// The library's own one-line form has no blanks.
void AppendOnOneLine(std::string& text, const json& value) {
  if (!value.is_structured()) {
    text += value.dump();
    return;
  }
  text += value.is_object() ? '{' : '[';
  for (auto entry = value.begin(); entry != value.end(); ++entry) {
    if (entry != value.begin()) {
      text += ", ";
    }
    if (value.is_object()) {
      text += json(entry.key()).dump() + ": ";
    }
    AppendOnOneLine(text, *entry);
  }
  text += value.is_object() ? '}' : ']';
}

}  // namespace

void JsonWriter::Begin(Kind kind) {
  StartEntry();
  Open(kind, false);
}

void JsonWriter::Begin(const std::string& key, Kind kind) {
  StartMember(key);
  Open(kind, false);
}

void JsonWriter::BeginLine(Kind kind) {
  StartEntry();
  Open(kind, true);
}

void JsonWriter::BeginLine(const std::string& key, Kind kind) {
  StartMember(key);
  Open(kind, true);
}

void JsonWriter::Open(Kind kind, bool onOneLine) {
  text_ += kind == Kind::kObject ? '{' : '[';
  open_.push_back({.kind = kind, .onOneLine = onOneLine});
}

void JsonWriter::End() {
  const Level ended = open_.back();
  open_.pop_back();
  if (!ended.empty && !ended.onOneLine) {
    Indent();
  }
  text_ += ended.kind == Kind::kObject ? '}' : ']';
}

void JsonWriter::Item(const json& value) {
  StartEntry();
  AppendOnOneLine(text_, value);
}

void JsonWriter::Member(const std::string& key, const json& value) {
  StartMember(key);
  AppendOnOneLine(text_, value);
}

void JsonWriter::String(std::string_view value) {
  StartEntry();
  AppendQuoted(text_, value);
}

void JsonWriter::Number(std::uint64_t value) {
  StartEntry();
  text_ += std::to_string(value);
}

void JsonWriter::Finish() {
  text_ += '\n';
  HandOver();
}

void JsonWriter::StartEntry() {
  if (open_.empty()) {
    return;
  }
  Level& level = open_.back();
  if (!level.empty) {
    text_ += level.onOneLine ? ", " : ",";
  }
  level.empty = false;
  if (level.onOneLine) {
    return;
  }
  Indent();
  if (sink_ && text_.size() > kPart) {
    HandOver();
  }
}

void JsonWriter::HandOver() {
  sink_(text_);
  text_.clear();
}

void JsonWriter::StartMember(const std::string& key) {
  StartEntry();
  AppendQuoted(text_, key);
  text_ += ": ";
}

void JsonWriter::Indent() {
  text_ += '\n';
  text_.append(2 * open_.size(), ' ');
}

}  // namespace StandIn
