#include "host/json/text_reader.h"

#include <array>

namespace StandIn {

TextReader ReaderOf(const std::string& text) {
  return [&text](std::size_t offset, std::span<char> into) {
    return offset < text.size() ? text.copy(into.data(), into.size(), offset) : 0;
  };
}

std::string WholeText(const TextReader& reader) {
  std::string text;
  std::array<char, 65536> block;
  while (const std::size_t size = reader(text.size(), block)) text.append(block.data(), size);
  return text;
}

}  // namespace StandIn
