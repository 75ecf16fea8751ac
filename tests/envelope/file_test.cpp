#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include "envelope/envelope_test_util.h"
#include "ofxkit/envelope/OEFile.h"
#include "ofxkit/ofxkit.h"

namespace {

const char kDefaultHeaders[] =
    "OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\n"
    "CHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";

std::string Text(const OEBuffer& buffer) {
  return buffer.GetBufferSize() ? std::string(buffer.GetBufferPtr(), buffer.GetBufferSize()) : std::string();
}

class FileTest : public EnvelopeTest {
 protected:
  // Writes file with a builder of the given line-end option.
  static std::string Written(OEDataObj& file, OEBuildStatus* status = nullptr, int lineEnd = 2) {
    OEBuffer out;
    OEBuilder builder(lineEnd);
    OEBuildStatus s = builder.Build(&out, &file, OE_BUILD_STRICT, 0);
    if (status) *status = s;
    return Text(out);
  }
  // Stores the nine headers of a clean file, with one of them replaced
  // (an empty replacement leaves that header out).
  static void SetCleanHeaders(OEFile& file, OEHeaderTag changed = OE_HEADER_UNKNOWN, const char* value = "") {
    static const char* const kValues[] = {"100", "OFXSGML", "102", "NONE", "USASCII",
                                          "1252", "NONE", "NONE", "NONE"};
    for (int t = OE_HEADER_OFXHEADER; t <= OE_HEADER_NEWFILEUID; ++t) {
      OEHeaderTag tag = static_cast<OEHeaderTag>(t);
      file.SetHeader(tag, tag == changed ? value : kValues[t - OE_HEADER_OFXHEADER]);
    }
  }
};

// ---------------------------------------------------------------------------
// Header values and MIME headers

TEST_F(FileTest, SetHeaderKeepsOnlyOFXHeadersWithValues) {
  OEFile file;
  EXPECT_EQ(file.SetHeader(OE_HEADER_VERSION, "103"), 1);
  EXPECT_EQ(file.SetHeader(OE_HEADER_DATA, ""), 0);
  for (int tag : {0, 1, -1, 11}) {  // CONTENT-TYPE, CONTENT-LENGTH, unknown, out of range
    EXPECT_EQ(file.SetHeader(static_cast<OEHeaderTag>(tag), "x"), 0);
    EXPECT_EQ(file.GetHeader(static_cast<OEHeaderTag>(tag)), nullptr);
  }
  ASSERT_NE(file.GetHeader(OE_HEADER_VERSION), nullptr);
  EXPECT_EQ(*file.GetHeader(OE_HEADER_VERSION), "103");
  EXPECT_EQ(file.ValidateHeader(OE_HEADER_DATA), 0);
  file.ClearHeaders();
  EXPECT_EQ(file.ValidateHeader(OE_HEADER_VERSION), 0);
}

TEST_F(FileTest, HandleHeaderStoresOFXHeadersAndCollectsMIMEHeaders) {
  OEFile file;
  OEString name("OFXHEADER");
  EXPECT_EQ(file.HandleHeader(OE_HEADER_OFXHEADER, "100", &name), OE_PARSE_OK);
  EXPECT_EQ(*file.GetHeader(OE_HEADER_OFXHEADER), "100");
  EXPECT_EQ(file.GetNumberMIMEHeaders(), 0);

  // Unknown names become MIME headers, named as written, in order.
  name = "Content-Type";
  EXPECT_EQ(file.HandleHeader(OE_HEADER_UNKNOWN, "text/plain", &name), OE_PARSE_OK);
  name = "X-Server";
  EXPECT_EQ(file.HandleHeader(OE_HEADER_UNKNOWN, "a", &name), OE_PARSE_OK);
  // A repeated name (any case) replaces the value, not the position.
  name = "content-TYPE";
  EXPECT_EQ(file.HandleHeader(OE_HEADER_UNKNOWN, "application/x-ofx", &name), OE_PARSE_OK);
  ASSERT_EQ(file.GetNumberMIMEHeaders(), 2);
  EXPECT_EQ(file.GetMIMEHeader(0)->GetValue(), "application/x-ofx");
  EXPECT_EQ(file.GetMIMEHeader(1)->GetName(), "X-Server");
  EXPECT_EQ(file.GetMIMEHeader(2), nullptr);
  EXPECT_EQ(file.GetMIMEHeader(-1), nullptr);
  EXPECT_EQ(file.GetMIMEHeader(size_t{1}), file.GetMIMEHeader(static_cast<unsigned short>(1)));
  OEString lookup("x-server");
  EXPECT_EQ(file.GetMIMEHeader(&lookup), file.GetMIMEHeader(1));
  EXPECT_EQ(file.GetMIMEHeader("CONTENT-TYPE"), file.GetMIMEHeader(0));
  EXPECT_EQ(file.GetMIMEHeader("content-length"), nullptr);
  EXPECT_EQ(file.GetMIMEHeader(static_cast<const OEString*>(nullptr)), nullptr);

  // An empty value is ignored; a line without a name cannot be kept.
  name = "X-Empty";
  EXPECT_EQ(file.HandleHeader(OE_HEADER_UNKNOWN, "", &name), OE_PARSE_OK);
  EXPECT_EQ(file.HandleHeader(OE_HEADER_UNKNOWN, "v", nullptr), OE_PARSE_NO_PARSER);
  OEString empty;
  EXPECT_EQ(file.HandleHeader(OE_HEADER_UNKNOWN, "v", &empty), OE_PARSE_NO_PARSER);
  EXPECT_EQ(file.GetNumberMIMEHeaders(), 2);
}

// ---------------------------------------------------------------------------
// Writing

TEST_F(FileTest, DefaultHeaderBlockIsWrittenExactly) {
  OEFileOFX file;
  OEBuildStatus status;
  EXPECT_EQ(Written(file, &status), kDefaultHeaders);
  EXPECT_EQ(status, OE_BUILD_OK);
  // Given values replace the defaults; the builder's option picks the line end.
  file.SetHeader(OE_HEADER_NEWFILEUID, "a1b2");
  file.SetHeader(OE_HEADER_VERSION, "103");
  EXPECT_EQ(Written(file, &status, 3),
            "OFXHEADER:100\nDATA:OFXSGML\nVERSION:103\nSECURITY:NONE\nENCODING:USASCII\n"
            "CHARSET:1252\nCOMPRESSION:NONE\nOLDFILEUID:NONE\nNEWFILEUID:a1b2\n\n");
}

TEST_F(FileTest, MIMEHeaderLines) {
  OEFile plain;
  plain.SetMIMEHeader("Content-Type", "application/x-ofx");
  plain.SetMIMEHeader("Content-Length", "42");
  EXPECT_EQ(Written(plain), "Content-Type: application/x-ofx\r\nContent-Length: 42\r\n");
  EXPECT_EQ(plain.SetMIMEHeader("", "x"), 0);

  // An OFX file marks its MIME headers with a blank line before its header block.
  OEFileOFX ofx;
  ofx.SetMIMEHeader("Content-Type", "application/x-ofx");
  EXPECT_EQ(Written(ofx), std::string("\r\n") + kDefaultHeaders);

  // Without parts, only the body and the closing boundary follow.
  plain.SetBoundary("b");
  plain.SetMIMEBody("epilogue");
  EXPECT_EQ(Written(plain), "Content-Type: application/x-ofx\r\nContent-Length: 42\r\nepilogue\n--b--\n");
}

// ---------------------------------------------------------------------------
// Header validation

struct HeaderCase {
  OEHeaderTag tag;
  const char* value;  // "" leaves the header out
  unsigned short result;
  OEParseWarning warning;
  int warnings;
};

TEST_F(FileTest, HeaderValidation) {
  const HeaderCase cases[] = {
      {OE_HEADER_UNKNOWN, "", 1, OEPW_BADFORMAT, 0},  // clean
      {OE_HEADER_VERSION, "103", 1, OEPW_BADFORMAT, 1},
      {OE_HEADER_OFXHEADER, "200", 1, OEPW_BADFORMAT, 1},
      {OE_HEADER_CHARSET, "ISO-8859-1", 1, OEPW_BADFORMAT, 1},
      {OE_HEADER_CHARSET, "1252", 1, OEPW_BADFORMAT, 0},
      {OE_HEADER_DATA, "XML", 0, OEPW_BADFORMAT, 1},
      {OE_HEADER_DATA, "ofxsgml", 1, OEPW_BADFORMAT, 0},  // read ignoring case
      {OE_HEADER_ENCODING, "UTF-8", 0, OEPW_BADFORMAT, 1},
      {OE_HEADER_COMPRESSION, "ZIP", 0, OEPW_BADFORMAT, 1},
      {OE_HEADER_SECURITY, "TYPE9", 1, OEPW_BADFORMAT, 0},  // not checked
      {OE_HEADER_OLDFILEUID, "1234", 1, OEPW_BADFORMAT, 0},
      {OE_HEADER_NEWFILEUID, "", 1, OEPW_MISSINGTAG, 1},
      {OE_HEADER_DATA, "", 1, OEPW_MISSINGTAG, 1},
  };
  for (const HeaderCase& c : cases) {
    SCOPED_TRACE(std::string(OEDataConversion::Text(c.tag) ? OEDataConversion::Text(c.tag) : "clean") + ":" +
                 c.value);
    log->DeleteAll();
    OEFileOFX file;
    file.SetType(OE_TAG_OFXFILERS);
    SetCleanHeaders(file, c.tag, c.value);
    EXPECT_EQ(file.ValidateHeaders(), c.result);
    ASSERT_EQ(log->Entries(), c.warnings);
    if (c.warnings == 0) continue;
    const OEParseException* w = log->Get(0);
    EXPECT_EQ(w->warning, c.warning);
    EXPECT_EQ(w->tagName, OEDataConversion::Text(c.tag));
    EXPECT_EQ(w->value, c.value);
    EXPECT_EQ(w->tag, OE_TAG_OFXFILERS);
    EXPECT_EQ(w->object, &file);
  }
}

// ---------------------------------------------------------------------------
// Request and response files

const char kBody[] =
    "<OFX>\r\n<SIGNONMSGSRSV1>\r\n<SONRS>\r\n<STATUS>\r\n<CODE>0\r\n<SEVERITY>INFO\r\n</STATUS>\r\n"
    "<DTSERVER>20050831165056.000[-8:PST]\r\n<LANGUAGE>ENG\r\n</SONRS>\r\n</SIGNONMSGSRSV1>\r\n</OFX>\r\n";

class ResponseFileTest : public FileTest {
 protected:
  // The clean header block with one line replaced ("" drops it).
  static std::string Headers(const char* line = nullptr, const char* replacement = "") {
    std::string text = kDefaultHeaders;
    if (line) {
      size_t at = text.find(line);
      text.replace(at, text.find("\r\n", at) + 2 - at, replacement);
    }
    return text;
  }
};

TEST_F(ResponseFileTest, WholeResponseParsesCleanly) {
  OEFileRs file;
  EXPECT_EQ(file.GetType(), OE_TAG_OFXFILERS);
  EXPECT_EQ(Parse(Headers() + kBody, &file), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  ASSERT_EQ(file.GetNumberOfResponse(), 1);
  EXPECT_EQ(file.GetNumberOfChildren(), 1);
  EXPECT_EQ(file.GetChild(0), file.GetResponse(0));
  EXPECT_EQ(file.GetResponse(0)->GetType(), OE_TAG_OFX);
  EXPECT_EQ(file.GetResponse(0)->GetNumMessage(), 1);
  const char* const values[] = {"100", "OFXSGML", "102", "NONE", "USASCII", "1252", "NONE", "NONE", "NONE"};
  for (int t = OE_HEADER_OFXHEADER; t <= OE_HEADER_NEWFILEUID; ++t) {
    const OEString* value = file.GetHeader(static_cast<OEHeaderTag>(t));
    ASSERT_NE(value, nullptr);
    EXPECT_EQ(*value, values[t - OE_HEADER_OFXHEADER]);
  }
  OEDataObj* lacking = &file;
  OETagID missing = OE_TAG_NONE;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&lacking, &missing), 1);

