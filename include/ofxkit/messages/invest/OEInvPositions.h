// Positions ("INVPOS" inside one of the five "POS..." kinds) and open orders
// ("OO" inside one of the eleven "OO..." kinds).
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/bank/OECurrency.h"
#include "ofxkit/messages/invest/OESecurities.h"

#define OE_INVPOS_FIELDS(X)                                 \
  X(CHILD, SecID, SECID, OESecID)                           \
  X(CHILD, Currency, CURRENCY, OECurrency)                  \
  X(VALUE, HeldInAcct, HELDINACCT, OESubAcct)               \
  X(VALUE, PosType, POSTYPE, OEPosType)                     \
  X(VALUE, Units, UNITS, OEPrecisionInteger)                \
  X(VALUE, UnitPrice, UNITPRICE, OEPrecisionInteger)        \
  X(VALUE, MktVal, MKTVAL, OEPrecisionInteger)              \
  X(VALUE, DtPriceAsOf, DTPRICEASOF, OEDateTime)            \
  X(TEXT, Memo, MEMO, OEString255)

// What every position has; linked to the position kind that holds it.
class OEInvPos : public OEOwnedAggregate {
  OE_AGGREGATE(OEInvPos, OE_INVPOS_FIELDS)
};

#define OE_INV_POS_FIELD(X) X(CHILD, InvPos, INVPOS, OEInvPos)
#define OE_INV_STREET_FIELDS(X)                             \
  X(VALUE, UnitsStreet, UNITSSTREET, OEPrecisionInteger)    \
  X(VALUE, UnitsUser, UNITSUSER, OEPrecisionInteger)        \
  X(FLAG, ReinvDiv, REINVDIV, unsigned short)

class OEPosDebt : public OEAggregate {
  OE_AGGREGATE(OEPosDebt, OE_INV_POS_FIELD)
};

#define OE_POSMF_FIELDS(X) OE_INV_POS_FIELD(X) OE_INV_STREET_FIELDS(X) X(FLAG, ReinvCG, REINVCG, unsigned short)
class OEPosMF : public OEAggregate {
  OE_AGGREGATE(OEPosMF, OE_POSMF_FIELDS)
};

#define OE_POSOPT_FIELDS(X) OE_INV_POS_FIELD(X) X(VALUE, Secured, SECURED, OESecured)
class OEPosOpt : public OEAggregate {
  OE_AGGREGATE(OEPosOpt, OE_POSOPT_FIELDS)
};

class OEPosOther : public OEAggregate {
  OE_AGGREGATE(OEPosOther, OE_INV_POS_FIELD)
};

#define OE_POSSTOCK_FIELDS(X) OE_INV_POS_FIELD(X) OE_INV_STREET_FIELDS(X)
class OEPosStock : public OEAggregate {
  OE_AGGREGATE(OEPosStock, OE_POSSTOCK_FIELDS)
};

// ---------------------------------------------------------------------------

#define OE_OO_FIELDS(X)                                     \
  X(CHILD, SecID, SECID, OESecID)                           \
  X(CHILD, Currency, CURRENCY, OECurrency)                  \
  X(TEXT, FITId, FITID, OEString255)                        \
  X(TEXT, ServerTxId, SRVRTID, OEString36)                  \
  X(VALUE, DtPlaced, DTPLACED, OEDateTime)                  \
  X(VALUE, Units, UNITS, OEPrecisionInteger)                \
  X(VALUE, SubAcct, SUBACCT, OESubAcct)                     \
  X(VALUE, Duration, DURATION, OEDuration)                  \
  X(VALUE, Restriction, RESTRICTION, OERestriction)         \
  X(VALUE, MinUnits, MINUNITS, OEPrecisionInteger)          \
  X(VALUE, LimitPrice, LIMITPRICE, OEPrecisionInteger)      \
  X(VALUE, StopPrice, STOPPRICE, OEPrecisionInteger)        \
  X(TEXT, Memo, MEMO, OEString255)

