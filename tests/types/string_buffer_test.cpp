#include <gtest/gtest.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>
#include <utility>

#include "ofxkit/ofxkit.h"

TEST(OEString, LimitIsAdvisoryAndSurvivesAssignment) {
  OEString32 s;
  std::string forty(40, 'x');
  s = forty.c_str();
  EXPECT_EQ(s.GetStrLength(), 40);
  EXPECT_FALSE(s.IsValid());
  EXPECT_TRUE(s.ExceedsSpecLength());
  s.TruncateToSpec();
  EXPECT_EQ(s.GetStrLength(), 32);
  EXPECT_TRUE(s.IsValid());

  s = "";
  EXPECT_TRUE(s.IsNull());
  EXPECT_EQ(s.SpecLength(), 32);
  EXPECT_STREQ(static_cast<const char*>(s), "");

  // Assigning a string with another limit keeps the fixed limit.
  OEString unlimited("abc");
  s = unlimited;
  EXPECT_EQ(s.SpecLength(), 32);
  EXPECT_EQ(s, "abc");
  // ... while a plain string takes the source's limit.
  OEString plain;
  plain = s;
  EXPECT_EQ(plain.SpecLength(), 32);

  OEString3 three("abc");
  OEString3 copied(three);
  OEString3 assigned;
  assigned = three;
  EXPECT_EQ(copied.SpecLength(), 3);
  EXPECT_EQ(assigned.SpecLength(), 3);
  EXPECT_EQ(assigned, "abc");
}

TEST(OEString, NullAndEmptyCompareEqual) {
  OEString empty("");
  OEString null;
  EXPECT_TRUE(empty == null);
  EXPECT_TRUE(empty == "");
  EXPECT_TRUE(null == static_cast<const char*>(nullptr));
  EXPECT_FALSE(null == "a");
  EXPECT_TRUE(null != "a");
  EXPECT_EQ(OEString("Bank").strcmpi("bANK"), 1);
  EXPECT_EQ(OEString("Bank").strcmpi("Banks"), 0);
  EXPECT_EQ(OEString().strcmpi(""), 1);
  EXPECT_EQ(OEString("a").strcmpi(nullptr), 0);
  EXPECT_FALSE(OEString("ab") == OEString("abc"));
}

TEST(OEString, ClearLockAndAppend) {
  OEString s;
  char* p = s.LockBuffer(10);
  ASSERT_NE(p, nullptr);
  strcpy(p, "abc");
  s.UnlockBuffer();
  EXPECT_EQ(s.GetStrLength(), 3);
  s.Clear('*');
  EXPECT_EQ(s, "*********");
  s.Clear(0);
  EXPECT_TRUE(s.IsEmpty());
  EXPECT_FALSE(s.IsNull());  // the block stays

  OEString t("ab");
  t += 'c';
  t += '\0';
  t += "de";
  t += static_cast<const char*>(nullptr);
  EXPECT_EQ(t, "abcde");
  // Appending part of itself must not read freed memory.
  t += static_cast<const char*>(t);
  EXPECT_EQ(t, "abcdeabcde");
  t = t + 5;
  EXPECT_EQ(t, "abcde");

  OEString a("x"), b("y");
  b.SetEncoding(OE_ENCODE_CDATA);
  OEString c = a + b;
  EXPECT_EQ(c, "xy");
  EXPECT_EQ(c.GetEncoding(), OE_ENCODE_CDATA);
  EXPECT_EQ(c.SpecLength(), OEString::kNoLimit);
}

TEST(OEString, BlanksAndCase) {
  OEString ws(" \t\r\n");
  EXPECT_TRUE(ws.IsWhiteSpace());
  EXPECT_FALSE(OEString(" a ").IsWhiteSpace());
  EXPECT_TRUE(OEString().IsWhiteSpace());

  OEString s("  Hello World  ");
  s.TrimLeadingSpaces();
  s.TrimTrailingSpaces();
  EXPECT_EQ(s, "Hello World");
  s.MakeUpper();
  EXPECT_EQ(s, "HELLO WORLD");
  s.MakeLower();
  EXPECT_EQ(s, "hello world");
  OEString tabs("\tx\t");
  tabs.TrimTrailingSpaces();
  EXPECT_EQ(tabs.GetStrLength(), 3);  // only spaces are trimmed
}

