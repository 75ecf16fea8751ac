#include "ofxkit/messages/invest/OESecurities.h"

OE_DEFINE_AGGREGATE(OESecID, OEAggregate, OE_SECID_FIELDS, SECID,
                    .Valid(OE_TAGS(UNIQUEID, UNIQUEIDTYPE))
                    .Required(OE_TAGS(UNIQUEID, UNIQUEIDTYPE)))
OE_DEFINE_AGGREGATE(OESecInfo, OEOwnedAggregate, OE_SECINFO_FIELDS, SECINFO,
                    .Valid(OE_TAGS(SECID, CURRENCY, SECNAME, TICKER, FIID, RATING, UNITPRICE, DTASOF, MEMO))
                    .Required(OE_TAGS(SECID, SECNAME)))
OE_DEFINE_AGGREGATE(OEPortion, OEAggregate, OE_PORTION_FIELDS, PORTION,
                    .Valid(OE_TAGS(ASSETCLASS, PERCENT))
                    .Required(OE_TAGS(ASSETCLASS, PERCENT)))
OE_DEFINE_AGGREGATE(OEFIPortion, OEAggregate, OE_FIPORTION_FIELDS, FIPORTION,
                    .Valid(OE_TAGS(FIASSETCLASS, PERCENT))
                    .Required(OE_TAGS(FIASSETCLASS, PERCENT)))
OE_DEFINE_AGGREGATE(OEMFAssetClass, OEAggregate, OE_MFASSETCLASS_FIELDS, MFASSETCLASS,
                    .Valid(OE_TAGS(PORTION))
                    .Required(OE_TAGS(PORTION)))
OE_DEFINE_AGGREGATE(OEFIMFAssetClass, OEAggregate, OE_FIMFASSETCLASS_FIELDS, FIMFASSETCLASS,
                    .Valid(OE_TAGS(FIPORTION))
                    .Required(OE_TAGS(FIPORTION)))

OE_DEFINE_AGGREGATE(OEDebtInfo, OEAggregate, OE_DEBTINFO_FIELDS, DEBTINFO,
                    .Valid(OE_TAGS(SECINFO, PARVALUE, DEBTTYPE, DEBTCLASS, COUPONRT, DTCOUPON, COUPONFREQ, CALLPRICE,
                                   YIELDTOCALL, DTCALL, CALLTYPE, YIELDTOMAT, DTMAT, ASSETCLASS, FIASSETCLASS))
                    .Required(OE_TAGS(SECINFO, PARVALUE, DEBTTYPE)))
OE_DEFINE_AGGREGATE(OEMFInfo, OEAggregate, OE_MFINFO_FIELDS, MFINFO,
                    .Valid(OE_TAGS(SECINFO, MFTYPE, YIELD, DTYIELDASOF, MFASSETCLASS, FIMFASSETCLASS))
                    .Required(OE_TAGS(SECINFO)))
OE_DEFINE_AGGREGATE(OEOptInfo, OEAggregate, OE_OPTINFO_FIELDS, OPTINFO,
                    .Valid(OE_TAGS(SECINFO, OPTTYPE, STRIKEPRICE, DTEXPIRE, SHPERCTRCT, SECID, ASSETCLASS,
                                   FIASSETCLASS))
                    .Required(OE_TAGS(SECINFO, OPTTYPE, STRIKEPRICE, DTEXPIRE, SHPERCTRCT)))
OE_DEFINE_AGGREGATE(OEOtherInfo, OEAggregate, OE_OTHERINFO_FIELDS, OTHERINFO,
                    .Valid(OE_TAGS(SECINFO, TYPEDESC, ASSETCLASS, FIASSETCLASS))
                    .Required(OE_TAGS(SECINFO)))
OE_DEFINE_AGGREGATE(OEStockInfo, OEAggregate, OE_STOCKINFO_FIELDS, STOCKINFO,
                    .Valid(OE_TAGS(SECINFO, STOCKTYPE, YIELD, DTYIELDASOF, ASSETCLASS, FIASSETCLASS))
                    .Required(OE_TAGS(SECINFO)))

OE_DEFINE_AGGREGATE(OESecList, OEAggregate, OE_SECLIST_FIELDS, SECLIST,
                    .Valid(OE_TAGS(DEBTINFO, MFINFO, OPTINFO, OTHERINFO, STOCKINFO)))
OE_DEFINE_AGGREGATE(OESecRq, OEAggregate, OE_SECRQ_FIELDS, SECRQ,
                    .Valid(OE_TAGS(SECID, TICKER, FIID))
                    .ExactlyOneOf(OE_TAGS(SECID, TICKER, FIID)))
OE_DEFINE_AGGREGATE(OESecListRq, OETransBase, OE_SECLISTRQ_FIELDS, SECLISTRQ,
                    .Valid(OE_TAGS(SECRQ))
                    .Required(OE_TAGS(SECRQ)))
OE_DEFINE_AGGREGATE(OESecListRs, OETransBase, OE_NO_FIELDS, SECLISTRS, )

namespace {
bool SameSecurity(const OESecID* a, const OESecID& b) {
  return a && a->GetUniqueID() == b.GetUniqueID() && a->GetUniqueIDType() == b.GetUniqueIDType();
}
}  // namespace

const OESecInfo* OESecList::FindSecInfo(const OESecID& id) const {
  // Every kind holds its SECINFO as its first child.
  for (unsigned short i = 0, n = GetNumberOfChildren(); i < n; ++i) {
    const OEDataObj* kind = GetChild(i);
    const OESecInfo* info = kind ? dynamic_cast<const OESecInfo*>(kind->GetChild(0)) : nullptr;
    if (info && SameSecurity(info->GetSecID(), id)) return info;
  }
  return nullptr;
}
