#include "host/module/word_lists.h"

#include <seccomp.h>
#include <sys/capability.h>

#include <cctype>
#include <cstdlib>
#include <memory>
#include <optional>
#include <string_view>

#include "host/module/names.h"
#include "host/module/nearest_word.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

// System calls are numbered below this on every architecture; what lies above are other ABIs'.
constexpr int kSyscallNumbers = 1024;

struct FreeSyscallName {
  void operator()(char* name) const { std::free(name); }
};
struct FreeCapabilityName {
  void operator()(char* name) const { cap_free(name); }
};

// Calls that the architecture lacks have negative numbers here and so are never met.
std::vector<std::string> SystemCalls() {
  std::vector<std::string> names;
  for (int number = 0; number < kSyscallNumbers; ++number) {
    const std::unique_ptr<char, FreeSyscallName> name(
        seccomp_syscall_resolve_num_arch(SCMP_ARCH_NATIVE, number));
    if (name != nullptr) {
      names.emplace_back(name.get());
    }
  }
  return names;
}

std::string LowerCase(std::string_view text) {
  std::string lower;
  for (const char c : text) {
    lower += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  }
  return lower;
}

// A capability that the library has no name for comes as its number and is passed over.
std::vector<std::string> Capabilities() {
  constexpr std::string_view kPrefix = "cap_";
  std::vector<std::string> names;
  for (cap_value_t capability = 0; capability < cap_max_bits(); ++capability) {
    const std::unique_ptr<char, FreeCapabilityName> name(cap_to_name(capability));
    const std::string lower = name == nullptr ? "" : LowerCase(name.get());
    if (lower.starts_with(kPrefix)) {
      names.push_back(lower.substr(kPrefix.size()));
    }
  }
  return names;
}

}  // namespace

const WordListInfo* InfoOf(WordList list) {
  const std::size_t index = static_cast<std::size_t>(list) - 1;
  return index < kWordLists.size() ? &kWordLists[index] : nullptr;
}

std::vector<std::string> DefaultWords(WordList list) {
  switch (list) {
    case WordList::kCapabilities:
    case WordList::kParamCapabilities:
      return Capabilities();
    case WordList::kObjectAccesses:
      return {"read",   "write",  "exec",    "append",  "create",
              "delete", "rename", "getattr", "setattr", "connect"};
    case WordList::kTransitionEvents:
      return {"exec", "fork"};
    case WordList::kFileTypes:
      return {"file", "dir", "symlink", "chardev", "blockdev", "fifo", "socket"};
    case WordList::kSocketTypes:
      return {"stream", "dgram", "seqpacket"};
    case WordList::kSyscalls:
      return SystemCalls();
    case WordList::kObjects:
      break;
  }
  return {};
}

std::string UnknownWordText(WordList list, const std::string& word,
                            const std::vector<std::string>& words) {
  const std::string text = StrCat("unknown ", InfoOf(list)->title, " \"", Shown(word), "\"");
  const std::optional<std::string> nearest = NearestWord(word, words);
  return nearest ? StrCat(text, " (nearest: ", *nearest, ")") : text;
}

}  // namespace StandIn
