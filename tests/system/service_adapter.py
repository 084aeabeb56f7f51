"""The adapter comes, goes and changes its radio; which adapter it is; what other notifications do."""

import itertools
import struct

from harness import CHANNEL, CHANNEL_LIST, Story

ACM, MSM, IHV = 0x08, 0x10, 0x40
OURS = "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}"
OTHER = "{11111111-2222-3333-4444-555555555555}"
PCI, USB, FOREIGN = "pci\\ven_1f5d", "usb\\vid_2b7e", "pci\\ven_8086&dev_1"
OFF, ON = 2, 1


def spectral(*names):
    return [(name, "SpectralAnalyser") for name in names]


# What the two ports hear.
WENT = spectral("CARD_PLUG_OUT"), spectral("CARD_PLUG_OUT")
CAME = spectral("RADIO_ON", "CARD_PLUG_IN"), spectral("CARD_PLUG_IN")
RADIO = [("GET_RADIO", "HotSpot20")]
NOTHING = [], []


class AdapterStory(Story):
    def begin(self, **scenario):
        self.start(**{"spectrum": {"channels": [1, 6, 11]}, **scenario})
        self.sa, self.hs20 = self.machine.sa(), self.machine.hs20()

    def events(self):
        """What both ports have heard since the last look, as (name, source), but for the list of networks, whose
        rules have stories of their own."""
        self.sa.send("GET_CHANNEL_LIST")
        self.hs20.send("GET_IS_CARD_IN")
        sa, hs20 = [], []
        while (event := self.sa.next_event())["EventId"] != CHANNEL_LIST:
            sa.append((event["EventId"], event["Source"]))
        while not (event := self.hs20.next_event())["EventId"].startswith("CARD_") or "Data" not in event:
            if event["EventId"] != "GET_ALL_NETWORK_LIST":
                hs20.append((event["EventId"], event["Source"]))
        return sa[:-1], hs20  # a channel list has its radio event before it

    def is_card_in(self):
        self.hs20.send("GET_IS_CARD_IN")
        return self.hs20.next_event()["EventId"] == "CARD_PLUG_IN"


class ComingAndGoing(AdapterStory):
    def test_removal_and_arrival_in_order_on_both_ports(self):
        self.begin()
        channels = self.sa.ask("GET_CHANNEL_LIST")["Data"]
        self.assertIn('"Channel" : 11', channels)
        for action, heard in (("pullAdapter", WENT), ("insertAdapter", CAME)):
            for time in ("the first time", "again"):
                with self.subTest(action, time=time):
                    self.control.do(action)
                    self.assertEqual(self.events(), heard)
                    self.assertEqual(self.is_card_in(), heard == CAME)
                    told = self.sa.ask("GET_CHANNEL_LIST")["Data"]
                    self.assertEqual(told, channels, "they are remembered")

    def test_an_adapter_that_comes_with_its_radio_off(self):
        self.begin(adapters=[{"inserted": False, "softwareRadio": "off"}])
        self.assertFalse(self.is_card_in())
        self.control.do("insertAdapter")
        self.assertEqual(self.events(), (spectral("RADIO_OFF", "CARD_PLUG_IN"), spectral("CARD_PLUG_IN")))

    def test_removal_of_another_adapter(self):
        for other in ({}, {"hardwareId": FOREIGN}):
            with self.subTest(other):
                self.begin(adapters=[other, {}])
                self.control.do("pullAdapter", adapter=0)
                self.assertEqual(self.events(), WENT)
                self.assertTrue(self.is_card_in())
                self.control.do("pullAdapter", adapter=1)
                self.events()
                self.assertFalse(self.is_card_in())


class Radio(AdapterStory):
    def test_every_state_of_both_switches(self):
        self.begin()
        for hardware, software in itertools.product(("on", "off", "unknown"), repeat=2):
            with self.subTest(hardware=hardware, software=software):
                self.control.do("radio", hardware=hardware, software=software)
                is_on, is_told_on = software == "on", hardware == software == "on"
                self.assertEqual(self.sa.next_event()["EventId"], "RADIO_ON" if is_told_on else "RADIO_OFF")
                told = self.hs20.next_event()
                self.assertEqual((told["EventId"], told["Source"]), RADIO[0])
                self.assertEqual(told["Data"], "true\n" if is_on else "false\n")
                self.assertEqual(self.events(), NOTHING)
                # Asked for, the software switch alone counts.
                self.assertEqual(self.hs20.ask("GET_RADIO")["Data"], told["Data"])
                self.sa.send("GET_CHANNEL_LIST")
                self.assertEqual(self.sa.next_event()["EventId"], "RADIO_ON" if is_on else "RADIO_OFF")
                self.sa.next_event()

    def test_a_query_that_fails_is_a_radio_that_is_off(self):
        self.begin()
        self.control.do("fail", call="WlanQueryInterface", error=5023, match="4", times=2)
        self.assertEqual(self.hs20.ask("GET_RADIO")["Data"], "false\n")
        self.sa.send("GET_CHANNEL_LIST")
        self.assertEqual(self.sa.next_event()["EventId"], "RADIO_OFF")

    def test_the_data_of_the_notification_decide(self):
        self.begin()
        for told, *radio, behind in (
            ("RADIO_ON", 0, ON, ON, b""),
            ("RADIO_OFF", 0, OFF, ON, b""),
            ("RADIO_OFF", 0, ON, OFF, b""),
            ("RADIO_OFF", 0, ON, 0x101, b""),
            ("RADIO_ON", 7, ON, ON, b"\xff" * 9),
            ("RADIO_OFF", 0, ON, b"\1\0\0"),
            ("RADIO_OFF", b""),
        ):
            with self.subTest(radio, behind=behind):
                data = struct.pack(f"<{len(radio)}I", *radio) + behind
                self.control.do("notify", source=MSM, code=7, dataHex=data.hex())
                self.assertEqual(self.events(), (spectral(told), RADIO))


