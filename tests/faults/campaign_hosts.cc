#include "tests/faults/campaign_hosts.h"

#include <filesystem>
#include <map>
#include <set>

#include "host/module/description_json.h"
#include "host/root/assemble.h"
#include "host/state/host_directory.h"
#include "tests/support/archives.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyFaults {

namespace fs = std::filesystem;
using StandIn::Archive;

namespace {

using Archives = std::map<std::string, Archive>;

constexpr char kPolicy[] = "policy/";
constexpr char kTardiskPolicy[] = "etc/olvane/secpolicy/tardisks/";

// What both small policies have.
Archives SmallArchives() {
  Archives archives;
  archives["base.tar"]
      .File("bin/tool", "x")
      .File("etc/motd", "welcome")
      .File("etc/app.conf", "")
      .File("srv/data/one", "1")
      .File("srv/data/deep/two", "2")
      .Fifo("srv/data/queue")
      .Symlink("srv/data/link", "one")
      .File(std::string(kPolicy) + "objects/main", "apps\nlogs # written by all\n")
      .File(std::string(kPolicy) + "objects/more", "keys\ndrivers\n")
      .File(std::string(kPolicy) + "domains/globalVMDom", "-s read grant\n-r /etc/motd r\n")
      .File(std::string(kPolicy) + "domains/ioFilterDom", "# no rules\n");
  archives["drivers.tar"]
      .File("lib/driver", "d")
      .File(std::string(kTardiskPolicy) + "drivers", "# its own label\n-E drivers ioFilterDom\n");
  archives["plain.tar"].File("lib/plain", "p");
  return archives;
}

constexpr char kAppDomain[] =
    "-s openat grant\n"
    "-s close revoke\n"
    "-c net_raw revoke\n"
    "-p ipc_lock guest-memory grant\n"
    "-p ipc_lock host-memory revoke\n"
    "-a logs read grant\n"
    "-d apps globalVMDom exec grant\n"
    "-f apps logs file grant\n"
    "-u keys stream revoke\n"
    "-r /etc/app.conf rw\n"
    "-r /srv/data r\n";

// Without a mistake.
Archives GoodArchives() {
  Archives archives = SmallArchives();
  archives["base.tar"]
      .File(std::string(kPolicy) + "domains/appDom", kAppDomain)
      .File(std::string(kPolicy) + "domains/logDom", "-s write grant\n-a logs append grant\n")
      .File(std::string(kPolicy) + "fileLabels/main",
            "/bin/tool apps\n/srv/data/* logs\n/etc/motd keys\n");
  return archives;
}

// With a mistake for every phase that can report one.
Archives BadArchives() {
  Archives archives = SmallArchives();
  archives["base.tar"]
      .File(std::string(kPolicy) + "objects/bad", "one two\n")
      .File(std::string(kPolicy) + "domains/appDom", kAppDomain)
      .File(std::string(kPolicy) + "domains/badWordDom",
            "-s openat grant\n-s nonsense grant\n-s close grant\n")
      .File(std::string(kPolicy) + "domains/contraryDom",
            "-s openat grant\n-p ipc_lock here grant\n-p ipc_lock here revoke\n")
      .File(std::string(kPolicy) + "domains/letterDom",
            "-a logs read grant\n-r /srv/data rq\n-s close grant\n")
      .File(std::string(kPolicy) + "fileLabels/bad", "/bin/tool apps\n/bin/tool\n/etc/motd logs\n")
      .File(std::string(kPolicy) + "fileLabels/main",
            "/srv/none logs\n/srv/data/* logs\n/etc/motd/* keys\n");
  archives["broken.tar"]
      .File("lib/broken", "b")
      .File(std::string(kTardiskPolicy) + "broken", "-E drivers nowhereDom\n");
  archives["unknown.tar"]
      .File("lib/unknown", "u")
      .File(std::string(kTardiskPolicy) + "unknown", "-E nolabel appDom\n");
  return archives;
}

Archive Packed(const fs::path& tree) {
  Archive archive;
  std::set<fs::path> entries;
  for (const auto& entry : fs::recursive_directory_iterator(tree)) entries.insert(entry.path());
  for (const fs::path& entry : entries) {
    const std::string name = entry.lexically_relative(tree);
    if (fs::is_directory(entry)) {
      archive.Directory(name);
    } else {
      archive.File(name, StandIn::ReadBytes(entry));
    }
  }
  return archive;
}

Archives ExampleArchives() {
  Archives archives;
  for (const auto& tree : fs::directory_iterator(SECPOLICY_EXAMPLES "/host/tardisks")) {
    archives[tree.path().filename().string() + ".tar"] = Packed(tree);
  }
  return archives;
}

Archives ArchivesOf(HostKind kind) {
  switch (kind) {
    case HostKind::kGood:
      return GoodArchives();
    case HostKind::kBad:
      return BadArchives();
    case HostKind::kExample:
      break;
  }
  return ExampleArchives();
}

}  // namespace

std::string PolicyDirOf(HostKind kind) {
  return kind == HostKind::kExample ? "/etc/olvane/secpolicy" : "/policy";
}

void MakeHost(HostKind kind, const std::string& dir) {
  StandIn::HostDirectory::Create(dir, StandIn::DefaultDescriptionText());
  for (const auto& [name, archive] : ArchivesOf(kind)) {
    StandIn::WriteBytes(dir + "/tardisks/" + name, archive.Bytes());
  }
  StandIn::Assemble(StandIn::HostDirectory(dir));
}

}  // namespace SecPolicyFaults
