"""A service that has nothing to do does nothing, in little memory."""

import pathlib
import time
import unittest

from harness import Machine, wait_until

WATCHED_SECONDS = 6.0
RESTING_LOOKS = 10  # one may fall between two steps of a thread that waits for its turn
MEMORY_LIMIT = 15 * 1024
TERABYTE = 1 << 30  # in kB


def status(path):
    return dict(line.split(":\t", 1) for line in path.read_text().splitlines() if ":\t" in line)


def kilobytes(text):
    return int(text.split()[0])


class Idle(unittest.TestCase):
    def assert_rests(self, machine):
        process = pathlib.Path(f"/proc/{machine.service_pid()}")

        def switches():
            tasks = list((process / "task").iterdir())
            return {task.name: int(status(task / "status")["voluntary_ctxt_switches"]) for task in tasks}

        before = self.first_rest(switches)
        time.sleep(WATCHED_SECONDS)
        after = switches()
        self.assertEqual(before.keys(), after.keys())
        woken = {name: after[name] - before[name] for name in after if after[name] != before[name]}
        # One period may end meanwhile: its thread wakes, and may wait for a lock.
        self.assertLessEqual(sum(woken.values()), 3, woken)

    @staticmethod
    def first_rest(switches):
        """Work just done has an end of its own, of some milliseconds."""
        seen = [switches()]

        def rests():
            seen.append(switches())
            return len(seen) > RESTING_LOOKS and all(look == seen[-1] for look in seen[-RESTING_LOOKS:])

        wait_until(rests, "a service at rest")
        return seen[-1]

    def assert_small(self, machine):
        memory = status(pathlib.Path(f"/proc/{machine.service_pid()}/status"))
        if kilobytes(memory["VmSize"]) > TERABYTE:
            self.skipTest("built with a sanitizer, which has memory of its own")
        self.assertLess(kilobytes(memory["VmRSS"]), MEMORY_LIMIT)

    def test_with_a_parent_and_no_client(self):
        with Machine({"speed": 1}, control=False) as machine:
            self.assert_rests(machine)
            self.assert_small(machine)

    def test_with_clients_that_say_nothing(self):
        with Machine({"speed": 1}, control=False) as machine:
            for client in [machine.sa() for _ in range(10)] + [machine.hs20() for _ in range(10)]:
                self.assertFalse(client.received)
            sa = machine.sa()
            sa.send("GET_CURRENT_CHANNEL")
            sa.next_event()
            self.assert_rests(machine)

    def test_memory_comes_back_after_work(self):
        levels = {f"{channel}": {"congestion": 50, "power": 60, "spread": 20} for channel in range(1, 14)}
        spectrum = {"channels": list(range(1, 14)), "scanMs": 20, "recordsPerScan": 50, "levels": levels}
        with Machine({"speed": 20, "spectrum": spectrum}) as machine:
            client = machine.sa()
            client.send("GET_CHANNEL_LIST")
            client.send("FULL_SCAN")
            for _ in range(2000):
                client.wait_event("SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION")
            client.send("STOP_SCAN")
            self.assert_small(machine)


if __name__ == "__main__":
    unittest.main()