  // Written back and read again, it is the same file.
  std::string written = Written(file);
  EXPECT_EQ(written.compare(0, sizeof kDefaultHeaders - 1, kDefaultHeaders), 0);
  OEFileRs again;
  EXPECT_EQ(Parse(written, &again), OE_PARSE_OK);
  EXPECT_EQ(Written(again), written);
}

TEST_F(ResponseFileTest, HeaderDeviations) {
  struct Case {
    const char* line;
    const char* replacement;
    OEParseStatus status;
    OEParseWarning warning;
  };
  const Case cases[] = {
      {"VERSION", "VERSION:103\r\n", OE_PARSE_WARNINGS, OEPW_BADFORMAT},
      {"NEWFILEUID", "", OE_PARSE_WARNINGS, OEPW_MISSINGTAG},
      {"CHARSET", "CHARSET:8859-1\r\n", OE_PARSE_WARNINGS, OEPW_BADFORMAT},
      {"DATA", "DATA:XML\r\n", OE_PARSE_NOT_HANDLED, OEPW_BADFORMAT},
      {"COMPRESSION", "COMPRESSION:GZIP\r\n", OE_PARSE_NOT_HANDLED, OEPW_BADFORMAT},
      // Blanks around names, colons and values, LF line ends, any case.
      {"SECURITY", "  security :  NONE  \n", OE_PARSE_OK, OEPW_UNKNOWNEXCEPTION},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.replacement);
    OEFileRs file;
    EXPECT_EQ(Parse(Headers(c.line, c.replacement) + kBody, &file), c.status);
    if (c.status == OE_PARSE_OK) {
      EXPECT_EQ(log->Entries(), 0);
      EXPECT_EQ(*file.GetHeader(OE_HEADER_SECURITY), "NONE");
      continue;
    }
    ASSERT_EQ(log->Entries(), 1);
    EXPECT_EQ(log->Get(0)->warning, c.warning);
    EXPECT_EQ(log->Get(0)->tagName, c.line);
    // A refused header block stops the parse before the body.
    EXPECT_EQ(file.GetNumberOfResponse(), c.status == OE_PARSE_NOT_HANDLED ? 0 : 1);
  }
}

