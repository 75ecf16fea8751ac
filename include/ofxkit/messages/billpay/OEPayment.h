// Bill payments: the payment itself ("PMTINFO" with its extended-payment
// invoices), single and recurring payment requests and responses, their
// modifications, cancellations and status inquiries.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/billpay/OEPayee.h"

// Fields that payments, payees and transfers share.
#define OE_SRVRTID_FIELD(X) X(TEXT, ServerTransactionID, SRVRTID, OEString36)
#define OE_RECSRVRTID_FIELD(X) X(TEXT, RecServerTransactionID, RECSRVRTID, OEString36)
#define OE_CURDEF_FIELD(X) X(TEXT, CurrencyDefault, CURDEF, OEString3)
#define OE_PAYEELSTID_FIELD(X) X(TEXT, PayeeListID, PAYEELSTID, OEString12)
#define OE_CHEQUENUM_FIELD(X) X(TEXT, CheckNumber, CHEQUENUM, OEString12)
#define OE_MODPENDING_FIELD(X) X(FLAG, ModifyPending, MODPENDING, unsigned short)
#define OE_CANPENDING_FIELD(X) X(FLAG, CancelPending, CANPENDING, unsigned short)
#define OE_RECURRINST_FIELD(X) X(CHILD, RecInstructions, RECURRINST, OERecInstruction)

// How often a recurring payment or transfer is made, and how many times.
#define OE_RECINSTRUCTION_FIELDS(X)                   \
  X(VALUE, Frequency, FREQ, OEFrequency)              \
  X(VALUE, NumInstallments, NINSTS, unsigned short)

class OERecInstruction : public OEAggregate {
  OE_AGGREGATE(OERecInstruction, OE_RECINSTRUCTION_FIELDS)
};

// A payee as the institution knows it ("EXTDPAYEE"), with the days it needs.
#define OE_EXTENDEDPAYEE_FIELDS(X)                    \
  X(TEXT, PayeeID, PAYEEID, OEString12)               \
  X(VALUE, IDScope, IDSCOPE, OEPayeeIDScope)          \
  X(TEXT, Name, NAME, OEString32)                     \
  X(VALUE, DaysToPay, DAYSTOPAY, unsigned short)

class OEExtendedPayee : public OEAggregate {
  OE_AGGREGATE(OEExtendedPayee, OE_EXTENDEDPAYEE_FIELDS)
};

// Where a payment stands ("PMTPRCSTS"): its processing code and date.
#define OE_PAYMENTPRCSTS_FIELDS(X)                    \
  X(VALUE, ProcessingCode, PMTPRCCODE, OEProcCode)    \
  X(VALUE, DateTimeProcessed, DTPMTPRC, OEDateTime)

class OEPaymentPrcSts : public OEAggregate {
  OE_AGGREGATE(OEPaymentPrcSts, OE_PAYMENTPRCSTS_FIELDS)
};

// The invoice detail of an extended payment.
#define OE_DISCOUNT_FIELDS(X)                         \
  X(VALUE, Rate, DSCRATE, OEPercent)                  \
  X(VALUE, Amount, DSCAMT, OEPrecisionInteger)        \
  X(VALUE, Date, DSCDATE, OEDateTime)                 \
  X(TEXT, Description, DSCDESC, OEString80)

class OEDiscount : public OEAggregate {
  OE_AGGREGATE(OEDiscount, OE_DISCOUNT_FIELDS)
};

#define OE_ADJUSTMENT_FIELDS(X)                       \
  X(TEXT, Number, ADJNO, OEString32)                  \
  X(TEXT, Description, ADJDESC, OEString80)           \
  X(VALUE, Amount, ADJAMT, OEPrecisionInteger)        \
  X(VALUE, Date, ADJDATE, OEDateTime)

class OEAdjustment : public OEAggregate {
  OE_AGGREGATE(OEAdjustment, OE_ADJUSTMENT_FIELDS)
};

#define OE_LINEITEM_FIELDS(X)                         \
  X(VALUE, Amount, LITMAMT, OEPrecisionInteger)       \
  X(TEXT, Description, LITMDESC, OEString80)

class OELineItem : public OEAggregate {
  OE_AGGREGATE(OELineItem, OE_LINEITEM_FIELDS)
};

#define OE_INVOICE_FIELDS(X)                              \
  X(CHILD, Discount, DISCOUNT, OEDiscount)                \
  X(LIST, Adjustment, ADJUSTMENT, OEAdjustment)           \
  X(LIST, LineItem, LINEITEM, OELineItem)                 \
  X(TEXT, InvoiceNumber, INVNO, OEString32)               \
  X(VALUE, InvoiceTotalAmount, INVTOTALAMT, OEPrecisionInteger) \
  X(VALUE, InvoicePaidAmount, INVPAIDAMT, OEPrecisionInteger)   \
  X(VALUE, InvoiceDate, INVDATE, OEDateTime)              \
  X(TEXT, InvoiceDescription, INVDESC, OEString80)

