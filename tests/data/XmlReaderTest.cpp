// The XML dialect's reader: blocks, quirks and every refusal with its exact words.
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "data/XmlReader.h"
#include "host/HostServices.h"
#include "simengine/Engine.h"

namespace {

const std::string kDecl = "<?xml version=\"1.0\"?>";

struct ReadResult {
    bool opened = false;
    std::vector<std::string> blocks;
    std::vector<std::string> reports;
    std::string encoding;
};

// A tag as "name[/] attr=value ...", a text as "DATA:text" or "CDATA:text".
std::string Render(const XmlBlock& block)
{
    if (block.name == nullptr)
        return std::string(block.attributeNames[0]) + ":" + block.attributeValues[0];
    std::string out = block.name;
    if (block.closing)
        out += "/";
    for (int i = 0; i < block.count; ++i)
        out += std::string(" ") + block.attributeNames[i] + "=" + block.attributeValues[i];
    return out;
}

ReadResult ReadAll(const std::string& text)
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    hostServices = engine.Table();
    ReadResult result;
    XmlReader reader;
    result.opened = reader.OpenFromMemory("t.xml", text.data(), static_cast<int64_t>(text.size()));
    if (result.opened) {
        while (const XmlBlock* block = reader.ReadBlock())
            result.blocks.push_back(Render(*block));
        // Once refused or ended, the reader stays silent.
        EXPECT_EQ(reader.ReadBlock(), nullptr);
    }
    if (reader.Encoding() != nullptr)
        result.encoding = reader.Encoding();
    for (const simengine::LogLine& line : engine.Records().All().Logs(simengine::LogKind::Report))
        result.reports.push_back(line.text.substr(0, line.text.find('\0')));
    return result;
}

std::string ParseError(const std::string& reason, int line, char character, const std::string& excerpt)
{
    char text[1024];
    std::snprintf(
        text, sizeof text,
        "Parsing error (%s) around line %d in XML 't.xml'. Unexpected character '%c' (%x) at:\n'%s'",
        reason.c_str(), line, character, static_cast<unsigned>(static_cast<int>(character)), excerpt.c_str());
    return std::string(text, std::strlen(text));
}

struct Row {
    const char* name;
    std::string body;  // behind the declaration
    std::vector<std::string> blocks;
    std::vector<std::string> reports;
};

void Check(const Row& row)
{
    SCOPED_TRACE(row.name);
    const ReadResult result = ReadAll(kDecl + row.body);
    EXPECT_TRUE(result.opened);
    EXPECT_EQ(result.blocks, row.blocks);
    EXPECT_EQ(result.reports, row.reports);
}

TEST(XmlReaderBlocks, EndsOfInput)
{
    // Catches a block given for a tag or text cut off by the end of the input, and
    // a close tag at the very end that is lost. (The reading rules in between are
    // compared byte by byte with a model of them in XmlReaderModelTest.)
    const Row rows[] = {
        {"tag with attributes as last bytes gives nothing", "<a b=\"c\">", {}, {}},
        {"close tag as last bytes is a block", "<r></r>", {"r", "r/"}, {}},
        {"unfinished text at the end is dropped", "<a>tail", {"a"}, {}},
        {"whitespace alone is no block", " \n\t <a>", {"a"}, {}},
    };
    for (const Row& row : rows)
        Check(row);
}