TEST_F(ResponseFileTest, SeveralOFXAggregatesInOrder) {
  OEFileRs file;
  EXPECT_EQ(Parse(Headers() + kBody + "<OFX>\r\n</OFX>\r\n", &file), OE_PARSE_OK);
  ASSERT_EQ(file.GetNumberOfResponse(), 2);
  EXPECT_EQ(file.GetResponse(0)->GetNumMessage(), 1);
  EXPECT_EQ(file.GetResponse(1)->GetNumMessage(), 0);
}

TEST_F(ResponseFileTest, MIMEHeaderLinesBeforeTheOFXHeaders) {
  OEFileRs file;
  EXPECT_EQ(Parse("Content-Type: application/x-ofx\r\nContent-Length: 512\r\n\r\n" + Headers() + kBody, &file),
            OE_PARSE_WARNINGS);
  // The header reader reports each name it does not know.
  EXPECT_EQ(Count(OEPW_BADFORMAT), 2);
  ASSERT_EQ(file.GetNumberMIMEHeaders(), 2);
  EXPECT_EQ(file.GetMIMEHeader(0)->GetName(), "Content-Type");
  EXPECT_EQ(file.GetMIMEHeader(0)->GetValue(), "application/x-ofx");
  EXPECT_EQ(file.GetMIMEHeader("content-length")->GetValue(), "512");
  EXPECT_EQ(file.GetNumberOfResponse(), 1);
  EXPECT_EQ(*file.GetHeader(OE_HEADER_VERSION), "102");

  // An unknown line in the second block, which is read without names, cannot be kept.
  OEFileRs second;
  EXPECT_EQ(Parse("X-A: 1\r\n\r\nOFXHEADER:100\r\nX-B: 2\r\n" + Headers("OFXHEADER") + kBody, &second),
            OE_PARSE_NO_PARSER);
}

