// In what two policies differ.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

enum class Change : std::uint8_t { kAdded, kRemoved, kChanged };

// Something that the policies differ in: as it is before and after, nothing where it is not there.
template <typename Content>
struct Changed {
  std::optional<Content> before;
  std::optional<Content> after;

  [[nodiscard]] Change Kind() const {
    if (!before) return Change::kAdded;
    return after ? Change::kChanged : Change::kRemoved;
  }
  [[nodiscard]] const Content& Latest() const { return after ? *after : *before; }
};

// Where a rule was changed, both have the same key, or they are granted transitions by the same
// label and event to different domains.
using ChangedRule = Changed<PolicyRule>;

template <typename Content>
struct Named {
  std::string name;
  Changed<Content> change;
};

struct ChangedDomain {
  std::string name;
  Change kind = Change::kChanged;  // kChanged: only in its rules
  std::optional<Place> place;      // of its file
  std::vector<ChangedRule> rules;  // by type, then by words; all of a domain that was not or is not
};

using ChangedLabel = Named<LabelledFile>;

// Each by name.
struct Difference {
  std::vector<ChangedDomain> domains;
  std::vector<Named<ObjectContent>> objects;
  std::vector<ChangedLabel> tardisks;
  std::vector<ChangedLabel> files;

  [[nodiscard]] bool IsEmpty() const {
    return domains.empty() && objects.empty() && tardisks.empty() && files.empty();
  }
};

// What has to change for `before` to mean what `after` means. Neither order nor places, comments or
// predefined objects count.
Difference Compare(const Policy& before, const Policy& after);

}  // namespace SecPolicyTool
