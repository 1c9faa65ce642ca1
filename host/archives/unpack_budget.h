// How much the archives of a host may unpack to.
#pragma once

#include <cstdint>
#include <string>

namespace StandIn {

// Far above what a root file system takes, far below what a decompression bomb makes.
inline constexpr std::uint64_t kMaxUnpackedBytes = std::uint64_t{64} << 30;
inline constexpr std::uint64_t kMaxEntries = 4'000'000;
inline constexpr std::uint64_t kMaxPathBytesInAll = std::uint64_t{512} << 20;
inline constexpr std::uint64_t kMaxDepth = 256;

struct UnpackLimits {
  // Of all archives together, once decompressed: headers, contents, padding and the holes of sparse
  // files.
  std::uint64_t bytes = kMaxUnpackedBytes;
  // Of all archives together, the directories included that only the names of others imply.
  std::uint64_t entries = kMaxEntries;
  // The lengths of the paths of all these; they are kept in memory until the image is complete.
  std::uint64_t pathBytes = kMaxPathBytesInAll;
  // Components of one path.
  std::uint64_t depth = kMaxDepth;
};

// What is left of the limits.
class UnpackBudget {
 public:
  explicit UnpackBudget(const UnpackLimits& limits) : limits_(limits), left_(limits) {}

  // Each takes from what is left. False: there isn't that much, and nothing was taken.
  [[nodiscard]] bool TakeBytes(std::uint64_t bytes) { return Take(left_.bytes, bytes); }
  [[nodiscard]] bool TakeEntry() { return Take(left_.entries, 1); }
  [[nodiscard]] bool TakePath(const std::string& path) {
    return Take(left_.pathBytes, path.size());
  }
  // Whether a path may have so many components.
  [[nodiscard]] bool AllowsDepth(std::uint64_t depth) const { return depth <= limits_.depth; }

  // What to say then.
  [[nodiscard]] std::string TooManyBytes() const {
    return "the tardisks unpack to more than " + std::to_string(limits_.bytes) + " bytes";
  }
  [[nodiscard]] std::string TooManyEntries() const {
    return "the tardisks hold more than " + std::to_string(limits_.entries) +
           " entries, with the directories that names imply";
  }
  [[nodiscard]] std::string TooLongPaths() const {
    return "the paths in the tardisks have more than " + std::to_string(limits_.pathBytes) +
           " bytes together";
  }
  [[nodiscard]] std::string TooDeep() const {
    return "the name has more than " + std::to_string(limits_.depth) + " components";
  }

 private:
  static bool Take(std::uint64_t& left, std::uint64_t amount) {
    if (amount > left) {
      return false;
    }
    left -= amount;
    return true;
  }

  UnpackLimits limits_;
  UnpackLimits left_;
};

}  // namespace StandIn