TEST_F(ResponseFileTest, AFileTakesNoElementsAndNeedsAParser) {
  // A stray element before the OFX aggregate is refused, and ends the parse.
  OEFileRs file;
  EXPECT_EQ(Parse(Headers() + "<CODE>0\r\n" + kBody, &file), OE_PARSE_NOT_HANDLED);
  EXPECT_GE(Count(OEPW_INVALIDELEM), 1);
  EXPECT_EQ(file.GetNumberOfResponse(), 0);

  log->DeleteAll();
  OETagDictionaryEntry code{OE_TAG_CODE, "CODE"};
  EXPECT_EQ(file.HandleTagElement(&code, OEString("0")), OE_PARSE_NOT_HANDLED);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_INVALIDELEM);
  EXPECT_EQ(log->Get(0)->value, "0");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_CODE);

  OEFileRq unparsed;
  OETagDictionaryEntry ofx{OE_TAG_OFX, "OFX"};
  EXPECT_EQ(unparsed.HandleTagStart(&ofx), OE_PARSE_NO_PARSER);
  EXPECT_EQ(unparsed.GetNumberOfRequest(), 0);
}

TEST_F(ResponseFileTest, TextsWithoutHeaders) {
  OEFileRs file;
  EXPECT_EQ(Parse(kBody, &file), OE_PARSE_WARNINGS);
  EXPECT_EQ(Count(OEPW_MISSINGTAG), 9);
  EXPECT_EQ(file.GetNumberOfResponse(), 1);
  EXPECT_EQ(file.AllRequiredPresent(), 0);  // OFXHEADER not given
  OEFileRs empty;
  EXPECT_EQ(Parse("", &empty), OE_PARSE_WARNINGS);
  EXPECT_EQ(empty.GetNumberOfResponse(), 0);
}