class OtherNotifications(AdapterStory):
    TOLD = {
        (ACM, 13): CAME,
        (ACM, 14): WENT,
        (MSM, 4): (spectral(CHANNEL), []),
        (MSM, 7): (spectral("RADIO_OFF"), RADIO),
        (MSM, 10): (spectral(CHANNEL), []),
    }

    def test_every_code_of_both_sources(self):
        self.begin()
        for source, code in itertools.product((ACM, MSM), (*range(40), 255, 0x80000000, 0xFFFFFFFF)):
            for data in ("", "00", "ff" * 16, "00" * 2000) if (source, code) != (MSM, 7) else ("",):
                self.control.do("notify", source=source, code=code, dataHex=data)
                with self.subTest(source=source, code=code, data=data[:8]):
                    self.assertEqual(self.events(), self.TOLD.get((source, code), NOTHING))

    def test_other_sources_are_nobody_s(self):
        self.begin()
        for source in (0, 1, 2, 4, 0x20, 0x80, 0x100, ACM | MSM, ACM | IHV, 0xFFFF, 0x80000008):
            for code in (4, 7, 10, 13, 14):
                self.control.do("notify", source=source, code=code, dataHex="00" * 16)
        self.assertEqual(self.events(), NOTHING)

    def test_the_interface_of_a_link_change_is_not_looked_at(self):
        self.begin()
        self.control.do("notify", source=MSM, code=4, guid=OTHER)
        self.assertEqual(self.events(), (spectral(CHANNEL), []))


class Identity(AdapterStory):
    def test_entries_of_the_class_key(self):
        for name, expected, entries in (
            ("on USB, behind another interface", True, [(OTHER, PCI), (OURS, USB)]),
            ("a longer vendor, in capitals", True, [(OURS, PCI.upper() + "00")]),
            ("an interface in small letters", True, [(OURS.lower(), PCI + "&dev_1")]),
            ("11 characters", False, [(OURS, PCI[:11])]),
            ("no hardware id", False, [(OURS, None)]),
            ("nothing", False, []),
            ("another interface", False, [(OTHER, PCI)]),
            ("entries that do not end the search", True, [(OURS, None), (None, PCI), (OURS, FOREIGN), (OURS, PCI)]),
            ("the vendor of the other bus", False, [(OURS, "pci\\ven_2b7e"), (OURS, "usb\\vid_1f5d")]),
            ("no braces", False, [(OURS.strip("{}"), PCI)]),
            ("something behind the interface", False, [(OURS + "x", PCI)]),
            ("an empty interface", False, [("", PCI)]),
            ("a hardware id of 255 bytes", True, [(OURS, PCI.ljust(255, "x"))]),
            ("a hardware id of 256 bytes", False, [(OURS, PCI.ljust(256, "x"))]),
            ("many before", True, [(OTHER, PCI)] * 100 + [(OURS, PCI)]),
        ):
            with self.subTest(name):
                self.begin(registryClass=[{"netCfgInstanceId": i, "matchingDeviceId": d} for i, d in entries])
                self.assertEqual(self.is_card_in(), expected)
                self.machine.stop()

    def test_the_maker_s_adapter_on_usb_behind_or_before_another_vendor_s(self):
        for adapters in itertools.permutations([FOREIGN, USB + "&pid_1"]):
            with self.subTest(adapters):
                self.begin(adapters=[{"hardwareId": device} for device in adapters])
                self.assertTrue(self.is_card_in())
                self.sa.send("FULL_SCAN")
                self.events()
                self.assertEqual(self.control.query("calls")[0]["result"], 0)

    def test_an_enumeration_that_fails_is_an_absent_adapter(self):
        self.begin()
        self.control.do("fail", call="WlanEnumInterfaces", error=1726)
        self.control.do("notify", source=ACM, code=14)
        self.events()
        self.assertFalse(self.is_card_in())
