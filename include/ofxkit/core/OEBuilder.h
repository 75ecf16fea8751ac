// Writes a tree of data objects as OFX text in the SGML form.
#pragma once

#include <cstdint>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEString.h"

class OETagDictionary;
class OEPrecisionInteger;
class OEPercent;
class OEPosPrecisionInteger;
class OEDateTime;
class OETime;
class OELanguage;
class OEString12;

// Enumerations written by Add<Name>(value) and AddTagOE<Name>(tag, value).
#define OE_BUILDER_ENUMS(X)                                                                  \
  X(BankTxType, OEBankTxType) X(BankAction, OEBankAction) X(ProcCode, OEProcCode)            \
  X(DayOfWeek, OEDayOfWeek) X(ClientRouting, OEClientRouting) X(OFXSecurity, OEOFXSecurity)  \
  X(SyncMode, OESyncMode) X(CharacterType, OECharacterType) X(BankAccountType, OEBankAccountType) \
  X(Service, OEService) X(ServiceStatus, OEServiceStatus) X(Frequency, OEFrequency)          \
  X(BuyType, OEBuyType) X(CallType, OECallType) X(Duration, OEDuration) X(DebtClass, OEDebtClass) \
  X(DebtType, OEDebtType) X(IncomeType, OEIncomeType) X(InvAcctType, OEInvAcctType)          \
  X(MFType, OEMFType) X(OptAction, OEOptAction) X(OptBuyType, OEOptBuyType)                  \
  X(SellReason, OESellReason) X(OptSellType, OEOptSellType) X(OptType, OEOptType)            \
  X(PosType, OEPosType) X(RelType, OERelType) X(Restriction, OERestriction)                  \
  X(Secured, OESecured) X(SellType, OESellType) X(StockType, OEStockType) X(SubAcct, OESubAcct) \
  X(TferAction, OETferAction) X(UnitType, OEUnitType) X(USProductType, OEUSProductType)      \
  X(BalType, OEBalType) X(AssetClass, OEAssetClass) X(CouponFreq, OECouponFreq)              \
  X(PayeeIDScope, OEPayeeIDScope) X(StatusSeverity, OEStatusSeverity) X(DebtAction, OEDebtAction) \
  X(ExtdPmtFor, OEExtdPmtFor)
#define OE_BUILDER_ENUM_FWD(Name, Type) enum Type : int32_t;
OE_BUILDER_ENUMS(OE_BUILDER_ENUM_FWD)
#undef OE_BUILDER_ENUM_FWD
enum OEHeaderTag : int32_t;
enum OEFidelityOptBuyType : int32_t;
enum OEFidelityOptSellType : int32_t;

// 0: strings longer than their limit (or otherwise invalid) fail the build;
// any other value: they are cut to their limit (or written as they are).
typedef int32_t OEBuildStringOpt;
enum : int32_t { OE_BUILD_STRICT = 0, OE_BUILD_LENIENT = 1 };
// 0: characters as they are; 1: "<", ">" and "&" written as entities.
typedef int32_t OEBuildStringMacroOpt;
enum : int32_t { OE_MACRO_NONE = 0, OE_MACRO_REPLACE = 1 };
// As AddString's argument, 1 ends the value with a line feed. As the
// builder's option: 0/1 no line end, 2/5 CR LF, 3/6 LF, 4/7 CR for headers
// and blank lines.
typedef int32_t OEBuildStringCrLfOpt;

class OEBuilder {
 public:
  static constexpr char OE_LEFT_BRACE = '<';
  static constexpr char OE_RIGHT_BRACE = '>';
  static constexpr char OE_END_MARKER = '/';
  static constexpr const char* OE_NEW_LINE = "\n";
  static constexpr char OE_HEADER_SEP = ':';
  static constexpr const char* OE_BOOLEAN_TRUE = "Y";
  static constexpr const char* OE_BOOLEAN_FALSE = "N";

  explicit OEBuilder(OEBuildStringCrLfOpt option = 2);
  virtual ~OEBuilder() = default;

