#include "tools/policy/letter.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cerrno>
#include <nlohmann/json.hpp>
#include <system_error>

#include "host/image/file_io.h"

namespace SecPolicyTool {

using nlohmann::json;

Letter::Letter() : fd_(memfd_create("secpolicy", MFD_CLOEXEC)) {
  // In a process without standard streams it would take the place of one, which the child opens.
  if (fd_.Get() >= 0 && fd_.Get() <= STDERR_FILENO) {
    fd_ = StandIn::UniqueFd(fcntl(fd_.Get(), F_DUPFD_CLOEXEC, STDERR_FILENO + 1));
  }
  if (fd_.Get() < 0) throw std::system_error(errno, std::generic_category(), "memfd_create");
}

void Letter::WriteBytes(std::string_view bytes) const {
  while (!bytes.empty()) {
    const ssize_t size = write(fd_.Get(), bytes.data(), bytes.size());
    if (size < 0) throw std::system_error(errno, std::generic_category(), "write");
    bytes.remove_prefix(static_cast<std::size_t>(size));
  }
}

std::string Letter::ReadBytes() const {
  if (lseek(fd_.Get(), 0, SEEK_SET) != 0) return {};
  return StandIn::ReadAll(fd_.Get(), "result");
}

// CBOR, since its strings may hold any bytes.
void Letter::Write(const json& content) const {
  std::string bytes;
  json::to_cbor(content, bytes);
  WriteBytes(bytes);
}

json Letter::Read() const {
  const std::string bytes = ReadBytes();
  return bytes.empty() ? json() : json::from_cbor(bytes);
}

}  // namespace SecPolicyTool
