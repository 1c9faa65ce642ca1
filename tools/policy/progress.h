// A bar for what takes long.
#pragma once

#include <chrono>
#include <functional>
#include <iosfwd>
#include <string>

namespace SecPolicyTool {

// Draws a bar on a terminal from the first second on, over and over in one line, and erases it when
// it ends. Draws nothing anywhere else.
class Progress {
 public:
  using Clock = std::function<std::chrono::steady_clock::time_point()>;

  // `what` is being done, in `total` steps; 0 when nobody knows: the seconds are shown then.
  explicit Progress(std::string what, std::size_t total = 0);
  // The same on a stream that is a terminal or is not, at another's time.
  Progress(std::string what, std::size_t total, std::ostream& out, bool isTerminal, Clock now);
  ~Progress() { Clear(); }
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  // A step is done.
  void Step();
  // Time has passed.
  void Tick();
  // Makes room for other output. The bar comes again with the next step or tick.
  void Clear();

 private:
  void Draw(std::chrono::steady_clock::duration elapsed);

  std::string what_;
  std::size_t total_;
  std::ostream& out_;
  bool isTerminal_;
  Clock now_;
  std::chrono::steady_clock::time_point start_;
  std::chrono::steady_clock::time_point next_;  // when it is drawn again
  std::size_t done_ = 0;
  bool isDrawn_ = false;
};

}  // namespace SecPolicyTool