  virtual OEBuildStatus Build(OEBuffer* output, OEDataObj* object, OEBuildStringOpt stringOption,
                              unsigned short checkRequired);
  virtual OEBuildStatus AddTagStart(OETagID tag);
  virtual OEBuildStatus AddTagEnd(OETagID tag);
  virtual OEBuildStatus AddTagElement(OETagID tag);
  virtual OEBuildStatus AddBlankLine();
  virtual OEBuildStatus AddOESShort(short v);
  virtual OEBuildStatus AddOEUShort(unsigned short v, char fill, unsigned short width);
  virtual OEBuildStatus AddOEUShort(unsigned short v);
  virtual OEBuildStatus AddOESLong(int32_t v);
  virtual OEBuildStatus AddOEULong(uint32_t v);
  virtual OEBuildStatus AddOEChar(char c);
  virtual OEBuildStatus AddOEBoolean(unsigned short b);
  virtual OEBuildStatus AddString(const OEString& value, OEBuildStringMacroOpt macro, OEBuildStringCrLfOpt line);
  virtual OEBuildStatus AddString(const OEString* value, OEBuildStringMacroOpt macro, OEBuildStringCrLfOpt line);
  virtual OEBuildStatus AddTagOEBoolean(OETagID tag, unsigned short b);
  virtual OEBuildStatus AddTagOEUShort(OETagID tag, unsigned short v, char fill, unsigned short width);
  virtual OEBuildStatus AddTagOEUShort(OETagID tag, unsigned short v);
  virtual OEBuildStatus AddTagOESShort(OETagID tag, short v);
  virtual OEBuildStatus AddTagOEULong(OETagID tag, uint32_t v);
  virtual OEBuildStatus AddTagOESLong(OETagID tag, int32_t v);
  virtual OEBuildStatus AddTagOEString(OETagID tag, const OEString& value);
  virtual OEBuildStatus AddTagOEString(OETagID tag, const OEString* value);
  virtual OEBuildStatus AddHeader(OEHeaderTag header, const OEString& value);
  virtual OEBuildStatus AddAmount(const OEPrecisionInteger& value);
  virtual OEBuildStatus AddQuantity(const OEPrecisionInteger& value);
  virtual OEBuildStatus AddUnitPrice(const OEPosPrecisionInteger& value);
  virtual OEBuildStatus AddRate(OEPercent value);
  virtual OEBuildStatus AddDateTime(const OEDateTime& value);
  virtual OEBuildStatus AddTime(const OETime& value);
  virtual OEBuildStatus AddServerID(const OEString12& id);
  virtual OEBuildStatus AddPayeeID(const OEString12& id);
  virtual OEBuildStatus AddLanguage(const OELanguage& language);
  virtual OEBuildStatus AddFidelityOptBuyType(const OEFidelityOptBuyType& value);
  virtual OEBuildStatus AddFidelityOptSellType(const OEFidelityOptSellType& value);
  virtual OEBuildStatus AddTagOEAmount(OETagID tag, const OEPrecisionInteger& value);
  virtual OEBuildStatus AddTagOEQuantity(OETagID tag, const OEPrecisionInteger& value);
  virtual OEBuildStatus AddTagOEUnitPrice(OETagID tag, const OEPosPrecisionInteger& value);
  virtual OEBuildStatus AddTagOERate(OETagID tag, const OEPercent& value);
  virtual OEBuildStatus AddTagOEDateTime(OETagID tag, const OEDateTime& value);
  virtual OEBuildStatus AddTagOETime(OETagID tag, const OETime& value);
  virtual OEBuildStatus AddTagOEServerID(OETagID tag, const OEString12& id);
  virtual OEBuildStatus AddTagOEPayeeID(OETagID tag, const OEString12& id);
  virtual OEBuildStatus AddTagOELanguage(OETagID tag, const OELanguage& language);
#define OE_BUILDER_ENUM_ADDERS(Name, Type) \
  virtual OEBuildStatus Add##Name(Type value); \
  virtual OEBuildStatus AddTagOE##Name(OETagID tag, Type value);
  OE_BUILDER_ENUMS(OE_BUILDER_ENUM_ADDERS)
#undef OE_BUILDER_ENUM_ADDERS
  // An element whose value is the given text followed by a line feed;
  // OE_BUILD_BAD_VALUE (and nothing written) when there is no text.
  OEBuildStatus AddTagOEText(OETagID tag, const char* text);
  OEBuffer* GetBuffer() const { return m_output; }
  virtual OEBuildStatus AddBuffer(OEBuffer* other);

  void SetCRLFoption(OEBuildStringCrLfOpt option) { m_lineEnd = option; }
  OEBuildStringCrLfOpt GetCRLFoption() const { return m_lineEnd; }
  OEBuildStringOpt GetStringOption() const { return m_stringOption; }
  // The first object whose writing failed; kept until a caller clears it.
  OEDataObj* GetObjectInError() const { return m_objectInError; }
  void SetObjectInError(OEDataObj* obj) {
    if (!m_objectInError) m_objectInError = obj;
  }
  void ClearObjectInError() { m_objectInError = nullptr; }

 protected:
  OEBuildStatus AddTag(OETagType kind, const char* name);
  // Raw output helpers.
  OEBuildStatus Put(const char* text, uint32_t n);
  OEBuildStatus PutLineEnd();
  OEBuildStatus PutNewLine() { return Put("\n", 1); }
  const char* TagName(OETagID tag) const;
  OEBuildStatus AddPrecisionInteger(const OEPrecisionInteger& value);
  // A value's text and its line feed; OE_BUILD_BAD_VALUE when there is none.
  OEBuildStatus AddText(const char* text);

 private:
  OEBuildStatus WriteTag(const char* name, bool end, bool newline);

  OETagDictionary* m_dictionary;
  OEBuffer* m_output;
  OEBuildStringOpt m_stringOption;
  OEBuildStringCrLfOpt m_lineEnd;
  OEDataObj* m_objectInError;
  OEString m_scratch;  // reused for date and time texts
};
