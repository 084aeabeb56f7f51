"""The adapter comes, goes and changes its radio; which adapter it is; what other notifications do."""

import itertools
import struct
import unittest

from harness import Machine

ACM, MSM, IHV = 0x08, 0x10, 0x40
CHANNEL = "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA"
CHANNEL_LIST = "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G"
OURS = "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}"
OTHER = "{11111111-2222-3333-4444-555555555555}"
OFF, ON, UNKNOWN = 2, 1, 0
SPECTRUM = {"channels": [1, 6, 11]}


class World(unittest.TestCase):
    def start(self, **scenario):
        machine = Machine({"speed": 20, "spectrum": SPECTRUM, **scenario})
        self.addCleanup(machine.__exit__, None, None, None)
        machine.__enter__()
        self.machine, self.control = machine, machine.control
        self.sa, self.hs20 = machine.sa(), machine.hs20()

    def events(self):
        """What both ports have heard since the last look, as (name, source), but for the list of networks, whose
        rules have stories of their own."""
        self.sa.send("GET_CHANNEL_LIST")
        self.hs20.send("GET_IS_CARD_IN")
        sa = self.until(self.sa, lambda event: event["EventId"] == CHANNEL_LIST)
        hs20 = self.until(self.hs20, lambda event: event["EventId"].startswith("CARD_") and "Data" in event)
        hs20 = [event for event in hs20 if event[0] != "GET_ALL_NETWORK_LIST"]
        return sa[:-1], hs20  # a channel list has its radio event before it

    @staticmethod
    def until(client, is_marker):
        heard = []
        while not is_marker(event := client.next_event()):
            heard.append((event["EventId"], event["Source"]))
        return heard

    def is_card_in(self):
        self.hs20.send("GET_IS_CARD_IN")
        return self.hs20.next_event()["EventId"] == "CARD_PLUG_IN"


def spectral(*names):
    return [(name, "SpectralAnalyser") for name in names]


class ComingAndGoing(World):
    def test_removal_and_arrival_in_order_on_both_ports(self):
        self.start()
        self.control.do("pullAdapter")
        self.assertEqual(self.events(), (spectral("CARD_PLUG_OUT"), spectral("CARD_PLUG_OUT")))
        self.assertFalse(self.is_card_in())
        self.control.do("insertAdapter")
        self.assertEqual(self.events(), (spectral("RADIO_ON", "CARD_PLUG_IN"), spectral("CARD_PLUG_IN")))
        self.assertTrue(self.is_card_in())

    def test_an_adapter_that_comes_with_its_radio_off(self):
        self.start(adapters=[{"inserted": False, "softwareRadio": "off"}])
        self.assertFalse(self.is_card_in())
        self.control.do("insertAdapter")
        self.assertEqual(self.events(), (spectral("RADIO_OFF", "CARD_PLUG_IN"), spectral("CARD_PLUG_IN")))

    def test_repeats_are_told_again(self):
        self.start()
        for _ in range(2):
            self.control.do("insertAdapter")
            self.assertEqual(self.events()[0], spectral("RADIO_ON", "CARD_PLUG_IN"))
        for _ in range(2):
            self.control.do("pullAdapter")
            self.assertEqual(self.events()[0], spectral("CARD_PLUG_OUT"))

    def test_removal_while_another_of_the_maker_remains(self):
        self.start(adapters=[{}, {}])
        self.control.do("pullAdapter", adapter=0)
        self.assertEqual(self.events(), (spectral("CARD_PLUG_OUT"), spectral("CARD_PLUG_OUT")))
        self.assertTrue(self.is_card_in())
        self.control.do("pullAdapter", adapter=1)
        self.events()
        self.assertFalse(self.is_card_in())

    def test_a_removal_that_another_vendor_s_adapter_causes(self):
        self.start(adapters=[{"hardwareId": "pci\\ven_8086&dev_1"}, {}])
        self.control.do("pullAdapter", adapter=0)
        self.assertEqual(self.events(), (spectral("CARD_PLUG_OUT"), spectral("CARD_PLUG_OUT")))
        self.assertTrue(self.is_card_in())

    def test_the_channels_are_remembered_while_the_adapter_is_out(self):
        self.start()
        lists = []
        for action in (None, "pullAdapter", "insertAdapter"):
            if action:
                self.control.do(action)
            self.sa.send("GET_CHANNEL_LIST")
            lists.append(self.sa.wait_event(CHANNEL_LIST)["Data"])
        self.assertEqual(len(set(lists)), 1, lists)
        self.assertIn('"Channel" : 11', lists[0])

    def test_a_storm_of_coming_and_going_ends_as_it_should(self):
        self.start()
        for _ in range(50):
            self.control.do("pullAdapter")
            self.control.do("insertAdapter")
        sa, hs20 = self.events()
        self.assertEqual(sa, spectral("CARD_PLUG_OUT", "RADIO_ON", "CARD_PLUG_IN") * 50)
        self.assertEqual(hs20, spectral("CARD_PLUG_OUT", "CARD_PLUG_IN") * 50)


