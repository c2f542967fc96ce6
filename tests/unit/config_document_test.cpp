// The simulated config store's file: what reads as a document, what its keys hold, and
// the bytes the store writes back, which must read back with every value as it was.
#include <gtest/gtest.h>

#include <algorithm>
#include <optional>
#include <string>

#include "sim/lib/config_document.h"

namespace {

constexpr const char* kDeclaration = "<?xml version=\"1.0\"?>\n";

// The file's text once read, or "(no document)".
std::string rewritten(const std::string& file)
{
    ConfigDocument document;
    return document.parse(file) ? document.text() : "(no document)";
}

std::string value_of(const ConfigDocument& document, const char* key)
{
    const std::optional<std::string_view> value = document.value(key);
    return value ? std::string(*value) : "(missing)";
}

} // namespace

TEST(ConfigDocument, ReadsAFileAndWritesItInTheStoresForm)
{
    const struct {
        const char* what;
        std::string file;
        std::string written;   // after the declaration
    } cases[] = {
        {"elements a line, empty ones closed at once", "<config><a>1</a><b></b><c><d/></c></config>",
         "<config>\n\t<a>1</a>\n\t<b />\n\t<c>\n\t\t<d />\n\t</c>\n</config>\n"},
        {"declaration, document type, comments and instructions go; attributes stay",
         "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\r\n<!DOCTYPE c SYSTEM \"c.dtd\" [<![IGNORE[ ' ]]>]>"
         "<!-- by hand --><c a='1 &amp; \"2\"'\tb=\"&#9;x\r\ny\"><?p x?><d>v</d></c>",
         "<c a=\"1 &amp; &quot;2&quot;\" b=\"&#09;x y\">\n\t<d>v</d>\n</c>\n"},
        {"texts beside elements stay on their line, parted where a comment parted them",
         "<c><a>x<!--n-->y<b/>z</a></c>", "<c>\n\t<a>x<!---->y<b />z</a>\n</c>\n"},
        {"line ends and references", "<c><a>1&#13;&#x41;&lt;\r\n2\r3</a></c>", "<c>\n\t<a>1&#13;A&lt;\n2\n3</a>\n</c>\n"},
        {"a text of blanks from a reference keeps one", "<c><a>&#32;<b/>y</a></c>", "<c>\n\t<a>&#32;<b />y</a>\n</c>\n"},
        {"CDATA sections stay", "<c><a><![CDATA[<x>&]]></a></c>", "<c>\n\t<a><![CDATA[<x>&]]></a>\n</c>\n"},
        {"a byte order mark and what follows the root", "\xEF\xBB\xBF<c/>text<d/>", "<c />\n<d />\n"},
    };
    for (const auto& [what, file, written] : cases)
        EXPECT_EQ(rewritten(file), kDeclaration + written) << what;

    // A NUL ends the file: what comes before must be a document.
    const std::string broken[] = {"", "  \n", "text", "<c>", "<c></d>", "<c a=1/>", "<c a='1'b='2'/>", "<1/>",
                                  "<c/ >", "<!x><c/>", "<!DOCTYPE c <x>><c/>", "<c><!DOCTYPE c></c>",
                                  "<!DOCTYPE c [<![ x ]>]><c/>", "<!DOCTYPE c [<!-x>]><c/>", "<c><!-- x</c>",
                                  "<? x?><c/>", std::string("<c>\0</c>", 8)};
    for (const std::string& file : broken)
        EXPECT_EQ(rewritten(file), "(no document)") << file;
    EXPECT_EQ(rewritten(std::string("<c>v</c>\0<", 10)), std::string(kDeclaration) + "<c>v</c>\n");
}

TEST(ConfigDocument, KeysHoldTheirFirstTextAsFarAsANul)
{
    ConfigDocument document;
    ASSERT_TRUE(document.parse("<c><a> <b>1</b>x<b>2</b>y</a><e/><n>&#65;&#0;z</n><d><![CDATA[q]]>r</d></c>"));
    const struct {
        const char* key;
        const char* value;
    } cases[] = {{"/a", "x"}, {"/a/b", "1"}, {"//a//b/", "1"}, {"", ""}, {"/e", ""}, {"/n", "A"}, {"/d", "q"},
                 {"/a/c", "(missing)"}, {"/b", "(missing)"}};
    for (const auto& [key, value] : cases)
        EXPECT_EQ(value_of(document, key), value) << key;
}

TEST(ConfigDocument, SetValuesReadBackThroughTheFile)
{
    ConfigDocument document;
    ASSERT_TRUE(document.parse("<c><a><![CDATA[old]]>more</a><n>1</n></c>"));
    const struct {
        const char* key;
        std::string value;
    } cases[] = {
        {"/a", "in ]]> place"}, {"/n", "<&>\"'"}, {"/new/deeper", "\r\n\x01\t"}, {"/blank", " "},
        {"/blanks", "\t\n "}, {"/empty", ""},
    };
    for (const auto& [key, value] : cases)
        ASSERT_TRUE(document.set(key, value)) << key;
    EXPECT_FALSE(document.set("/a b", "x"));
    EXPECT_FALSE(document.set("/1", "x"));

    const std::string written = document.text();
    EXPECT_EQ(written, std::string(kDeclaration) +
                           "<c>\n\t<a>in ]]&gt; place<!---->more</a>\n\t<n>&lt;&amp;&gt;\"'</n>\n"
                           "\t<new>\n\t\t<deeper>&#13;\n&#01;\t</deeper>\n\t</new>\n"
                           "\t<blank>&#32;</blank>\n\t<blanks>&#09;\n </blanks>\n\t<empty></empty>\n</c>\n");
    ConfigDocument again;
    ASSERT_TRUE(again.parse(written));
    for (const auto& [key, value] : cases)
        EXPECT_EQ(value_of(again, key), value) << key;
}

TEST(ConfigDocument, WritesADeepFileWithoutOutgrowingIt)
{
    std::string file = "<c>";
    for (int i = 0; i < 100000; ++i)
        file += "<a>";
    file += "v";
    for (int i = 0; i < 100000; ++i)
        file += "</a>";
    file += "</c>";
    ConfigDocument document;
    ASSERT_TRUE(document.parse(file));
    const std::string written = document.text();
    EXPECT_EQ(written.find(std::string(64, '\t')), std::string::npos);
    EXPECT_LT(written.size(), 2 * file.size());
    ConfigDocument again;
    ASSERT_TRUE(again.parse(written));
    std::string key;
    for (int i = 0; i < 100000; ++i)
        key += "/a";
    EXPECT_EQ(value_of(again, key.c_str()), "v");
}
