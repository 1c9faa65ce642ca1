#include "tools/policy/host_work.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cstring>
#include <exception>
#include <stdexcept>

#include "tools/policy/child_process.h"
#include "tools/policy/error_messages.h"
#include "tools/policy/exit_status.h"
#include "tools/policy/letter.h"
#include "tools/policy/progress.h"

namespace SecPolicyTool {

namespace {

using nlohmann::json;
using StandIn::Session;

// What the terminate handler needs, which is not handed anything.
struct Current {
  Session& session;
  const Letter& letter;
  const std::function<json(Session&)>& work;
};
const Current* current = nullptr;

// Runs the work and leaves its result, or what it threw, in the letter.
int Finish(const Current& now) {
  json content;
  try {
    content["result"] = now.work(now.session);
  } catch (const std::exception& failure) {
    content["failure"] = MessageOf(failure);
  }
  now.letter.Write(content);
  return kDone;
}

[[noreturn]] void OnTerminate() {
  try {
    Finish(*current);
  } catch (...) {
    _exit(kFailed);
  }
  _exit(kTerminated);
}

}  // namespace

HostWork WorkInHost(StandIn::HostDirectory host, StandIn::SessionOptions options,
                    const std::function<void(Session&)>& before,
                    const std::function<json(Session&)>& work) {
  const Letter letter;
  HostWork outcome;
  const auto inHost = [&] {
    Session session(std::move(host), options);
    const Current now{session, letter, work};
    current = &now;
    std::set_terminate(OnTerminate);
    before(session);
    return Finish(now);
  };
  Progress progress("Working in the host");
  const int status = RunInChild(
      inHost, [&](std::string& line) { AddMessageLine(outcome.errors, line); },
      [&] { progress.Tick(); });
  if (WIFSIGNALED(status)) {
    throw std::runtime_error(std::string("the work in the host was killed (") +
                             strsignal(WTERMSIG(status)) + ")");
  }
  json content = letter.Read();
  if (content.contains("failure")) {
    throw std::runtime_error(content["failure"].get_ref<const std::string&>());
  }
  outcome.wasTerminated = WEXITSTATUS(status) == kTerminated;
  if (!content.contains("result")) {
    throw std::runtime_error(outcome.errors.empty() ? "the work in the host came to no end"
                                                    : outcome.errors.back());
  }
  outcome.result = std::move(content["result"]);
  return outcome;
}

}  // namespace SecPolicyTool
