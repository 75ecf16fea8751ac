#include "ofxkit/messages/bank/OEBankTransactionList.h"

OE_DEFINE_AGGREGATE(OEBankStatementTx, OEAggregate, OE_BANKSTATEMENTTX_FIELDS, STMTTRN,
                    .Valid(OE_TAGS(STMTTRN, TRNTYPE, DTPOSTED, DTUSER, DTAVAIL, TRNAMT, FITID, CORRECTFITID,
                                   CORRECTACTION, SRVRTID, CHEQUENUM, REFNUM, SIC, PAYEEID, NAME, PAYEE, BANKACCTTO,
                                   CCACCTTO, MEMO, CURRENCY, ORIGCURRENCY))
                    .Required(OE_TAGS(TRNTYPE, DTPOSTED, TRNAMT, FITID))
                    .OneOf(OE_TAG_NAME, OE_TAG_PAYEE)
                    .OneOf(OE_TAG_BANKACCTTO, OE_TAG_CCACCTTO))

OETagID OEBankStatementTx::GetFirstMissingRequiredTag(OETagID after) const {
  OETagID answer = OEDataObj::GetFirstMissingRequiredTag(after);
  if (answer != OE_TAG_NONE) return answer;
  // The walk goes on past the last absent required tag (or from the start).
  bool passed = after == OE_TAG_NONE;
  if (!passed && !ValidateTag(after)) {
    OEArrayOfTags required{nullptr, 0};
    GetArrayOfRequiredTags(required);
    for (unsigned short i = 0; i < required.count && !passed; ++i) passed = required.tags[i] == after;
  }
  for (const OEAggregateInfo::Pair& pair : GetInfo().oneOf) {
    if (ValidateTag(pair.first) || ValidateTag(pair.second)) continue;
    for (OETagID tag : {pair.first, pair.second}) {
      if (passed) return tag;
      passed = tag == after;
    }
  }
  return OE_TAG_NONE;
}

OE_DEFINE_AGGREGATE(OEBankTransactionList, OEAggregate, OE_BANKTRANSACTIONLIST_FIELDS, BANKTRANLIST,
                    .Valid(OE_TAGS(DTSTART, DTEND, STMTTRN))
                    .Required(OE_TAGS(DTSTART, DTEND)))
