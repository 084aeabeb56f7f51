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

    void saveAndLoad() {
        ASSERT_EQ(save(), kSuccess);
        ASSERT_EQ(load(saved()), kSuccess) << saved();
    }

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

TEST_F(XmlFile, IsTakenIfItIsWellFormed) {
    for (const char* content :
         {"<?xml version=\"1.0\" encoding=\"utf-8\" standalone='yes' ?>\n<!-- c --><a b='1' c=\"2\"/>\n<?p "
          "i?>",
          "\xEF\xBB\xBF<a/>", "<a></a>", "<!DOCTYPE a><a/>", "<!DOCTYPE a SYSTEM \"a.dtd\"><a/>",
          "<a><![CDATA[<&]]></a>", "<a>&lt;&gt;&amp;&quot;&apos;&#65;&#x1F600;</a>", "<a>]] ></a>",
          "<\xC3\xA9l\xC3\xA9ment/>", "<a:b xmlns:a='u'/>", "<a >x</a >"})
        EXPECT_EQ(load(content), kSuccess) << content;
}

TEST_F(XmlFile, IsRefusedIfItIsNot) {
    struct Case {
        const char* what;
        std::vector<std::string> contents;
    };
    const Case cases[] = {
        {"one element", {"", " ", "text", "<a/><b/>", "<a/>text", "text<a/>", "<a/>\0"s}},
        {"tags", {"<a>", "<a", "<a/", "</a>", "<a></b>", "<a><b></a></b>", "<1/>", "<a><2/></a>", "< a/>"}},
        {"attributes",
         {"<a b/>", "<a b=1/>", "<a b='1' b='2'/>", "<a b='1'c='2'/>", "<a b='<'/>", "<a b='&'/>",
          "<a b='1/>"}},
        {"references", {"<a>&</a>", "<a>& </a>", "<a>&nbsp;</a>", "<a>&lt</a>", "<a>&#;</a>", "<a>&#x;</a>"}},
        {"numbers", {"<a>&#0;</a>", "<a>&#x110000;</a>", "<a>&#xD800;</a>"}},
        {"sections", {"<a>]]></a>", "<a><![CDATA[x]]</a>", "<a><!-- -- --></a>", "<a><!-- x"}},
        {"characters", {"<a>\x01</a>", "<a>\0</a>"s, "<a>\xEF\xBF\xBF</a>"}},
        {"bytes", {"<a>\xC3</a>", "<a>\xC0\x80</a>", "<a>\xED\xA0\x80</a>"}},
        {"declarations",
         {" <?xml version='1.0'?><a/>", "<?xml encoding='UTF-8'?><a/>",
          "<?xml version='1.0' encoding='UTF-8'><a/>", "<?xml version='1.0' encoding='klingon'?><a/>",
          "<?xml version='1.0' encoding='UTF-16'?><a/>", "<?xml version='1.0' standalone='perhaps'?><a/>",
          "<a><?xml version='1.0'?></a>", "<!DOCTYPE a [<!ENTITY e 'x'>]><a>&e;</a>"}},
    };
    for (const Case& c : cases)
        for (const std::string& content : c.contents)
            EXPECT_EQ(load(content), kFailure) << c.what << ": " << content;
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

TEST_F(XmlFile, ComesInEveryEncodingThatItMayClaimAndLeavesInOne) {
    const std::u16string wide = u"\uFEFF<?xml version='1.0' encoding='UTF-16'?><a>\u00E9\U0001F600</a>";
    const std::pair<std::string, const wchar_t*> cases[] = {
        {utf16(wide, false), L"\u00E9\U0001F600"},
        {utf16(wide, true), L"\u00E9\U0001F600"},
        {utf16(u"\uFEFF<a>x</a>", true), L"x"},
        {"<?xml version='1.0' encoding='ISO-8859-1'?><a>\xC3\xA9</a>", L"\u00C3\u00A9"},
        {"<?xml version='1.0' encoding='us-ascii'?><a>e</a>", L"e"},
        {"\xEF\xBB\xBF<?xml version='1.0' encoding='UTF-8'?><a>\xC3\xA9</a>", L"\u00E9"},
    };
    for (const auto& [content, expected] : cases) {
        ASSERT_EQ(load(content), kSuccess) << content;
        EXPECT_EQ(text("/a"), expected) << content;
        saveAndLoad();
        EXPECT_TRUE(saved().starts_with("\xEF\xBB\xBF"));
        EXPECT_EQ(text("/a"), expected) << "after a save of " << content;
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
    saveAndLoad();
    EXPECT_EQ(text("/r/a"), expected);
}

TEST_F(XmlFile, HoldsWhateverTextXmlCan) {
    for (const std::wstring value :
         {L"", L" leading and trailing ", L"\t\n\r\r\n ", L"<a href=\"x\">&amp;'\"]]></a>",
          L"\u00E9\u4E2D\uD7FF\uE000\uFFFD", L"\U0001F600\U0010FFFF", L"<![CDATA[x]]>"}) {
        ASSERT_EQ(load("<r/>"), kSuccess);
        ASSERT_EQ(m_document.setChild("t", value, {}, false), kSuccess);
        saveAndLoad();
        EXPECT_EQ(text("/r/t"), value);
    }
}

TEST_F(XmlFile, SetsAChildElementOrMakesOne) {
    ASSERT_EQ(load("<r><c><?id 5?><id>7</id></c></r>"), kSuccess);
    const XmlDocument::Node parent = select("/r/c");
    EXPECT_EQ(m_document.getText("id", parent), L"7");
    XmlDocument::Node made;
    EXPECT_EQ(m_document.setChild("id", L"8", parent, false, &made), kSuccess);
    EXPECT_FALSE(made);
    EXPECT_EQ(m_document.setChild("id", L"9", parent, true, &made), kSuccess);
    EXPECT_TRUE(made);
    EXPECT_EQ(m_document.setChild("top", L"t", {}, true), kSuccess);
    saveAndLoad();
    EXPECT_TRUE(saved().ends_with("<r><c><?id 5?><id>8</id><id>9</id></c><top>t</top></r>")) << saved();
}

TEST_F(XmlFile, KeepsWhatItDoesNotKnow) {
    const std::string content =
        "\xEF\xBB\xBF<?xml version=\"1.0\" encoding=\"UTF-8\"?><!DOCTYPE r><!--c--><r a=\"&lt;&#10;\" "
        "x:y=\"z\"> <?p i?><!-- n --><![CDATA[&]]>\t<b/></r>";
    ASSERT_EQ(load(content), kSuccess);
    saveAndLoad();
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

}  // namespace
}  // namespace vexa::test
