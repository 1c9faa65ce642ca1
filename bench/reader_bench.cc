// The reader of policy files, beside other code for the same bytes.
#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <unistd.h>

#include <array>
#include <fstream>
#include <string_view>

#include "bench/support/allocations.h"
#include "bench/support/host_process.h"
#include "fuzz/support/scratch_directory.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyBench {
namespace {

using Lines = std::map<unsigned int, std::queue<std::string>>;

constexpr int kLines = 1'000'000;
constexpr std::string_view kLine = "-s openat /etc grant\n";
static_assert(kLine.size() == 21);

const std::string& File() {
  static const std::string path = [] {
    std::string text;
    for (int i = 0; i < kLines; ++i) text += kLine;
    std::string file = Scratch() + "/lines";
    Fuzz::WriteFile(file, text);
    return file;
  }();
  return path;
}

// The file's blocks of 64 KiB, cut behind the last whole line.
template <typename Take>
void ForEachLine(const std::string& path, Take take) {
  const int fd = open(path.c_str(), O_RDONLY | O_CLOEXEC);
  std::array<char, 65536> block;
  std::size_t kept = 0;
  for (ssize_t size; (size = read(fd, block.data() + kept, block.size() - kept)) > 0;) {
    std::string_view text(block.data(), kept + static_cast<std::size_t>(size));
    for (std::size_t end; (end = text.find('\n')) != std::string_view::npos;) {
      take(text.substr(0, end));
      text.remove_prefix(end + 1);
    }
    kept = text.copy(block.data(), text.size());
  }
  close(fd);
}

template <typename Take>
void ForEachWord(std::string_view line, Take take) {
  while (!line.empty()) {
    const std::string_view word = line.substr(0, line.find(' '));
    if (!word.empty()) take(word);
    line.remove_prefix(std::min(line.size(), word.size() + 1));
  }
}

// ---- What is compared --------------------------------------------------------------------------

// Reads and splits, and keeps nothing.
void ReadAndForget(const std::string& path) {
  std::size_t characters = 0;
  ForEachLine(path, [&](std::string_view line) {
    ForEachWord(line, [&](std::string_view word) { characters += word.size(); });
  });
  benchmark::DoNotOptimize(characters);
}

std::queue<std::string> PlainWords(const std::string& line) {
  std::queue<std::string> words;
  std::string word;
  for (const char c : line.substr(0, line.find('#'))) {
    if (c != ' ') {
      word += c;
    } else if (!word.empty()) {
      words.push(word);
      word.clear();
    }
  }
  if (!word.empty()) words.push(word);
  return words;
}

// The plainest code for the same data structure.
void PlainRead(const std::string& path, Lines& lines) {
  std::ifstream file(path);
  char buffer[1024];
  unsigned int number = 1;
  while (file.getline(buffer, sizeof buffer)) {
    const std::queue<std::string> words = PlainWords(buffer);
    if (!words.empty()) lines[number] = words;
    ++number;
  }
}

// The fastest code for it that was found; it knows no comments, no long lines and no errors.
void BestRead(const std::string& path, Lines& lines) {
  unsigned int number = 0;
  ForEachLine(path, [&](std::string_view line) {
    ++number;
    std::queue<std::string>* words = nullptr;
    ForEachWord(line, [&](std::string_view word) {
      if (words == nullptr) words = &lines.try_emplace(lines.end(), number)->second;
      words->emplace(word);
    });
  });
}

void LibraryRead(const std::string& path, Lines& lines) { SecPolicy::ParseFile(path, lines); }

// ---- Measures ----------------------------------------------------------------------------------

void SetRates(benchmark::State& state) {
  state.counters["items"] = kLines;
  state.SetItemsProcessed(state.iterations() * kLines);
  state.SetBytesProcessed(state.iterations() * kLines * static_cast<int>(kLine.size()));
}

void ReaderForgets(benchmark::State& state) {
  for (auto _ : state) ReadAndForget(File());
  SetRates(state);
}
BENCHMARK(ReaderForgets)->Name("reader/read and forget")->Unit(benchmark::kMillisecond);

using Read = void (*)(const std::string&, Lines&);

// Filling and freeing.
void Reader(benchmark::State& state, Read read) {
  double bytes = 0;
  for (auto _ : state) {
    Lines lines;
    const std::size_t before = HeapBytes();
    read(File(), lines);
    bytes = static_cast<double>(HeapBytes() - before);
    if (lines.size() != kLines) state.SkipWithError("lines are missing");
  }
  state.counters["bytes_each"] = bytes / kLines;
  SetRates(state);
}
BENCHMARK_CAPTURE(Reader, plainest, PlainRead)
    ->Name("reader/plainest")
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reader, best, BestRead)->Name("reader/best found")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Reader, library, LibraryRead)
    ->Name("reader/library")
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace SecPolicyBench

BENCHMARK_MAIN();
