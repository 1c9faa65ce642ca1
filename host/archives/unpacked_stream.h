// The bytes of an archive file once decompressed.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "host/archives/decoder.h"
#include "host/archives/unpack_budget.h"

namespace StandIn {

// Reads a file through whatever compression it has, or none (see NewDecoder), within a budget.
// Since the archive's own format isn't looked at here, what follows the end of the archive can be
// seen too.
class UnpackedStream {
 public:
  // Reads from `fd`, which must outlive this object, and takes what it reads from `budget`.
  UnpackedStream(int fd, UnpackBudget& budget);

  using Result = Decoder::Result;
  // The next bytes, valid until the next call. After kError, `Error()` says what is wrong; the
  // stream is of no further use.
  Result Next(std::string_view& block);
  [[nodiscard]] const std::string& Error() const { return error_; }

  // The number of bytes up to and with the last one so far that isn't zero.
  [[nodiscard]] std::uint64_t EndOfContent() const { return endOfContent_; }

 private:
  UnpackBudget& budget_;
  std::unique_ptr<Decoder> decoder_;
  std::uint64_t delivered_ = 0;
  std::uint64_t endOfContent_ = 0;
  std::string error_;
};

}  // namespace StandIn