class OEInvoice : public OEAggregate {
  OE_AGGREGATE(OEInvoice, OE_INVOICE_FIELDS)
};

#define OE_EXTENDEDPAYMENTINVOICE_FIELDS(X) X(LIST, Invoice, INVOICE, OEInvoice)

class OEExtendedPaymentInvoice : public OEAggregate {
  OE_AGGREGATE(OEExtendedPaymentInvoice, OE_EXTENDEDPAYMENTINVOICE_FIELDS)
};

#define OE_EXTENDEDPAYMENT_FIELDS(X)                                   \
  X(LIST, ExtendedPaymentInvoice, EXTDPMTINV, OEExtendedPaymentInvoice) \
  X(VALUE, PaymentFor, EXTDPMTFOR, OEExtdPmtFor)                       \
  X(TEXT, CheckNumber, EXTDPMTCHK, OEString10)                         \
  X(TEXT, Description, EXTDPMTDSC, OEString255)

class OEExtendedPayment : public OEAggregate {
  OE_AGGREGATE(OEExtendedPayment, OE_EXTENDEDPAYMENT_FIELDS)
};

// One payment ("PMTINFO"): from a bank account to a payee named either by
// the institution's id ("PAYEEID") or by name and address ("PAYEE").
#define OE_PAYMENTINFO_FIELDS(X)                              \
  X(CHILD, BankAcctFrom, BANKACCTFROM, OEBankAccount)         \
  X(CHILD, Payee, PAYEE, OEPayee)                             \
  X(CHILD, BankAcctTo, BANKACCTTO, OEBankAccount)             \
  X(CHILD, ExtendedPayment, EXTDPMT, OEExtendedPayment)       \
  X(VALUE, TranAmount, TRNAMT, OEPrecisionInteger)            \
  X(TEXT, PayeeID, PAYEEID, OEString12)                       \
  OE_PAYEELSTID_FIELD(X)                                      \
  X(TEXT, PayAccount, PAYACCT, OEString32)                    \
  X(VALUE, DateDue, DTDUE, OEDateTime)                        \
  X(TEXT, Memo, MEMO, OEString255)                            \
  X(TEXT, BillRefInfo, BILLREFINFO, OEString80)

class OEPaymentInfo : public OEAggregate {
  OE_AGGREGATE(OEPaymentInfo, OE_PAYMENTINFO_FIELDS)
};

// ---------------------------------------------------------------------------
// Single payments ("PMTTRNRQ", "PMTINQTRNRQ").

#define OE_PAYMENTBASE_FIELDS(X) X(CHILD, PaymentInfo, PMTINFO, OEPaymentInfo)