// What every open order has; linked to the order kind that holds it.
class OEOO : public OEOwnedAggregate {
  OE_AGGREGATE(OEOO, OE_OO_FIELDS)
};

#define OE_OO_FIELD(X) X(CHILD, OO, OO, OEOO)
#define OE_OO_UNITTYPE_FIELD(X) X(VALUE, UnitType, UNITTYPE, OEUnitType)

#define OE_OOBUYDEBT_FIELDS(X) OE_OO_FIELD(X) X(FLAG, Auction, AUCTION, unsigned short) X(VALUE, DtAuction, DTAUCTION, OEDateTime)
class OEOOBuyDebt : public OEAggregate {
  OE_AGGREGATE(OEOOBuyDebt, OE_OOBUYDEBT_FIELDS)
};

#define OE_OOBUYMF_FIELDS(X) OE_OO_FIELD(X) X(VALUE, BuyType, BUYTYPE, OEBuyType) OE_OO_UNITTYPE_FIELD(X)
class OEOOBuyMF : public OEAggregate {
  OE_AGGREGATE(OEOOBuyMF, OE_OOBUYMF_FIELDS)
};

#define OE_OOBUYOPT_FIELDS(X) OE_OO_FIELD(X) X(VALUE, OptBuyType, OPTBUYTYPE, OEOptBuyType)
class OEOOBuyOpt : public OEAggregate {
  OE_AGGREGATE(OEOOBuyOpt, OE_OOBUYOPT_FIELDS)
};

#define OE_OOBUYOTHER_FIELDS(X) OE_OO_FIELD(X) OE_OO_UNITTYPE_FIELD(X)
class OEOOBuyOther : public OEAggregate {
  OE_AGGREGATE(OEOOBuyOther, OE_OOBUYOTHER_FIELDS)
};

#define OE_OOBUYSTOCK_FIELDS(X) OE_OO_FIELD(X) X(VALUE, BuyType, BUYTYPE, OEBuyType)
class OEOOBuyStock : public OEAggregate {
  OE_AGGREGATE(OEOOBuyStock, OE_OOBUYSTOCK_FIELDS)
};

class OEOOSellDebt : public OEAggregate {
  OE_AGGREGATE(OEOOSellDebt, OE_OO_FIELD)
};

#define OE_OOSELLMF_FIELDS(X) \
  OE_OO_FIELD(X) X(VALUE, SellType, SELLTYPE, OESellType) OE_OO_UNITTYPE_FIELD(X) X(FLAG, SellAll, SELLALL, unsigned short)
class OEOOSellMF : public OEAggregate {
  OE_AGGREGATE(OEOOSellMF, OE_OOSELLMF_FIELDS)
};

#define OE_OOSELLOPT_FIELDS(X) OE_OO_FIELD(X) X(VALUE, OptSellType, OPTSELLTYPE, OEOptSellType)
class OEOOSellOpt : public OEAggregate {
  OE_AGGREGATE(OEOOSellOpt, OE_OOSELLOPT_FIELDS)
};

class OEOOSellOther : public OEAggregate {
  OE_AGGREGATE(OEOOSellOther, OE_OOBUYOTHER_FIELDS)
};

#define OE_OOSELLSTOCK_FIELDS(X) OE_OO_FIELD(X) X(VALUE, SellType, SELLTYPE, OESellType)
class OEOOSellStock : public OEAggregate {
  OE_AGGREGATE(OEOOSellStock, OE_OOSELLSTOCK_FIELDS)
};

// A switch from one fund (the order's security) into another (SECID here).
#define OE_OOSWITCHMF_FIELDS(X) \
  OE_OO_FIELD(X) X(CHILD, SecID, SECID, OESecID) OE_OO_UNITTYPE_FIELD(X) X(FLAG, SwitchAll, SWITCHALL, unsigned short)
class OEOOSwitchMF : public OEAggregate {
  OE_AGGREGATE(OEOOSwitchMF, OE_OOSWITCHMF_FIELDS)
};
