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

// What every reader takes or refuses, and in which encodings, is seen beside another one:
// system/store_xml.py.
TEST_F(XmlFile, IsRefusedWhereOtherReadersMayTakeIt) {
    for (const std::string& content : {"<?xml version='1.0' encoding='windows-1252'?><a/>"s,
                                       "<!DOCTYPE a [<!ENTITY e 'x'>]><a>&e;</a>"s, "<\0a\0/\0>\0"s})
        EXPECT_EQ(load(content), kFailure) << content;
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
