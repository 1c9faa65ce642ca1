#include "tools/graph/graph_forms.h"

#include <nlohmann/json.hpp>
#include "tools/policy/policy_json.h"

namespace SecPolicyTool {

nlohmann::json GraphJson(const TransitionGraph& graph) {
  nlohmann::json domains = nlohmann::json::array();
  for (std::size_t domain = 0; domain < graph.Domains().size(); ++domain) {
    nlohmann::json transitions = nlohmann::json::array();
    for (const Link& link : graph.LinksFrom(domain)) {
      for (const Transition& transition : graph.TransitionsOf(link)) {
        transitions.push_back({{"label", transition.label},
                               {"event", transition.event},
                               {"target", graph.Domains()[link.to]},
                               {"place", ToJson(transition.place)}});
      }
    }
    domains.push_back({{"name", graph.Domains()[domain]}, {"transitions", std::move(transitions)}});
  }
  return {{"domains", std::move(domains)}};
}

}  // namespace SecPolicyTool
