// Decompression of archive files.
#pragma once

#include <memory>
#include <string>
#include <string_view>

namespace StandIn {

// The bytes of a file once decompressed, from its first to its last.
class Decoder {
 public:
  Decoder() = default;
  virtual ~Decoder() = default;
  Decoder(const Decoder&) = delete;
  Decoder& operator=(const Decoder&) = delete;

  enum class Result { kBlock, kEnd, kError };
  // The next bytes, at least one, valid until the next call. After kError, `Error()` says what is
  // wrong; the decoder is of no further use.
  virtual Result Next(std::string_view& block) = 0;
  [[nodiscard]] const std::string& Error() const { return error_; }

 protected:
  Result Fail(const std::string& error) {
    error_ = error;
    return Result::kError;
  }

 private:
  std::string error_;
};

// Reads the regular file `fd`, which must outlive the decoder, from its start. It may be compressed
// once by gzip, bzip2, lz4, lzip, xz or zstd, or not at all: what is compressed otherwise is handed
// over as it is. No program is started.
//
// Whatever checksums and lengths the compressed data has are verified, of each member where there
// are several. Data that is damaged, incomplete, or followed by anything else is an error, found at
// the latest in place of kEnd.
std::unique_ptr<Decoder> NewDecoder(int fd);

}  // namespace StandIn
