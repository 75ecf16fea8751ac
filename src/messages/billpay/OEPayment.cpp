#include "ofxkit/messages/billpay/OEPayment.h"

OE_DEFINE_AGGREGATE(OERecInstruction, OEAggregate, OE_RECINSTRUCTION_FIELDS, RECURRINST,
                    .Valid(OE_TAGS(FREQ, NINSTS))
                    .Required(OE_TAGS(FREQ)))
OE_DEFINE_AGGREGATE(OEExtendedPayee, OEAggregate, OE_EXTENDEDPAYEE_FIELDS, EXTDPAYEE,
                    .Valid(OE_TAGS(PAYEEID, IDSCOPE, NAME, DAYSTOPAY))
                    .Required(OE_TAGS(DAYSTOPAY)))
OE_DEFINE_AGGREGATE(OEPaymentPrcSts, OEAggregate, OE_PAYMENTPRCSTS_FIELDS, PMTPRCSTS,
                    .Valid(OE_TAGS(PMTPRCCODE, DTPMTPRC))
                    .Required(OE_TAGS(PMTPRCCODE, DTPMTPRC)))

OE_DEFINE_AGGREGATE(OEDiscount, OEAggregate, OE_DISCOUNT_FIELDS, DISCOUNT,
                    .Valid(OE_TAGS(DSCRATE, DSCAMT, DSCDATE, DSCDESC))
                    .Required(OE_TAGS(DSCRATE, DSCAMT, DSCDESC)))
OE_DEFINE_AGGREGATE(OEAdjustment, OEAggregate, OE_ADJUSTMENT_FIELDS, ADJUSTMENT,
                    .Valid(OE_TAGS(ADJNO, ADJDESC, ADJAMT, ADJDATE))
                    .Required(OE_TAGS(ADJDESC, ADJAMT)))
OE_DEFINE_AGGREGATE(OELineItem, OEAggregate, OE_LINEITEM_FIELDS, LINEITEM,
                    .Valid(OE_TAGS(LITMAMT, LITMDESC))
                    .Required(OE_TAGS(LITMAMT, LITMDESC)))
OE_DEFINE_AGGREGATE(OEInvoice, OEAggregate, OE_INVOICE_FIELDS, INVOICE,
                    .Valid(OE_TAGS(DISCOUNT, ADJUSTMENT, LINEITEM, INVNO, INVTOTALAMT, INVPAIDAMT, INVDATE, INVDESC))
                    .Required(OE_TAGS(INVNO, INVTOTALAMT, INVPAIDAMT, INVDATE, INVDESC)))
OE_DEFINE_AGGREGATE(OEExtendedPaymentInvoice, OEAggregate, OE_EXTENDEDPAYMENTINVOICE_FIELDS, EXTDPMTINV,
                    .Valid(OE_TAGS(INVOICE))
                    .Required(OE_TAGS(INVOICE)))
OE_DEFINE_AGGREGATE(OEExtendedPayment, OEAggregate, OE_EXTENDEDPAYMENT_FIELDS, EXTDPMT,
                    .Valid(OE_TAGS(EXTDPMTINV, EXTDPMTFOR, EXTDPMTCHK, EXTDPMTDSC)))

// The payee is named one way or the other, never both: an incomplete payment
// is told of both ways.
OE_DEFINE_AGGREGATE(OEPaymentInfo, OEAggregate, OE_PAYMENTINFO_FIELDS, PMTINFO,
                    .Valid(OE_TAGS(BANKACCTFROM, PAYEE, BANKACCTTO, EXTDPMT, TRNAMT, PAYEEID, PAYEELSTID, PAYACCT,
                                   DTDUE, MEMO, BILLREFINFO))
                    .Required(OE_TAGS(BANKACCTFROM, TRNAMT, PAYACCT, DTDUE))
                    .Alternatives(OE_TAGS(PAYEEID, PAYEE)))

OE_DEFINE_AGGREGATE(OEPaymentBase, OETransBase, OE_PAYMENTBASE_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEPaymentRq, OEPaymentBase, OE_NO_FIELDS, PMTRQ,
                    .Valid(OE_TAGS(PMTINFO))
                    .Required(OE_TAGS(PMTINFO)))
OE_DEFINE_AGGREGATE(OEPaymentRs, OEPaymentBase, OE_PAYMENTRS_FIELDS, PMTRS,
                    .Valid(OE_TAGS(PMTINFO, EXTDPAYEE, PMTPRCSTS, SRVRTID, PAYEELSTID, CURDEF, CHEQUENUM, RECSRVRTID))
                    .Required(OE_TAGS(PMTINFO, PMTPRCSTS, SRVRTID, PAYEELSTID, CURDEF)))
OE_DEFINE_AGGREGATE(OEPaymentModifyRq, OEPaymentBase, OE_SRVRTID_FIELD, PMTMODRQ,
                    .Valid(OE_TAGS(PMTINFO, SRVRTID))
                    .Required(OE_TAGS(PMTINFO, SRVRTID)))
