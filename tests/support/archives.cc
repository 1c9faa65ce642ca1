#include "tests/support/archives.h"

#include <archive_entry.h>
#include <locale.h>

#include <array>
#include <cstdio>
#include <memory>
#include <stdexcept>

namespace StandIn {

namespace {

constexpr std::size_t kBlock = 512;

la_ssize_t Append(archive*, void* text, const void* bytes, std::size_t size) {
  static_cast<std::string*>(text)->append(static_cast<const char*>(bytes), size);
  return static_cast<la_ssize_t>(size);
}

void Require(archive* writer, int result) {
  if (result < ARCHIVE_WARN) {
    throw std::runtime_error(::archive_error_string(writer));
  }
}

std::string Padded(std::string bytes) {
  bytes.resize((bytes.size() + kBlock - 1) / kBlock * kBlock);
  return bytes;
}

}  // namespace

Archive& Archive::Directory(const std::string& name, mode_t mode) {
  entries_.push_back({.name = name, .type = AE_IFDIR, .mode = mode});
  return *this;
}

Archive& Archive::File(const std::string& name, const std::string& content, mode_t mode) {
  entries_.push_back({.name = name,
                      .type = AE_IFREG,
                      .mode = mode,
                      .content = content,
                      .size = static_cast<std::int64_t>(content.size())});
  return *this;
}

Archive& Archive::Symlink(const std::string& name, const std::string& target) {
  entries_.push_back({.name = name, .type = AE_IFLNK, .mode = 0777, .symlink = target});
  return *this;
}

Archive& Archive::HardLink(const std::string& name, const std::string& target) {
  entries_.push_back({.name = name, .type = AE_IFREG, .mode = 0644, .hardLink = target});
  return *this;
}

Archive& Archive::Fifo(const std::string& name, mode_t mode) {
  entries_.push_back({.name = name, .type = AE_IFIFO, .mode = mode});
  return *this;
}

Archive& Archive::SparseFile(const std::string& name, std::int64_t size, std::int64_t offset,
                             const std::string& content) {
  entries_.push_back({.name = name,
                      .type = AE_IFREG,
                      .mode = 0644,
                      .content = content,
                      .size = size,
                      .offset = offset});
  return *this;
}

void Archive::Write(archive* writer, const Entry& entry) {
  const std::unique_ptr<archive_entry, void (*)(archive_entry*)> header(::archive_entry_new(),
                                                                        ::archive_entry_free);
  ::archive_entry_set_pathname(header.get(), entry.name.c_str());
  ::archive_entry_set_filetype(header.get(), entry.type);
  ::archive_entry_set_perm(header.get(), entry.mode);
  ::archive_entry_set_size(header.get(), entry.size);
  if (!entry.symlink.empty()) {
    ::archive_entry_set_symlink(header.get(), entry.symlink.c_str());
  }
  if (!entry.hardLink.empty()) {
    ::archive_entry_set_hardlink(header.get(), entry.hardLink.c_str());
  }
  const auto length = static_cast<std::int64_t>(entry.content.size());
  if (entry.size != length) {
    ::archive_entry_sparse_add_entry(header.get(), entry.offset, length);
  }
  Require(writer, ::archive_write_header(writer, header.get()));
  // A sparse file is handed over whole; the writer picks the parts that its map names.
  std::string whole(static_cast<std::size_t>(entry.offset), '\0');
  whole += entry.content;
  if (!entry.content.empty()) {
    Require(writer, static_cast<int>(::archive_write_data(writer, whole.data(), whole.size())));
  }
}

std::string Archive::Bytes() const {
  std::string text;
  const std::unique_ptr<archive, int (*)(archive*)> writer(::archive_write_new(),
                                                           ::archive_write_free);
  Require(writer.get(), ::archive_write_set_format(writer.get(), format_));
  Require(writer.get(), ::archive_write_add_filter(writer.get(), filter_));
  // Some decompressors don't take zeros after their input for padding.
  Require(writer.get(), ::archive_write_set_bytes_in_last_block(writer.get(), 1));
  Require(writer.get(), ::archive_write_open(writer.get(), &text, nullptr, Append, nullptr));
  for (const Entry& entry : entries_) {
    Write(writer.get(), entry);
  }
  Require(writer.get(), ::archive_write_close(writer.get()));
  return text;
}

RawArchive& RawArchive::Header(const RawHeader& header) {
  std::string block(kBlock, '\0');
  const auto put = [&](std::size_t offset, const std::string& text) {
    block.replace(offset, text.size(), text);
  };
  put(0, header.name.substr(0, 100));
  put(100, header.mode);
  put(108, "0000000");
  put(116, "0000000");
  put(124, header.size);
  put(136, "00000000000");
  put(148, "        ");  // the checksum is formed with blanks in its own place
  block[156] = header.type;
  put(157, header.link.substr(0, 100));
  put(257, std::string("ustar\00000", 8));
  unsigned int sum = 0;
  for (const char byte : block) {
    sum += static_cast<unsigned char>(byte);
  }
  std::array<char, 8> checksum;
  std::snprintf(checksum.data(), checksum.size(), "%06o", sum & 0777777u);
  put(148, checksum.data());
  block[154] = '\0';
  bytes_ += block;
  return *this;
}

RawArchive& RawArchive::Content(const std::string& bytes) { return Bytes(Padded(bytes)); }

RawArchive& RawArchive::Extended(const std::vector<std::pair<std::string, std::string>>& records) {
  std::string text;
  for (const auto& [key, value] : records) {
    const std::string tail = " " + key + "=" + value + "\n";
    std::size_t length = tail.size();
    while (std::to_string(length).size() + tail.size() != length) {
      length = std::to_string(length).size() + tail.size();
    }
    text += std::to_string(length) + tail;
  }
  Header({.name = "extended", .type = 'x', .size = OctalSize(text.size())});
  return Content(text);
}

RawArchive& RawArchive::Bytes(const std::string& bytes) {
  bytes_ += bytes;
  return *this;
}

RawArchive& RawArchive::End() { return Bytes(std::string(2 * kBlock, '\0')); }

std::string OctalSize(std::uint64_t size) {
  std::array<char, 24> digits;
  std::snprintf(digits.data(), digits.size(), "%011llo", static_cast<unsigned long long>(size));
  return digits.data();
}

}  // namespace StandIn
