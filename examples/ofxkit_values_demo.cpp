// A tour of the value types: exact amounts, OFX dates, enumerated values, a
// bank account written as OFX, and the warnings that bad values leave in the
// parse log.
#include <ofxkit/ofxkit.h>

#include <cstdio>
#include <string>

namespace {
void PrintWarnings() {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  for (unsigned short i = 0; i < log->Entries(); ++i) {
    const OEParseException* w = log->Get(i);
    OEString code;
    w->WarningString(code);
    // Conversions outside an element name no tag; their text is the input.
    if (w->tag == OE_TAG_NONE)
      std::printf("  warning %s text=\"%s\"\n", code.c_str(), w->tagName.c_str());
    else
      std::printf("  warning %s tag=%s value=\"%s\"\n", code.c_str(), OEUtility::TagToString(w->tag).c_str(),
                  w->value.c_str());
  }
  log->DeleteAll();
}
}  // namespace

int main() {
  OEPrecisionInteger deposit, fee;
  deposit.ConvertStringToOEPrecisionInteger("1250.75");
  fee.ConvertStringToOEPrecisionInteger("-12.5");
  OEPrecisionInteger balance = deposit + fee;
  char text[OEPrecisionInteger::kTextSize + 1];
  balance.FormatText(text);
  std::printf("1250.75 + -12.5 = %s (exact decimal arithmetic)\n", text);

  OEDateTime posted;
  posted.ConvertStringToOEDateTime("20261123153000.250[-5:EST]");
  OEString when;
  posted.GetDateString(when);
  std::printf("posted %s\n", when.c_str());

  OEBankAccount account;
  account.SetBankID("121000248");
  account.SetAccountID("000123456789");
  account.SetAccountType(OEString("checking"));
  OEBuffer out;
  OEBuilder builder;
  struct Holder : OEDataObj {
    const OEDataObj* account = nullptr;
    OEBuildStatus Build(OEBuilder* b) const override { return account->BuildObject(b, OE_TAG_NONE); }
  } holder;
  holder.account = &account;
  OEBuildStatus status = builder.Build(&out, &holder, OE_BUILD_STRICT, 1);
  std::printf("account as OFX (build status %d):\n%s", static_cast<int>(status),
              std::string(out.GetBufferPtr(), out.GetBufferSize()).c_str());

  char trnuid[OEUtility::kTransactionIDLength + 1];
  OEUtility::GenerateTransactionID(trnuid);
  std::printf("fresh transaction id %s\n", trnuid);

  std::printf("bad values are kept out and reported:\n");
  OEPrecisionInteger bad;
  bad.ConvertStringToOEPrecisionInteger("12.3.4");
  account.SetAccountType(OEString("SAVNGS"));
  account.SetBankID("1210002481234");
  PrintWarnings();
  return 0;
}
