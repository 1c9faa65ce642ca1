#include "host/json/json_writer.h"

#include <nlohmann/json.hpp>

namespace StandIn {

using nlohmann::json;

namespace {

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
  text_ += kind == Kind::kObject ? '{' : '[';
  open_.push_back({kind, true});
}

void JsonWriter::Begin(const std::string& key, Kind kind) {
  StartEntry();
  text_ += json(key).dump();
  text_ += kind == Kind::kObject ? ": {" : ": [";
  open_.push_back({kind, true});
}

void JsonWriter::End() {
  const Level ended = open_.back();
  open_.pop_back();
  if (!ended.empty) {
    Indent();
  }
  text_ += ended.kind == Kind::kObject ? '}' : ']';
}

void JsonWriter::Item(const json& value) {
  StartEntry();
  AppendOnOneLine(text_, value);
}

void JsonWriter::Member(const std::string& key, const json& value) {
  StartEntry();
  text_ += json(key).dump();
  text_ += ": ";
  AppendOnOneLine(text_, value);
}

void JsonWriter::StartEntry() {
  if (open_.empty()) {
    return;
  }
  if (!open_.back().empty) {
    text_ += ',';
  }
  open_.back().empty = false;
  Indent();
}

void JsonWriter::Indent() {
  text_ += '\n';
  text_.append(2 * open_.size(), ' ');
}

}  // namespace StandIn
