// A test fixture that gives each test an empty, enabled parse log with no
// parse buffer or parser attached, and leaves it that way afterwards.
#pragma once

#include <gtest/gtest.h>

#include "ofxkit/parse/OEParseLogger.h"

class LogFixture : public ::testing::Test {
 protected:
  void SetUp() override {
    log = OEParseLogger::TheOEParseLogger();
    ASSERT_NE(log, nullptr);
    Reset();
  }
  void TearDown() override { Reset(); }
  void Reset() {
    log->SetBuffer(nullptr);
    log->SetParser(nullptr);
    log->EnableLogging(1);
    log->DeleteAll();
  }
  // True when some warning of the log has this code.
  bool Logged(OEParseWarning code) const {
    for (unsigned short i = 0; i < log->Entries(); ++i)
      if (log->Get(i)->warning == code) return true;
    return false;
  }
  OEParseLogger* log = nullptr;
};
