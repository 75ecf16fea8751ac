#include "ofxkit/messages/bank/OEStopCheck.h"

OE_DEFINE_AGGREGATE(OECheckRange, OEAggregate, OE_CHECKRANGE_FIELDS, CHKRANGE,
                    .Valid(OE_TAGS(CHKNUMSTART, CHKNUMEND))
                    .Required(OE_TAGS(CHKNUMSTART)))
OE_DEFINE_AGGREGATE(OECheckDescription, OEAggregate, OE_CHECK_FIELDS, CHKDESC,
                    .Valid(OE_TAGS(NAME, CHEQUENUM, DTUSER, TRNAMT))
                    .Required(OE_TAGS(NAME)))
// The currency, which leads the valid order, is written last.
OE_DEFINE_AGGREGATE(OEStopCheckNumber, OEAggregate, OE_STOPCHECKNUMBER_FIELDS, STPCHKNUM,
                    .Valid(OE_TAGS(CURRENCY, ORIGCURRENCY, CHEQUENUM, NAME, DTUSER, TRNAMT, CHKSTATUS, CHKERROR))
                    .Required(OE_TAGS(CHEQUENUM, CHKSTATUS))
                    .WriteOrder(OE_TAGS(CHEQUENUM, NAME, DTUSER, TRNAMT, CHKSTATUS, CHKERROR, CURRENCY,
                                        ORIGCURRENCY)))
// A range of cheques or one cheque described, never both; an incomplete
// request is told of both ways.
OE_DEFINE_AGGREGATE(OEStopCheckRq, OETransBase, OE_STOPCHECKRQ_FIELDS, STPCHKRQ,
                    .Valid(OE_TAGS(BANKACCTFROM, CHKRANGE, CHKDESC))
                    .Required(OE_TAGS(BANKACCTFROM))
                    .Alternatives(OE_TAGS(CHKRANGE, CHKDESC)))
OE_DEFINE_AGGREGATE(OEStopCheckRs, OETransBase, OE_STOPCHECKRS_FIELDS, STPCHKRS,
                    .Valid(OE_TAGS(BANKACCTFROM, STPCHKNUM, CURDEF, FEE, FEEMSG))
                    .Required(OE_TAGS(BANKACCTFROM, STPCHKNUM, CURDEF, FEE, FEEMSG))
                    .WriteOrder(OE_TAGS(CURDEF, BANKACCTFROM, STPCHKNUM, FEE, FEEMSG)))