TEST(OEString, OverlongTextIsRefused) {
  std::string huge(70000, 'a');
  OEString s("keep");
  s = huge.c_str();
  EXPECT_TRUE(s.IsNull());  // cannot be held in a 16-bit length
  std::string max(65534, 'b');
  s = max.c_str();
  EXPECT_EQ(s.GetStrLength(), 65534);
}

TEST(OEString, SpecialLimits) {
  OEUserPassword pw;
  EXPECT_EQ(pw.SpecLength(), 171);
  pw.SetSpecLength32();
  pw = OEString("secret");
  EXPECT_EQ(pw.SpecLength(), 32);

  OEEMailMsgBody body;
  EXPECT_FALSE(body.IsValid());  // empty
  body = std::string(2160, 'm').c_str();
  EXPECT_TRUE(body.IsValid());
  body = std::string(2161, 'm').c_str();
  EXPECT_FALSE(body.IsValid());
  OEString10000 longText("text");
  body = longText;
  EXPECT_EQ(body.SpecLength(), 10000);
  body = OEString("text");
  EXPECT_EQ(body.SpecLength(), 2000);

  OEMultiLenString multi;
  multi.SetSpecLength(12);
  multi = OEString("abc");
  EXPECT_EQ(multi.SpecLength(), 12);
}

// The limit belongs to the target in every assignment, also through a
// reference to the base class and from a temporary.
TEST(OEString, LimitBelongsToTheTargetThroughABaseReference) {
  const std::string forty(40, 'x');
  OEString32 s;
  OEString& r = s;
  r = OEString(forty.c_str());
  EXPECT_EQ(s.SpecLength(), 32);
  EXPECT_FALSE(s.IsValid());
  EXPECT_EQ(s.GetStrLength(), 40);

  OEMultiLenString multi;
  multi.SetSpecLength(10);
  OEString& m = multi;
  m = OEString("01234567890123");
  EXPECT_EQ(multi.SpecLength(), 10);
  EXPECT_FALSE(multi.IsValid());

  OEEMailMsgBody body;
  OEString tenThousand("text");
  tenThousand.SetSpecLength(10000);
  static_cast<OEString&>(body) = std::move(tenThousand);
  EXPECT_EQ(body.SpecLength(), 10000);

  OEUserPassword password;
  static_cast<OEString&>(password) = OEString(forty.c_str());
  EXPECT_EQ(password.SpecLength(), 171);
  EXPECT_EQ(password.GetStrLength(), 40);

  // A plain string still takes everything from a temporary.
  OEString plain;
  OEString32 source("abc");
  plain = std::move(source);
  EXPECT_EQ(plain.SpecLength(), 32);
  EXPECT_EQ(plain, "abc");
  EXPECT_TRUE(source.IsNull());
}

