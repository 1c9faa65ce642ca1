#include "tools/policy/unknown_word.h"

#include "host/module/nearest_word.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

std::string UnknownWordText(const std::string& what, const std::string& word,
                            const std::vector<std::string>& known) {
  const auto nearest = StandIn::NearestWord(word, known);
  const std::string text = "unknown " + what + " \"" + Printable(word) + "\"";
  return nearest ? text + " (nearest: " + Printable(*nearest) + ")" : text;
}

}  // namespace SecPolicyTool