TEST(XmlReaderErrors, EveryRefusal)
{
    // Catches a wrong reason, character, line or excerpt (or one cut a byte early or
    // late), and a reader that goes on reading after a refusal.
    const std::string expectQuote = "Expecting \" character to start value definition (all values must be "
                                    "defined name=\"value\" with quotes).";
    const Row rows[] = {
        {"> in text", "\n>", {}, {ParseError("not expecting '>'", 2, '>', ">")}},
        {"<< in a tag", "<<a>", {}, {ParseError("not expecting another '<'", 1, '<', "<a>")}},
        {"<> in a tag", "<>", {}, {ParseError("not expecting '<' yet", 1, '>', ">")}},
        {"nothing between values",
         "<a b=\"c\"d=\"e\">",
         {},
         {ParseError("Unexpected character after value definition.", 1, 'd', "\"d=\"e\">")}},
        {"quoted word then a letter in text",
         "x \"y\"z<a>",
         {},
         {ParseError("Unexpected character after value definition.", 1, 'z', "\"z<a>")}},
        // A byte above 127 prints in hex as the promoted plain char: ffffffe9.
        {"quoted word then a high byte",
         "x \"y\"\xe9<a>",
         {},
         {ParseError("Unexpected character after value definition.", 1, '\xe9', "\"\xe9<a>")}},
        {"no =", "<a b>\n", {}, {ParseError("Reading next block (case #1)", 1, '\0', ">\n")}},
        {"digit first in a name",
         "<a 1b=\"c\">\n",
         {},
         {ParseError("Reading next block (case #1)", 1, '\0', ">\n")}},
        {"no quotes",
         "<a b=c>\n",
         {},
         {ParseError(expectQuote, 1, 'c', ">\n"), ParseError("Reading next block (case #2)", 2, '\0', "\n")}},
        {"single quotes",
         "<a b='c'>x",
         {},
         {ParseError(expectQuote, 1, '\'', ">x"), ParseError("Reading next block (case #2)", 1, '\0', "x")}},
        {"unended cdata",
         "<a><![CDATA[x",
         {"a"},
         {ParseError("'![CDATA[' does not end with ']]>' pattern.", 1, ' ', "![CDATA[x")}},
        {"nested comment",
         "<a>\n<!-- <!-- -->",
         {"a"},
         {ParseError("New comment block start within a comment block.", 2, '<', " <!-- -->")}},
        {"unended comment",
         "<a><!-- xy",
         {"a"},
         {ParseError("Comment block not ended properly.", 1, ' ', "- xy")}},
        {"excerpt cut at 254 bytes",
         ">" + std::string(300, 'x'),
         {},
         {ParseError("not expecting '>'", 1, '>', ">" + std::string(253, 'x'))}},
        {"excerpt of 254 bytes whole",
         ">" + std::string(253, 'y'),
         {},
         {ParseError("not expecting '>'", 1, '>', ">" + std::string(253, 'y'))}},
        {"blocks before the error are given",
         "<a><b>\n\n<<",
         {"a", "b"},
         {ParseError("not expecting another '<'", 3, '<', "<")}},
    };
    for (const Row& row : rows)
        Check(row);
}

TEST(XmlReaderLimits, TokenBuffer)
{
    // Catches a text limit off by one, and a long tag or value that is refused
    // instead of cut.
    const std::string longest(XmlReader::kTokenLimit, 't');
    EXPECT_EQ(ReadAll(kDecl + longest + "<a>").blocks, (std::vector<std::string>{"DATA:" + longest, "a"}));

    const ReadResult overrun = ReadAll(kDecl + longest + "t<a>");
    EXPECT_TRUE(overrun.blocks.empty());
    ASSERT_EQ(overrun.reports.size(), 1u);
    EXPECT_EQ(overrun.reports[0].substr(0, 40), "Parsing error (buffer overrun) around li");

    // A value that overruns the buffer is cut, and the tag loses its '>'.
    const std::string value(20000, 'v');
    const ReadResult cut = ReadAll(kDecl + "<a b=\"" + value + "\"><c>");
    ASSERT_EQ(cut.blocks.size(), 2u);
    EXPECT_EQ(cut.blocks[0], "a b=" + value.substr(0, XmlReader::kTokenLimit - 6));
    EXPECT_EQ(cut.blocks[1], "c");
    EXPECT_TRUE(cut.reports.empty());
}

std::string Attributes(int count)
{
    std::string tag = "<e";
    for (int i = 0; i < count; ++i)
        tag += " a" + std::to_string(i) + "=\"" + std::to_string(i) + "\"";
    return tag + "><z>";
}