class Radio(World):
    def test_every_state_of_both_switches(self):
        self.start()
        for hardware, software in itertools.product(("on", "off", "unknown"), repeat=2):
            with self.subTest(hardware=hardware, software=software):
                self.control.do("radio", hardware=hardware, software=software)
                told = "RADIO_ON" if hardware == software == "on" else "RADIO_OFF"
                self.assertEqual(self.sa.next_event()["EventId"], told)
                event = self.hs20.next_event()
                self.assertEqual((event["EventId"], event["Source"]), ("GET_RADIO", "HotSpot20"))
                self.assertEqual(event["Data"], "true\n" if software == "on" else "false\n")
                self.assertEqual(self.events(), ([], []))

    def test_asked_for_the_software_switch_alone_counts(self):
        self.start()
        for hardware, software in itertools.product(("on", "off"), ("on", "off", "unknown")):
            with self.subTest(hardware=hardware, software=software):
                self.control.do("radio", hardware=hardware, software=software)
                self.events()
                self.sa.send("GET_CHANNEL_LIST")
                self.assertEqual(self.sa.next_event()["EventId"], "RADIO_ON" if software == "on" else "RADIO_OFF")
                self.sa.next_event()
                self.hs20.send("GET_RADIO")
                self.assertEqual(self.hs20.next_event()["Data"], "true\n" if software == "on" else "false\n")

    def test_a_query_that_fails_is_a_radio_that_is_off(self):
        self.start()
        self.control.do("fail", call="WlanQueryInterface", error=5023, match="4", times=2)
        self.hs20.send("GET_RADIO")
        self.assertEqual(self.hs20.next_event()["Data"], "false\n")
        self.sa.send("GET_CHANNEL_LIST")
        self.assertEqual(self.sa.next_event()["EventId"], "RADIO_OFF")

    def test_the_data_of_the_notification_decide(self):
        self.start()
        cases = {
            "on": (struct.pack("<III", 0, ON, ON), "RADIO_ON"),
            "software off": (struct.pack("<III", 0, OFF, ON), "RADIO_OFF"),
            "hardware off": (struct.pack("<III", 0, ON, OFF), "RADIO_OFF"),
            "another number": (struct.pack("<III", 0, ON, 0x101), "RADIO_OFF"),
            "another radio": (struct.pack("<III", 7, ON, ON), "RADIO_ON"),
            "more than is needed": (struct.pack("<III", 0, ON, ON) + b"\xff" * 9, "RADIO_ON"),
            "a byte too short": (struct.pack("<III", 0, ON, ON)[:-1], "RADIO_OFF"),
            "one byte": (b"\x01", "RADIO_OFF"),
            "none": (b"", "RADIO_OFF"),
        }
        for name, (data, told) in cases.items():
            with self.subTest(name):
                self.control.do("notify", source=MSM, code=7, dataHex=data.hex())
                self.assertEqual(self.events(), (spectral(told), [("GET_RADIO", "HotSpot20")]))


