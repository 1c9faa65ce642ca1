// Tests of the library on a host of their own.
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <string>
#include <type_traits>
#include <vector>

#include "host/session/session.h"
#include "host/trace/fault_plan.h"
#include "secpolicy/secpolicy.h"
#include "tests/support/archives.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {

using StandIn::Fault;
using StandIn::Operation;

// What became of something that ran in a host.
struct Outcome {
  std::string value;  // what it returned, as text
  // The exception that left it: the text of a TavonException, "retry: " and the text of a
  // SecPolicyRetryException, "other: " and the text of any other; empty for none.
  std::string error;
  int signal = 0;  // the signal that ended the process; 0 for none
  std::string out;
  std::string err;
  // In the order in which they happened: "kernel: " and an operation as TraceLog writes it, "info:
  // " or "error: " and a message of the system log.
  std::vector<std::string> events;

  // The events of one kind, without their prefix.
  [[nodiscard]] std::vector<std::string> Operations() const;
  [[nodiscard]] std::vector<std::string> Infos() const;
  [[nodiscard]] std::vector<std::string> Errors() const;  // without "Error: "
  // The operations of these names only.
  [[nodiscard]] std::vector<std::string> Operations(const std::vector<std::string>& names) const;
};

// A host of the test's own. What the host is made of is said first; the first Run assembles it.
// Each Run is a process of its own that enters the host; the kernel's state goes from one to the
// next.
class HostTest : public testing::Test {
 protected:
  HostTest();
  ~HostTest() override;

  // The content of host.json; by default everything is the default.
  void Describe(const std::string& json) { description_ = json; }

  // An archive of the host, to which entries are added.
  StandIn::Archive& Tardisk(const std::string& name) { return tardisks_[name]; }

  // A file of the policy directory, for example "domains/appDom"; it is outside the host and seen
  // inside under the same path. The four sub-directories exist but for "tardisks", which the
  // library takes from the host itself.
  void Policy(const std::string& file, const std::string& text);
  [[nodiscard]] std::string PolicyDir() const { return directory_ / "policy"; }
  [[nodiscard]] std::string PolicyPath(const std::string& file) const {
    return PolicyDir() + "/" + file;
  }

  // Globally needed domains: their files, each with a comment alone.
  void WellKnownDomains();

  // Where a path of the host's root file system lies outside, once it is assembled.
  [[nodiscard]] std::string InRoot(const std::string& path) const {
    return directory_ / "host/root" + path;
  }
  void Assemble();

  // Has the kernel refuse a call in every Run from here on.
  void Fail(Operation operation, std::uint64_t call = 1, int number = EIO);
  void Fail(const Fault& fault) { faults_.push_back(fault); }
  void FailNothing() { faults_.clear(); }

  // Runs `body` in the host. It may return a string or an unsigned number, or nothing. Expectations
  // belong behind it, on the outcome.
  template <typename Body>
  Outcome Run(const Body& body) {
    return RunText([&]() -> std::string {
      using Result = std::invoke_result_t<Body>;
      if constexpr (std::is_void_v<Result>) {
        body();
        return {};
      } else if constexpr (std::is_integral_v<Result>) {
        return std::to_string(body());
      } else {
        return body();
      }
    });
  }

  Outcome Load() {
    return Run([&] { SecPolicy::LoadPolicy(PolicyDir()); });
  }
  Outcome Display(const std::string& selector = "") {
    return Run([&] { SecPolicy::DisplayPolicy(selector); });
  }

  // What `body`, given an open interface, does in the host; its operations without the opening and
  // the closing of that interface.
  template <typename Body>
  Outcome RunWithInterface(const Body& body) {
    Outcome outcome = Run([&] {
      SecPolicy::ZekAccessInterfaceImpl iface;
      return body(iface);
    });
    std::erase(outcome.events, "kernel: open-interface");
    std::erase(outcome.events, "kernel: close-interface");
    return outcome;
  }

  // Makes this process one of the host, for good: for death tests, whose process ends anyway.
  void EnterHere();

 private:
  Outcome RunText(const std::function<std::string()>& body);
  [[nodiscard]] StandIn::SessionOptions Options() const;

  StandIn::TemporaryDirectory directory_;
  std::string description_;
  std::map<std::string, StandIn::Archive> tardisks_;
  std::vector<Fault> faults_;
  bool assembled_ = false;
  std::unique_ptr<StandIn::Session> here_;
};

}  // namespace SecPolicyTest
