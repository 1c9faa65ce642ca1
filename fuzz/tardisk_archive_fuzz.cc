// Archives: unpacked or refused with HostError that names the archive; nothing outside the root is
// touched, and what is in the root is what the account says.
#include <fcntl.h>

#include <filesystem>
#include <set>

#include "fuzz/support/input.h"
#include "fuzz/support/require.h"
#include "fuzz/support/scratch_directory.h"
#include "host/root/remove_tree.h"
#include "host/root/unpack.h"
#include "secpolicy/host/host_error.h"
#include "tests/support/memory_file.h"

namespace {

namespace fs = std::filesystem;

constexpr StandIn::UnpackLimits kLimits{.bytes = 1U << 18, .entries = 64};
constexpr char kSecret[] = "outside";

// A directory that holds the root and, beside it, a file that nothing may touch.
class Place {
 public:
  Place() { Fuzz::WriteFile(Path("secret"), kSecret); }

  [[nodiscard]] std::string Path(const std::string& name) const {
    return directory_.Path() + "/" + name;
  }

  // An empty root; its descriptor.
  [[nodiscard]] StandIn::UniqueFd NewRoot() const {
    fs::create_directory(Path("root"));
    return StandIn::UniqueFd(open(Path("root").c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  }

  void RemoveRoot() const {
    const StandIn::UniqueFd fd(open(directory_.Path().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    StandIn::RemoveTree({fd.Get(), directory_.Path()}, "root");
  }

  void RequireUntouched() const {
    std::size_t entries = 0;
    for (const auto& entry : fs::directory_iterator(directory_.Path())) {
      const std::string name = entry.path().filename();
      Fuzz::Require(name == "secret" || name == "root", "nothing is made outside the root");
      ++entries;
    }
    Fuzz::Require(entries == 2, "nothing outside the root is removed");
    Fuzz::Require(fs::hard_link_count(Path("secret")) == 1, "nothing outside the root is linked");
    std::ifstream stream(Path("secret"));
    Fuzz::RequireEqual({std::istreambuf_iterator<char>(stream), {}}, kSecret,
                       "nothing outside the root is written to");
  }

 private:
  Fuzz::ScratchDirectory directory_;
};

// The paths of all that is in the root.
std::set<std::string> PathsIn(const std::string& root) {
  std::set<std::string> paths;
  for (const auto& entry : fs::recursive_directory_iterator(root)) {
    paths.insert(entry.path().string().substr(root.size()));
  }
  return paths;
}

void RequireAccount(const StandIn::ImageLayout& layout, const std::string& root) {
  std::set<std::string> brought;
  for (const StandIn::TardiskContent& tardisk : layout.Index().tardisks) {
    Fuzz::RequireEqual(tardisk.name, "fuzz.tar", "the account names the archive");
    brought.insert(tardisk.paths.begin(), tardisk.paths.end());
  }
  std::set<std::string> found = PathsIn(root);
  // Both are there whatever the archive brings, if only as a name.
  for (const char* always : {"/", "/tardisks"}) {
    brought.erase(always);
    found.erase(always);
  }
  Fuzz::Require(brought == found, "the account says what is in the root");
}

void UnpackInto(const StandIn::UniqueFd& root, const Place& place, int archive) {
  StandIn::UnpackBudget budget(kLimits);
  StandIn::ImageLayout layout;
  const StandIn::TreeWriter tree({root.Get(), place.Path("root")});
  try {
    const auto entries = StandIn::Unpack({archive, "fuzz.tar", "fuzz.tar"}, budget, layout, tree);
    Fuzz::Require(entries <= kLimits.entries, "there are no more entries than allowed");
    RequireAccount(layout, place.Path("root"));
  } catch (const StandIn::HostError& error) {
    // What cannot be made is refused before anyone tries: no refusal comes from the file system.
    Fuzz::Require(std::string(error.what()).starts_with("fuzz.tar: "),
                  "a refusal names the archive");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const Place place;
  static SecPolicyTest::MemoryFile archive;
  archive.Write(Fuzz::BytesOf(data, size));
  UnpackInto(place.NewRoot(), place, archive.Descriptor());
  place.RequireUntouched();
  place.RemoveRoot();
  return 0;
}