TEST_F(ResponseFileTest, RequestFileWithDefaults) {
  OEFileRq file;
  EXPECT_EQ(file.GetType(), OE_TAG_OFXFILERQ);
  EXPECT_EQ(Written(file), kDefaultHeaders);
  EXPECT_EQ(file.AppendRequest(nullptr), 0);
  ASSERT_EQ(file.AppendRequest(new OERequest), 1);
  EXPECT_EQ(file.ValidateTag(OE_TAG_OFX), 1);
  EXPECT_EQ(Written(file, nullptr, 3),
            "OFXHEADER:100\nDATA:OFXSGML\nVERSION:102\nSECURITY:NONE\nENCODING:USASCII\n"
            "CHARSET:1252\nCOMPRESSION:NONE\nOLDFILEUID:NONE\nNEWFILEUID:NONE\n\n<OFX>\n</OFX>\n");
  // Replacing a request deletes the one it replaces.
  OERequest* second = new OERequest;
  EXPECT_EQ(file.SetRequest(0, second), 1);
  EXPECT_EQ(file.GetRequest(0), second);
  EXPECT_EQ(file.GetNumberOfRequest(), 1);
}

TEST_F(ResponseFileTest, MultipartFile) {
  OEFileRs first, second;
  ASSERT_EQ(Parse(Headers() + kBody, &first), OE_PARSE_OK);
  std::string other = kBody;
  other.replace(other.find("20050831"), 8, "20260101");
  ASSERT_EQ(Parse(Headers() + other, &second), OE_PARSE_OK);
  // Alone, each part is its header block and its OFX text.
  std::string firstText = Written(first).substr(sizeof kDefaultHeaders - 1);
  std::string secondText = Written(second).substr(sizeof kDefaultHeaders - 1);

  OEFile message;
  OEFileRs* parts[] = {new OEFileRs, new OEFileRs};
  ASSERT_EQ(parts[0]->DeepCopyFrom(&first), 1);
  ASSERT_EQ(parts[1]->DeepCopyFrom(&second), 1);
  for (OEFileRs* part : parts) {
    part->SetParent(&message);
    ASSERT_EQ(message.AppendSubfile(part), 1);
  }
  EXPECT_EQ(message.GetNumberOfChildren(), 2);
  EXPECT_EQ(message.GetChild(1), parts[1]);
  message.SetBoundary("b");
  const std::string expected = "--b\n\r\n" + std::string(kDefaultHeaders) + firstText + "--b\n\r\n" +
                               kDefaultHeaders + secondText + "--b--\n";
  OEBuildStatus status;
  EXPECT_EQ(Written(message, &status), expected);
  EXPECT_EQ(status, OE_BUILD_OK);
  // Each part now carries its size and type; a second build replaces them.
  EXPECT_EQ(Written(message), expected);
  ASSERT_EQ(parts[0]->GetNumberMIMEHeaders(), 2);
  EXPECT_EQ(parts[0]->GetMIMEHeader("content-length")->GetValue(), std::to_string(firstText.size()).c_str());
  EXPECT_EQ(parts[1]->GetMIMEHeader("content-length")->GetValue(), std::to_string(secondText.size()).c_str());
  EXPECT_EQ(parts[1]->GetMIMEHeader("content-type")->GetValue(), "application/x-ofx");

  // A part that cannot be written stops the build and names itself.
  OEFileRs* broken = new OEFileRs;
  broken->SetParent(&message);
  message.AppendSubfile(broken);
  OEBuffer out;
  OEBuilder builder;
  EXPECT_EQ(builder.Build(&out, &message, OE_BUILD_STRICT, 0), OE_BUILD_MISSING_REQUIRED);
  EXPECT_EQ(builder.GetObjectInError(), broken);
  // So does a gap in the parts.
  OEFile gapped;
  ASSERT_EQ(gapped.SetSubfile(1, new OEFile), 1);
  EXPECT_EQ(gapped.GetSubfile(0), nullptr);
  EXPECT_EQ(builder.Build(&out, &gapped, OE_BUILD_STRICT, 0), OE_BUILD_NO_OUTPUT);
}

