#include <gtest/gtest.h>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"

using ParseLogTest = LogFixture;

TEST_F(ParseLogTest, RecordsCarryWhatWasReported) {
  OEDataObj obj;
  EXPECT_EQ(log->AppendParseException(OEPW_BADFORMAT, "12x", "TRNAMT", OE_TAG_TRNAMT, &obj), 1);
  ASSERT_EQ(log->Entries(), 1);
  const OEParseException* r = log->Get(0);
  EXPECT_EQ(r->warning, OEPW_BADFORMAT);
  EXPECT_EQ(r->value, "12x");
  EXPECT_EQ(r->tagName, "TRNAMT");
  EXPECT_EQ(r->tag, OE_TAG_TRNAMT);
  EXPECT_EQ(r->object, &obj);
  EXPECT_EQ(r->position, -1);  // no parse buffer
  OEString name;
  r->WarningString(name);
  EXPECT_EQ(name, "OEPW_BADFORMAT");
  OEParseException extra;
  extra.warning = OEPW_EXTRAAGG;
  extra.WarningString(name);
  EXPECT_EQ(name, "OEPW_EXTRAAGG");
  EXPECT_EQ(log->GetAnyParseExceptionsLogged(), 1);
  log->DeleteAll();
  EXPECT_EQ(log->GetAnyParseExceptionsLogged(), 0);
  EXPECT_EQ(log->Entries(), 0);
}

TEST_F(ParseLogTest, PositionAndObjectComeFromTheParseInProgress) {
  OEBuffer buffer;
  buffer += "<OFX><SIGNONMSGSRSV1>";
  buffer.SetBufferOffset(5);
  OEParser parser;
  OEDataObj root;
  parser.Parse(&buffer, &root, 0);
  log->SetBuffer(&buffer);
  log->SetParser(&parser);
  log->AppendParseException(OEPW_UNKNOWNTAG, "", "X", OE_TAG_NONE, nullptr);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->position, 5);
  EXPECT_EQ(log->Get(0)->object, &root);
}

TEST_F(ParseLogTest, DisabledLoggingStillCounts) {
  log->EnableLogging(0);
  EXPECT_EQ(log->AppendParseException(OEPW_UNKNOWNTAG, "", "", OE_TAG_NONE, nullptr), 1);
  EXPECT_EQ(log->AppendParseException(new OEParseException()), 1);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(log->GetAnyParseExceptionsLogged(), 1);
}

TEST_F(ParseLogTest, CopyingKeepsTheWarningsOfAParse) {
  log->AppendParseException(OEPW_TOOLONG, "value", "NAME", OE_TAG_NAME, nullptr);
  log->AppendParseException(OEPW_LOWERCASE, "", "bankid", OE_TAG_BANKID, nullptr);

  // An application's own log whose logging is off takes the shared log's
  // flags first.
  OEParseLogger kept;
  EXPECT_EQ(kept.Entries(), 0);
  EXPECT_EQ(kept.GetLoggingEnabled(), 1);
  kept.EnableLogging(0);
  OEParser parser;  // clears the shared log: re-add after it
  log->AppendParseException(OEPW_TOOLONG, "value", "NAME", OE_TAG_NAME, nullptr);
  log->AppendParseException(OEPW_LOWERCASE, "", "bankid", OE_TAG_BANKID, nullptr);
  EXPECT_EQ(parser.CopyExceptionListTo(&kept), 1);
  ASSERT_EQ(kept.Entries(), 2);
  EXPECT_EQ(kept.GetLoggingEnabled(), 1);
  EXPECT_EQ(kept.GetAnyParseExceptionsLogged(), 1);
  EXPECT_EQ(kept.Get(1)->tagName, "bankid");
  EXPECT_EQ(kept.Get(0)->value, "value");
  log->DeleteAll();
  EXPECT_EQ(kept.Entries(), 2);  // independent copies
  EXPECT_EQ(parser.GetNumberParseExceptions(), 0);
  EXPECT_EQ(parser.GetParseException(0), nullptr);
}
