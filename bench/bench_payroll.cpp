// Parsing and building a payroll update response with hundreds of employees
// and thousands of paychecks (the update data a payroll service sends after a
// busy quarter), as an OEFileRs tree. The response is generated here.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

#include "ofxkit/ofxkit.h"

namespace {

constexpr int kEmployees = 400;
constexpr int kPayChecksPerEmployee = 6;

void Line(std::string& out, const char* tag, const std::string& value) {
  out += '<';
  out += tag;
  out += '>';
  out += value;
  out += '\n';
}
void Open(std::string& out, const char* tag) { out += std::string("<") + tag + ">\n"; }
void Close(std::string& out, const char* tag) { out += std::string("</") + tag + ">\n"; }

std::string Money(int cents) {
  char text[32];
  std::snprintf(text, sizeof text, "$%s%d.%02d", cents < 0 ? "-" : "", (cents < 0 ? -cents : cents) / 100,
                (cents < 0 ? -cents : cents) % 100);
  return text;
}

void Employee(std::string& out, int n) {
  Open(out, "V.EMPMOD");
  Open(out, "V.ADDRINFO");
  Line(out, "V.FIRST", "Employee");
  Line(out, "V.LAST", "Number " + std::to_string(n));
  Line(out, "V.ADDR1", std::to_string(100 + n) + " Elm St");
  Line(out, "V.ADDR2", "__OFX_EMPTY_STRING__");
  Line(out, "V.CITY", "Springfield");
  Line(out, "V.STATE", "IL");
  Line(out, "V.POSTALCODE", "62701");
  Close(out, "V.ADDRINFO");
  Open(out, "V.PAYROLL");
  Line(out, "V.PAYPD", "BIWEEKLY");
  Open(out, "V.WAGE");
  Line(out, "V.PITEMID", "10");
  Line(out, "V.RATE", Money(4000000 + n * 100));
  Close(out, "V.WAGE");
  Close(out, "V.PAYROLL");
  Open(out, "V.EMPTAX");
  Open(out, "V.EMPFIT");
  Line(out, "V.FEDFILESTATUS", n % 2 ? "SINGLE" : "MARRIED");
  Line(out, "V.ALLOWANCES", std::to_string(n % 4));
  Close(out, "V.EMPFIT");
  Open(out, "V.EMPSIT");
  Line(out, "V.STATE", "IL");
  Line(out, "V.ALLOWANCES", "1");
  Close(out, "V.EMPSIT");
  Close(out, "V.EMPTAX");
  Line(out, "V.EMPID", "E-" + std::to_string(1000 + n));
  Line(out, "V.SSN", "123-45-" + std::to_string(1000 + n));
  Line(out, "V.DTHIRE", "20190301");
  Line(out, "V.DTRELEASE", "__OFX_EMPTY_STRING__");
  Line(out, "V.INACTIVE", "N");
  Close(out, "V.EMPMOD");
}

void PayCheck(std::string& out, int employee, int n) {
  int gross = 153846 + employee;
  int fit = -(gross / 10), ss = -(gross * 62 / 1000), med = -(gross * 145 / 10000);
  Open(out, "V.PAYCHKMOD");
  Open(out, "V.SALARYLINE");
  Line(out, "V.PITEMID", "10");
  Line(out, "V.PAYTYPE", "REG");
  Line(out, "V.AMT", Money(gross));
  Close(out, "V.SALARYLINE");
  const int taxes[3] = {fit, ss, med};
  for (int t = 0; t < 3; ++t) {
    Open(out, "V.TAXLINE");
    Line(out, "V.PITEMID", std::to_string(30 + t));
    Line(out, "V.WB", Money(gross));
    Line(out, "V.AMT", Money(taxes[t]));
    Close(out, "V.TAXLINE");
  }
  Line(out, "V.PAYCHKID", "PC-" + std::to_string(employee * 100 + n));
  Line(out, "V.EMPID", "E-" + std::to_string(1000 + employee));
  char date[16];
  std::snprintf(date, sizeof date, "202404%02d", 5 + n * 2);
  Line(out, "V.DTTX", date);
  Line(out, "V.AMT", Money(gross + fit + ss + med));
  Line(out, "V.MEMO", "__OFX_EMPTY_STRING__");
  Line(out, "V.CLEARED", "Y");
  Close(out, "V.PAYCHKMOD");
}

const std::string& UpdateResponse() {
  static const std::string text = [] {
    std::string out =
        "OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\n"
        "CHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";
    Open(out, "OFX");
    Open(out, "SIGNONMSGSRSV1");
    Open(out, "SONRS");
    Open(out, "STATUS");
    Line(out, "CODE", "0");
    Line(out, "SEVERITY", "INFO");
    Close(out, "STATUS");
    Line(out, "DTSERVER", "20240415120000");
    Line(out, "LANGUAGE", "ENG");
    Close(out, "SONRS");
    Close(out, "SIGNONMSGSRSV1");
    Open(out, "V.PAYROLLMSGSRSV1");
    Open(out, "V.PAYROLLUPDATERS");
    Line(out, "TOKEN", "118");
    Line(out, "V.PAYCHKNEXTID", "PC-90000");
    Line(out, "V.PAYROLLTXNEXTID", "TX-10");
    Line(out, "V.EMPNEXTID", "E-" + std::to_string(1000 + kEmployees));
    Line(out, "V.PITEMNEXTID", "42");
    Open(out, "V.PAYROLLUPDATEDATA");
    for (int e = 0; e < kEmployees; ++e)
      for (int n = 0; n < kPayChecksPerEmployee; ++n) PayCheck(out, e, n);
    for (int e = 0; e < kEmployees; ++e) Employee(out, e);
    Close(out, "V.PAYROLLUPDATEDATA");
    Close(out, "V.PAYROLLUPDATERS");
    Close(out, "V.PAYROLLMSGSRSV1");
    Close(out, "OFX");
    return out;
  }();
  return text;
}

void Fill(OEBuffer& buffer, const std::string& text) {
  buffer.SetBufferOffset(0);
  buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
  buffer.SetBufferOffset(0);
}

void BM_ParsePayrollUpdate(benchmark::State& state) {
  const std::string& text = UpdateResponse();
  OEBuffer buffer(static_cast<uint32_t>(text.size() + 1), 0);
  Fill(buffer, text);
  for (auto _ : state) {
    OEFileRs file;
    OESimpleParser parser;
    if (parser.Parse(&buffer, &file, 0) != OE_PARSE_OK) {
      state.SkipWithError("parse failed");
      break;
    }
    benchmark::DoNotOptimize(file.GetNumberOfResponse());
  }
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) * static_cast<int64_t>(text.size()));
  state.counters["paychecks"] = kEmployees * kPayChecksPerEmployee;
  state.counters["employees"] = kEmployees;
}
BENCHMARK(BM_ParsePayrollUpdate)->Unit(benchmark::kMillisecond);

void BM_BuildPayrollUpdate(benchmark::State& state) {
  const std::string& text = UpdateResponse();
  OEBuffer input(static_cast<uint32_t>(text.size() + 1), 0);
  Fill(input, text);
  OEFileRs file;
  OESimpleParser parser;
  parser.Parse(&input, &file, 0);
  OEBuffer out(static_cast<uint32_t>(text.size() + 65536), 1 << 20);
  int64_t written = 0;
  for (auto _ : state) {
    out.SetBufferOffset(0);
    out.SetBufferSize(0);
    OEPayrollBuilder builder;
    if (builder.Build(&out, &file, OE_BUILD_STRICT, 0) != OE_BUILD_OK) {
      state.SkipWithError("build failed");
      break;
    }
    written += out.GetBufferSize();
  }
  // The tree builds back to the text it was read from.
  if (std::string(out.GetBufferPtr(), out.GetBufferSize()) != text) state.SkipWithError("built text differs");
  state.SetBytesProcessed(written);
}
BENCHMARK(BM_BuildPayrollUpdate)->Unit(benchmark::kMillisecond);
}  // namespace

BENCHMARK_MAIN();
