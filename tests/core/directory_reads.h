// Directory listings as only some file systems give them.
#pragma once

#include <string>

namespace SecPolicyTest {

// While this object lives, no listing reports the type of the entry of that name.
class UnreportedType {
 public:
  explicit UnreportedType(const std::string& name);
  ~UnreportedType();
  UnreportedType(const UnreportedType&) = delete;
  UnreportedType& operator=(const UnreportedType&) = delete;
};

// While this object lives, a listing fails with EIO once it has given `entries` entries, "." and
// ".." among them.
class FailingListing {
 public:
  explicit FailingListing(long entries);
  ~FailingListing();
  FailingListing(const FailingListing&) = delete;
  FailingListing& operator=(const FailingListing&) = delete;
};

}  // namespace SecPolicyTest