TEST_F(ResponseFileTest, DeepCopies) {
  OEFile message;
  message.SetBoundary("xyz");
  message.SetMIMEBody("end");
  message.SetMIMEHeader("Content-Type", "multipart/mixed; boundary=xyz");
  message.SetHeader(OE_HEADER_NEWFILEUID, "n1");
  OEFileRs* response = new OEFileRs;
  ASSERT_EQ(Parse(Headers() + kBody + "<OFX>\r\n</OFX>\r\n", response), OE_PARSE_OK);
  response->SetParent(&message);
  message.AppendSubfile(response);
  OEFile* plain = new OEFile;
  plain->SetMIMEHeader("X-Note", "text");
  plain->SetParent(&message);
  message.AppendSubfile(plain);
  std::string original = Written(message);

  OEFile copy;
  copy.SetHeader(OE_HEADER_VERSION, "999");  // positions the source lacks are cleared
  copy.SetMIMEHeader("X-Old", "gone");
  ASSERT_EQ(copy.DeepCopyFrom(&message), 1);
  EXPECT_EQ(copy.GetHeader(OE_HEADER_VERSION), nullptr);
  EXPECT_EQ(*copy.GetHeader(OE_HEADER_NEWFILEUID), "n1");
  EXPECT_EQ(copy.GetBoundary(), "xyz");
  EXPECT_EQ(copy.GetMIMEBody(), "end");
  EXPECT_EQ(copy.GetMIMEHeader("X-Old"), nullptr);
  ASSERT_EQ(copy.GetNumberOfSubfiles(), 2);
  OEFileRs* copiedResponse = dynamic_cast<OEFileRs*>(copy.GetSubfile(0));
  ASSERT_NE(copiedResponse, nullptr);
  EXPECT_NE(copiedResponse, response);
  EXPECT_EQ(copiedResponse->GetParent(), &copy);
  ASSERT_EQ(copiedResponse->GetNumberOfResponse(), 2);
  EXPECT_NE(copiedResponse->GetResponse(0), response->GetResponse(0));
  EXPECT_EQ(copy.GetSubfile(1)->GetType(), OE_TAG_MIME);
  EXPECT_EQ(copy.GetSubfile(1)->GetParent(), &copy);
  EXPECT_EQ(copy.GetSubfile(1)->GetMIMEHeader("x-note")->GetValue(), "text");
  EXPECT_EQ(copy.DeepCopyFrom(&copy), 1);
  EXPECT_EQ(copy.DeepCopyFrom(static_cast<const OEFile*>(nullptr)), 0);

  EXPECT_EQ(Written(copy), original);

  // Nothing is shared: a copy outlives its source.
  {
    OEFile* source = new OEFile;
    ASSERT_EQ(source->DeepCopyFrom(&message), 1);
    OEFile last;
    ASSERT_EQ(last.DeepCopyFrom(source), 1);
    delete source;
    EXPECT_EQ(Written(last), original);
  }

  // A response file copies its responses and keeps its type.
  OEFileRs rs;
  ASSERT_EQ(rs.DeepCopyFrom(response), 1);
  EXPECT_EQ(rs.GetType(), OE_TAG_OFXFILERS);
  EXPECT_EQ(rs.GetParent(), nullptr);
  EXPECT_EQ(rs.GetNumberOfResponse(), 2);
  response->SetParent(nullptr);
  EXPECT_EQ(Written(rs), Written(*response));
}

