#include "tests/support/host_test.h"

#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <sstream>

#include "host/files/unique_fd.h"
#include "host/module/description_json.h"
#include "host/root/assemble.h"
#include "host/state/host_directory.h"
#include "tests/support/system_log.h"

namespace SecPolicyTest {

using StandIn::HostDirectory;
using StandIn::UniqueFd;

namespace {

namespace fs = std::filesystem;

// Files in memory that the child writes and the test reads.
struct Channels {
  UniqueFd out{memfd_create("out", 0)};
  UniqueFd err{memfd_create("err", 0)};
  UniqueFd events{memfd_create("events", 0)};
  UniqueFd result{memfd_create("result", 0)};
};

std::string ContentOf(const UniqueFd& file) {
  std::string text(static_cast<std::size_t>(lseek(file.Get(), 0, SEEK_END)), '\0');
  const ssize_t size = pread(file.Get(), text.data(), text.size(), 0);
  text.resize(size < 0 ? 0 : static_cast<std::size_t>(size));
  return text;
}

std::vector<std::string> LinesOf(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

std::string DescribeException() try {
  throw;
} catch (const SecPolicy::SecPolicyRetryException& failure) {
  return std::string("retry: ") + failure.what();
} catch (const Tavon::Lib::TavonException& failure) {
  return failure.what();
} catch (const std::exception& failure) {
  return std::string("other: ") + failure.what();
}

// The value and the error, divided by a byte that neither has.
void WriteResult(const UniqueFd& to, const std::string& value, const std::string& error) {
  dprintf(to.Get(), "%s\x01%s", value.c_str(), error.c_str());
}

std::vector<std::string> WithPrefix(const std::vector<std::string>& events,
                                    const std::string& prefix) {
  std::vector<std::string> found;
  for (const std::string& event : events) {
    if (event.starts_with(prefix)) found.push_back(event.substr(prefix.size()));
  }
  return found;
}

}  // namespace

std::vector<std::string> Outcome::Operations() const { return WithPrefix(events, "kernel: "); }
std::vector<std::string> Outcome::Infos() const { return WithPrefix(events, "info: "); }
std::vector<std::string> Outcome::Errors() const { return WithPrefix(events, "error: Error: "); }

std::vector<std::string> Outcome::Operations(const std::vector<std::string>& names) const {
  std::vector<std::string> found = Operations();
  std::erase_if(found, [&](const std::string& operation) {
    return std::find(names.begin(), names.end(), operation.substr(0, operation.find(' '))) ==
           names.end();
  });
  return found;
}

HostTest::HostTest() : description_(StandIn::DefaultDescriptionText()) {
  for (const char* dir : {"objects", "domains", "fileLabels"})
    fs::create_directories(PolicyPath(dir));
}

HostTest::~HostTest() = default;

void HostTest::Policy(const std::string& file, const std::string& text) {
  const fs::path path = PolicyPath(file);
  fs::create_directories(path.parent_path());
  StandIn::WriteBytes(path.string(), text);
}

void HostTest::WellKnownDomains() {
  for (const char* domain : {"appDom", "globalVMDom", "ioFilterDom"}) {
    Policy(std::string("domains/") + domain, "# no rules\n");
  }
}

void HostTest::Assemble() {
  if (assembled_) return;
  const std::string dir = directory_ / "host";
  HostDirectory::Create(dir, description_);
  for (const auto& [name, archive] : tardisks_) {
    StandIn::WriteBytes(dir + "/tardisks/" + name, archive.Bytes());
  }
  StandIn::Assemble(HostDirectory(dir));
  assembled_ = true;
}

void HostTest::Fail(Operation operation, std::uint64_t call, int number) {
  Fail(Fault{.operation = operation, .call = call, .number = number});
}

StandIn::SessionOptions HostTest::Options() const {
  StandIn::SessionOptions options;
  options.visible = {PolicyDir()};
#if defined(SECPOLICY_ADDRESS_SANITIZER)
  // The search for leaks at the process's end reads it.
  options.visible.push_back("/proc");
#endif
  options.faults = faults_;
  return options;
}

void HostTest::EnterHere() {
  Assemble();
  here_ = std::make_unique<StandIn::Session>(HostDirectory(directory_ / "host"), Options());
}

Outcome HostTest::RunText(const std::function<std::string()>& body) {
  Assemble();
  Channels channels;
  std::cout.flush();
  std::cerr.flush();
  const pid_t child = fork();
  if (child == 0) {
    dup2(channels.out.Get(), STDOUT_FILENO);
    dup2(channels.err.Get(), STDERR_FILENO);
    CaptureSystemLog(channels.events.Get());
    std::string value;
    std::string error;
    try {
      StandIn::SessionOptions options = Options();
      options.trace = [&](const std::string& line) {
        dprintf(channels.events.Get(), "kernel: %s\n", line.c_str());
      };
      StandIn::Session session(HostDirectory(directory_ / "host"), options);
      session.BeginBatch();
      try {
        value = body();
      } catch (...) {
        error = DescribeException();
      }
      session.Commit();
    } catch (...) {
      error = DescribeException();
    }
    WriteResult(channels.result, value, error);
    std::exit(0);
  }
  int status = 0;
  waitpid(child, &status, 0);
  const std::string result = ContentOf(channels.result);
  const std::size_t divider = result.find('\x01');
  Outcome outcome;
  outcome.value = result.substr(0, divider);
  if (divider != std::string::npos) outcome.error = result.substr(divider + 1);
  outcome.signal = WIFSIGNALED(status) ? WTERMSIG(status) : 0;
  outcome.out = ContentOf(channels.out);
  outcome.err = ContentOf(channels.err);
  outcome.events = LinesOf(ContentOf(channels.events));
  // A leak or another finding of a sanitizer at the child's end.
  if (WIFEXITED(status)) {
    EXPECT_EQ(WEXITSTATUS(status), 0) << outcome.err;
  }
  return outcome;
}

}  // namespace SecPolicyTest
