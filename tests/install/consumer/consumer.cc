// consumer HOST DAMAGED-POLICY POLICY: a program that knows the library by what is installed. It
// enters the host, says why the damaged policy was refused, loads the other, and prints what the
// kernel holds then.
#include <secpolicy/host/entered_host.h>
#include <secpolicy/secpolicy.h>

#include <iostream>
#include <string>

namespace {

void Load(const std::string& policy) try {
  SecPolicy::LoadPolicy(policy);
  std::cout << "loaded\n" << std::flush;
} catch (const Tavon::Lib::TavonException& failure) {
  std::cout << "refused: " << failure.what() << "\n" << std::flush;
}

}  // namespace

int main(int argc, char** argv) try {
  if (argc != 4) return 2;
  StandIn::EnterOptions options;
  options.visible = {argv[2], argv[3]};
  StandIn::EnteredHost host(argv[1], options);
  Load(argv[2]);
  host.BeginBatch();
  Load(argv[3]);
  host.Commit();
  std::cout << "appDom: " << SecPolicy::GetDomainNameForID(SecPolicy::GetDefaultTardiskDomain())
            << "\n"
            << std::flush;
  SecPolicy::DisplayPolicy("");
  return 0;
} catch (const StandIn::HostError& failure) {
  std::cerr << "host: " << failure.what() << "\n";
  return 1;
}
