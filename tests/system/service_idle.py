"""A service that has nothing to do does nothing, in little memory."""

import pathlib
import time

from harness import Machine, Story, wait_until

WATCHED_SECONDS = 6.0
RESTING_LOOKS = 10  # one may fall between two steps of a thread that waits for its turn
# Of its own: how many pages of files count as its own depends on what the host keeps of them.
MEMORY_LIMIT = 10 * 1024
TERABYTE = 1 << 30  # in kB


def status(path):
    return dict(line.split(":\t", 1) for line in (path / "status").read_text().splitlines() if ":\t" in line)


class Idle(Story):
    def assert_rests(self, machine):
        tasks = pathlib.Path(f"/proc/{machine.service_pid()}/task")

        def switches():
            return {task.name: int(status(task)["voluntary_ctxt_switches"]) for task in tasks.iterdir()}

        looks = []

        def rests():
            """Work just done has an end of its own, of some milliseconds."""
            looks.append(switches())
            return len(looks) > RESTING_LOOKS and all(look == looks[-1] for look in looks[-RESTING_LOOKS:])

        wait_until(rests, "a service at rest")
        time.sleep(WATCHED_SECONDS)
        before, after = looks[-1], switches()
        self.assertEqual(before.keys(), after.keys())
        woken = {name: after[name] - before[name] for name in after if after[name] != before[name]}
        # One period may end meanwhile: its thread wakes, and may wait for a lock.
        self.assertLessEqual(sum(woken.values()), 3, woken)

    def assert_small(self, machine):
        told = status(pathlib.Path(f"/proc/{machine.service_pid()}"))
        virtual, own, shared = (int(told[name].split()[0]) for name in ("VmSize", "RssAnon", "RssShmem"))
        if virtual > TERABYTE:
            self.skipTest("built with a sanitizer, which has memory of its own")
        self.assertLess(own + shared, MEMORY_LIMIT)

    def test_with_a_parent_and_then_with_clients_that_say_nothing(self):
        with Machine({"speed": 1}, control=False) as machine:
            self.assert_rests(machine)
            self.assert_small(machine)
            for _ in range(10):
                machine.sa(), machine.hs20()
            machine.sa().ask("GET_CURRENT_CHANNEL")
            self.assert_rests(machine)

    def test_memory_comes_back_after_work(self):
        levels = {f"{channel}": {"congestion": 50, "power": 60, "spread": 20} for channel in range(1, 14)}
        spectrum = {"channels": list(range(1, 14)), "scanMs": 20, "recordsPerScan": 50, "levels": levels}
        machine = self.start(spectrum=spectrum)
        client = machine.sa()
        client.send("GET_CHANNEL_LIST")
        client.send("FULL_SCAN")
        for _ in range(2000):
            client.wait_event("SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION")
        client.send("STOP_SCAN")
        self.assert_small(machine)