#ifdef OFXKIT_CORPUS_DIR
TEST_F(ResponseFileTest, PublicSamples) {
  std::error_code error;
  std::filesystem::directory_iterator samples(OFXKIT_CORPUS_DIR, error);
  if (error) GTEST_SKIP() << "no public samples";
  for (const std::filesystem::directory_entry& sample : samples) {
    const std::string extension = sample.path().extension().string();
    if (extension != ".ofx" && extension != ".sgml") continue;
    SCOPED_TRACE(sample.path().filename().string());
    std::ifstream in(sample.path(), std::ios::binary);
    const std::string text((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    OEFileRs file;
    OEParseStatus status = Parse(text, &file);
    // The body may stop early (an aggregate without its class yet, a sample
    // that leaves an aggregate open), but never before the first OFX aggregate.
    EXPECT_TRUE(status == OE_PARSE_OK || status == OE_PARSE_WARNINGS || status == OE_PARSE_NO_PARSER ||
                status == OE_PARSE_END_MISMATCH)
        << status;
    EXPECT_GE(file.GetNumberOfResponse(), 1);
    const bool headed = text.compare(0, 10, "OFXHEADER:") == 0;
    EXPECT_EQ(file.ValidateHeader(OE_HEADER_OFXHEADER), headed ? 1 : 0);
    EXPECT_EQ(Count(OEPW_MISSINGTAG), headed ? 0 : 9);
  }
}
#endif

}  // namespace
