#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "ofxkit/net/OENet.h"

namespace {

class TestAccess : public OENetAccess {
 public:
  unsigned short CanDoNetworkSetup() override { return 0; }
  unsigned short IsNetworkSetup() override { return 1; }
  unsigned short DoNetworkSetup() override { return 0; }
  OENetStatus InitConnection() override { return OE_NET_OK; }
  OENetStatus EndConnection() override { return OE_NET_OK; }
  OENetRequest* NewNetRequest() override { return nullptr; }
  OENetStatus DeleteNetRequest(OENetRequest*) override { return OE_NET_OK; }
  std::string Agent() const {
    OEString s;
    GetAgentName(s);
    return s.c_str();
  }
  std::string TempPath() const {
    OEString s;
    GetTempFilePath(s);
    return s.c_str();
  }
};

struct LogLine {
  std::string text;
  unsigned short level;
  const char* detail;
};
std::vector<LogLine> g_lines;
void RecordLine(const char* text, unsigned short level, const char* detail) {
  g_lines.push_back({text ? text : "(null)", level, detail});
}

struct Report {
  OEOpCode op;
  void* a;
  void* b;
};
std::vector<Report> g_reports;
void RecordReport(OEOpCode op, void* a, void* b) { g_reports.push_back({op, a, b}); }

TEST(OENetAccess, DefaultsAndSetters) {
  TestAccess access;
  EXPECT_EQ(access.Agent(), "NONAME");
  EXPECT_EQ(access.TempPath(), "");
  access.SetAgentName(OEString("Ledger 7.0"));
  access.SetTempFilePath(OEString("/var/tmp/ledger"));
  EXPECT_EQ(access.Agent(), "Ledger 7.0");
  EXPECT_EQ(access.TempPath(), "/var/tmp/ledger");
  uint32_t code = 42;
  EXPECT_EQ(access.GetStatus(code), 0);
  EXPECT_EQ(code, 42u);
  EXPECT_EQ(access.SetGlobalState(&code), 0);
}

TEST(OENetAccess, CallbacksReceiveTheirArgumentsOnlyWhenSet) {
  g_lines.clear();
  g_reports.clear();
  TestAccess access;
  // Without callbacks, nothing happens and nothing breaks.
  access.LogMessage("lost", 1, nullptr);
  access.UpdateSessionStatus(OE_OP_SEND_PROGRESS, nullptr, nullptr);
  EXPECT_TRUE(g_lines.empty());
  EXPECT_TRUE(g_reports.empty());

  access.SetLogCallback(RecordLine);
  access.SetSessionCallback(RecordReport);
  static const char kDetail[] = "detail";
  access.LogMessage("***GXN: NCConnect returns 2200", 1, kDetail);
  access.LogMessage(nullptr, 3, nullptr);
  int sent = 10, total = 20;
  access.UpdateSessionStatus(OE_OP_RECEIVE_PROGRESS, &sent, &total);
  access.UpdateSessionStatus(static_cast<OEOpCode>(7), nullptr, nullptr);
  ASSERT_EQ(g_lines.size(), 2u);
  EXPECT_EQ(g_lines[0].text, "***GXN: NCConnect returns 2200");
  EXPECT_EQ(g_lines[0].level, 1);
  EXPECT_EQ(g_lines[0].detail, kDetail);
  EXPECT_EQ(g_lines[1].text, "(null)");
  EXPECT_EQ(g_lines[1].level, 3);
  ASSERT_EQ(g_reports.size(), 2u);
  EXPECT_EQ(g_reports[0].op, OE_OP_RECEIVE_PROGRESS);
  EXPECT_EQ(g_reports[0].a, &sent);
  EXPECT_EQ(g_reports[0].b, &total);
  EXPECT_EQ(g_reports[1].op, 7);

  // A copy keeps the callbacks and the texts; clearing a callback stops it.
  access.SetAgentName(OEString("Ledger"));
  TestAccess copy(access);
  copy.LogMessage("from the copy", 2, nullptr);
  EXPECT_EQ(g_lines.back().text, "from the copy");
  EXPECT_EQ(copy.Agent(), "Ledger");
  copy.SetLogCallback(nullptr);
  copy.LogMessage("dropped", 1, nullptr);
  EXPECT_EQ(g_lines.back().text, "from the copy");
  access.LogMessage("original still logs", 1, nullptr);
  EXPECT_EQ(g_lines.back().text, "original still logs");
}

}  // namespace
