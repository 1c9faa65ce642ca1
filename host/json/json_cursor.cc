#include "host/json/json_cursor.h"

#include <algorithm>
#include <limits>
#include <nlohmann/json.hpp>
#include <string_view>

#include "host/json/json_limits.h"
#include "host/text/escaped.h"
#include "platform/tavon_strcat.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

using nlohmann::json;
using Tavon::Misc::StrCat;

namespace {

// Refuses, while a document is parsed, what the parser itself would pass over.
class ParseGuard {
 public:
  explicit ParseGuard(const std::string& file) : limits_(file) {}

  void Check(int depth, json::parse_event_t event, const json& parsed) {
    limits_.Check(static_cast<std::size_t>(depth));
    if (event == json::parse_event_t::object_start) {
      limits_.BeginObject();
    } else if (event == json::parse_event_t::object_end) {
      limits_.EndObject();
    } else if (event == json::parse_event_t::key) {
      limits_.Key(parsed.get_ref<const std::string&>());
    }
  }

 private:
  JsonLimits limits_;
};

// The parser's text behind `prefix`: without its own name for the error and its count of lines.
std::string Cause(const json::exception& error, std::string_view prefix) {
  const std::string text = error.what();
  const std::size_t found = text.find(prefix);
  return Escaped(found == std::string::npos ? text : text.substr(found + prefix.size())).Text();
}

json Parsed(const std::string& text, const std::string& file,
            const json::parser_callback_t& callback) {
  // The parser's message for an empty text differs between its versions.
  if (text.empty()) {
    throw HostError(StrCat(file, ":1:1: syntax error: the file is empty"));
  }
  try {
    return json::parse(text, callback);
  } catch (const json::parse_error& error) {
    FailAtByte(text, error.byte, file, Cause(error, ": "));
  } catch (const json::out_of_range& error) {
    throw HostError(StrCat(file, ": ", Cause(error, "] ")));
  }
}

// Appends to `place` the place of `sought` within `value`; says whether it is there. Places are
// asked for only when something is wrong, so that cursors need not carry them.
bool FindPlace(const json& value, const json& sought, json::json_pointer& place) {
  if (&value == &sought) {
    return true;
  }
  std::size_t index = 0;
  for (auto item = value.begin(); value.is_structured() && item != value.end(); ++item) {
    if (value.is_object()) {
      place /= item.key();
    } else {
      place /= index++;
    }
    if (FindPlace(*item, sought, place)) {
      return true;
    }
    place.pop_back();
  }
  return false;
}

}  // namespace

json ParseJson(const std::string& text, const std::string& file) {
  ParseGuard guard(file);
  return Parsed(text, file, [&guard](int depth, json::parse_event_t event, const json& parsed) {
    guard.Check(depth, event, parsed);
    return true;
  });
}

void RequireJson(const std::string& text, const std::string& file) {
  Parsed(text, file, [](int, json::parse_event_t, const json&) { return false; });
}

void FailAtByte(const std::string& text, std::size_t bytes, const std::string& file,
                const std::string& what) {
  const std::string_view before = std::string_view(text).substr(0, bytes == 0 ? 0 : bytes - 1);
  const auto lines = std::count(before.begin(), before.end(), '\n');
  const std::size_t lineStart = before.rfind('\n') + 1;  // npos wraps to the first line's start
  throw HostError(StrCat(file, ":", lines + 1, ":", before.size() - lineStart + 1, ": ", what));
}

JsonCursor::JsonCursor(const json& document, std::string file)
    : JsonCursor(document, std::make_shared<const JsonOrigin>(JsonOrigin{std::move(file)})) {}

JsonCursor::JsonCursor(const json& tree, std::shared_ptr<const JsonOrigin> origin)
    : value_(&tree), tree_(&tree), origin_(std::move(origin)) {}

JsonCursor::JsonCursor(const json& value, const JsonCursor& from)
    : value_(&value), tree_(from.tree_), origin_(from.origin_) {}

JsonCursor JsonCursor::Member(const std::string& key) const {
  const std::optional<JsonCursor> member = Find(key);
  if (!member) {
    Fail(StrCat("lacks the member \"", key, "\""));
  }
  return *member;
}

std::optional<JsonCursor> JsonCursor::Find(const std::string& key) const {
  if (!value_->is_object()) {
    Fail("must be an object");
  }
  const auto found = value_->find(key);
  if (found == value_->end()) {
    return std::nullopt;
  }
  return JsonCursor(*found, *this);
}

void JsonCursor::AllowOnly(std::initializer_list<const char*> keys) const {
  for (const auto& [key, member] : Members()) {
    if (std::find(keys.begin(), keys.end(), key) == keys.end()) {
      member.Fail("unknown member");
    }
  }
}

void JsonCursor::ExpectArray() const {
  if (!value_->is_array()) {
    Fail("must be an array");
  }
}

std::vector<JsonCursor> JsonCursor::Items() const {
  ExpectArray();
  std::vector<JsonCursor> items;
  items.reserve(value_->size());
  for (const json& item : *value_) {
    items.push_back(JsonCursor(item, *this));
  }
  return items;
}

std::vector<std::pair<std::string, JsonCursor>> JsonCursor::Members() const {
  if (!value_->is_object()) {
    Fail("must be an object");
  }
  std::vector<std::pair<std::string, JsonCursor>> members;
  for (const auto& [key, member] : value_->items()) {
    members.emplace_back(key, JsonCursor(member, *this));
  }
  return members;
}

std::string JsonCursor::String() const {
  if (!IsString()) {
    Fail("must be a string");
  }
  return value_->get<std::string>();
}

std::uint64_t JsonCursor::Unsigned(std::uint64_t least, std::uint64_t most) const {
  const std::uint64_t number = value_->is_number_unsigned() ? value_->get<std::uint64_t>() : 0;
  if (!value_->is_number_unsigned() || number < least || number > most) {
    Fail(StrCat("must be a whole number from ", least, " to ", most));
  }
  return number;
}

std::vector<std::string> JsonCursor::Strings() const {
  std::vector<std::string> strings;
  for (const JsonCursor& item : Items()) {
    strings.push_back(item.String());
  }
  return strings;
}

bool JsonCursor::IsString() const { return value_->is_string(); }

void JsonCursor::Fail(const std::string& what) const {
  json::json_pointer place;
  FindPlace(*tree_, *value_, place);
  // Keys are from outside; a NUL in one would end the message.
  const std::string text = origin_->place() + Escaped(place.to_string()).Text();
  throw HostError(StrCat(origin_->file, ": ", text.empty() ? "/" : text, ": ", what));
}

void ExpectFormat(const JsonCursor& document, std::uint64_t known) {
  const JsonCursor format = document.Member("format");
  const std::uint64_t found = format.Unsigned(0, std::numeric_limits<std::uint64_t>::max());
  if (found != known) {
    format.Fail(StrCat("format ", found, " is not known here, only format ", known));
  }
}

}  // namespace StandIn