class OtherNotifications(World):
    TOLD = {
        (ACM, 13): (spectral("RADIO_ON", "CARD_PLUG_IN"), spectral("CARD_PLUG_IN")),
        (ACM, 14): (spectral("CARD_PLUG_OUT"), spectral("CARD_PLUG_OUT")),
        (MSM, 4): (spectral(CHANNEL), []),
        (MSM, 7): (spectral("RADIO_OFF"), [("GET_RADIO", "HotSpot20")]),
        (MSM, 10): (spectral(CHANNEL), []),
    }

    def test_every_code_of_both_sources(self):
        self.start()
        for source in (ACM, MSM):
            for code in (*range(40), 255, 0x80000000, 0xFFFFFFFF):
                for data in ("", "00", "ff" * 16, "00" * 2000):
                    if (source, code) == (MSM, 7) and data:
                        continue
                    self.control.do("notify", source=source, code=code, dataHex=data)
                    with self.subTest(source=source, code=code, data=data[:8]):
                        self.assertEqual(self.events(), self.TOLD.get((source, code), ([], [])))

    def test_other_sources_are_nobody_s(self):
        self.start()
        for source in (0, 1, 2, 4, 0x20, 0x80, 0x100, ACM | MSM, ACM | IHV, 0xFFFF, 0x80000008):
            for code in (4, 7, 10, 13, 14):
                self.control.do("notify", source=source, code=code, dataHex="00" * 16)
        self.assertEqual(self.events(), ([], []))

    def test_the_interface_of_a_link_change_is_not_looked_at(self):
        self.start()
        self.control.do("notify", source=MSM, code=4, guid=OTHER)
        self.assertEqual(self.events(), (spectral(CHANNEL), []))


class Identity(World):
    PCI, USB = "pci\\ven_1f5d", "usb\\vid_2b7e"

    def assert_present(self, expected, entries):
        classes = [{"netCfgInstanceId": guid, "matchingDeviceId": device} for guid, device in entries]
        self.start(registryClass=classes)
        self.assertEqual(self.is_card_in(), expected, entries)
        self.machine.stop()

    def test_entries_of_the_class_key(self):
        cases = (
            ("on PCI", True, [(OURS, self.PCI + "&dev_1")]),
            ("on USB", True, [(OURS, self.USB + "&pid_1")]),
            ("nothing behind the vendor", True, [(OURS, self.PCI)]),
            ("a longer vendor", True, [(OURS, self.PCI + "00")]),
            ("capitals", True, [(OURS, self.PCI.upper() + "&DEV_1")]),
            ("small letters", True, [(OURS.lower(), self.USB)]),
            ("11 characters", False, [(OURS, self.PCI[:11])]),
            ("11 characters, then a match", True, [(OURS, self.PCI[:11]), (OURS, self.PCI)]),
            ("nothing", False, []),
            ("no hardware id", False, [(OURS, None)]),
            ("no hardware id, then a match", True, [(OURS, None), (OURS, self.PCI)]),
            ("no interface, then a match", True, [(None, self.PCI), (OURS, self.PCI)]),
            ("neither, then a match", True, [(None, None), (OURS, self.PCI)]),
            ("another interface", False, [(OTHER, self.PCI)]),
            ("another interface, then a match", True, [(OTHER, self.PCI), (OURS, self.USB)]),
            ("another vendor, then a match", True, [(OURS, "pci\\ven_8086&dev_1"), (OURS, self.PCI)]),
            ("another vendor", False, [(OURS, "pci\\ven_8086&dev_1")]),
            ("the vendor of the other bus", False, [(OURS, "pci\\ven_2b7e"), (OURS, "usb\\vid_1f5d")]),
            ("no braces", False, [(OURS.strip("{}"), self.PCI)]),
            ("something behind the interface", False, [(OURS + "x", self.PCI)]),
            ("an empty interface", False, [("", self.PCI)]),
            ("a hardware id of 255 bytes", True, [(OURS, self.PCI.ljust(255, "x"))]),
            ("a hardware id of 256 bytes", False, [(OURS, self.PCI.ljust(256, "x"))]),
            ("many before", True, [(OTHER, self.PCI)] * 300 + [(OURS, self.PCI)]),
        )
        for name, expected, entries in cases:
            with self.subTest(name):
                self.assert_present(expected, entries)

    def test_the_maker_s_adapter_on_usb_behind_or_before_another_vendor_s(self):
        other, ours = {"hardwareId": "pci\\ven_8086&dev_1"}, {"hardwareId": self.USB + "&pid_1"}
        for adapters in ([other, ours], [ours, other]):
            with self.subTest(adapters):
                self.start(adapters=adapters)
                self.assertTrue(self.is_card_in())
                self.sa.send("FULL_SCAN")
                self.events()
                call = self.control.query("calls")[0]
                self.assertEqual(call["result"], 0)

    def test_an_enumeration_that_fails_is_an_absent_adapter(self):
        self.start()
        self.control.do("fail", call="WlanEnumInterfaces", error=1726)
        self.control.do("notify", source=ACM, code=14)
        self.events()
        self.assertFalse(self.is_card_in())


if __name__ == "__main__":
    unittest.main()
