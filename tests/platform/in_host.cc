// Before main() runs, the process enters the host directory that the environment names: the
// stand-in host as the platform of a program that knows of none.
#include <secpolicy/host/entered_host.h>

#include <cstdlib>

namespace {

const char* Directory() {
  const char* const directory = std::getenv("SECPOLICY_TEST_HOST");
  return directory != nullptr ? directory : "";
}

const StandIn::EnteredHost kHost(Directory());  // NOLINT(cert-err58-cpp): it ends the program

}  // namespace
