// Queues and line maps of the reader as values that can be compared and printed.
#pragma once

#include <map>
#include <queue>
#include <string>
#include <vector>

namespace SecPolicyTest {

using Words = std::vector<std::string>;

inline Words WordsOf(std::queue<std::string> queue) {
  Words words;
  for (; !queue.empty(); queue.pop()) words.push_back(queue.front());
  return words;
}

inline std::queue<std::string> QueueOf(const Words& words) {
  return std::queue<std::string>({words.begin(), words.end()});
}

inline std::map<unsigned int, Words> LinesOf(
    const std::map<unsigned int, std::queue<std::string>>& lines) {
  std::map<unsigned int, Words> all;
  for (const auto& [number, queue] : lines) all[number] = WordsOf(queue);
  return all;
}

}  // namespace SecPolicyTest
