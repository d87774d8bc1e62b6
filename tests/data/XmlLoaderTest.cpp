// Loading XML databases through the engine's files: the root/array/node shape,
// the loader's messages, the envelope, and the retry popup.
#include <optional>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "data/Database.h"
#include "data/ScrambledEnvelope.h"
#include "host/HostServices.h"
#include "simengine/Engine.h"

namespace {

const std::string kDecl = "<?xml version=\"1.0\"?>\n";
const std::string kPath = "d.xml";
const std::string kPopup = "CANCEL_TRY_CONTINUE,Failed to load XML file 'd.xml'.";

std::string Text(const char* text)
{
    return text != nullptr ? text : "~";
}

// Arrays as "name(pairs)[node|node]", a node as "id:name=value,...", null as "~".
std::string Render(const Database& database)
{
    std::string out;
    for (const DataArray* array : database.arrays) {
        if (!out.empty())
            out += " ";
        out += Text(array->name.text) + "(";
        for (int i = 0; i < array->values.count; ++i)
            out += (i ? "," : "") + Text(array->values[i].name.text) + "=" + Text(array->values[i].value);
        out += ")[";
        for (int n = 0; n < array->nodes.count; ++n) {
            const DataNode* node = array->nodes[n];
            out += (n ? "|" : "") + Text(node->id.text) + ":";
            for (int i = 0; i < node->values.count; ++i)
                out += (i ? "," : "") + Text(node->values[i].name.text) + "=" + Text(node->values[i].value);
        }
        out += "]";
    }
    return out;
}

struct Load {
    bool loaded = false;
    std::string tree;
    std::vector<std::string> reports;
    std::vector<std::string> popups;
};

simengine::Engine& FreshEngine()
{
    simengine::Engine& engine = simengine::Engine::Instance();
    engine.Reset();
    hostServices = engine.Table();
    return engine;
}

Load LoadFile(const std::string& bytes, const std::vector<std::optional<std::string>>& answers = {})
{
    simengine::Engine& engine = FreshEngine();
    engine.Files().AddMemoryFile(kPath, bytes);
    for (const auto& answer : answers)
        engine.Commands().QueuePopupAnswer(answer);
    Database database;
    Load result;
    result.loaded = database.Load(kPath.c_str());
    result.tree = Render(database);
    const simengine::JournalView journal = engine.Records().All();
    for (const simengine::LogLine& line : journal.Logs(simengine::LogKind::Report))
        result.reports.push_back(line.text);
    result.popups = journal.Popups();
    return result;
}

std::string NotInRoot(const char* name)
{
    return std::string(
               "DataManager: XML database needs to be contained within 'root' block (not expecting '") +
           name + "'). 'd.xml' is invalid.";
}
const std::string kNoRootClosing =
    "DataManager: XML database needs to end with root block closing. 'd.xml' is invalid.";
const std::string kBlockAfterRoot = "DataManager: No blocks can exist after </root>. 'd.xml' is invalid.";
std::string NotAnArray(const char* name)
{
    return std::string("DataManager: root/array/node structure violated. '") + name +
           "' is not 'array'. 'd.xml' is invalid.";
}
const std::string kEndsUnexpectedly = "DataManager: File 'd.xml' ends unexpectedly. Not loaded.";
const std::string kEnclosingArrays =
    "DataManager: File 'd.xml' has enclosing arrays which is not supported. Not loaded.";
std::string NotArrayOrNode(const char* name)
{
    return std::string(
               "DataManager: in 'd.xml' is expecting to find two types of elements inside root: 'array' and "
               "'node'. '") +
           name + "' is not one of them.";
}
std::string ErrorAfterNode(int count, const char* id)
{
    return "DataManager: error parsing file 'd.xml' after node #" + std::to_string(count) + " with id '" +
           id + "'.";
}
std::string StructureAfterNode(int count, const char* id)
{
    return ErrorAfterNode(count, id).substr(0, ErrorAfterNode(count, id).size() - 1) +
           ". Basic root/array/node structure violated.";
}

// The opening and closing of a file with one array "A", around the rows' nodes.
const std::string A = "<root><array id=\"A\">";
const std::string Z = "</array></root>";

struct Row {
    const char* name;
    std::string body;  // behind the declaration
    std::string tree;  // "" for a refused file
    std::vector<std::string> reports;
};

TEST(XmlLoader, Shapes)
{
    // Catches a loader that mis-nests, keeps a partial tree after a refusal, or
    // takes a node's pairs, text and id from the wrong place.
    const Row rows[] = {
        {"smallest", "<root></root>", "", {}},
        {"self-closing array creates nothing", "<root><array id=\"A\"/></root>", "", {}},
        {"empty array", A + Z, "A()[]", {}},
        {"array pairs, last id and value win",
         "<root><array id=\"A\" x=\"1\" id=\"B\" x=\"2\" y=\"3\"></array></root>",
         "B(x=2,y=3)[]",
         {}},
        {"array without id", "<root><array></array></root>", "~()[]", {}},
        {"node forms alike",
         A + "<node id=\"a\"></node><node id=\"a\"/><node id=\"a\"> </node>" + Z,
         "A()[a:id=a|a:id=a|a:id=a]",
         {}},
        {"node text", A + "<node id=\"a\">hello</node>" + Z, "A()[a:id=a,DATA=hello]", {}},
        {"node cdata", A + "<node id=\"a\"><![CDATA[x<y]]></node>" + Z, "A()[a:id=a,CDATA=x<y]", {}},
        {"block behind text dropped unseen",
         A + "<node id=\"a\">x<node id=\"b\"/>" + Z,
         "A()[a:id=a,DATA=x]",
         {}},
        {"open node then self-closing node with attributes",
         A + "<node id=\"a\"><node id=\"b\" c=\"d\"/>" + Z,
         "A()[a:id=a|b:id=b,c=d]",
         {}},
        {"self-closing node ends at </array>", A + "<node id=\"a\"/>" + Z, "A()[a:id=a]", {}},
        {"stray </node> is a node", A + "</node>" + Z, "A()[~:]", {}},
        {"node without id", A + "<node v=\"1\"/>" + Z, "A()[~:v=1]", {}},
        {"repeated id: last is the id", A + "<node id=\"a\" id=\"b\"/>" + Z, "A()[b:id=a,id=b]", {}},
        {"two arrays and </array> at top level",
         A + Z.substr(0, 8) + "</array><array id=\"B\"><node id=\"x\"/>" + Z,
         "A()[] B()[x:id=x]",
         {}},
        {"text behind </root> at the end", "<root></root>\ntail", "", {}},
        {"parse error behind </root>",
         "<root></root>>",
         "",
         {"Parsing error (not expecting '>') around line 2 in XML 'd.xml'. Unexpected character '>' (3e) "
          "at:\n'>'"}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        const Load result = LoadFile(kDecl + row.body);
        EXPECT_TRUE(result.loaded);
        EXPECT_EQ(result.tree, row.tree);
        EXPECT_EQ(result.reports, row.reports);
        EXPECT_TRUE(result.popups.empty());
    }
}

TEST(XmlLoader, Refusals)
{
    // Catches a wrong message, a wrong count or id in ErrorAfterNode/StructureAfterNode, a partial tree left
    // behind, and a refusal without its popup.
    const Row rows[] = {
        {"NotInRoot self-closing root", "<root/>", "", {NotInRoot("root")}},
        {"NotInRoot other element", "<base></base>", "", {NotInRoot("base")}},
        {"NotInRoot text first", "text<root></root>", "", {NotInRoot("null")}},
        {"NotInRoot no block at all", "", "", {NotInRoot("null")}},
        {"NoRootClosing root then end", "<root>", "", {kNoRootClosing}},
        {"NoRootClosing missing </root>", A + "<node id=\"a\"/></array>", "", {kNoRootClosing}},
        {"NoRootClosing after a </array> at top level", "<root></array>", "", {kNoRootClosing}},
        {"BlockAfterRoot tag behind </root>", "<root></root><x>", "", {kBlockAfterRoot}},
        {"BlockAfterRoot text then tag behind </root>", "<root></root> t <x>", "", {kBlockAfterRoot}},
        {"NotAnArray", "<root><node id=\"a\"/></root>", "", {NotAnArray("node")}},
        {"NotAnArray open root again", "<root><root>", "", {NotAnArray("root")}},
        {"NotAnArray text", "<root>t<array>", "", {NotAnArray("null")}},
        {"EndsUnexpectedly", A + "\n", "", {kEndsUnexpectedly}},
        {"EnclosingArrays", A + "<array id=\"B\">\n", "", {kEnclosingArrays}},
        {"NotArrayOrNode other element", A + "<item/>" + Z, "", {NotArrayOrNode("item")}},
        {"NotArrayOrNode </root> inside an array", A + "</root>", "", {NotArrayOrNode("root")}},
        {"NotArrayOrNode second text behind a node",
         A + "<node id=\"a\">one</node>two<node/>" + Z,
         "",
         {NotArrayOrNode("null")}},
        {"ErrorAfterNode no block behind node", A + "<node id=\"a\">\n", "", {ErrorAfterNode(1, "a")}},
        {"ErrorAfterNode counts over arrays, null id",
         A + "<node id=\"a\"/></array><array><node/><node>\n",
         "",
         {ErrorAfterNode(3, "null")}},
        {"StructureAfterNode open node then </array>",
         A + "<node id=\"a\"></array></root>",
         "",
         {StructureAfterNode(1, "a")}},
        {"StructureAfterNode open node then open node",
         A + "<node id=\"a\"><node id=\"b\">" + Z,
         "",
         {StructureAfterNode(1, "a")}},
        {"parse error then kEndsUnexpectedly",
         A + "<<",
         "",
         {"Parsing error (not expecting another '<') around line 2 in XML 'd.xml'. Unexpected character '<' "
          "(3c) at:\n'<'",
          kEndsUnexpectedly}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        const Load result = LoadFile(kDecl + row.body);
        EXPECT_FALSE(result.loaded);
        EXPECT_EQ(result.tree, row.tree);
        EXPECT_EQ(result.reports, row.reports);
        EXPECT_EQ(result.popups, std::vector<std::string>{kPopup});
    }
}

TEST(XmlLoader, EveryPrefixOfAValidFileFails)
{
    // Catches a loader that accepts a truncated file, or crashes on one; the full
    // file up to and behind "</root>" loads.
    const std::string file =
        kDecl + "<root>\n <array id=\"A\" k=\"v\">\n  <node id=\"a\" x=\"&quot;1\\n\">t</node>\n"
                "  <!-- c --><node id=\"b\"/>\n  <node><![CDATA[z]]></node>\n </array>\n</root>\n";
    const size_t complete = file.find("</root>") + 7;
    for (size_t length = 0; length <= file.size(); ++length) {
        SCOPED_TRACE(length);
        const Load result = LoadFile(file.substr(0, length));
        EXPECT_EQ(result.loaded, length >= complete);
        if (length >= complete)
            EXPECT_EQ(result.tree, "A(k=v)[a:id=a,x=\"1\n,DATA=t|b:id=b|~:CDATA=z]");
        else
            EXPECT_EQ(result.tree, "");
        EXPECT_EQ(result.popups.size(), length >= complete ? 0u : 1u);
    }
}

TEST(XmlLoader, RetryPopup)
{
    // Catches a retry on an answer other than the exact word, a loop that stops
    // early, or a file that is not read anew.
    const std::string bad = kDecl + "<root>";
    const Load gaveUp = LoadFile(bad, {std::string("TRY_AGAIN"), std::string("try_again")});
    EXPECT_FALSE(gaveUp.loaded);
    EXPECT_EQ(gaveUp.reports, (std::vector<std::string>{kNoRootClosing, kNoRootClosing}));
    EXPECT_EQ(gaveUp.popups, (std::vector<std::string>{kPopup, kPopup}));

    EXPECT_EQ(LoadFile(bad, {std::nullopt}).popups.size(), 1u);
    EXPECT_EQ(LoadFile(bad, {std::string("TRY_AGAIN "), std::string("TRY_AGAIN")}).popups.size(), 1u);

    // A missing file has no message of its own: only the popup after each attempt.
    simengine::Engine& engine = FreshEngine();
    engine.Files().InjectOpenFailure(kPath);
    engine.Commands().QueuePopupAnswer(std::string("TRY_AGAIN"));
    Database database;
    EXPECT_FALSE(database.Load(kPath.c_str()));
    EXPECT_TRUE(engine.Records().All().Logs(simengine::LogKind::Report).empty());
    EXPECT_EQ(engine.Records().All().Popups(), (std::vector<std::string>{kPopup, kPopup}));
    EXPECT_EQ(database.arrays.count, 0);
}

std::string Envelope(const std::string& plain)
{
    std::string out(envelope::kHeaderSize + plain.size(), '\0');
    std::copy(envelope::kMagic, envelope::kMagic + envelope::kMagicSize, out.begin());
    const uint32_t sum = envelope::Scramble(reinterpret_cast<const unsigned char*>(plain.data()),
                                            static_cast<int32_t>(plain.size()),
                                            reinterpret_cast<unsigned char*>(&out[envelope::kHeaderSize]));
    const uint32_t length = static_cast<uint32_t>(plain.size());
    for (int i = 0; i < 4; ++i) {
        out[14 + i] = static_cast<char>(length >> (8 * i));
        out[18 + i] = static_cast<char>(sum >> (8 * i));
    }
    return out;
}

TEST(ScrambledEnvelope, KnownBytes)
{
    // Catches a key or index that does not wrap, and an unsigned checksum (the
    // scrambler as the reader's inverse is run by DataToolsTest). Worked by hand: stored byte 0x01
    // at index 1 with key 'O' (0x4F) gives 0x01 + 0x4F + 1 = 0x51; index 13 reuses
    // key 'M'; stored 0xFF at index 2 adds -2 to the sum.
    const unsigned char stored[3] = {0x00, 0x01, 0xFF};
    unsigned char plain[3];
    EXPECT_EQ(envelope::Descramble(stored, 3, plain), static_cast<uint32_t>(1 - 2));
    EXPECT_EQ(plain[0], 'M');
    EXPECT_EQ(plain[1], 0x51);
    EXPECT_EQ(plain[2], static_cast<unsigned char>(0xFF + 'R' + 2));

    // Index 13 wraps to key byte 0, index 256 adds 0: a zero stored byte there
    // gives exactly the key byte.
    const std::vector<unsigned char> zeros(257, 0);
    std::vector<unsigned char> out(257);
    envelope::Descramble(zeros.data(), 257, out.data());
    EXPECT_EQ(out[13], static_cast<unsigned char>('M' + 13));
    EXPECT_EQ(out[256], static_cast<unsigned char>(envelope::kMagic[256 % 13]));
}

TEST(ScrambledEnvelope, ReadByContent)
{
    // Catches an envelope told by name, a length or checksum not enforced, and a
    // header check that looks at fewer bytes than the magic and its terminator.
    const std::string good = kDecl + "<root><array id=\"A\"></array></root>";
    const std::string envelopeBytes = Envelope(good);
    const std::string notFound =
        "XML document needs to start with line like <?xml versions=... ?>. File 'd.xml' doesn't.";
    std::string oneMore = envelopeBytes + "x";
    std::string oneLess = envelopeBytes.substr(0, envelopeBytes.size() - 1);
    std::string negative = envelopeBytes;
    negative[17] = '\x80';
    std::string changedLate = envelopeBytes;
    changedLate[envelope::kHeaderSize + 5] ^= 1;
    std::string otherTerminator = envelopeBytes;
    otherTerminator[13] = '!';
    const std::string shortMagic = std::string(envelope::kMagic, envelope::kMagicSize) + "1234567";

    struct EnvelopeRow {
        const char* name;
        std::string bytes;
        bool loaded;
        std::vector<std::string> reports;
    };
    const EnvelopeRow rows[] = {
        {"envelope", envelopeBytes, true, {}},
        {"one byte more", oneMore, false, {}},
        {"one byte less", oneLess, false, {}},
        {"negative length", negative, false, {}},
        {"changed stored byte", changedLate, false, {}},
        {"empty payload", Envelope(""), false, {notFound}},
        {"other 14th byte is plain",
         otherTerminator,
         false,
         {"First non-whitespace char in XML document needs to be '<'. First char in 'd.xml' is #77 'M'."}},
        {"21 bytes with the magic is plain",
         shortMagic,
         false,
         {"First non-whitespace char in XML document needs to be '<'. First char in 'd.xml' is #77 'M'."}},
    };
    for (const EnvelopeRow& row : rows) {
        SCOPED_TRACE(row.name);
        const Load result = LoadFile(row.bytes);
        EXPECT_EQ(result.loaded, row.loaded);
        EXPECT_EQ(result.reports, row.reports);
        EXPECT_EQ(result.tree, row.loaded ? "A()[]" : "");
    }

    // Index 0 has the weight 0: changing it goes unnoticed, and changes one byte of
    // text ('<' of the declaration becomes '=').
    std::string firstByte = envelopeBytes;
    firstByte[envelope::kHeaderSize] = static_cast<char>(firstByte[envelope::kHeaderSize] + 1);
    EXPECT_EQ(
        LoadFile(firstByte).reports,
        (std::vector<std::string>{
            "First non-whitespace char in XML document needs to be '<'. First char in 'd.xml' is #61 '='."}));
}

TEST(XmlLoader, ShortReadAndFailedOpen)
{
    // Catches a reader that trusts a short read's missing bytes, or reports a
    // missing file itself.
    simengine::Engine& engine = FreshEngine();
    engine.Files().AddMemoryFile(kPath, kDecl + "<root></root>");
    engine.Files().InjectShortRead(kPath, static_cast<int64_t>(kDecl.size()) + 6);
    Database database;
    EXPECT_FALSE(database.Load(kPath.c_str()));
    const auto reports = engine.Records().All().Logs(simengine::LogKind::Report);
    ASSERT_EQ(reports.size(), 1u);
    EXPECT_EQ(reports[0].text, kNoRootClosing);
}

}  // namespace
