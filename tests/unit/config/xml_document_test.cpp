#include "config/XmlDocument.h"

#include <gtest/gtest.h>

#include "config/ResultCodes.h"
#include "platform/KnownFolders.h"
#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

using namespace std::string_literals;

/// One file of the store, as a document.
class XmlFile : public testing::Test {
protected:
    ResultCode load(std::string_view content) {
        m_machine.write("x.xml", content);
        m_document.release();
        m_document.create();
        return m_document.load(path());
    }

    ResultCode save() { return m_document.save(path()); }
    std::string saved() { return m_machine.read("x.xml"); }

    std::wstring text(const char* xpath) { return m_document.getText(xpath, {}).value_or(L"(none)"); }

    XmlDocument::Node select(const char* xpath) {
        XmlDocument::Node node;
        m_document.selectSingleNode(xpath, {}, node);
        return node;
    }

    std::wstring path() { return *platform::publicFolder() + L"\\Roaming\\Korvane\\x.xml"; }

    StoreMachine m_machine;
    XmlDocument m_document;
};

TEST_F(XmlFile, IsTakenExactlyIfItIsWellFormed) {
    struct Case {
        std::string_view content;
        bool isTaken;
    };
    const Case cases[] = {
        {"<a/>", true},
        {"<a></a>", true},
        {"\xEF\xBB\xBF<a/>", true},
        {"<?xml version='1.0'?><a/>", true},
        {"<?xml version=\"1.0\" encoding=\"utf-8\" standalone='yes' ?>\n<!-- c --><a b='1' c=\"2\"/>\n<?p "
         "i?>\n",
         true},
        {"<!DOCTYPE a><a/>", true},
        {"<!DOCTYPE a SYSTEM \"a.dtd\"><a/>", true},
        {"<a><![CDATA[<&]]></a>", true},
        {"<a>&lt;&gt;&amp;&quot;&apos;&#65;&#x1F600;</a>", true},
        {"<a>]] ></a>", true},
        {"<\xC3\xA9l\xC3\xA9ment/>", true},
        {"<a:b xmlns:a='u'/>", true},
        {"<a >x</a >", true},
        {"", false},
        {" ", false},
        {"text", false},
        {"<a>", false},
        {"<a", false},
        {"<a/", false},
        {"</a>", false},
        {"<a></b>", false},
        {"<a><b></a></b>", false},
        {"<a/><b/>", false},
        {"<a/>text", false},
        {"text<a/>", false},
        {" <?xml version='1.0'?><a/>", false},
        {"<?xml encoding='UTF-8'?><a/>", false},
        {"<?xml version='1.0' encoding='UTF-8'><a/>", false},
        {"<?xml version='1.0' encoding='klingon'?><a/>", false},
        {"<?xml version='1.0' encoding='UTF-16'?><a/>", false},
        {"<?xml version='1.0' standalone='perhaps'?><a/>", false},
        {"<a><?xml version='1.0'?></a>", false},
        {"<a>&</a>", false},
        {"<a>& </a>", false},
        {"<a>&nbsp;</a>", false},
        {"<a>&lt</a>", false},
        {"<a>&#0;</a>", false},
        {"<a>&#x110000;</a>", false},
        {"<a>&#xD800;</a>", false},
        {"<a>&#;</a>", false},
        {"<a>&#x;</a>", false},
        {"<a>]]></a>", false},
        {"<a><![CDATA[x]]</a>", false},
        {"<a><!-- -- --></a>", false},
        {"<a><!-- x", false},
        {"<a b/>", false},
        {"<a b=1/>", false},
        {"<a b='1' b='2'/>", false},
        {"<a b='1'c='2'/>", false},
        {"<a b='<'/>", false},
        {"<a b='&'/>", false},
        {"<a b='1/>", false},
        {"<1/>", false},
        {"<a><2/></a>", false},
        {"< a/>", false},
        {"<a>\x01</a>", false},
        {std::string_view("<a>\0</a>", 8), false},
        {std::string_view("<a/>\0", 5), false},
        {"<a>\xC3</a>", false},
        {"<a>\xC0\x80</a>", false},
        {"<a>\xED\xA0\x80</a>", false},
        {"<a>\xEF\xBF\xBF</a>", false},
        {"<!DOCTYPE a [<!ENTITY e 'x'>]><a>&e;</a>", false},
    };
    for (const Case& c : cases)
        EXPECT_EQ(load(c.content), c.isTaken ? kSuccess : kFailure) << c.content;
}