// Every request and response that carries a payment.
class OEPaymentBase : public OETransBase {
  OE_AGGREGATE(OEPaymentBase, OE_PAYMENTBASE_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEPaymentRq : public OEPaymentBase {
  OE_AGGREGATE(OEPaymentRq, OE_NO_FIELDS)
  using OEPaymentBase::DeepCopyFrom;
};

#define OE_PAYMENTRS_FIELDS(X)                                     \
  X(CHILD, ExtendedPayee, EXTDPAYEE, OEExtendedPayee)              \
  X(CHILD, PaymentPrcSts, PMTPRCSTS, OEPaymentPrcSts)              \
  OE_SRVRTID_FIELD(X) OE_PAYEELSTID_FIELD(X) OE_CURDEF_FIELD(X)    \
  OE_CHEQUENUM_FIELD(X) OE_RECSRVRTID_FIELD(X)

class OEPaymentRs : public OEPaymentBase {
  OE_AGGREGATE(OEPaymentRs, OE_PAYMENTRS_FIELDS)
  using OEPaymentBase::DeepCopyFrom;
};

class OEPaymentModifyRq : public OEPaymentBase {
  OE_AGGREGATE(OEPaymentModifyRq, OE_SRVRTID_FIELD)
  using OEPaymentBase::DeepCopyFrom;
};

#define OE_PAYMENTMODIFYRS_FIELDS(X)                      \
  X(CHILD, PaymentPrcSts, PMTPRCSTS, OEPaymentPrcSts)     \
  OE_SRVRTID_FIELD(X)

class OEPaymentModifyRs : public OEPaymentBase {
  OE_AGGREGATE(OEPaymentModifyRs, OE_PAYMENTMODIFYRS_FIELDS)
  using OEPaymentBase::DeepCopyFrom;
};

// Cancellations and inquiries name the payment by its server id.
class OEPaymentCanInqBase : public OETransBase {
  OE_AGGREGATE(OEPaymentCanInqBase, OE_SRVRTID_FIELD)
  using OETransBase::DeepCopyFrom;
};

class OEPaymentCancelRq : public OEPaymentCanInqBase {
  OE_AGGREGATE(OEPaymentCancelRq, OE_NO_FIELDS)
  using OEPaymentCanInqBase::DeepCopyFrom;
};

class OEPaymentCancelRs : public OEPaymentCanInqBase {
  OE_AGGREGATE(OEPaymentCancelRs, OE_NO_FIELDS)
  using OEPaymentCanInqBase::DeepCopyFrom;
};

class OEPaymentInquiryRq : public OEPaymentCanInqBase {
  OE_AGGREGATE(OEPaymentInquiryRq, OE_NO_FIELDS)
  using OEPaymentCanInqBase::DeepCopyFrom;
};

#define OE_PAYMENTINQUIRYRS_FIELDS(X)                     \
  X(CHILD, PaymentPrcSts, PMTPRCSTS, OEPaymentPrcSts)     \
  OE_CHEQUENUM_FIELD(X)

class OEPaymentInquiryRs : public OEPaymentCanInqBase {
  OE_AGGREGATE(OEPaymentInquiryRs, OE_PAYMENTINQUIRYRS_FIELDS)
  using OEPaymentCanInqBase::DeepCopyFrom;
};

// ---------------------------------------------------------------------------
// Recurring payments ("RECPMTTRNRQ").

#define OE_RECPAYMENTBASE_FIELDS(X)                             \
  OE_RECURRINST_FIELD(X)                                        \
  X(VALUE, InitialAmount, INITIALAMT, OEPrecisionInteger)       \
  X(VALUE, FinalAmount, FINALAMT, OEPrecisionInteger)

// A payment model: the payment, how it recurs, and a different first or
// last amount.
class OERecPaymentBase : public OEPaymentBase {
  OE_AGGREGATE(OERecPaymentBase, OE_RECPAYMENTBASE_FIELDS)
  using OEPaymentBase::DeepCopyFrom;
};

class OERecPaymentRq : public OERecPaymentBase {
  OE_AGGREGATE(OERecPaymentRq, OE_NO_FIELDS)
  using OERecPaymentBase::DeepCopyFrom;
};

#define OE_RECPAYMENTRS_FIELDS(X)                            \
  X(CHILD, ExtendedPayee, EXTDPAYEE, OEExtendedPayee)        \
  OE_RECSRVRTID_FIELD(X) OE_PAYEELSTID_FIELD(X) OE_CURDEF_FIELD(X)

class OERecPaymentRs : public OERecPaymentBase {
  OE_AGGREGATE(OERecPaymentRs, OE_RECPAYMENTRS_FIELDS)
  using OERecPaymentBase::DeepCopyFrom;
};

#define OE_RECPAYMENTMODIFYBASE_FIELDS(X) OE_RECSRVRTID_FIELD(X) OE_MODPENDING_FIELD(X)

class OERecPaymentModifyBase : public OERecPaymentBase {
  OE_AGGREGATE(OERecPaymentModifyBase, OE_RECPAYMENTMODIFYBASE_FIELDS)
  using OERecPaymentBase::DeepCopyFrom;
};

class OERecPaymentModifyRq : public OERecPaymentModifyBase {
  OE_AGGREGATE(OERecPaymentModifyRq, OE_NO_FIELDS)
  using OERecPaymentModifyBase::DeepCopyFrom;
};

class OERecPaymentModifyRs : public OERecPaymentModifyBase {
  OE_AGGREGATE(OERecPaymentModifyRs, OE_NO_FIELDS)
  using OERecPaymentModifyBase::DeepCopyFrom;
};

#define OE_RECCANCEL_FIELDS(X) OE_RECSRVRTID_FIELD(X) OE_CANPENDING_FIELD(X)

class OERecPaymentCancelBase : public OETransBase {
  OE_AGGREGATE(OERecPaymentCancelBase, OE_RECCANCEL_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OERecPaymentCancelRq : public OERecPaymentCancelBase {
  OE_AGGREGATE(OERecPaymentCancelRq, OE_NO_FIELDS)
  using OERecPaymentCancelBase::DeepCopyFrom;
};

class OERecPaymentCancelRs : public OERecPaymentCancelBase {
  OE_AGGREGATE(OERecPaymentCancelRs, OE_NO_FIELDS)
  using OERecPaymentCancelBase::DeepCopyFrom;
};
