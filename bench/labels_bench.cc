// Labelling of a tree.
#include <benchmark/benchmark.h>
#include <dirent.h>
#include <sys/xattr.h>

#include <cstring>
#include <stdexcept>

#include "bench/support/host_process.h"
#include "platform/private_calls.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyBench {
namespace {

using SecPolicy::ZekAccessInterfaceImpl;
using ZekCtl::Security::kObjectLabel;

void Label(const char* path, std::uint32_t id) {
  if (setxattr(path, ZekCtl::Kernel::kLabelAttribute, &id, sizeof id, XATTR_REPLACE) != 0) {
    throw std::runtime_error(std::string("no label for ") + path);
  }
}

// The id of an object label, after a first call through the gate, for which the host looks up all
// of its files.
std::uint32_t FirstLabel(ZekAccessInterfaceImpl& iface) {
  iface.AddLabels({"object"}, kObjectLabel);
  const std::uint32_t id = iface.LookupLabel("object", kObjectLabel);
  Label("/tree", id);
  return id;
}

void LabelTree(benchmark::State& state) {
  RunEach(state, BenchHost::WithTree(), "", BenchHost::kTreeFiles, [] {
    ZekAccessInterfaceImpl iface;
    FirstLabel(iface);
    return Measure([&] { SecPolicy::SetDirLabelRecursive("/tree", "object", iface); });
  });
}
BENCHMARK(LabelTree)->Name("labels/library")->UseManualTime();

// The barest loop: each path is put together in place.
void LabelBarely(char* path, std::size_t length, std::uint32_t id) {
  Label(path, id);
  DIR* const dir = opendir(path);
  if (dir == nullptr) throw std::runtime_error(std::string("cannot open ") + path);
  path[length] = '/';
  while (const dirent64* entry = readdir64(dir)) {
    if (std::strcmp(entry->d_name, ".") == 0 || std::strcmp(entry->d_name, "..") == 0) continue;
    const std::size_t name = std::strlen(entry->d_name);
    std::memcpy(path + length + 1, entry->d_name, name + 1);
    if (entry->d_type == DT_DIR) {
      LabelBarely(path, length + 1 + name, id);
    } else {
      Label(path, id);
    }
  }
  path[length] = '\0';
  closedir(dir);
}

void BareLoop(benchmark::State& state) {
  RunEach(state, BenchHost::WithTree(), "", BenchHost::kTreeFiles, [] {
    ZekAccessInterfaceImpl iface;
    const std::uint32_t id = FirstLabel(iface);
    return Measure([&] {
      char path[4096] = "/tree";
      LabelBarely(path, std::strlen(path), id);
    });
  });
}
BENCHMARK(BareLoop)->Name("labels/barest loop")->UseManualTime();

}  // namespace
}  // namespace SecPolicyBench
