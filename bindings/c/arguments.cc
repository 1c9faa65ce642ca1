#include "bindings/c/arguments.h"

#include <string_view>

#include "bindings/c/failure.h"
#include "host/text/utf8_text.h"

namespace SecPolicyC {

namespace {

[[noreturn]] void Refuse(const std::string& name, const char* what) {
  throw Failure(SECPOLICY_INVALID_ARGUMENT, name + " is " + what);
}

}  // namespace

void RequireSet(const void* argument, const char* name) {
  if (argument == nullptr) Refuse(name, "NULL");
}

std::string TextOf(const char* argument, const char* name) {
  RequireSet(argument, name);
  std::string text = argument;
  if (StandIn::ValidText(text) != text) Refuse(name, "not UTF-8");
  return text;
}

std::optional<std::string> OptionalTextOf(const char* argument, const char* name) {
  if (argument == nullptr) return std::nullopt;
  return TextOf(argument, name);
}

std::string PathOf(const char* argument, const char* name) {
  std::string path = TextOf(argument, name);
  if (path.empty()) Refuse(name, "empty");
  return path;
}

std::string PolicyDirOf(const char* argument, const char* name) {
  return argument == nullptr ? std::string() : PathOf(argument, name);
}

std::vector<std::string> WordsOf(const char* const* words, std::size_t count) {
  if (count == 0) throw Failure(SECPOLICY_BAD_REQUEST, "a question without words");
  RequireSet(words, "words");
  std::vector<std::string> texts;
  for (std::size_t i = 0; i < count; ++i) {
    texts.push_back(TextOf(words[i], ("words[" + std::to_string(i) + "]").c_str()));
  }
  return texts;
}

}  // namespace SecPolicyC