std::string utf16(std::u16string_view text, bool isBigEndian) {
    std::string bytes;
    for (const char16_t unit : text) {
        const char high = static_cast<char>(unit >> 8);
        const char low = static_cast<char>(unit & 0xFF);
        bytes += isBigEndian ? std::string{high, low} : std::string{low, high};
    }
    return bytes;
}

TEST_F(XmlFile, ComesInEveryEncodingThatItMayClaim) {
    struct Case {
        std::string content;
        const wchar_t* text;
    };
    const std::u16string wide = u"\uFEFF<?xml version='1.0' encoding='UTF-16'?><a>\u00E9\U0001F600</a>";
    const Case cases[] = {
        {utf16(wide, false), L"\u00E9\U0001F600"},
        {utf16(wide, true), L"\u00E9\U0001F600"},
        {utf16(u"\uFEFF<a>x</a>", true), L"x"},
        {"<?xml version='1.0' encoding='iso-8859-1'?><a>\xE9</a>", L"\u00E9"},
        {"<?xml version='1.0' encoding='ISO-8859-1'?><a>\xC3\xA9</a>", L"\u00C3\u00A9"},
        {"<?xml version='1.0' encoding='us-ascii'?><a>e</a>", L"e"},
        {"\xEF\xBB\xBF<?xml version='1.0' encoding='UTF-8'?><a>\xC3\xA9</a>", L"\u00E9"},
    };
    for (const Case& c : cases) {
        ASSERT_EQ(load(c.content), kSuccess) << c.content;
        EXPECT_EQ(text("/a"), c.text) << c.content;
        ASSERT_EQ(save(), kSuccess);
        EXPECT_TRUE(saved().starts_with("\xEF\xBB\xBF"));
        EXPECT_EQ(saved().find("iso"), std::string::npos);
        ASSERT_EQ(load(saved()), kSuccess) << saved();
        EXPECT_EQ(text("/a"), c.text) << "after a save of " << c.content;
    }
}

TEST_F(XmlFile, IsRefusedInBytesThatAreNotWhatItClaims) {
    const std::string cases[] = {
        utf16(u"\uFEFF<a>\xD800</a>", false),
        utf16(u"\uFEFF<a>\xDC00</a>", true),
        utf16(u"\uFEFF<a>x</a>", false) + "y",
        utf16(u"\uFEFF<?xml version='1.0' encoding='UTF-8'?><a/>", false),
        utf16(u"<a/>", false),
        "<?xml version='1.0' encoding='us-ascii'?><a>\xC3\xA9</a>",
        "<?xml version='1.0' encoding='windows-1252'?><a>e</a>",
    };
    for (const std::string& content : cases)
        EXPECT_EQ(load(content), kFailure) << content;
}

TEST_F(XmlFile, GivesAllTextBelowANodeAndKeepsIt) {
    ASSERT_EQ(load("<r><a> x<!-- n -->y<b>z</b><![CDATA[<&>]]>&lt;&#13;\r\nw\rv </a></r>"), kSuccess);
    const std::wstring expected = L" xyz<&><\r\nw\nv ";
    EXPECT_EQ(text("/r/a"), expected);
    ASSERT_EQ(save(), kSuccess);
    ASSERT_EQ(load(saved()), kSuccess);
    EXPECT_EQ(text("/r/a"), expected);
}

