"""What calls leave of the interpreter's process, and calls from several threads."""

import concurrent.futures
import os
import pathlib
import signal
import threading

import secpolicy
from hosts import HostTest


def state():
    """What of this process a host could have changed."""
    status = pathlib.Path("/proc/self/status").read_text().splitlines()
    kept = [line for line in status if line.startswith(("Seccomp", "NoNewPrivs", "Cap", "Uid"))]
    root = os.stat("/")
    return {"root": (root.st_dev, root.st_ino), "directory": os.getcwd(), "privileges": kept,
            "descriptors": sorted(os.listdir("/proc/self/fd")),
            "handlers": [signal.getsignal(number) for number in signal.valid_signals()],
            "blocked": signal.pthread_sigmask(signal.SIG_BLOCK, ())}


class ProcessTest(HostTest):
    def test_it_is_as_it_was(self):
        self.write("domains/globalVMDom", "-s opne grant\n")
        before = state()
        with self.assertRaises(secpolicy.LoadError):
            self.host.load(self.policy)
        self.host.show()
        self.host.check(self.policy)
        with self.host.read_policy(self.policy) as policy:
            policy.search()
        self.assertEqual(state(), before)
        with self.assertRaises(ChildProcessError):
            os.waitpid(-1, os.WNOHANG)

    def test_a_file_that_is_half_written_is_written_once(self):
        path = self.directory / "log"
        with open(path, "w", encoding="utf-8") as log:
            log.write("held back\n")
            self.host.show()
        self.assertEqual(path.read_text(), "held back\n")

    def test_forked_children_may_call_too(self):
        child = os.fork()
        if child == 0:
            code = 1
            try:
                code = 0 if self.host.show(0).domains[0].name == "rootDom" else 2
            finally:
                os._exit(code)
        self.assertEqual(os.waitpid(child, 0)[1], 0)


class ThreadsTest(HostTest):
    def work(self, number):
        """A round on a host of the thread's own."""
        with secpolicy.Host.create(self.directory / f"host{number}") as host:
            host.assemble()
            for _ in range(3):
                self.assertEqual(host.check(self.policy).errors, ())
                host.load(self.policy)
            return [each.name for each in host.show().domains]

    def test_threads_on_hosts_of_their_own(self):
        with concurrent.futures.ThreadPoolExecutor(4) as threads:
            results = list(threads.map(self.work, range(4)))
        self.assertEqual(results, [["rootDom", "appDom", "globalVMDom", "ioFilterDom"]] * 4)

    def test_threads_on_one_host(self):
        with concurrent.futures.ThreadPoolExecutor(4) as threads:
            results = list(threads.map(lambda _: self.host.load(self.policy), range(8)))
        self.assertEqual({result.errors for result in results}, {()})

    def test_other_threads_go_on_during_a_call(self):
        # Enough lines for a call that takes longer than a switch between threads.
        lines = "".join(f"-r /path/{number} r\n" for number in range(20000))
        self.write("domains/many", lines)
        is_over = threading.Event()
        steps = 0

        def count():
            nonlocal steps
            while not is_over.is_set():
                steps += 1

        counter = threading.Thread(target=count)
        counter.start()
        try:
            before = steps
            self.host.check(self.policy)
            self.assertGreater(steps, before)
        finally:
            is_over.set()
            counter.join()

    def test_closing_waits_for_calls(self):
        with concurrent.futures.ThreadPoolExecutor(2) as threads:
            handle = self.host._handle
            with handle.use():
                self.host.close()
                self.assertEqual(handle._uses, 1)
                with self.assertRaises(ValueError):
                    threads.submit(self.host.show).result()
            self.assertEqual(handle._uses, 0)
