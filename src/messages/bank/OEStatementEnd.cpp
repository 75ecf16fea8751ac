#include "ofxkit/messages/bank/OEStatementEnd.h"

// Both kinds of closing write their currency last.
OE_DEFINE_AGGREGATE(OEClosing, OEAggregate, OE_CLOSING_FIELDS, CLOSING,
                    .Valid(OE_TAGS(CURRENCY, ORIGCURRENCY, FITID, DTOPEN, DTCLOSE, DTNEXT, BALOPEN, BALCLOSE, BALMIN,
                                   DEPANDCREDIT, CHKANDDEB, TOTALFEES, TOTALINT, DTPOSTSTART, DTPOSTEND, MKTGINFO))
                    .Required(OE_TAGS(FITID, DTCLOSE, BALCLOSE, DTPOSTSTART, DTPOSTEND))
                    .WriteOrder(OE_TAGS(FITID, DTOPEN, DTCLOSE, DTNEXT, BALOPEN, BALCLOSE, BALMIN, DEPANDCREDIT,
                                        CHKANDDEB, TOTALFEES, TOTALINT, DTPOSTSTART, DTPOSTEND, MKTGINFO, CURRENCY,
                                        ORIGCURRENCY)))
OE_DEFINE_AGGREGATE(OECCClosing, OEAggregate, OE_CCCLOSING_FIELDS, CCCLOSING,
                    .Valid(OE_TAGS(CURRENCY, ORIGCURRENCY, FITID, DTOPEN, DTCLOSE, DTNEXT, BALOPEN, BALCLOSE,
                                   DTPMTDUE, MINPMTDUE, FINCHG, PAYANDCREDIT, PURANDADV, DEBADJ, CREDITLIMIT,
                                   DTPOSTSTART, DTPOSTEND, MKTGINFO))
                    .Required(OE_TAGS(FITID, DTCLOSE, BALCLOSE, DTPOSTSTART, DTPOSTEND))
                    .WriteOrder(OE_TAGS(FITID, DTOPEN, DTCLOSE, DTNEXT, BALOPEN, BALCLOSE, DTPMTDUE, MINPMTDUE, FINCHG,
                                        PAYANDCREDIT, PURANDADV, DEBADJ, CREDITLIMIT, DTPOSTSTART, DTPOSTEND,
                                        MKTGINFO, CURRENCY, ORIGCURRENCY)))

OE_DEFINE_AGGREGATE(OEStatementEndRq, OETransBase, OE_STATEMENTENDRQ_FIELDS, STMTENDRQ,
                    .Valid(OE_TAGS(BANKACCTFROM, DTSTART, DTEND))
                    .Required(OE_TAGS(BANKACCTFROM)))
OE_DEFINE_AGGREGATE(OECCStatementEndRq, OETransBase, OE_CCSTATEMENTENDRQ_FIELDS, CCSTMTENDRQ,
                    .Valid(OE_TAGS(CCACCTFROM, DTSTART, DTEND))
                    .Required(OE_TAGS(CCACCTFROM)))

// The answers write the currency first, then the account and the closings.
OE_DEFINE_AGGREGATE(OEStatementEndRs, OETransBase, OE_STATEMENTENDRS_FIELDS, STMTENDRS,
                    .Valid(OE_TAGS(BANKACCTFROM, CLOSING, CURDEF))
                    .Required(OE_TAGS(BANKACCTFROM, CURDEF))
                    .WriteOrder(OE_TAGS(CURDEF, BANKACCTFROM, CLOSING)))
OE_DEFINE_AGGREGATE(OECCStatementEndRs, OETransBase, OE_CCSTATEMENTENDRS_FIELDS, CCSTMTENDRS,
                    .Valid(OE_TAGS(CCACCTFROM, CCCLOSING, CURDEF))
                    .Required(OE_TAGS(CCACCTFROM, CURDEF))
                    .WriteOrder(OE_TAGS(CURDEF, CCACCTFROM, CCCLOSING)))

namespace {
template <class T>
T* Disconnect(OEAggregate* self, OEDynamicArrayTyped<T>& list, unsigned short index, OETagID tag) {
  T* entry = list.Get(index);
  if (!entry || !list.UnSet(index)) return nullptr;
  if (list.Entries() == 0) self->ClearTagQuietly(tag);
  return entry;
}
}  // namespace

OEClosing* OEStatementEndRs::DisconnectClosing(unsigned short index) {
  return Disconnect(this, FieldClosing(), index, OE_TAG_CLOSING);
}

OECCClosing* OECCStatementEndRs::DisconnectCCClosing(unsigned short index) {
  return Disconnect(this, FieldCCClosing(), index, OE_TAG_CCCLOSING);
}
