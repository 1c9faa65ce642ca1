#include "tools/check/findings_json.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <nlohmann/json.hpp>
#include <string_view>
#include <unordered_map>
#include <utility>

namespace SecPolicyTool {

using nlohmann::json;

namespace {

using Bytes = std::vector<std::uint8_t>;

// There may be a million findings, which differ in a number or two: each text is carried once, and
// a finding is a row of numbers, those of its texts among them.
constexpr std::array<std::string Finding::*, 5> kTexts{
    &Finding::id, &Finding::message, &Finding::loadMessage, &Finding::help, &Finding::source};

void AddNumber(std::size_t number, Bytes& bytes) {
  const auto value = static_cast<std::uint32_t>(number);
  const auto* begin = reinterpret_cast<const std::uint8_t*>(&value);
  bytes.insert(bytes.end(), begin, begin + sizeof value);
}

// Texts that the findings own, each once and in front of it its length.
class TextWriter {
 public:
  std::size_t NumberOf(const std::string& text) {
    const auto [entry, isNew] = numbers_.try_emplace(text, numbers_.size());
    if (isNew) {
      AddNumber(text.size(), bytes_);
      bytes_.insert(bytes_.end(), text.begin(), text.end());
    }
    return entry->second;
  }

  Bytes Take() && { return std::move(bytes_); }

 private:
  std::unordered_map<std::string_view, std::size_t> numbers_;
  Bytes bytes_;
};

class Reader {
 public:
  explicit Reader(const Bytes& bytes)
      : rest_(reinterpret_cast<const char*>(bytes.data()), bytes.size()) {}

  [[nodiscard]] bool IsAtEnd() const { return rest_.empty(); }

  std::uint32_t Number() {
    std::uint32_t value = 0;
    const std::string_view bytes = Take(sizeof value);
    std::memcpy(&value, bytes.data(), sizeof value);
    return value;
  }

  std::string_view Text() { return Take(Number()); }

 private:
  std::string_view Take(std::size_t size) {
    const std::string_view taken = rest_.substr(0, size);
    rest_.remove_prefix(size);
    return taken;
  }

  std::string_view rest_;
};

Finding ReadFinding(Reader& row, const std::vector<std::string_view>& texts) {
  Finding finding;
  finding.severity = row.Number() != 0 ? Severity::kError : Severity::kWarning;
  finding.place.line = row.Number();
  finding.place.column = row.Number();
  finding.length = row.Number();
  finding.place.file = texts.at(row.Number());
  for (const auto text : kTexts) finding.*text = texts.at(row.Number());
  return finding;
}

}  // namespace

json ToJson(const std::vector<Finding>& findings) {
  TextWriter texts;
  Bytes rows;
  for (const Finding& finding : findings) {
    AddNumber(finding.severity == Severity::kError ? 1 : 0, rows);
    AddNumber(finding.place.line, rows);
    AddNumber(finding.place.column, rows);
    AddNumber(finding.length, rows);
    AddNumber(texts.NumberOf(finding.place.file), rows);
    for (const auto text : kTexts) AddNumber(texts.NumberOf(finding.*text), rows);
  }
  return {{"texts", json::binary(std::move(texts).Take())},
          {"rows", json::binary(std::move(rows))}};
}

std::vector<Finding> FindingsOfJson(const json& content) {
  std::vector<std::string_view> texts;
  for (Reader text(content.at("texts").get_binary()); !text.IsAtEnd();) {
    texts.push_back(text.Text());
  }
  std::vector<Finding> findings;
  for (Reader rows(content.at("rows").get_binary()); !rows.IsAtEnd();) {
    findings.push_back(ReadFinding(rows, texts));
  }
  return findings;
}

}  // namespace SecPolicyTool