TEST(XmlReaderLimits, AttributeLimit)
{
    // Catches a limit reported at the wrong count, more than once, or attributes
    // stored beyond the tables.
    EXPECT_TRUE(ReadAll(kDecl + Attributes(511)).reports.empty());
    for (int count : {512, 513, 600}) {
        SCOPED_TRACE(count);
        const ReadResult result = ReadAll(kDecl + Attributes(count));
        EXPECT_EQ(result.reports,
                  (std::vector<std::string>{"Too many blocks (512 limit) in object 'e' in xml 't.xml'."}));
        ASSERT_EQ(result.blocks.size(), 2u);
        EXPECT_EQ(result.blocks[0].substr(result.blocks[0].size() - 9), " a511=511");
        EXPECT_EQ(result.blocks[1], "z");
    }
}

TEST(XmlReaderDeclaration, StartOfText)
{
    // Catches the two start messages swapped, a byte order mark not skipped, and a
    // cursor left inside the declaration.
    const std::string noDeclaration =
        "XML document needs to start with line like <?xml versions=... ?>. File 't.xml' doesn't.";
    struct DeclRow {
        const char* name;
        std::string text;
        bool opened;
        std::vector<std::string> reports;
        std::vector<std::string> blocks;
        std::string encoding;
    };
    const DeclRow rows[] = {
        {"empty", "", false, {noDeclaration}, {}, ""},
        {"whitespace", " \n\t ", false, {noDeclaration}, {}, ""},
        {"one byte <", "<", false, {noDeclaration}, {}, ""},
        {"starts with x",
         "xml",
         false,
         {"First non-whitespace char in XML document needs to be '<'. First char in 't.xml' is #120 'x'."},
         {},
         ""},
        {"byte above 127",
         "\xe9<",
         false,
         {"First non-whitespace char in XML document needs to be '<'. First char in 't.xml' is #233 '\xe9'."},
         {},
         ""},
        {"no ?>", "<root></root>", false, {noDeclaration}, {}, ""},
        {"?> right behind <", "<?><a>", false, {noDeclaration}, {}, ""},
        {"any first tag will do", "<zz ?><a>", true, {}, {"a"}, ""},
        {"plain", "<?xml version=\"1.0\"?><a>", true, {}, {"a"}, ""},
        {"bom and blank lines", "\xEF\xBB\xBF\n\n  <?xml version=\"1.0\"?>\n<a>", true, {}, {"a"}, ""},
        {"encoding", "<?xml version=\"1.0\" encoding=\"UTF-8\"?><a>", true, {}, {"a"}, "UTF-8"},
        {"encoding spaced, single quotes kept", "<?xml encoding = ' x '?><a>", true, {}, {"a"}, "'x'"},
        {"empty encoding", "<?xml encoding=\"\"?><a>", true, {}, {"a"}, ""},
    };
    for (const DeclRow& row : rows) {
        SCOPED_TRACE(row.name);
        const ReadResult result = ReadAll(row.text);
        EXPECT_EQ(result.opened, row.opened);
        EXPECT_EQ(result.reports, row.reports);
        EXPECT_EQ(result.blocks, row.blocks);
        EXPECT_EQ(result.encoding, row.encoding);
    }
}

TEST(XmlReaderEntities, ReplaceEntities)
{
    // Catches a single pass (which would turn "&amp;quot;" into a quote) and
    // entities that are not in the dialect.
    struct EntityRow {
        const char* in;
        const char* out;
    };
    const EntityRow rows[] = {
        {"", ""},
        {"&", "&"},
        {"&quot;", "\""},
        {"&amp;", "&"},
        {"&amp;quot;", "&quot;"},
        {"&quot;&quot;x", "\"\"x"},
        {"&amp;amp;", "&amp;"},
        {"&lt;&gt;&#34;", "&lt;&gt;&#34;"},
        {"&quot", "&quot"},
    };
    for (const EntityRow& row : rows) {
        SCOPED_TRACE(row.in);
        std::string value = row.in;
        XmlReader::ReplaceEntities(&value[0]);
        EXPECT_STREQ(value.c_str(), row.out);
    }
}

}  // namespace