// Short texts live inside the string and long ones on the heap; the block
// behaves the same on both sides of that line and across it.
TEST(OEString, StorageAcrossTheInlineBoundary) {
  const int inlineBlock = OEString::kInlineBlock;
  for (int n : {1, 2, inlineBlock - 1, inlineBlock, inlineBlock + 1, 200}) {
    SCOPED_TRACE(n);
    const std::string text(static_cast<size_t>(n - 1), 'a');
    OEString s(text.c_str());
    EXPECT_EQ(s.BufferSize(), text.empty() ? 0 : n);
    EXPECT_EQ(std::string(s.c_str()), text);

    // Growing one character at a time keeps the text and exact fit.
    OEString grown;
    for (size_t i = 0; i < text.size(); ++i) grown += 'a';
    EXPECT_EQ(grown, s);
    EXPECT_EQ(grown.BufferSize(), s.BufferSize());

    // Copies and moves carry the text whichever side it is on.
    OEString copy(s);
    OEString moved(std::move(copy));
    EXPECT_EQ(moved, s);
    EXPECT_TRUE(copy.IsNull());
    OEString assigned;
    assigned = std::move(moved);
    EXPECT_EQ(assigned, s);

    // Clear fills the whole block, wherever it is.
    if (!text.empty()) {
      assigned.Clear('*');
      EXPECT_EQ(std::string(assigned.c_str()), std::string(static_cast<size_t>(n - 1), '*'));
    }
  }
  // Assigning part of itself, across the line.
  OEString self("0123456789012345678901234567890123456789");
  self = self + 30;
  EXPECT_EQ(self, "0123456789");
  self += self;
  EXPECT_EQ(self, "01234567890123456789");
  self.Append(self.c_str(), self.GetStrLength());
  EXPECT_EQ(self, "0123456789012345678901234567890123456789");
  // The block never shrinks while text is held.
  EXPECT_EQ(self.BufferSize(), 41);
  self = "ab";
  EXPECT_EQ(self.BufferSize(), 41);
  EXPECT_EQ(self, "ab");
}

TEST(OELargeBuffer, CeilingIsChosenWhenMade) {
  std::string bytes(5000000, 'b');
  OELargeBuffer large(6000000, 0);
  EXPECT_EQ(large.WriteLarge(bytes.data(), 5000000), OEBUF_OK);
  EXPECT_EQ(large.GetBufferSize(), 5000000u);
  EXPECT_EQ(large.WriteLarge(bytes.data(), 999999), OEBUF_OK);
  EXPECT_EQ(large.Write('x'), OEBUF_OUTOFRANGE);  // would end at the ceiling
  EXPECT_EQ(large.GetBufferSize(), 5999999u);
  EXPECT_EQ(large.GetCh(5999998), 'b');
  OEBuffer plain;
  EXPECT_EQ(plain.WriteLarge(bytes.data(), 5000000), OEBUF_OUTOFRANGE);
}

TEST(OELargeBuffer, WholeFilesOfAnySizeAreRead) {
  const std::string path = ::testing::TempDir() + "ofxkit_read_file_test.bin";
  std::string content(4500000, 'q');
  content[0] = '<';
  content[4499999] = '>';
  FILE* f = fopen(path.c_str(), "wb");
  ASSERT_NE(f, nullptr);
  ASSERT_EQ(fwrite(content.data(), 1, content.size(), f), content.size());
  fclose(f);
  int error = -1;
  OEBuffer* buffer = OEReadFileIntoBuffer(path.c_str(), &error);
  ASSERT_NE(buffer, nullptr);
  EXPECT_EQ(error, 0);
  EXPECT_EQ(buffer->GetBufferSize(), 4500000u);
  EXPECT_EQ(buffer->GetBufferOffset(), 0u);
  EXPECT_EQ(memcmp(buffer->GetBufferPtr(), content.data(), content.size()), 0);
  delete buffer;

  f = fopen(path.c_str(), "wb");
  fclose(f);
  buffer = OEReadFileIntoBuffer(path.c_str(), &error);
  ASSERT_NE(buffer, nullptr);  // an empty file is an empty buffer
  EXPECT_EQ(buffer->GetBufferSize(), 0u);
  delete buffer;
  remove(path.c_str());

  EXPECT_EQ(OEReadFileIntoBuffer(path.c_str(), &error), nullptr);
  EXPECT_EQ(error, ENOENT);
  EXPECT_EQ(OEReadFileIntoBuffer(::testing::TempDir().c_str(), &error), nullptr);
  EXPECT_EQ(error, EISDIR);
  // A device (or a pipe) is read to its end.
  buffer = OEReadFileIntoBuffer("/dev/null", &error);
  ASSERT_NE(buffer, nullptr);
  EXPECT_EQ(buffer->GetBufferSize(), 0u);
  delete buffer;
  EXPECT_EQ(OEReadFileIntoBuffer(nullptr, &error), nullptr);
  EXPECT_EQ(error, EINVAL);
}

