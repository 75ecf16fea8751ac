#include "ofxkit/messages/invest/OEInvPositions.h"

OE_DEFINE_AGGREGATE(OEInvPos, OEOwnedAggregate, OE_INVPOS_FIELDS, INVPOS,
                    .Valid(OE_TAGS(SECID, CURRENCY, HELDINACCT, POSTYPE, UNITS, UNITPRICE, MKTVAL, DTPRICEASOF, MEMO))
                    .Required(OE_TAGS(SECID, HELDINACCT, POSTYPE, UNITS, UNITPRICE, MKTVAL, DTPRICEASOF)))
OE_DEFINE_AGGREGATE(OEPosDebt, OEAggregate, OE_INV_POS_FIELD, POSDEBT,
                    .Valid(OE_TAGS(INVPOS))
                    .Required(OE_TAGS(INVPOS)))
OE_DEFINE_AGGREGATE(OEPosMF, OEAggregate, OE_POSMF_FIELDS, POSMF,
                    .Valid(OE_TAGS(INVPOS, UNITSSTREET, UNITSUSER, REINVDIV, REINVCG))
                    .Required(OE_TAGS(INVPOS)))
OE_DEFINE_AGGREGATE(OEPosOpt, OEAggregate, OE_POSOPT_FIELDS, POSOPT,
                    .Valid(OE_TAGS(INVPOS, SECURED))
                    .Required(OE_TAGS(INVPOS)))
OE_DEFINE_AGGREGATE(OEPosOther, OEAggregate, OE_INV_POS_FIELD, POSOTHER,
                    .Valid(OE_TAGS(INVPOS))
                    .Required(OE_TAGS(INVPOS)))
OE_DEFINE_AGGREGATE(OEPosStock, OEAggregate, OE_POSSTOCK_FIELDS, POSSTOCK,
                    .Valid(OE_TAGS(INVPOS, UNITSSTREET, UNITSUSER, REINVDIV))
                    .Required(OE_TAGS(INVPOS)))

OE_DEFINE_AGGREGATE(OEOO, OEOwnedAggregate, OE_OO_FIELDS, OO,
                    .Valid(OE_TAGS(SECID, CURRENCY, FITID, SRVRTID, DTPLACED, UNITS, SUBACCT, DURATION, RESTRICTION,
                                   MINUNITS, LIMITPRICE, STOPPRICE, MEMO))
                    .Required(OE_TAGS(SECID, FITID, DTPLACED, UNITS, SUBACCT, DURATION, RESTRICTION)))
OE_DEFINE_AGGREGATE(OEOOBuyDebt, OEAggregate, OE_OOBUYDEBT_FIELDS, OOBUYDEBT,
                    .Valid(OE_TAGS(OO, AUCTION, DTAUCTION))
                    .Required(OE_TAGS(OO, AUCTION)))
OE_DEFINE_AGGREGATE(OEOOBuyMF, OEAggregate, OE_OOBUYMF_FIELDS, OOBUYMF,
                    .Valid(OE_TAGS(OO, BUYTYPE, UNITTYPE))
                    .Required(OE_TAGS(OO, BUYTYPE, UNITTYPE)))
OE_DEFINE_AGGREGATE(OEOOBuyOpt, OEAggregate, OE_OOBUYOPT_FIELDS, OOBUYOPT,
                    .Valid(OE_TAGS(OO, OPTBUYTYPE))
                    .Required(OE_TAGS(OO, OPTBUYTYPE)))
OE_DEFINE_AGGREGATE(OEOOBuyOther, OEAggregate, OE_OOBUYOTHER_FIELDS, OOBUYOTHER,
                    .Valid(OE_TAGS(OO, UNITTYPE))
                    .Required(OE_TAGS(OO, UNITTYPE)))
OE_DEFINE_AGGREGATE(OEOOBuyStock, OEAggregate, OE_OOBUYSTOCK_FIELDS, OOBUYSTOCK,
                    .Valid(OE_TAGS(OO, BUYTYPE))
                    .Required(OE_TAGS(OO, BUYTYPE)))
OE_DEFINE_AGGREGATE(OEOOSellDebt, OEAggregate, OE_OO_FIELD, OOSELLDEBT,
                    .Valid(OE_TAGS(OO))
                    .Required(OE_TAGS(OO)))
OE_DEFINE_AGGREGATE(OEOOSellMF, OEAggregate, OE_OOSELLMF_FIELDS, OOSELLMF,
                    .Valid(OE_TAGS(OO, SELLTYPE, UNITTYPE, SELLALL))
                    .Required(OE_TAGS(OO, SELLTYPE, UNITTYPE, SELLALL)))
OE_DEFINE_AGGREGATE(OEOOSellOpt, OEAggregate, OE_OOSELLOPT_FIELDS, OOSELLOPT,
                    .Valid(OE_TAGS(OO, OPTSELLTYPE))
                    .Required(OE_TAGS(OO, OPTSELLTYPE)))
OE_DEFINE_AGGREGATE(OEOOSellOther, OEAggregate, OE_OOBUYOTHER_FIELDS, OOSELLOTHER,
                    .Valid(OE_TAGS(OO, UNITTYPE))
                    .Required(OE_TAGS(OO, UNITTYPE)))
OE_DEFINE_AGGREGATE(OEOOSellStock, OEAggregate, OE_OOSELLSTOCK_FIELDS, OOSELLSTOCK,
                    .Valid(OE_TAGS(OO, SELLTYPE))
                    .Required(OE_TAGS(OO, SELLTYPE)))
OE_DEFINE_AGGREGATE(OEOOSwitchMF, OEAggregate, OE_OOSWITCHMF_FIELDS, OOSWITCHMF,
                    .Valid(OE_TAGS(OO, SECID, UNITTYPE, SWITCHALL))
                    .Required(OE_TAGS(OO, SECID, UNITTYPE, SWITCHALL)))
