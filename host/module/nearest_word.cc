#include "host/module/nearest_word.h"

#include <algorithm>
#include <string_view>
#include <utility>

namespace StandIn {

namespace {

char Lower(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

bool Same(char a, char b) { return Lower(a) == Lower(b); }

std::size_t AllowedEdits(std::string_view a, std::string_view b) {
  return std::max<std::size_t>(1, std::max(a.size(), b.size()) / 3);
}

// The number of edits that make `a` into `b`, no character being edited twice.
std::size_t EditDistance(std::string_view a, std::string_view b) {
  std::vector<std::size_t> older(b.size() + 1);
  std::vector<std::size_t> old(b.size() + 1);
  std::vector<std::size_t> row(b.size() + 1);
  for (std::size_t j = 0; j <= b.size(); ++j) {
    row[j] = j;
  }
  for (std::size_t i = 1; i <= a.size(); ++i) {
    older.swap(old);
    old.swap(row);
    row[0] = i;
    for (std::size_t j = 1; j <= b.size(); ++j) {
      const std::size_t replaced = old[j - 1] + (Same(a[i - 1], b[j - 1]) ? 0 : 1);
      row[j] = std::min({old[j] + 1, row[j - 1] + 1, replaced});
      if (i > 1 && j > 1 && Same(a[i - 1], b[j - 2]) && Same(a[i - 2], b[j - 1])) {
        row[j] = std::min(row[j], older[j - 2] + 1);
      }
    }
  }
  return row[b.size()];
}

bool CanBeNear(std::string_view a, std::string_view b) {
  const std::size_t difference = a.size() > b.size() ? a.size() - b.size() : b.size() - a.size();
  return difference <= AllowedEdits(a, b);
}

}  // namespace

std::optional<std::string> NearestWord(const std::string& word,
                                       const std::vector<std::string>& list) {
  const std::string* nearest = nullptr;
  std::size_t fewest = 0;
  for (const std::string& candidate : list) {
    if (!CanBeNear(word, candidate)) {
      continue;
    }
    const std::size_t edits = EditDistance(word, candidate);
    if (edits <= AllowedEdits(word, candidate) && (nearest == nullptr || edits < fewest)) {
      nearest = &candidate;
      fewest = edits;
    }
  }
  return nearest == nullptr ? std::nullopt : std::optional<std::string>(*nearest);
}

}  // namespace StandIn