TEST_F(XmlFile, HoldsWhateverTextXmlCan) {
    const std::wstring texts[] = {L"",
                                  L" leading and trailing ",
                                  L"\t\n\r\r\n ",
                                  L"<a href=\"x\">&amp;'\"]]></a>",
                                  L"\u00E9\u4E2D\uD7FF\uE000\uFFFD",
                                  L"\U0001F600\U0010FFFF",
                                  L"<![CDATA[x]]>"};
    for (const std::wstring& value : texts) {
        ASSERT_EQ(load("<r/>"), kSuccess);
        ASSERT_EQ(m_document.setChild("t", value, {}, false), kSuccess);
        ASSERT_EQ(save(), kSuccess);
        ASSERT_EQ(load(saved()), kSuccess) << saved();
        EXPECT_EQ(text("/r/t"), value);
    }
}

TEST_F(XmlFile, RefusesTextThatXmlCannotHoldAndStaysAsItWas) {
    for (const std::wstring& value : {L"a\x01"s, L"\x1F"s, L"a\0b"s, L"\uFFFE"s, L"\uFFFF"s}) {
        ASSERT_EQ(load("<r><t>old</t></r>"), kSuccess);
        EXPECT_EQ(m_document.setChild("t", value, select("/r"), false), kFailure);
        EXPECT_EQ(text("/r/t"), L"old");
    }
}

TEST_F(XmlFile, FindsElementsAloneByTheirNames) {
    ASSERT_EQ(load("<r><c><?id 5?><id>7</id></c></r>"), kSuccess);
    EXPECT_EQ(m_document.getText("id", select("/r/c")), L"7");
}

TEST_F(XmlFile, SetsAChildOrMakesOne) {
    ASSERT_EQ(load("<r><c><id>7</id></c></r>"), kSuccess);
    const XmlDocument::Node parent = select("/r/c");
    XmlDocument::Node made;
    EXPECT_EQ(m_document.setChild("id", L"8", parent, false, &made), kSuccess);
    EXPECT_FALSE(made);
    EXPECT_EQ(m_document.setChild("id", L"9", parent, true, &made), kSuccess);
    EXPECT_TRUE(made);
    EXPECT_EQ(m_document.setChild("top", L"t", {}, true), kSuccess);
    ASSERT_EQ(save(), kSuccess);
    EXPECT_EQ(saved(), "\xEF\xBB\xBF<?xml version=\"1.0\"?><r><c><id>8</id><id>9</id></c><top>t</top></r>");
}

TEST_F(XmlFile, KeepsWhatItDoesNotKnow) {
    const std::string content =
        "\xEF\xBB\xBF<?xml version=\"1.0\" encoding=\"UTF-8\"?><!DOCTYPE r><!--c--><r a=\"&lt;&#10;\" "
        "x:y=\"z\"> <?p i?><!-- n --><![CDATA[&]]>\t<b/></r>";
    ASSERT_EQ(load(content), kSuccess);
    ASSERT_EQ(save(), kSuccess);
    ASSERT_EQ(load(saved()), kSuccess);
    for (const char* part : {"<!DOCTYPE r>", "<!--c-->", "a=\"&lt;&#10;\"", "x:y=\"z\"", "<?p i?>",
                             "<!-- n -->", "<![CDATA[&]]>\t<b"})
        EXPECT_NE(saved().find(part), std::string::npos) << part << " in " << saved();
}

TEST_F(XmlFile, MayBeOfAnyDepth) {
    constexpr int kDepth = 200000;
    std::string content = "<r><c>";
    for (int i = 0; i < kDepth; ++i)
        content += "<a>";
    content += "x";
    for (int i = 0; i < kDepth; ++i)
        content += "</a>";
    ASSERT_EQ(load(content + "</c></r>"), kSuccess);
    EXPECT_EQ(text("/r/c"), L"x");
    ASSERT_EQ(save(), kSuccess);
    XmlDocument::remove(select("/r/c"));
    ASSERT_EQ(save(), kSuccess);
    EXPECT_TRUE(saved().ends_with("<r></r>"));
}

TEST_F(XmlFile, IsNothingWithoutADocument) {
    m_document.release();
    EXPECT_EQ(m_document.load(path()), kNoDocument);
    m_document.create();
    EXPECT_EQ(m_document.load(*platform::publicFolder() + L"\\none.xml"), kFailure);
}

}  // namespace
}  // namespace vexa::test
