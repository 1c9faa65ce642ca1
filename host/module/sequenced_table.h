// Records that keep the order in which they came and are found by a key.
#pragma once

#include <list>
#include <utility>

namespace StandIn {

// `Index` maps keys to places (std::list<Record>::iterator); its keys may refer into the records,
// which stay where they are until they are erased. `KeyOf` gives a record's key. A record's key
// must not be changed in place: use Rekey. What throws changes nothing.
template <typename Record, typename Index, auto KeyOf>
class SequencedTable {
 public:
  using Key = typename Index::key_type;

  SequencedTable() = default;
  SequencedTable(SequencedTable&&) noexcept = default;
  SequencedTable& operator=(SequencedTable&&) noexcept = default;

  [[nodiscard]] std::size_t Size() const { return records_.size(); }
  [[nodiscard]] const std::list<Record>& Records() const { return records_; }
  [[nodiscard]] const Index& ByKey() const { return index_; }

  // nullptr when there is none. Valid until the record is erased.
  [[nodiscard]] Record* Find(const Key& key) const {
    const auto found = index_.find(key);
    return found == index_.end() ? nullptr : &*found->second;
  }

  // Puts a record behind the last. No record may have its key.
  void Append(Record record) {
    std::list<Record> appended;
    appended.push_back(std::move(record));
    index_.emplace(KeyOf(appended.front()), appended.begin());
    records_.splice(records_.end(), appended);
  }

  // False when there is none.
  bool Erase(const Key& key) {
    const auto found = index_.find(key);
    if (found == index_.end()) {
      return false;
    }
    const auto place = found->second;
    index_.erase(found);
    records_.erase(place);
    return true;
  }

  // Lets `change` give the record at `key`, which must be there, another key; a record that has
  // that one already is erased. The record keeps its place in the order.
  template <typename Change>
  void Rekey(const Key& key, Change change) {
    std::list<Record> changed(1, *index_.find(key)->second);
    change(changed.front());
    // From here on nothing throws.
    auto entry = index_.extract(key);
    Erase(KeyOf(changed.front()));
    const auto place = std::exchange(entry.mapped(), changed.begin());
    entry.key() = KeyOf(changed.front());
    index_.insert(std::move(entry));
    records_.splice(place, changed);
    records_.erase(place);
  }

 private:
  std::list<Record> records_;
  Index index_;
};

}  // namespace StandIn