TEST(OEBuffer, GrowthAndCeiling) {
  OEBuffer b;
  EXPECT_EQ(b.GetBufferAllocation(), 512u);
  std::string bytes(513, 'z');
  EXPECT_EQ(b.WriteLarge(bytes.data(), 513), OEBUF_OK);
  EXPECT_EQ(b.GetBufferAllocation(), 1024u);
  EXPECT_EQ(b.GetBufferSize(), 513u);

  OEBuffer big(100, 0);
  EXPECT_EQ(big.GetBufferAllocation(), 100u);
  // With no growth step the buffer grows by exactly what a write needs.
  EXPECT_EQ(big.WriteLarge(bytes.data(), 150), OEBUF_OK);
  EXPECT_EQ(big.GetBufferAllocation(), 150u);

  OEBuffer nearly(3999990, 16);
  std::string filler(3999990, 'f');
  ASSERT_EQ(nearly.WriteLarge(filler.data(), 3999990), OEBUF_OK);
  EXPECT_EQ(nearly.Write("0123456789", 10), OEBUF_OUTOFRANGE);  // would end at 4,000,000
  EXPECT_EQ(nearly.GetBufferSize(), 3999990u);
  EXPECT_EQ(nearly.Write("012345678", 9), OEBUF_OK);
}

TEST(OEBuffer, ReadAccessAndRewind) {
  OEBuffer b;
  b += "hello";
  b += 'x';
  EXPECT_EQ(b.GetCh(-1), 0);
  EXPECT_EQ(b.GetCh(static_cast<int32_t>(b.GetBufferSize())), 0);
  EXPECT_EQ(b.GetCh(0), 'h');
  int32_t where = -1;
  EXPECT_EQ(b.FindSubChar(0, 'l', &where), 1);
  EXPECT_EQ(where, 2);
  EXPECT_EQ(b.FindSubChar(0, 'q', &where), 0);
  EXPECT_EQ(where, 6);
  OEString out;
  EXPECT_EQ(b.GetData(out, 1, 3), 3);
  EXPECT_EQ(out, "ell");

  b.ClearBuffer(0);  // size stays, offset rewinds
  EXPECT_EQ(b.GetBufferSize(), 6u);
  EXPECT_EQ(b.GetBufferOffset(), 0u);
  char c;
  EXPECT_EQ(b.Read(&c), OEBUF_OK);
  EXPECT_EQ(b.SetBufferOffset(7), 0);
  EXPECT_EQ(b.SetBufferOffset(6), 1);
  EXPECT_EQ(b.Read(&c), OEBUF_OUTOFRANGE);

  OEBuffer w;
  w += "abcdef";
  w.SetBufferOffset(2);
  w += "Z";  // writing makes the written end the logical end
  EXPECT_EQ(w.GetBufferSize(), 3u);
}

TEST(OEBuffer, CopyAppendCompare) {
  OEBuffer a, b;
  a += "0123456789";
  EXPECT_EQ(a.CopyBuffer(&b, 2, 3), OEBUF_OK);
  EXPECT_EQ(b.GetBufferSize(), 3u);
  EXPECT_EQ(b.GetCh(0), '2');
  EXPECT_EQ(a.CopyBuffer(&b, 8, 5), OEBUF_OUTOFRANGE);
  EXPECT_EQ(a.CopyBuffer(&b, 0, 0), OEBUF_OK);
  EXPECT_EQ(a.CompareBuffer(&b), 1);
  b += &a;
  EXPECT_EQ(b.GetBufferSize(), 20u);
  b += &b;  // appending itself doubles it
  EXPECT_EQ(b.GetBufferSize(), 40u);
  EXPECT_EQ(a.CompareBuffer(&b), 0);
  OEBuffer copy(a);
  EXPECT_EQ(copy.CompareBuffer(&a), 1);
  unsigned short got = 0;
  char dest[4];
  a.SetBufferOffset(8);
  EXPECT_EQ(a.Read(dest, got, 4), OEBUF_OK);
  EXPECT_EQ(got, 2);
}
