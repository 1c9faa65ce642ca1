#include "host/module/json_names.h"

#include <algorithm>
#include <set>

#include "host/module/names.h"

namespace StandIn {

namespace {

bool SeparatesWords(char c) {
  const auto byte = static_cast<unsigned char>(c);
  return byte <= ' ' || byte == 0x7f;
}

std::string Checked(const JsonCursor& place,
                    std::optional<NameFault> (*faultOf)(const std::string&)) {
  std::string name = DecodeBytes(place);
  if (const std::optional<NameFault> fault = faultOf(name)) {
    place.Fail(fault->text);
  }
  return name;
}

}  // namespace

std::string ReadName(const JsonCursor& place) { return Checked(place, FaultOfName); }

std::string ReadPath(const JsonCursor& place) { return Checked(place, FaultOfPath); }

std::string ReadNonEmpty(const JsonCursor& place) { return Checked(place, FaultOfFreeWord); }

std::string ReadWord(const JsonCursor& place) {
  std::string word = DecodeBytes(place);
  if (word.empty()) {
    place.Fail("is empty");
  }
  if (std::any_of(word.begin(), word.end(), SeparatesWords)) {
    place.Fail("must be one word");
  }
  return word;
}

std::vector<std::string> ReadList(const JsonCursor& place,
                                  std::string (*readOne)(const JsonCursor&)) {
  std::vector<std::string> list;
  std::set<std::string> seen;
  for (const JsonCursor& item : place.Items()) {
    list.push_back(readOne(item));
    if (!seen.insert(list.back()).second) {
      item.Fail("is listed twice");
    }
  }
  return list;
}

}  // namespace StandIn
