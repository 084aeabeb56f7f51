"""The configuration file beside another reader of XML: what that one takes we take, what it refuses we refuse, and both
read the same."""

import random
import re
import unittest
import xml.etree.ElementTree

from harness import Machine

SEED = 7
MUTANTS = 250
UNTOUCHED = len('<?xml version="1.0"')  # the other reader doesn't care what version it is
SENTINEL = (
    "<c><global><nextcredid>2</nextcredid></global><credentials><credential><id>1</id><type>eapttls</type>"
    "<accesstype>alluser</accesstype><realm>sentinel</realm></credential></credentials><users/></c>"
).encode()
BASE = (
    '<?xml version="1.0" encoding="UTF-8"?><!-- c --><configurations a="1" b=\'&lt;2\'><global>'
    "<nextcredid>9</nextcredid></global><credentials><credential><id>7</id><type>eapttls</type>"
    "<accesstype>alluser</accesstype><creator>x</creator><eap>2</eap><credname>n&amp;&#233;&#x1F600; é</credname>"
    "<realm> r<!-- n -->y<b>z</b><![CDATA[<&>]]>\r\n&#13;v\rw </realm><username/><password>p&#13;&quot;</password>"
    "</credential></credentials>"
    "<?p i?><users></users></configurations>\n"
).encode()
PIECES = [
    *(bytes([byte]) for byte in b"<>&;/\"'= -!?x:1\r\n\x00\x01\x7f\x80"), b"]]>", b"<![CDATA[", b"<!--", b"-->", b"&amp;",
    b"&#0;", b"&#x41;", b"&x;", b"<a>", b"</a>", b"<a/>", b"<?p?>", b"<?xml?>", b"\xc3\xa9", b"\xed\xa0\x80",
    b"\xef\xbf\xbf", b"\xf0\x9f\x98\x80",
]  # fmt: skip


def mutant(rng):
    text = bytearray(BASE)
    for _ in range(rng.randrange(1, 4)):
        at, kind = rng.randrange(UNTOUCHED, len(text)), rng.randrange(4)
        if kind == 0:
            del text[at : at + rng.randrange(1, 6)]
        elif kind == 1:
            text[at:at] = rng.choice(PIECES)
        elif kind == 2:
            text[at : at + 1] = rng.choice(PIECES)
        else:
            other = rng.randrange(len(text))
            text[at:at] = text[other : other + rng.randrange(1, 20)]
    return bytes(text)


DECLARATION, TEXT = b'<?xml version="1.0" encoding="UTF-8"?>', BASE.decode()
WIDE = "\ufeff" + TEXT.replace("UTF-8", "UTF-16")
# What a file may begin with, or may not.
BEGINNINGS = [
    b"", b"<?xml version='1.0' encoding=\"utf-8\" standalone='yes' ?>", b"\xef\xbb\xbf" + DECLARATION,
    b"<?xml encoding='UTF-8'?>", b"<?xml version='1.0' encoding='UTF-8'>", b"<?xml version='1.0' standalone='perhaps'?>",
    b"text", b"<a/>", b"<!DOCTYPE a SYSTEM \"a.dtd\">", b"<!-- -- -->", b"<?xml-model x?>",
]  # fmt: skip
# What text may hold, or may not.
PARTS = [
    b"]] >", b"]]>", b"<![CDATA[x]]", b"<!-- -- -->", b"<!-- x", b"&lt;&gt;&amp;&quot;&apos;&#65;&#x1F6a;&#x1F6A;",
    b"&", b"& ", b"&nbsp;", b"&lt", b"&#;", b"&#x;", b"&#0;", b"&#x110000;", b"&#xD800;", b"<x></x >", b"<x >y</x>",
    b"<\xc3\xa9/>", b"<x b='1' c=\"2\"/>", b"<x>", b"<x", b"<x/", b"</x>", b"<x></y>", b"<x><y></x></y>", b"<1/>",
    b"< x/>", b"<x b/>", b"<x b=1/>", b"<x b='1' b='2'/>", b"<x b='1'c='2'/>", b"<x b='<'/>", b"<x b='&'/>", b"<x b='1/>",
    b"\x01", b"\0", b"\xef\xbf\xbf", b"\xc3", b"\xc0\x80", b"\xed\xa0\x80", b"<?xml version='1.0'?>",
]  # fmt: skip
# Whole ones beside those that random damage makes.
CORPUS = [
    BASE,
    *(WIDE.replace("é", text).encode("utf-16-be", "surrogatepass") for text in ("é", "\ud800", "\udc00")),
    *(WIDE.encode("utf-16-le") + end for end in (b"", b"x")),
    *(text.encode("utf-16") for text in (TEXT, WIDE)),
    *(BASE.replace(DECLARATION, beginning) for beginning in BEGINNINGS),
    *(BASE.replace(b"&#x1F600;", part) for part in PARTS),
    TEXT.replace("&#x1F600;", "").replace("UTF-8", "ISO-8859-1").encode("latin-1"),
    BASE.replace(b" \xc3\xa9", b"").replace(b"UTF-8", b"us-ascii"),
    *(BASE.replace(b"UTF-8", name) for name in (b"UTF-16", b"US-ASCII", b"nonsense")),
    *(BASE.replace(b"<!-- c -->", types) for types in (b"<!DOCTYPE configurations>", b"<!DOCTYPE x><!DOCTYPE y>")),
    *(b"", b"\xff\xfe", BASE * 2, b" " + BASE, BASE[:-30], BASE.replace(b"\r\n", b"\r")),
]


def read_by_other(content):
    """The tree as another reader sees it, or None if it refuses the file."""
    try:
        return xml.etree.ElementTree.fromstring(content)
    except (xml.etree.ElementTree.ParseError, ValueError, LookupError):
        return None


def realms(tree):
    """The realms that belong in the list, so far as it is the only credential that could."""
    found = []
    for node in tree.findall("credentials/*"):
        text = {child.tag: "".join(child.itertext()) for child in reversed(node)}
        number = re.match(r"\s*([+-]?[0-9]+)", text.get("id", ""))
        types = text.get("type") in ("eapttls", "eaptls") and text.get("accesstype") == "alluser"
        if number and 0 < int(number[1]) < 2**31 and types:
            found.append(text.get("realm", ""))
    return found


class Reading(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        machine = cls.enterClassContext(Machine({"config": SENTINEL.decode()}, control=False))
        cls.client, cls.file = machine.hs20(), machine.config()

    def read(self):
        """The realms in the list, once the service has read the file again."""
        self.client.send("READ_CREDENTIAL_FROM_FILE")
        return [entry["RealName"] for entry in self.client.credentials()]

    def check(self, content):
        self.file.write_bytes(SENTINEL)
        self.assertEqual(self.read(), ["sentinel"])
        self.file.write_bytes(content)
        ours, tree = self.read(), read_by_other(content)
        self.client.credentials("SET_POSITION_CREDENTIAL", {"Id": 7, "Order": 0})
        saved = self.file.read_bytes()
        if tree is None:
            self.assertEqual(ours, ["sentinel"], "taken, though the other reader refuses it")
            self.assertEqual(saved, content, "a file that can't be read was changed")
        else:
            self.assertEqual(ours, realms(tree))
            again = read_by_other(saved)
            self.assertIsNotNone(again, saved)
            self.assertEqual(realms(again), realms(tree))

    def test_whole_and_damaged_files(self):
        rng = random.Random(SEED)
        for number, content in enumerate([*CORPUS, *(mutant(rng) for _ in range(MUTANTS))]):
            with self.subTest(seed=SEED, number=number, content=content):
                self.check(content)
