// The processes of this machine.
#include "host/kernel/proc_processes.h"

#include <gtest/gtest.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "tests/support/child_process.h"

namespace StandIn {
namespace {

TEST(ProcProcessesTest, KnowsItself) {
  const ProcProcesses processes;
  const ProcessIdentity self = processes.Self();
  EXPECT_EQ(self.pid, getpid());
  EXPECT_NE(self.startTime, 0u);
  EXPECT_EQ(processes.Self(), self);
  EXPECT_TRUE(processes.Runs(self));
}

TEST(ProcProcessesTest, ProcessOfAnotherStartIsAnother) {
  const ProcProcesses processes;
  ProcessIdentity self = processes.Self();
  ++self.startTime;
  EXPECT_FALSE(processes.Runs(self));
  self.startTime = 0;
  EXPECT_FALSE(processes.Runs(self));
}

TEST(ProcProcessesTest, ForkedChildIsItself) {
  const ProcProcesses processes;
  const ProcessIdentity parent = processes.Self();
  EXPECT_TRUE(ChildPassed(StartChild([&] {
    EXPECT_EQ(processes.Self().pid, getpid());
    EXPECT_NE(processes.Self(), parent);
    EXPECT_TRUE(processes.Runs(parent));
  })));
}

TEST(ProcProcessesTest, EndedProcessRunsNoMore) {
  const ProcProcesses processes;
  int ends[2];
  ASSERT_EQ(pipe(ends), 0);
  const pid_t child = StartChild([&] {
    const ProcessIdentity self = processes.Self();
    EXPECT_EQ(write(ends[1], &self, sizeof self), static_cast<ssize_t>(sizeof self));
    pause();
  });
  ProcessIdentity identity;
  ASSERT_EQ(read(ends[0], &identity, sizeof identity), static_cast<ssize_t>(sizeof identity));
  EXPECT_TRUE(processes.Runs(identity));
  kill(child, SIGKILL);
  waitpid(child, nullptr, 0);
  EXPECT_FALSE(processes.Runs(identity));
  close(ends[0]);
  close(ends[1]);
}

TEST(ProcProcessesTest, NamesOfProgramsMayHoldAnything) {
  EXPECT_TRUE(ChildPassed(StartChild([] {
    const ProcProcesses processes;
    const ProcessIdentity self = processes.Self();
    for (const char* name : {") 1 2 3 (", "a b", ")", "x) R 1 1 1"}) {
      prctl(PR_SET_NAME, name);
      EXPECT_EQ(processes.Self(), self) << name;
    }
  })));
}

}  // namespace
}  // namespace StandIn
