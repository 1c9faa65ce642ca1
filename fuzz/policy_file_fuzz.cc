// The reader of policy files against a second reading: lines, their numbers, and where it ends.
#include "fuzz/support/input.h"
#include "fuzz/support/plain_reader.h"
#include "fuzz/support/require.h"
#include "secpolicy/secpolicy.h"
#include "tests/support/memory_file.h"

namespace {

std::string Shown(unsigned int number, const std::string& words) {
  return std::to_string(number) + ": " + words + "\n";
}

// The words are kept apart by a NUL, which none of them holds.
std::string Shown(const Fuzz::PlainLines& lines) {
  std::string text;
  for (const auto& [number, words] : lines) {
    text += Shown(number, Fuzz::Joined(words, std::string(1, '\0')));
  }
  return text;
}

std::string ShownAsRead(const std::string& path) {
  std::map<unsigned int, std::queue<std::string>> lines;
  SecPolicy::ParseFile(path, lines);
  Fuzz::PlainLines plain;
  for (auto& [number, words] : lines) {
    Fuzz::Require(!words.empty(), "a line without words has no entry");
    for (; !words.empty(); words.pop()) plain[number].push_back(words.front());
  }
  return Shown(plain);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static SecPolicyTest::MemoryFile file;
  const std::string bytes = Fuzz::BytesOf(data, size);
  file.Write(bytes);
  Fuzz::RequireEqual(ShownAsRead(file.Path()), Shown(Fuzz::PlainLinesOf(bytes)),
                     "both readings give the same lines");
  return 0;
}
