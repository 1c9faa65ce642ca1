// Host directories.
#include <filesystem>
#include <memory>

#include "bindings/c/arguments.h"
#include "bindings/c/barrier.h"
#include "bindings/c/handles.h"
#include "host/module/description_json.h"
#include "host/root/assemble.h"
#include "host/state/host_directory.h"

using SecPolicyC::Guarded;
using SecPolicyC::PathOf;
using SecPolicyC::RequireSet;
using StandIn::HostDirectory;

extern "C" {

secpolicy_status secpolicy_host_create(const char* directory, secpolicy_error** error) {
  return Guarded(error, [&] {
    const std::string path = PathOf(directory, "directory");
    HostDirectory::Create(path, StandIn::DefaultDescriptionText());
  });
}

secpolicy_status secpolicy_host_open(const char* directory, secpolicy_host** host,
                                     secpolicy_error** error) {
  if (host != nullptr) *host = nullptr;
  return Guarded(error, [&] {
    RequireSet(host, "host");
    const std::string path = PathOf(directory, "directory");
    auto opened = std::make_unique<secpolicy_host>();
    opened->path = std::filesystem::absolute(path).string();
    const HostDirectory here(path);
    *host = opened.release();
  });
}

secpolicy_status secpolicy_host_assemble(const secpolicy_host* host, secpolicy_error** error) {
  return Guarded(error, [&] {
    RequireSet(host, "host");
    StandIn::Assemble(HostDirectory(host->path));
  });
}

const char* secpolicy_host_path(const secpolicy_host* host) {
  return host == nullptr ? nullptr : host->path.c_str();
}

void secpolicy_host_free(secpolicy_host* host) { delete host; }

}  // extern "C"
