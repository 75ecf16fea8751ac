// Securities: their identity ("SECID"), their description ("SECINFO" inside
// one of the five "...INFO" kinds), the list a securities-list response
// carries ("SECLIST") and the request for it ("SECLISTRQ", "SECRQ").
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OECurrency.h"

#define OE_SECID_FIELDS(X)                     \
  X(TEXT, UniqueID, UNIQUEID, OEString32)      \
  X(TEXT, UniqueIDType, UNIQUEIDTYPE, OEString10)

// A security's identifier: a CUSIP, an ISIN or another scheme named by its type.
class OESecID : public OEAggregate {
  OE_AGGREGATE(OESecID, OE_SECID_FIELDS)
};

#define OE_SECINFO_FIELDS(X)                               \
  X(CHILD, SecID, SECID, OESecID)                          \
  X(CHILD, Currency, CURRENCY, OECurrency)                 \
  X(TEXT, SecName, SECNAME, OEString120)                   \
  X(TEXT, Ticker, TICKER, OEString32)                      \
  X(TEXT, FIID, FIID, OEString32)                          \
  X(TEXT, Rating, RATING, OEString10)                      \
  X(VALUE, UnitPrice, UNITPRICE, OEPosPrecisionInteger)    \
  X(VALUE, DtAsOf, DTASOF, OEDateTime)                     \
  X(TEXT, Memo, MEMO, OEString255)

// What every kind of security has; linked to the "...INFO" that holds it.
class OESecInfo : public OEOwnedAggregate {
  OE_AGGREGATE(OESecInfo, OE_SECINFO_FIELDS)
};

// One share of a fund's assets in a standard asset class ("PORTION") or in a
// class the institution names ("FIPORTION").
#define OE_PORTION_FIELDS(X)                          \
  X(VALUE, AssetClass, ASSETCLASS, OEAssetClass)      \
  X(VALUE, Percent, PERCENT, OEPrecisionInteger)

class OEPortion : public OEAggregate {
  OE_AGGREGATE(OEPortion, OE_PORTION_FIELDS)
};

#define OE_FIPORTION_FIELDS(X)                          \
  X(VALUE, FIAssetClass, FIASSETCLASS, OEAssetClass)    \
  X(VALUE, Percent, PERCENT, OEPrecisionInteger)

class OEFIPortion : public OEAggregate {
  OE_AGGREGATE(OEFIPortion, OE_FIPORTION_FIELDS)
};

#define OE_MFASSETCLASS_FIELDS(X) X(LIST, Portion, PORTION, OEPortion)
class OEMFAssetClass : public OEAggregate {
  OE_AGGREGATE(OEMFAssetClass, OE_MFASSETCLASS_FIELDS)
};

#define OE_FIMFASSETCLASS_FIELDS(X) X(LIST, FIPortion, FIPORTION, OEFIPortion)
class OEFIMFAssetClass : public OEAggregate {
  OE_AGGREGATE(OEFIMFAssetClass, OE_FIMFASSETCLASS_FIELDS)
};

// The five kinds of security description.
#define OE_SECINFO_FIELD(X) X(CHILD, SecInfo, SECINFO, OESecInfo)
#define OE_ASSETCLASS_FIELDS(X)                         \
  X(VALUE, AssetClass, ASSETCLASS, OEAssetClass)        \
  X(VALUE, FIAssetClass, FIASSETCLASS, OEAssetClass)

#define OE_DEBTINFO_FIELDS(X)                               \
  OE_SECINFO_FIELD(X)                                       \
  X(VALUE, ParValue, PARVALUE, OEPrecisionInteger)          \
  X(VALUE, DebtType, DEBTTYPE, OEDebtType)                  \
  X(VALUE, DebtClass, DEBTCLASS, OEDebtClass)               \
  X(VALUE, CouponRate, COUPONRT, OEPrecisionInteger)        \
  X(VALUE, DtCoupon, DTCOUPON, OEDateTime)                  \
  X(VALUE, CouponFreq, COUPONFREQ, OECouponFreq)            \
  X(VALUE, CallPrice, CALLPRICE, OEPrecisionInteger)        \
  X(VALUE, YieldToCall, YIELDTOCALL, OEPrecisionInteger)    \
  X(VALUE, DtCall, DTCALL, OEDateTime)                      \
  X(VALUE, CallType, CALLTYPE, OECallType)                  \
  X(VALUE, YieldToMat, YIELDTOMAT, OEPrecisionInteger)      \
  X(VALUE, DtMat, DTMAT, OEDateTime)                        \
  OE_ASSETCLASS_FIELDS(X)

