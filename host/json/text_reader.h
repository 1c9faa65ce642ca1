// Texts that are read in blocks and written in parts, so that they need not be in memory.
#pragma once

#include <cstddef>
#include <functional>
#include <span>
#include <string>
#include <string_view>

namespace StandIn {

// Fills `into` with the bytes of a text from `offset` on and returns how many it has put there:
// fewer than `into` has room for only at the end of the text. Throws HostError when the text cannot
// be read. What it reads from must outlive it and stay unchanged.
using TextReader = std::function<std::size_t(std::size_t offset, std::span<char> into)>;

// Reads `text` itself.
TextReader ReaderOf(const std::string& text);
TextReader ReaderOf(const std::string&& text) = delete;  // would dangle

// All of it. Throws what `reader` throws.
std::string WholeText(const TextReader& reader);

// Takes the next part of a text that is written.
using TextSink = std::function<void(std::string_view part)>;
// Writes a text from its beginning to its end.
using TextWriter = std::function<void(const TextSink& sink)>;

}  // namespace StandIn
