#include "host/archives/unpacked_stream.h"

namespace StandIn {

UnpackedStream::UnpackedStream(int fd, UnpackBudget& budget)
    : budget_(budget), decoder_(NewDecoder(fd)) {}

UnpackedStream::Result UnpackedStream::Next(std::string_view& block) {
  const Result result = decoder_->Next(block);
  if (result == Result::kError) error_ = decoder_->Error();
  if (result != Result::kBlock) return result;
  if (!budget_.TakeBytes(block.size())) {
    error_ = budget_.TooManyBytes();
    return Result::kError;
  }
  if (const std::size_t last = block.find_last_not_of('\0'); last != std::string_view::npos) {
    endOfContent_ = delivered_ + last + 1;
  }
  delivered_ += block.size();
  return Result::kBlock;
}

}  // namespace StandIn
