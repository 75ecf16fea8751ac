#include <gtest/gtest.h>

#include <chrono>
#include <dirent.h>

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/parse/OEParseEngine.h"
#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEBuffer.h"

#include "support/log_fixture.h"

namespace {

// Opens the protected item layer for the tests.
class Engine : public OEParseEngine {
 public:
  using OEParseEngine::OEParseEngine;
  using OEParseEngine::CopyCurrTagItemToBuffer;
  using OEParseEngine::CurrentItem;
  using OEParseEngine::CurrTagItemType;
  using OEParseEngine::ExpandSgmlMacros;
  using OEParseEngine::FindPreviousNonWhiteSpace;
  using OEParseEngine::FindWhiteSpaces;
  using OEParseEngine::GetOETagInternal;
  using OEParseEngine::GetOeTagItem;
  using OEParseEngine::GetOneItemFromOEBuffer;
  using OEParseEngine::GetTagData;
  using OEParseEngine::IsCommentTag;
  using OEParseEngine::IsWhiteSpace;
  using OEParseEngine::NextTagType;
  using OEParseEngine::SkipWhiteSpaces;
};

using Item = OEParseEngine::OETagItemInfo;
using Strings = std::vector<std::string>;
const Strings kNoWarnings;

class ParseEngineTest : public LogFixture {
 protected:

  // The buffer's allocation is exactly the text, so that a read past the end
  // shows under AddressSanitizer.
  OEBuffer& Load(const std::string& text) {
    buffer.reset(new OEBuffer(static_cast<uint32_t>(text.size())));
    if (!text.empty()) buffer->WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
    engine.reset(new Engine(*buffer));
    return *buffer;
  }

  // Every GetOETag result up to OE_TAG_DONE: "<NAME" start, "</NAME" end,
  // "NAME=value" element, "FAILED". Stops after maxSteps (a hang guard).
  Strings Tags(size_t maxSteps = 10000) {
    Strings out;
    OETagDictionaryEntry entry{OE_TAG_NONE, nullptr};
    OEString value;
    for (size_t i = 0; i < maxSteps; ++i) {
      switch (engine->GetOETag(entry, value)) {
        case OE_TAG_START: out.push_back(std::string("<") + entry.name); break;
        case OE_TAG_END: out.push_back(std::string("</") + entry.name); break;
        case OE_TAG_ELEMENT: out.push_back(std::string(entry.name) + "=" + value.c_str()); break;
        case OE_TAG_FAILED: out.push_back("FAILED"); break;
        case OE_TAG_DONE: return out;
      }
    }
    out.push_back("NO END");
    return out;
  }
  Strings Tags(const std::string& text) {
    Load(text);
    return Tags();
  }

  // The log as "WARNING name=... value=... tag=..." lines (empty parts left out).
  Strings Warnings() const {
    Strings out;
    for (unsigned short i = 0; i < log->Entries(); ++i) {
      const OEParseException* r = log->Get(i);
      std::string line = OEParseException::WarningName(r->warning);
      if (!r->tagName.IsEmpty()) line += std::string(" name=") + r->tagName.c_str();
      if (!r->value.IsEmpty()) line += std::string(" value=") + r->value.c_str();
      if (r->tag) line += std::string(" tag=") + OETagDictionary::TheOETagDictionary()->GetTagString(r->tag);
      out.push_back(line);
    }
    return out;
  }

  Strings Headers() {
    Strings out;
    OEHeaderTag tag;
    OEString value, name;
    while (engine->GetHeader(tag, value, &name))
      out.push_back(std::string(name.c_str()) + "(" + std::to_string(tag) + ")=" + value.c_str());
    return out;
  }

