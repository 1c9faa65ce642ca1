// The words of one rule.
#pragma once

#include <algorithm>
#include <array>
#include <compare>
#include <initializer_list>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "platform/rule_types.h"

namespace StandIn {

// Up to kMost words, kept in place: a load makes one of these for each of its rules, and a vector
// would take memory each time.
class FewWords {
 public:
  static constexpr std::size_t kMost = ZekCtl::Security::kMostRuleWords;

  FewWords() = default;
  FewWords(std::initializer_list<std::string> words) { Append(words); }
  // NOLINTNEXTLINE(google-explicit-constructor): the same, otherwise written
  FewWords(const std::vector<std::string>& words) { Append(words); }

  // std::length_error when there are kMost already.
  void push_back(std::string word) {
    if (size_ == kMost) throw std::length_error("a rule has at most three words");
    words_[size_++] = std::move(word);
  }

  [[nodiscard]] std::size_t size() const { return size_; }
  [[nodiscard]] const std::string* begin() const { return words_.data(); }
  [[nodiscard]] const std::string* end() const { return words_.data() + size_; }
  // `index` must be below size().
  [[nodiscard]] std::string& operator[](std::size_t index) { return words_[index]; }
  [[nodiscard]] const std::string& operator[](std::size_t index) const { return words_[index]; }

  // std::out_of_range unless `index` is below size().
  [[nodiscard]] const std::string& at(std::size_t index) const {
    if (index >= size_) throw std::out_of_range("a rule has no such word");
    return words_[index];
  }

  friend bool operator==(const FewWords& a, const FewWords& b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end());
  }
  friend std::strong_ordering operator<=>(const FewWords& a, const FewWords& b) {
    return std::lexicographical_compare_three_way(a.begin(), a.end(), b.begin(), b.end());
  }

 private:
  template <typename Words>
  void Append(const Words& words) {
    for (const std::string& word : words) push_back(word);
  }

  std::array<std::string, kMost> words_;
  std::size_t size_ = 0;
};

}  // namespace StandIn
