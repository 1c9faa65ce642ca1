// loader POLICY: loads the policy and shows what the platform holds. The exceptions that end the
// two go to standard error, where the platform records its operations.
#include <secpolicy/secpolicy.h>

#include <functional>
#include <iostream>

namespace {

void Run(const char* name, const std::function<void()>& step) try {
  std::cerr << name << "\n" << std::flush;
  step();
} catch (const Tavon::Lib::TavonException& failure) {
  std::cerr << name << " ended: " << failure.what() << "\n" << std::flush;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  Run("load", [&] { SecPolicy::LoadPolicy(argv[1]); });
  Run("show", [] { SecPolicy::DisplayPolicy(""); });
  Run("service", [] { SecPolicy::AddUlvoService(1, "clock"); });
}
