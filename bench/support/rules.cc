#include "bench/support/rules.h"

#include <filesystem>
#include <iterator>
#include <string_view>

#include "fuzz/support/scratch_directory.h"

namespace SecPolicyBench {

namespace {

constexpr std::string_view kCapabilities[] = {
    "chown",        "kill",       "setgid",         "setuid",    "setpcap",    "net_bind_service",
    "net_admin",    "net_raw",    "ipc_lock",       "ipc_owner", "sys_module", "sys_rawio",
    "sys_chroot",   "sys_ptrace", "sys_pacct",      "sys_admin", "sys_boot",   "sys_nice",
    "sys_resource", "sys_time",   "sys_tty_config", "mknod",     "lease",      "audit_write"};
constexpr std::string_view kSystemCalls[] = {
    "read",   "write",  "openat", "close",   "fstat",    "lseek",  "mmap",     "mprotect",
    "munmap", "brk",    "ioctl",  "pread64", "pwrite64", "readv",  "writev",   "madvise",
    "dup",    "getpid", "socket", "connect", "accept",   "sendto", "recvfrom", "shutdown",
    "bind",   "listen", "clone",  "execve",  "exit",     "wait4",  "kill",     "uname"};
constexpr std::string_view kAccesses[] = {"read",   "write",  "exec",    "append",  "create",
                                          "delete", "rename", "getattr", "setattr", "connect"};
constexpr std::string_view kEvents[] = {"exec", "fork"};
constexpr std::string_view kFileTypes[] = {"file",     "dir",  "symlink", "chardev",
                                           "blockdev", "fifo", "socket"};
constexpr std::string_view kSocketTypes[] = {"stream", "dgram", "seqpacket"};

std::string Numbered(const char* stem, std::size_t number, int digits) {
  std::string text = std::to_string(number);
  if (text.size() < static_cast<std::size_t>(digits)) text.insert(0, digits - text.size(), '0');
  return stem + text;
}

const std::vector<std::string>& Objects() {
  static const std::vector<std::string> names = ObjectNames();
  return names;
}

// The words that `number` stands for, each list a digit, the last one the lowest; nothing when
// there are not so many.
std::string Combination(std::size_t number, std::initializer_list<std::vector<std::string>> lists) {
  std::string text;
  for (auto list = std::rbegin(lists); list != std::rend(lists); ++list) {
    text.insert(0, " " + (*list)[number % list->size()]);
    number /= list->size();
  }
  return number == 0 ? text : std::string();
}

template <std::size_t kCount>
std::vector<std::string> List(const std::string_view (&words)[kCount]) {
  return {std::begin(words), std::end(words)};
}

std::string WordsOf(char type, std::size_t number) {
  switch (type) {
    case 'a':
      return Combination(number, {Objects(), List(kAccesses)});
    case 'c':
      return Combination(number, {List(kCapabilities)});
    case 'd':
      return Combination(number, {Objects(), DomainNames(), List(kEvents)});
    case 'f':
      return Combination(number, {Objects(), Objects(), List(kFileTypes)});
    case 's':
      return Combination(number, {List(kSystemCalls)});
    case 'u':
      return Combination(number, {Objects(), List(kSocketTypes)});
    default:
      return " " + std::string(kCapabilities[number % 4]) + " " + std::to_string(number);
  }
}

void WriteLines(const std::string& path, const std::vector<std::string>& lines) {
  std::string text;
  for (const std::string& line : lines) text += line + "\n";
  Fuzz::WriteFile(path, text);
}

void MakeDirectories(const std::string& policy) {
  for (const char* part : {"objects", "domains", "fileLabels"}) {
    std::filesystem::create_directories(policy + "/" + part);
  }
}

}  // namespace

std::vector<std::string> DomainNames() {
  std::vector<std::string> names{"appDom", "globalVMDom", "ioFilterDom"};
  while (names.size() < kDomains) names.push_back(Numbered("dom", names.size(), 3));
  return names;
}

std::vector<std::string> ObjectNames() {
  std::vector<std::string> names;
  while (names.size() < kObjects) names.push_back(Numbered("object", names.size(), 2));
  return names;
}

std::string RuleLine(char type, std::size_t number) {
  const std::string words = WordsOf(type, number);
  if (words.empty()) return {};
  return std::string("-") + type + words + (number % 2 == 0 ? " grant" : " revoke");
}

std::vector<std::string> RuleLines(std::size_t count) {
  std::vector<std::string> lines;
  std::size_t parameters = 0;
  for (std::size_t i = 0; lines.size() < count; ++i) {
    for (const char type : kRuleTypes) {
      std::string line = type == 'p' ? "" : RuleLine(type, i);
      // Where the words of a type have run out, a parameter takes the rule's place.
      if (line.empty()) line = RuleLine('p', parameters++);
      if (lines.size() < count) lines.push_back(std::move(line));
    }
  }
  return lines;
}

std::string WritePolicy(const std::string& dir, std::size_t count) {
  const std::string policy = dir + "/policy-" + std::to_string(count);
  MakeDirectories(policy);
  WriteLines(policy + "/objects/base", ObjectNames());
  const std::vector<std::string> lines = RuleLines(count / kDomains);
  for (const std::string& domain : DomainNames()) WriteLines(policy + "/domains/" + domain, lines);
  return policy;
}

void WriteDomain(const std::string& path, const std::string& lines) {
  MakeDirectories(path);
  Fuzz::WriteFile(path + "/domains/appDom", lines);
}

}  // namespace SecPolicyBench
