#include "tests/tools/check/check_fixture.h"

namespace SecPolicyTool {

CheckTest::CheckTest() {
  base_.Directory("etc").File("etc/motd", "hello").File("etc/hosts", "");
  base_.Directory("usr/bin").File("usr/bin/ls", "").Symlink("bin", "usr/bin");
  vendor_.File("opt/tool", "");
  Policy("objects/base", "conf\nprogram\n");
  Policy("domains/rootDom", "-d program netDom exec grant\n");
  Policy("domains/netDom", "-a conf read grant\n");
  Policy("fileLabels/base", "/etc/* conf\n/usr/bin/ls program\n");
}

void CheckTest::MakeCheckHost() const { MakeHost({{"base.tar", base_}, {"vendor.tar", vendor_}}); }

Result CheckTest::Check(const Arguments& more) const {
  Arguments arguments{"check", "--host", Host()};
  arguments.insert(arguments.end(), more.begin(), more.end());
  arguments.push_back(PolicyDir());
  return Command(arguments);
}

std::vector<Finding> CheckTest::Findings() const {
  return CheckPolicy(StandIn::HostDirectory(Host()), PolicyDir());
}

std::string CheckTest::WithoutDir(std::string text) const {
  const std::string dir = PolicyDir() + "/";
  for (std::size_t at = 0; (at = text.find(dir, at)) != std::string::npos;) {
    text.erase(at, dir.size());
  }
  return text;
}

std::vector<std::string> CheckTest::Found() const {
  std::vector<std::string> found;
  for (const Finding& finding : Findings()) {
    const std::string severity = finding.severity == Severity::kError ? "error" : "warning";
    found.push_back(WithoutDir(PlaceText(finding.place) + ": " + severity + ": " + finding.message +
                               " [" + finding.id + "]"));
  }
  return found;
}

std::vector<std::string> CheckTest::LoadErrorsOf() const {
  std::vector<std::string> errors;
  const std::string mark = "Error: ";
  for (const std::string& line : Load().Errors()) {
    if (line.starts_with(mark)) errors.push_back(line.substr(mark.size()));
  }
  return errors;
}

}  // namespace SecPolicyTool