OE_DEFINE_AGGREGATE(OEPaymentModifyRs, OEPaymentBase, OE_PAYMENTMODIFYRS_FIELDS, PMTMODRS,
                    .Valid(OE_TAGS(PMTINFO, PMTPRCSTS, SRVRTID))
                    .Required(OE_TAGS(PMTINFO, SRVRTID)))

OE_DEFINE_AGGREGATE(OEPaymentCanInqBase, OETransBase, OE_SRVRTID_FIELD, NONE,
                    .Valid(OE_TAGS(SRVRTID))
                    .Required(OE_TAGS(SRVRTID)))
OE_DEFINE_AGGREGATE(OEPaymentCancelRq, OEPaymentCanInqBase, OE_NO_FIELDS, PMTCANCRQ,
                    .Valid(OE_TAGS(SRVRTID))
                    .Required(OE_TAGS(SRVRTID)))
OE_DEFINE_AGGREGATE(OEPaymentCancelRs, OEPaymentCanInqBase, OE_NO_FIELDS, PMTCANCRS,
                    .Valid(OE_TAGS(SRVRTID))
                    .Required(OE_TAGS(SRVRTID)))
OE_DEFINE_AGGREGATE(OEPaymentInquiryRq, OEPaymentCanInqBase, OE_NO_FIELDS, PMTINQRQ,
                    .Valid(OE_TAGS(SRVRTID))
                    .Required(OE_TAGS(SRVRTID)))
OE_DEFINE_AGGREGATE(OEPaymentInquiryRs, OEPaymentCanInqBase, OE_PAYMENTINQUIRYRS_FIELDS, PMTINQRS,
                    .Valid(OE_TAGS(PMTPRCSTS, SRVRTID, CHEQUENUM))
                    .Required(OE_TAGS(PMTPRCSTS, SRVRTID)))

OE_DEFINE_AGGREGATE(OERecPaymentBase, OEPaymentBase, OE_RECPAYMENTBASE_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OERecPaymentRq, OERecPaymentBase, OE_NO_FIELDS, RECPMTRQ,
                    .Valid(OE_TAGS(PMTINFO, RECURRINST, INITIALAMT, FINALAMT))
                    .Required(OE_TAGS(PMTINFO, RECURRINST)))
OE_DEFINE_AGGREGATE(OERecPaymentRs, OERecPaymentBase, OE_RECPAYMENTRS_FIELDS, RECPMTRS,
                    .Valid(OE_TAGS(PMTINFO, EXTDPAYEE, RECSRVRTID, PAYEELSTID, CURDEF, RECURRINST, INITIALAMT,
                                   FINALAMT))
                    .Required(OE_TAGS(PMTINFO, RECSRVRTID, PAYEELSTID, CURDEF, RECURRINST)))
OE_DEFINE_AGGREGATE(OERecPaymentModifyBase, OERecPaymentBase, OE_RECPAYMENTMODIFYBASE_FIELDS, NONE,
                    .Valid(OE_TAGS(PMTINFO, RECSRVRTID, RECURRINST, INITIALAMT, FINALAMT, MODPENDING))
                    .Required(OE_TAGS(PMTINFO, RECSRVRTID, RECURRINST, MODPENDING)))
OE_DEFINE_AGGREGATE(OERecPaymentModifyRq, OERecPaymentModifyBase, OE_NO_FIELDS, RECPMTMODRQ,
                    .Valid(OE_TAGS(PMTINFO, RECSRVRTID, RECURRINST, INITIALAMT, FINALAMT, MODPENDING))
                    .Required(OE_TAGS(PMTINFO, RECSRVRTID, RECURRINST, MODPENDING)))
OE_DEFINE_AGGREGATE(OERecPaymentModifyRs, OERecPaymentModifyBase, OE_NO_FIELDS, RECPMTMODRS,
                    .Valid(OE_TAGS(PMTINFO, RECSRVRTID, RECURRINST, INITIALAMT, FINALAMT, MODPENDING))
                    .Required(OE_TAGS(PMTINFO, RECSRVRTID, RECURRINST, MODPENDING)))
OE_DEFINE_AGGREGATE(OERecPaymentCancelBase, OETransBase, OE_RECCANCEL_FIELDS, NONE,
                    .Valid(OE_TAGS(RECSRVRTID, CANPENDING))
                    .Required(OE_TAGS(RECSRVRTID, CANPENDING)))
OE_DEFINE_AGGREGATE(OERecPaymentCancelRq, OERecPaymentCancelBase, OE_NO_FIELDS, RECPMTCANCRQ,
                    .Valid(OE_TAGS(RECSRVRTID, CANPENDING))
                    .Required(OE_TAGS(RECSRVRTID, CANPENDING)))
OE_DEFINE_AGGREGATE(OERecPaymentCancelRs, OERecPaymentCancelBase, OE_NO_FIELDS, RECPMTCANCRS,
                    .Valid(OE_TAGS(RECSRVRTID, CANPENDING))
                    .Required(OE_TAGS(RECSRVRTID, CANPENDING)))
