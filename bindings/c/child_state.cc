#include "bindings/c/child_state.h"

#include <fcntl.h>
#include <link.h>
#include <sys/time.h>
#include <syslog.h>
#include <unistd.h>
#include <ext/stdio_filebuf.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <ctime>
#include <iostream>
#include <limits>
#include <locale>
#include <system_error>

#include "host/image/unique_fd.h"

namespace SecPolicyC {

namespace {

void TakeDefault(int signal) {
  struct sigaction action {};
  action.sa_handler = SIG_DFL;
  sigaction(signal, &action, nullptr);
}

bool IsIgnored(int signal) {
  struct sigaction action {};
  return sigaction(signal, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

void SetAlarm(std::chrono::milliseconds time) {
  using std::chrono::duration_cast;
  const auto seconds = duration_cast<std::chrono::seconds>(time);
  itimerval timer{};
  timer.it_value.tv_sec = seconds.count();
  timer.it_value.tv_usec = duration_cast<std::chrono::microseconds>(time - seconds).count();
  setitimer(ITIMER_REAL, &timer, nullptr);
}

}  // namespace

void TakeDefaultSignals() {
  for (int signal = 1; signal <= SIGRTMAX; ++signal) {
    if (!IsIgnored(signal)) TakeDefault(signal);
  }
  TakeDefault(SIGALRM);
  TakeDefault(SIGCHLD);
  sigset_t none;
  sigemptyset(&none);
  sigprocmask(SIG_SETMASK, &none, nullptr);
}

void TakeFreeLocks(std::chrono::milliseconds patience) {
  SetAlarm(patience);
  closelog();
  tzset();
  // Exceptions are thrown by it, and the gate looks for the process's own code with it.
  dl_iterate_phdr([](dl_phdr_info*, std::size_t, void*) { return 1; }, nullptr);
  std::locale::global(std::locale::classic());
  SetAlarm(std::chrono::milliseconds(0));
}

namespace {

void TakeNullStreams() {
  StandIn::UniqueFd null(open("/dev/null", O_RDWR));
  for (const int stream : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
    if (dup2(null.Get(), stream) < 0) {
      throw std::system_error(errno, std::generic_category(), "/dev/null");
    }
  }
  // Where streams were closed, it has become one of them.
  if (null.Get() <= STDERR_FILENO) static_cast<void>(null.Release());
}

}  // namespace

void TakeOwnDescriptors(std::vector<int> kept) {
  TakeNullStreams();
  // Errors are collected from the descriptor.
  static __gnu_cxx::stdio_filebuf<char> errors(STDERR_FILENO, std::ios::out);
  std::cerr.rdbuf(&errors);
  std::sort(kept.begin(), kept.end());
  unsigned int first = STDERR_FILENO + 1;
  for (const int each : kept) {
    const auto number = static_cast<unsigned int>(each);
    if (number > first) close_range(first, number - 1, 0);
    first = number + 1;
  }
  close_range(first, std::numeric_limits<unsigned int>::max(), 0);
}

}  // namespace SecPolicyC
