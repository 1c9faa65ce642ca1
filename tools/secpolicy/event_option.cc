#include "tools/secpolicy/event_option.h"

#include <algorithm>
#include <stdexcept>
#include <vector>

#include "host/module/description_json.h"
#include "host/module/module_description.h"
#include "host/module/word_lists.h"
#include "host/text/escaped.h"
#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

using StandIn::WordList;

CommandOption EventOption(std::optional<std::string>& event) {
  return {.names = {"--event"},
          .value = "EVENT",
          .description = "Only transitions on this event, for example \"exec\"",
          .store = Into(event)};
}

void RequireEvent(const std::string& host, const std::optional<std::string>& event) {
  if (!event) return;
  const StandIn::HostDirectory directory = OpenHost(host);
  const auto description = StandIn::ReadDescription(
      directory.DescriptionText(), directory.Ref().PathOf(StandIn::kDescriptionFile));
  const std::vector<std::string>& events = description.words.at(WordList::kTransitionEvents);
  if (std::find(events.begin(), events.end(), *event) != events.end()) return;
  const std::string problem = StandIn::UnknownWordText(WordList::kTransitionEvents, *event, events);
  throw std::runtime_error(StandIn::Escaped(problem).Text());
}

}  // namespace SecPolicyTool
