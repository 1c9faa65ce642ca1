#include "tools/policy/unknown_word.h"

#include "host/module/nearest_word.h"
#include "host/text/escaped.h"

namespace SecPolicyTool {

using StandIn::Escaped;

std::string UnknownWordText(const std::string& what, const std::string& word,
                            const std::vector<std::string>& known) {
  const auto nearest = StandIn::NearestWord(word, known);
  const std::string text = "unknown " + what + " \"" + Escaped(word).Text() + "\"";
  return nearest ? text + " (nearest: " + Escaped(*nearest).Text() + ")" : text;
}

}  // namespace SecPolicyTool
