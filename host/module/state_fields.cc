#include "host/module/state_fields.h"

#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

std::uint32_t Read32(const JsonCursor& place, std::uint64_t least, std::uint64_t most) {
  return static_cast<std::uint32_t>(place.Unsigned(least, most));
}

WorldId ReadWorld(const JsonCursor& place, std::uint64_t least) {
  return static_cast<WorldId>(place.Unsigned(least, kMostWorld));
}

std::vector<JsonCursor> ItemsOf(const JsonCursor& object, const char* key) {
  const auto member = object.Find(key);
  return member ? member->Items() : std::vector<JsonCursor>();
}

std::vector<JsonCursor> RowOf(const JsonCursor& place, std::size_t size) {
  std::vector<JsonCursor> row = place.Items();
  if (row.size() != size) {
    place.Fail(StrCat("must have ", size, " elements"));
  }
  return row;
}

DomainId ReadDomainId(const JsonCursor& place, const DomainTable& domains) {
  const DomainId id = Read32(place, 0, domains.Slots() - 1);
  if (domains.Get(id) == nullptr) {
    place.Fail(StrCat("no domain has the id ", id));
  }
  return id;
}

}  // namespace StandIn