class OEDebtInfo : public OEAggregate {
  OE_AGGREGATE(OEDebtInfo, OE_DEBTINFO_FIELDS)
};

#define OE_MFINFO_FIELDS(X)                                         \
  OE_SECINFO_FIELD(X)                                               \
  X(VALUE, MFType, MFTYPE, OEMFType)                                \
  X(VALUE, Yield, YIELD, OEPrecisionInteger)                        \
  X(VALUE, DtYieldAsOf, DTYIELDASOF, OEDateTime)                    \
  X(CHILD, MFAssetClass, MFASSETCLASS, OEMFAssetClass)              \
  X(CHILD, FIMFAssetClass, FIMFASSETCLASS, OEFIMFAssetClass)

class OEMFInfo : public OEAggregate {
  OE_AGGREGATE(OEMFInfo, OE_MFINFO_FIELDS)
};

// SECID here is the underlying security of the option.
#define OE_OPTINFO_FIELDS(X)                               \
  OE_SECINFO_FIELD(X)                                      \
  X(VALUE, OptType, OPTTYPE, OEOptType)                    \
  X(VALUE, StrikePrice, STRIKEPRICE, OEPrecisionInteger)   \
  X(VALUE, DtExpire, DTEXPIRE, OEDateTime)                 \
  X(VALUE, ShPerCtrct, SHPERCTRCT, uint32_t)               \
  X(CHILD, SecID, SECID, OESecID)                          \
  OE_ASSETCLASS_FIELDS(X)

class OEOptInfo : public OEAggregate {
  OE_AGGREGATE(OEOptInfo, OE_OPTINFO_FIELDS)
};

#define OE_OTHERINFO_FIELDS(X)                   \
  OE_SECINFO_FIELD(X)                            \
  X(TEXT, TypeDesc, TYPEDESC, OEString32)        \
  OE_ASSETCLASS_FIELDS(X)

class OEOtherInfo : public OEAggregate {
  OE_AGGREGATE(OEOtherInfo, OE_OTHERINFO_FIELDS)
};

#define OE_STOCKINFO_FIELDS(X)                           \
  OE_SECINFO_FIELD(X)                                    \
  X(VALUE, StockType, STOCKTYPE, OEStockType)            \
  X(VALUE, Yield, YIELD, OEPrecisionInteger)             \
  X(VALUE, DtYieldAsOf, DTYIELDASOF, OEDateTime)         \
  OE_ASSETCLASS_FIELDS(X)

class OEStockInfo : public OEAggregate {
  OE_AGGREGATE(OEStockInfo, OE_STOCKINFO_FIELDS)
};

// The securities a response describes, kind by kind; each kind keeps the
// order it was read in, and the kinds are written in a fixed order.
#define OE_SECLIST_FIELDS(X)                        \
  X(LIST, DebtInfo, DEBTINFO, OEDebtInfo)           \
  X(LIST, MFInfo, MFINFO, OEMFInfo)                 \
  X(LIST, OptInfo, OPTINFO, OEOptInfo)              \
  X(LIST, OtherInfo, OTHERINFO, OEOtherInfo)        \
  X(LIST, StockInfo, STOCKINFO, OEStockInfo)

class OESecList : public OEAggregate {
  OE_AGGREGATE(OESecList, OE_SECLIST_FIELDS)

  // The SECINFO of the security with this identifier (unique id and its
  // type), of whatever kind; null when the list has none.
  const OESecInfo* FindSecInfo(const OESecID& id) const;
};

// One security asked for: by identifier, by ticker or by the institution's
// id, exactly one of the three.
#define OE_SECRQ_FIELDS(X)                  \
  X(CHILD, SecID, SECID, OESecID)           \
  X(TEXT, Ticker, TICKER, OEString32)       \
  X(TEXT, FIID, FIID, OEString32)

class OESecRq : public OEAggregate {
  OE_AGGREGATE(OESecRq, OE_SECRQ_FIELDS)
};

#define OE_SECLISTRQ_FIELDS(X) X(LIST, SecRq, SECRQ, OESecRq)

class OESecListRq : public OETransBase {
  OE_AGGREGATE(OESecListRq, OE_SECLISTRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// The answer in a securities-list transaction is empty: the list itself
// follows the transaction in the message set.
class OESecListRs : public OETransBase {
  OE_AGGREGATE(OESecListRs, OE_NO_FIELDS)
  using OETransBase::DeepCopyFrom;
};
