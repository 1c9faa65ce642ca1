// A host service in small: loads the host's policy by the shared library and says in which domains
// its programs run.
//
// Uses nothing but the installed headers and libraries:
//
//   c++ -std=c++20 -o load_policy load_policy.cc
//     $(pkg-config --cflags --libs secpolicy secpolicy-host)
//   ./load_policy HOST-DIRECTORY
//
// On a target, the lines that enter the stand-in host are left out: the process runs there already.
#include <secpolicy/host/entered_host.h>
#include <secpolicy/secpolicy.h>

#include <unistd.h>

#include <exception>
#include <iostream>

namespace {

void LoadAndTell(const char* directory) {
  // For the rest of this process's life: its root directory is the host's, and what the library
  // asks of the kernel is answered by the host's.
  StandIn::EnteredHost host(directory);
  host.BeginBatch();
  SecPolicy::LoadPolicy("/etc/olvane/secpolicy");
  host.Commit();
  std::cout << "domain of virtual machines: "
            << SecPolicy::GetDomainNameForID(SecPolicy::GetGlobalVMDomain()) << "\n"
            << "domain of I/O filters: "
            << SecPolicy::GetDomainNameForID(SecPolicy::GetIOFilterDomain()) << "\n"
            << "domain of programs in tardisks: "
            << SecPolicy::GetDomainNameForID(SecPolicy::GetDefaultTardiskDomain()) << "\n"
            << "domain of this process: "
            << SecPolicy::GetDomainNameForID(SecPolicy::GetDomainIDForWorld(getpid())) << "\n";
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: load_policy HOST-DIRECTORY\n";
    return 2;
  }
  try {
    LoadAndTell(argv[1]);
    return 0;
  } catch (const std::exception& failure) {
    std::cerr << "load_policy: " << failure.what() << "\n";
    return 1;
  }
}
