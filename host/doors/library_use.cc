#include "host/doors/library_use.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <utility>

#include "secpolicy/secpolicy.h"

namespace StandIn {

namespace {

constexpr std::array<std::string_view, 3> kPolicySubdirectories{"/objects", "/domains",
                                                                "/fileLabels"};

thread_local LibraryUse* current = nullptr;

// What the caller of a load handles, so that a load that ends by raising again what its caller
// handles comes back.
struct Termination {};

}  // namespace

LibraryUse::LibraryUse(Kernel& kernel, LibraryOutput& output, std::string policyDir)
    : kernel_(kernel),
      output_(output),
      policyDir_(std::move(policyDir)),
      attachment_(kernel.Attachment()),
      before_(std::exchange(current, this)) {}

LibraryUse::~LibraryUse() { current = before_; }

LibraryUse* LibraryUse::Current() noexcept { return current; }

bool LibraryUse::IsOnMachine(const std::string& path) const noexcept {
  if (policyDir_.empty() || !path.starts_with(policyDir_)) return false;
  const std::string_view below = std::string_view(path).substr(policyDir_.size());
  return std::any_of(kPolicySubdirectories.begin(), kPolicySubdirectories.end(),
                     [&](std::string_view directory) {
                       return below == directory ||
                              (below.starts_with(directory) && below[directory.size()] == '/');
                     });
}

LoadEnd RunLoad(const std::string& dir) {
  try {
    throw Termination();
  } catch (const Termination&) {
    try {
      SecPolicy::LoadPolicy(dir);
    } catch (const Termination&) {
      return LoadEnd::kTerminated;
    } catch (const Tavon::Lib::TavonException& failure) {
      LibraryUse::Current()->Output().OnError(failure.what(), &failure);
      return LoadEnd::kFailed;
    }
  }
  return LoadEnd::kDone;
}

}  // namespace StandIn
