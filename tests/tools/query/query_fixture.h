// A host and a policy that the verbs which ask policies are tried on.
#pragma once

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {

class QueryTest : public CommandTest {
 protected:
  QueryTest() {
    Policy("objects/base", "conf\nprogram\n");
    Policy("domains/rootDom", "-d program netDom exec grant\n");
    Policy("domains/netDom",
           "# network\n-s open grant\n-s ptrace revoke\n-a conf read grant\n"
           "-p net_bind_service 443 grant\n-r /etc r\n-r /etc/shadow\n-r /bin/ls rx\n");
    Policy("domains/appDom", "-s open grant\n-r /usr rx\n");
  }

  void SetUp() override { MakeHost({{"base.tar", Base()}}); }

  [[nodiscard]] static StandIn::Archive Base() {
    StandIn::Archive base;
    base.Directory("etc").File("etc/hosts", "").File("etc/shadow", "");
    base.Directory("etc/net").File("etc/net/a", "").File("etc/net/b", "");
    base.Symlink("etc/net/link", "a");
    base.Directory("usr/bin").File("usr/bin/ls", "").Symlink("bin", "usr/bin");
    return base;
  }

  // The verb with the test's host.
  Result Verb(const std::string& verb, const Arguments& more) const {
    Arguments arguments{verb, "--host", Host()};
    arguments.insert(arguments.end(), more.begin(), more.end());
    return Command(arguments);
  }

  // What it prints, with "policy" for the path of the policy directory.
  std::string Printed(const std::string& verb, const Arguments& more) const {
    return Short(Verb(verb, more).out);
  }

  [[nodiscard]] std::string Short(std::string text) const {
    for (std::size_t at = 0; (at = text.find(PolicyDir(), at)) != std::string::npos;) {
      text.replace(at, PolicyDir().size(), "policy");
    }
    return text;
  }
};

}  // namespace SecPolicyTool