  std::unique_ptr<OEBuffer> buffer;
  std::unique_ptr<Engine> engine;
};


// ---------------------------------------------------------------------------
// Lexical rules: what GetOETag delivers for a text and what it logs.

struct LexCase {
  const char* text;
  Strings tags;
  Strings warnings;
};

const LexCase kLexCases[] = {
    {"<CODE>0\r\n<SEVERITY>INFO", {"CODE=0", "SEVERITY=INFO"}, {}},
    {"<OFX>\r\n  <SIGNONMSGSRSV1>\n</SIGNONMSGSRSV1></OFX>",
     {"<OFX", "<SIGNONMSGSRSV1", "</SIGNONMSGSRSV1", "</OFX"},
     {}},
    {"<OFX><  /  OFX  >", {"<OFX", "</OFX"}, {}},
    {"<STATUS><CODE>0</CODE><SEVERITY>INFO</STATUS>",
     {"<STATUS", "CODE=0", "</CODE", "SEVERITY=INFO", "</STATUS"},
     {}},
    // Attributes are ignored; text before the first '<' is not read.
    {"junk <OFX version=\"1\"></OFX>", {"<OFX", "</OFX"}, {}},
    // Values lose surrounding whitespace.
    {"<ORG>  \t Example  Bank \t \r\n<FID>1234 </FI>", {"ORG=Example  Bank", "FID=1234", "</FI"}, {}},
    // Macros: three known names in any case, expanded once.
    {"<NAME>Smith &amp; Sons &nbsp;", {"NAME=Smith & Sons &nbsp;"}, {}},
    {"<NAME>&AMP;&Lt;b&gT; &amp;lt; & &; a&b", {"NAME=&<b> &lt; & &; a&b"}, {}},
    // Comments vanish, also right after a value.
    {"<OFX><!-- note --> <!----><CODE>0   <!-- OK -->\r\n<SEVERITY>INFO</OFX>",
     {"<OFX", "CODE=0", "SEVERITY=INFO", "</OFX"},
     {}},
    // CDATA is kept as written, with the text after it, unexpanded.
    {"<MEMO><![CDATA[a<b> &amp; c]]> tail \r\n<CODE>0", {"MEMO=<![CDATA[a<b> &amp; c]]> tail", "CODE=0"}, {}},
    {"<MEMO><! [ cdata [x]y]>z<CODE>0", {"MEMO=<! [ cdata [x]y]>z", "CODE=0"}, {}},
    {"<code>0<Severity>INFO",
     {"CODE=0", "SEVERITY=INFO"},
     {"OEPW_LOWERCASE name=code tag=CODE", "OEPW_LOWERCASE name=Severity tag=SEVERITY"}},
    // Unknown tags are skipped: an element with its value, an aggregate up to
    // its end tag (ignoring case, nesting not counted), an unclosed one as an
    // empty tag, one at the very end not at all.
    {"<XYZ>abc<CODE>0", {"CODE=0"}, {"OEPW_UNKNOWNTAG name=XYZ"}},
    {"<XYZ><CODE>1<XYZ>2</xyz>stray</XYZ><CODE>0",
     {"CODE=0"},
     {"OEPW_UNKNOWNTAG name=XYZ", "OEPW_BADFORMAT value=stray", "OEPW_UNKNOWNTAG name=XYZ"}},
    {"<OFX><XYZ><CODE>0</OFX>", {"<OFX", "CODE=0", "</OFX"}, {"OEPW_UNKNOWNTAG name=XYZ", "OEPW_BADFORMAT value=XYZ"}},
    {"<!DOCTYPE x><OFX></OFX>",
     {"<OFX", "</OFX"},
     {"OEPW_UNKNOWNTAG name=!DOCTYPE", "OEPW_BADFORMAT value=!DOCTYPE"}},
    {"<OFX><XYZ>", {"<OFX"}, {"OEPW_UNKNOWNTAG name=XYZ", "OEPW_SKIPFAILED name=XYZ"}},
    {"<xyz>1<CODE>0", {"CODE=0"}, {"OEPW_LOWERCASE name=xyz", "OEPW_UNKNOWNTAG name=xyz"}},
    // Stray text, unknown end tags and a "comment" that is none.
    {"</STATUS>stray<!-- c -->more</XYZ><!-->x<CODE>0",
     {"</STATUS", "CODE=0"},
     {"OEPW_BADFORMAT value=stray", "OEPW_BADFORMAT value=more", "OEPW_UNKNOWNTAG name=XYZ",
      "OEPW_UNKNOWNTAG name=!--"}},
};

TEST_F(ParseEngineTest, LexicalRules) {
  for (const LexCase& c : kLexCases) {
    log->DeleteAll();
    EXPECT_EQ(Tags(c.text), c.tags) << c.text;
    EXPECT_EQ(Warnings(), c.warnings) << c.text;
  }
}

// Plain tags whose names were met before are read in one quick pass; the
// same text with a comment before every tag is read the general way
// throughout. Both must deliver the same tags, values and warnings. Each text
// is read twice in a row, so that its second half meets known names.
TEST_F(ParseEngineTest, KnownTagsReadAlikeOnEveryPath) {
  const std::string texts[] = {
      // Values with macros before, on and after the eight-byte steps of the
      // value scan, and with trailing whitespace of every kind.
      "<NAME>a&amp;b<NAME>0123456&amp;<NAME>01234567&amp;x<NAME>012345678901234&lt;<NAME>x  \t\r\n"
      "<NAME>&amp<NAME>&<NAME>&;<MEMO>0123456789012345678901234567890123&gt;56789<MEMO>plain text past sixteen   ",
      // Names past sixteen bytes that differ only after them, and dotted names.
      "<CHGUSERINFOSYNCRQ><CHGUSERINFOSYNCRS></CHGUSERINFOSYNCRQ></CHGUSERINFOSYNCRS>"
      "<V.PAYROLLENROLLRQ>x</V.PAYROLLENROLLRQ><V.PAYROLLENROLLRS>y</V.PAYROLLENROLLRS>",
      // Lower-case names are warned about every time; unknown ones are skipped.
      "<code>0<code>1<CODE>2<Code>3<XYZ>4<xyz>5",
      // Odd spacing and attributes.
      "<OFX >< CODE>0</ OFX><OFX a=1><CODE >1</OFX >",
      // A control character inside a name, and a value that runs to the end.
      "<CO\x01" "DE>0<CODE>1<MEMO>to the end &amp; beyond  ",
      // Aggregates followed by tags, comments, CDATA and whitespace.
      "<OFX><!-- c --><STATUS></STATUS><BANKMSGSRSV1>\r\n</BANKMSGSRSV1><MEMO><![CDATA[x]]></OFX>",
      // The text ends right after a start tag.
      "<OFX><CODE>0<SEVERITY>",
  };
  for (const std::string& once : texts) {
    const std::string text = once + once;
    log->DeleteAll();
    const Strings quick = Tags(text);
    const Strings quickWarnings = Warnings();
    std::string general;
    for (char c : text) {
      if (c == '<') general += "<!---->";
      general += c;
    }
    log->DeleteAll();
    EXPECT_EQ(Tags(general), quick) << text;
    EXPECT_EQ(Warnings(), quickWarnings) << text;
  }
  // Both readings share the memory of names met: names alike in their first
  // sixteen bytes must still be told apart.
  EXPECT_EQ(Tags("<CHGUSERINFOSYNCRQ></CHGUSERINFOSYNCRS><CHGUSERINFOSYNCRS></CHGUSERINFOSYNCRQ></CHGUSERINFOSYNCRS>"),
            (Strings{"<CHGUSERINFOSYNCRQ", "</CHGUSERINFOSYNCRS", "<CHGUSERINFOSYNCRS", "</CHGUSERINFOSYNCRQ",
                     "</CHGUSERINFOSYNCRS"}));
}

TEST_F(ParseEngineTest, MacrosExpandInPlace) {
  Load("");
  OEString in("x &lt;&gt; y"), out;
  EXPECT_EQ(engine->ExpandSgmlMacros(in, out), 1);
  EXPECT_EQ(out, "x <> y");
  EXPECT_EQ(engine->ExpandSgmlMacros(in, in), 1);
  EXPECT_EQ(in, "x <> y");
}

TEST_F(ParseEngineTest, StartTagWithNothingAfterItFails) {
  Load("<OFX><SIGNONMSGSRSV1>  \r\n<!-- c -->");
  OETagDictionaryEntry entry{OE_TAG_NONE, nullptr};
  OEString value("stale");
  EXPECT_EQ(engine->GetOETag(entry, value), OE_TAG_START);
  EXPECT_EQ(entry.id, OE_TAG_OFX);
  EXPECT_EQ(engine->GetOETag(entry, value), OE_TAG_FAILED);
  EXPECT_EQ(entry.id, OE_TAG_OFX);  // untouched
  EXPECT_EQ(value, "");
  EXPECT_EQ(engine->GetOETag(entry, value), OE_TAG_DONE);
  EXPECT_EQ(engine->GetOETag(entry, value), OE_TAG_DONE);
}

TEST_F(ParseEngineTest, GetTagIDReturnsEveryKnownTag) {
  Load("<OFX><xx></OFX>");
  OETagID id = OE_TAG_CODE;
  ASSERT_NE(engine->GetTagID(&id), nullptr);
  EXPECT_EQ(id, OE_TAG_OFX);
  const OETagDictionaryEntry* end = engine->GetTagID(&id);
  ASSERT_NE(end, nullptr);
  EXPECT_EQ(end->id, OE_TAG_OFX);
  EXPECT_EQ(engine->CurrTagItemType(), OEParseEngine::OEITEM_ENDTAG);
  EXPECT_EQ(engine->GetTagID(&id), nullptr);
  EXPECT_EQ(id, OE_TAG_NONE);
}

TEST_F(ParseEngineTest, ADictionaryCanBeSupplied) {
  static const OETagDictionaryEntry kTable[] = {{OE_TAG_CODE, "KODE"}};
  TagDictionary mine(kTable, 1);
  Load("<KODE>1<CODE>2");
  EXPECT_EQ(engine->SetDictionary(&mine), 1);
  EXPECT_EQ(Tags(), (Strings{"KODE=1"}));  // the entry of the given dictionary
  EXPECT_EQ(Warnings(), (Strings{"OEPW_UNKNOWNTAG name=CODE"}));
  Load("<CODE>2");
  engine->SetDictionary(&mine);
  engine->SetDictionary(nullptr);  // back to the shared one
  EXPECT_EQ(Tags(), (Strings{"CODE=2"}));
}

// ---------------------------------------------------------------------------
// Items and the look-ahead slot

TEST_F(ParseEngineTest, ItemsDescribeTheirText) {
  OEBuffer& b = Load("  <OFX a=b>\r\n value  \r\n</ CODE><![CDATA[x]]>y <!-- c --><");
  // Each item as "type:text@end", comments marked with '!'.
  Strings items;
  Item item;
  while (Engine::GetOneItemFromOEBuffer(b, item)) {
    items.push_back(std::to_string(item.type) + (Engine::IsCommentTag(b, item) ? "!" : ":") +
                    std::string(buffer->GetBufferPtr() + item.start, item.length) + "@" + std::to_string(item.end));
  }
  EXPECT_EQ(items, (Strings{"0:OFX@11", "2:value@23", "1:CODE@31", "3:<![CDATA[x]]>y@46", "0!!--@56", "0:@57"}));
  EXPECT_EQ(item.type, OEParseEngine::OEITEM_NONE);

  Item skipping;
  skipping.end = 46;
  ASSERT_EQ(Engine::GetOETagInternal(b, skipping), 1);  // passes over the comment
  EXPECT_EQ(skipping.start, 57);
}

TEST_F(ParseEngineTest, PeekingDoesNotConsume) {
  Load("<CODE>0<SEVERITY>INFO");
  ASSERT_EQ(engine->GetOeTagItem(), 1);
  EXPECT_EQ(engine->NextTagType(), OEParseEngine::OEITEM_DATA);
  EXPECT_EQ(engine->NextTagType(), OEParseEngine::OEITEM_DATA);
  EXPECT_EQ(engine->CurrTagItemType(), OEParseEngine::OEITEM_STARTTAG);
  OEString text;
  EXPECT_EQ(engine->GetTagData(text, 0, 0), 1);
  EXPECT_EQ(text, "0");
  EXPECT_EQ(engine->CopyCurrTagItemToBuffer(text, 1, 1), 1);
  EXPECT_EQ(engine->NextTagType(), OEParseEngine::OEITEM_STARTTAG);
  ASSERT_EQ(engine->GetOeTagItem(), 1);
  EXPECT_EQ(engine->GetTagData(text, 0, 0), 1);
  EXPECT_EQ(text, "INFO");
  EXPECT_EQ(engine->NextTagType(), OEParseEngine::OEITEM_NONE);
  EXPECT_EQ(engine->GetOeTagItem(), 0);
}

TEST_F(ParseEngineTest, CopiesReadOnFromTheSamePlace) {
  Load("<OFX><CODE>0</OFX>");
  OETagDictionaryEntry entry{OE_TAG_NONE, nullptr};
  OEString value;
  ASSERT_EQ(engine->GetOETag(entry, value), OE_TAG_START);  // <CODE> waits in the look-ahead slot
  Engine copy(*engine);
  EXPECT_EQ(copy.GetOETag(entry, value), OE_TAG_ELEMENT);
  EXPECT_EQ(value, "0");
  EXPECT_EQ(engine->GetOETag(entry, value), OE_TAG_ELEMENT);
  Engine assigned(*buffer);
  assigned = copy;
  EXPECT_EQ(assigned.GetOETag(entry, value), OE_TAG_END);
  EXPECT_EQ(entry.id, OE_TAG_OFX);
}

TEST_F(ParseEngineTest, TextAddedToTheBufferIsRead) {
  Load("<CODE>0");
  EXPECT_EQ(Tags(), (Strings{"CODE=0"}));
  const std::string more(5000, ' ');  // enough to move the buffer's storage
  buffer->WriteLarge(more.data(), static_cast<uint32_t>(more.size()));
  *buffer += "<SEVERITY>INFO";
  EXPECT_EQ(Tags(), (Strings{"SEVERITY=INFO"}));
}

TEST_F(ParseEngineTest, WhitespaceHelpers) {
  EXPECT_EQ(Engine::IsWhiteSpace(' ') + Engine::IsWhiteSpace('\n') + Engine::IsWhiteSpace('\r') +
                Engine::IsWhiteSpace('\t'),
            4);
  EXPECT_EQ(Engine::IsWhiteSpace('\0') + Engine::IsWhiteSpace('\v') + Engine::IsWhiteSpace('\f') +
                Engine::IsWhiteSpace('x'),
            0);
  EXPECT_EQ(Engine::IsWhiteSpace(static_cast<const char*>(nullptr)), 1);
  EXPECT_EQ(Engine::IsWhiteSpace(" \t\r\n"), 1);
  EXPECT_EQ(Engine::IsWhiteSpace(" x "), 0);

  OEBuffer& b = Load(std::string("ab \r\n\tcd  \0  e", 14));
  EXPECT_EQ(Engine::SkipWhiteSpaces(b, 2), 6);
  EXPECT_EQ(Engine::SkipWhiteSpaces(b, 8), 10);  // stops at the NUL
  EXPECT_EQ(Engine::FindWhiteSpaces(b, 0), 2);
  EXPECT_EQ(Engine::FindWhiteSpaces(b, 10), 10);
  EXPECT_EQ(Engine::FindPreviousNonWhiteSpace(b, 6), 2);
  EXPECT_EQ(Engine::FindPreviousNonWhiteSpace(b, 10), 8);
  EXPECT_EQ(Engine::FindPreviousNonWhiteSpace(b, 0), -1);
}

// ---------------------------------------------------------------------------
// Header block

TEST_F(ParseEngineTest, HeaderLinesUpToTheBlankLine) {
  Load("OFXHEADER : 100\r\nDATA:OFXSGML\r\n\r\n<OFX></OFX>");
  EXPECT_EQ(Headers(), (Strings{"OFXHEADER(2)=100", "DATA(3)=OFXSGML"}));
  EXPECT_EQ(engine->GetHeaderPos(), 33);  // the line after the blank line
  engine->ResetToEndOfHeader();
  EXPECT_EQ(Tags(), (Strings{"<OFX", "</OFX"}));
  EXPECT_EQ(Warnings(), kNoWarnings);
}

TEST_F(ParseEngineTest, HeaderBlockEndsWhereTheBodyBegins) {
  Load("OFXHEADER:100\nSECURITY:\nVERSION:102 <!-- note -->\n<OFX><DTSERVER>20050831165056.000[-8:PST]");
  EXPECT_EQ(Headers(), (Strings{"OFXHEADER(2)=100", "SECURITY(5)=", "VERSION(4)=102"}));
  engine->ResetToEndOfHeader();
  EXPECT_EQ(Tags(), (Strings{"<OFX", "DTSERVER=20050831165056.000[-8:PST]"}));
}

TEST_F(ParseEngineTest, MimeHeadersThenOfxHeaders) {
  Load("Content-Type: application/x-ofx\r\nnot a header\r\n<!-- c --> Content-Length: 10\r\n\r\n"
       "OFXHEADER:100\r\n\r\n<OFX>");
  EXPECT_EQ(Headers(), (Strings{"Content-Type(-1)=application/x-ofx", "Content-Length(-1)=10"}));
  EXPECT_EQ(Headers(), (Strings{"OFXHEADER(2)=100"}));
  EXPECT_EQ(Headers(), Strings{});
  EXPECT_EQ(Warnings(), (Strings{"OEPW_BADFORMAT value=Content-Type", "OEPW_BADFORMAT value=Content-Length"}));
}

TEST_F(ParseEngineTest, TagReadingStartsAtTheFirstTagUntilReset) {
  Load("OFXHEADER:100\r\n\r\n<OFX></OFX>");
  EXPECT_EQ(Tags(), (Strings{"<OFX", "</OFX"}));
  EXPECT_EQ(Headers(), (Strings{"OFXHEADER(2)=100"}));
}

// ---------------------------------------------------------------------------
// MIME

TEST_F(ParseEngineTest, FileTypeFromTheTextAfterTheHeaders) {
  OEString ofx("application/x-ofx"), upper("APPLICATION/X-OFX"), plain("text/plain");
  Load("<OFX><SIGNONMSGSRQV1><SONRQ></SONRQ><SONRS>");
  EXPECT_EQ(engine->GetFileType(&ofx), OEMIME_OFXRESPONSE);
  EXPECT_EQ(engine->GetFileType(&upper), OEMIME_OFXRESPONSE);
  EXPECT_EQ(engine->GetFileType(&plain), OEMIME_UNKNOWN);
  EXPECT_EQ(engine->GetFileType(nullptr), OEMIME_UNKNOWN);
  Load("<OFX><sonrq>");
  EXPECT_EQ(engine->GetFileType(&ofx), OEMIME_OFXREQUEST);
  Load(std::string(200, ' ') + "<SONRS>");  // beyond the first 200 characters
  EXPECT_EQ(engine->GetFileType(&ofx), OEMIME_UNKNOWN);
}

TEST_F(ParseEngineTest, BoundaryFromTheContentType) {
  Load("");
  OEString boundary;
  OEString quoted("multipart/mixed; boundary=\"ABC\"");
  EXPECT_EQ(engine->GetMIMEBoundary(quoted, boundary), 1);
  EXPECT_EQ(boundary, "abc");
  OEString bare("MultiPart/Mixed; BOUNDARY=Part_1 x");
  EXPECT_EQ(engine->GetMIMEBoundary(bare, boundary), 1);
  EXPECT_EQ(boundary, "part_1");
  OEString longOne(("multipart/mixed; boundary=" + std::string(100, 'b')).c_str());
  EXPECT_EQ(engine->GetMIMEBoundary(longOne, boundary), 1);
  EXPECT_EQ(boundary.GetStrLength(), 71);
  for (const char* bad : {"text/plain; boundary=x", "multipart/mixed", "multipart/mixed; boundary"}) {
    OEString type(bad);
    EXPECT_EQ(engine->GetMIMEBoundary(type, boundary), 0) << bad;
  }
}

TEST_F(ParseEngineTest, MimePartsBetweenBoundaryLines) {
  Load("preamble\r\n--abc\r\nContent-Type: application/x-ofx\r\n\r\nBODY1\r\n--abc\r\nsecond\r\n--abc--\r\n");
  OEString boundary("abc"), body;
  EXPECT_EQ(engine->FindMIMEBoundary(boundary), OEBOUND_FOUND);
  EXPECT_EQ(engine->GetHeaderPos(), 17);
  EXPECT_EQ(Headers(), (Strings{"Content-Type(-1)=application/x-ofx"}));
  ASSERT_EQ(engine->GetMIMEBody(boundary, body), 1);
  EXPECT_EQ(body, "BODY1\r\n");
  EXPECT_EQ(engine->FindMIMEBoundary(boundary), OEBOUND_FOUND);
  ASSERT_EQ(engine->GetMIMEBody(boundary, body), 1);
  EXPECT_EQ(body, "second\r\n");
  EXPECT_EQ(engine->FindMIMEBoundary(boundary), OEBOUND_LAST);
  EXPECT_EQ(engine->FindMIMEBoundary(boundary), OEBOUND_NONE);

  int32_t position = 0;
  Load("text --abc\n--abc");  // dashes need not begin a line; the last has no line feed after it
  EXPECT_EQ(engine->FindMIMEBoundary(boundary, position), OEBOUND_FOUND);
  EXPECT_EQ(position, 11);
  EXPECT_EQ(engine->FindMIMEBoundary(boundary, position), OEBOUND_NONE);
}

// ---------------------------------------------------------------------------
// Robustness: no input may crash, hang or read outside the text.

TEST_F(ParseEngineTest, TextEndsAtTheFirstNul) {
  EXPECT_EQ(Tags(std::string("<CODE>0\0<SEVERITY>INFO", 22)), (Strings{"CODE=0"}));
  Load(std::string("OFXHEADER:1\0\n00\n", 16));
  EXPECT_EQ(Headers(), Strings{});
}

TEST_F(ParseEngineTest, BrokenConstructsEndTheText) {
  const char* const inputs[] = {"<", "< ", "</", "<!", "<![", "<![CDATA[", "<![CDATA[x]", "<![CDATA[x]]",
                                "<![CDATA[x]]]", "<!--", "<!-- x", "<!-- x --", "<<<<", "<OFX<CODE>0",
                                "<OFX><!-- never closed", "<MEMO><![CDATA[abc", "&&&&;", ">>>"};
  for (const char* text : inputs) {
    Strings tags = Tags(text);
    EXPECT_TRUE(tags.empty() || tags.back() != "NO END") << text;
    Load(text);
    Headers();
  }
  EXPECT_EQ(Tags("<OFX><![CDATA[abc"), (Strings{"<OFX"}));
}

TEST_F(ParseEngineTest, HugeNamesAndValues) {
  const std::string name(70000, 'A');
  EXPECT_EQ(Tags("<" + name + "><CODE>0"), (Strings{"CODE=0"}));
  EXPECT_EQ(Tags("<MEMO>" + std::string(60000, 'v') + "<CODE>0"),
            (Strings{"MEMO=" + std::string(60000, 'v'), "CODE=0"}));
  EXPECT_EQ(Tags("<MEMO>" + std::string(70000, 'v')), (Strings{"FAILED"}));  // too long for a string
  EXPECT_EQ(Tags("<MEMO>" + std::string(70000, '&')), (Strings{"FAILED"}));
}

// Inputs that would make a naive engine quadratic must stay fast.
TEST_F(ParseEngineTest, PathologicalInputsStayLinear) {
  log->EnableLogging(0);
  std::string unclosed, cdata, lines, amps;
  // Unclosed unknown tags, CDATA openings whose closing fails at the very
  // end, header lines without a colon before a far one (and a far "--" for
  // the boundary search), and a value full of '&'.
  for (int i = 0; i < 100000; ++i) unclosed += "<X" + std::to_string(i) + ">";
  for (int i = 0; i < 200000; ++i) cdata += "<![CDATA[>";
  cdata += "]]";
  for (int i = 0; i < 1000000; ++i) lines += "x\n";
  lines += ":--c";
  amps = "<MEMO>" + std::string(60000, '&') + ";";
  const std::string inputs[] = {unclosed, cdata, lines, amps};
  for (const std::string& text : inputs) {
    const auto start = std::chrono::steady_clock::now();
    Load(text);
    Headers();
    OEString boundary("b");
    EXPECT_EQ(engine->FindMIMEBoundary(boundary), OEBOUND_NONE);
    engine->ResetToEndOfHeader();
    Tags(1000000);
    const auto seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    EXPECT_LT(seconds, 10.0) << text.substr(0, 40);
  }
}

// Random texts over the characters that matter to the lexer, through every
// operation. Under the sanitizers this shows any read outside the text.
TEST_F(ParseEngineTest, RandomTextsAreSurvived) {
  log->EnableLogging(0);
  static const char* const kPieces[] = {"<", ">", "/", "!", "[", "]", "-", "--", "&", ";", ":", "=", "\"",
                                        " ", "\r\n", "\n", "\t", "" /* a NUL */, "CDATA",
                                        "OFX", "CODE", "xyz", "0", "&amp;", "<!--", "-->", "OFXHEADER",
                                        "multipart", "SONRS"};
  const size_t kCount = sizeof kPieces / sizeof kPieces[0];
  uint32_t seed = 12345;
  auto next = [&seed] {
    seed = seed * 1103515245u + 12345u;
    return seed >> 16;
  };
  for (int round = 0; round < 3000; ++round) {
    std::string text;
    const uint32_t pieces = next() % 60;
    for (uint32_t i = 0; i < pieces; ++i) {
      const uint32_t k = next() % kCount;
      if (k == 17) text.push_back('\0');
      else text += kPieces[k];
    }
    Load(text);
    Strings tags = Tags(text.size() * 2 + 10);
    ASSERT_TRUE(tags.empty() || tags.back() != "NO END") << round;
    Load(text);
    Headers();
    Headers();
    OEString type("x-ofx"), boundary("--"), body;
    engine->GetFileType(&type);
    engine->GetMIMEBody(boundary, body);
    engine->FindMIMEBoundary(boundary);
    engine->ResetToEndOfHeader();
    Tags(text.size() * 2 + 10);
    engine->SkipCurrentTag();
  }
}

// ---------------------------------------------------------------------------
// Public sample files, when they are present.

TEST_F(ParseEngineTest, CorpusFilesReadCleanly) {
  DIR* dir = opendir(OFXKIT_CORPUS_DIR);
  if (!dir) GTEST_SKIP() << "no corpus at " << OFXKIT_CORPUS_DIR;
  int files = 0;
  while (dirent* e = readdir(dir)) {
    const std::string name = e->d_name;
    if (name.size() < 5 || (name.substr(name.size() - 4) != ".ofx" && name.substr(name.size() - 5) != ".sgml"))
      continue;
    FILE* f = fopen((std::string(OFXKIT_CORPUS_DIR) + "/" + name).c_str(), "rb");
    ASSERT_NE(f, nullptr) << name;
    std::string text;
    char chunk[4096];
    size_t n;
    while ((n = fread(chunk, 1, sizeof chunk, f)) > 0) text.append(chunk, n);
    fclose(f);
    ++files;
    log->DeleteAll();
    Load(text);
    Headers();
    Headers();
    engine->ResetToEndOfHeader();
    const Strings tags = Tags();
    ASSERT_FALSE(tags.empty()) << name;
    EXPECT_EQ(tags.front(), "<OFX") << name;
    EXPECT_EQ(tags.back(), "</OFX") << name;
    for (const std::string& t : tags) EXPECT_NE(t, "FAILED") << name;
    // Tags outside the vocabulary (CHECKNUM, 401(k) details) are skipped with
    // their values; nothing else may be reported.
    for (const std::string& w : Warnings()) EXPECT_EQ(w.rfind("OEPW_UNKNOWNTAG ", 0), 0u) << name << ": " << w;
  }
  closedir(dir);
  if (files == 0) GTEST_SKIP() << "corpus is empty";
}

}  // namespace
