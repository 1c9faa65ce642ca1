#include "tools/policy/progress.h"

#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <utility>

#include "tools/policy/terminal.h"

namespace SecPolicyTool {

using std::chrono::steady_clock;

namespace {

constexpr std::chrono::seconds kSilent{1};
constexpr std::chrono::milliseconds kBetween{100};
constexpr std::size_t kWidth = 30;

}  // namespace

Progress::Progress(std::string what, std::size_t total)
    : Progress(std::move(what), total, std::cerr, isatty(STDERR_FILENO) == 1, steady_clock::now) {}

Progress::Progress(std::string what, std::size_t total, std::ostream& out, bool isTerminal,
                   Clock now)
    : what_(std::move(what)),
      total_(total),
      out_(out),
      isTerminal_(isTerminal),
      now_(std::move(now)),
      start_(now_()),
      next_(start_ + kSilent) {}

void Progress::Step() {
  ++done_;
  Tick();
}

void Progress::Tick() {
  if (!isTerminal_) return;
  const auto now = now_();
  if (now < next_) return;
  next_ = now + kBetween;
  Draw(now - start_);
}

void Progress::Clear() {
  if (!isDrawn_) return;
  out_ << TerminalText::EraseLine() << std::flush;
  isDrawn_ = false;
}

void Progress::Draw(steady_clock::duration elapsed) {
  out_ << TerminalText::EraseLine() << what_;
  if (total_ == 0) {
    out_ << " ... " << std::chrono::duration_cast<std::chrono::seconds>(elapsed).count() << " s";
  } else {
    const std::size_t done = std::min(done_, total_);
    const std::size_t filled = done * kWidth / total_;
    out_ << " [" << std::string(filled, '#') << std::string(kWidth - filled, '.') << "] "
         << done * 100 / total_ << " %";
  }
  out_ << std::flush;
  isDrawn_ = true;
}

}  // namespace SecPolicyTool
