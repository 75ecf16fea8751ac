// Investment transactions: the shared inner aggregates ("INVTRAN", "INVBUY",
// "INVSELL") and the twenty-one kinds of transaction around them.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OEBankTransactionList.h"
#include "ofxkit/messages/bank/OECurrency.h"
#include "ofxkit/messages/invest/OESecurities.h"

#define OE_INVTRAN_FIELDS(X)                         \
  X(TEXT, FITId, FITID, OEString255)                 \
  X(TEXT, ServerTxId, SRVRTID, OEString36)           \
  X(VALUE, DtTrade, DTTRADE, OEDateTime)             \
  X(VALUE, DtSettle, DTSETTLE, OEDateTime)           \
  X(TEXT, Memo, MEMO, OEString255)

// What every transaction has: its id, dates and memo. Linked to the kind of
// transaction that holds it (GetChildObj, GetChildType).
class OEInvTran : public OEOwnedAggregate {
  OE_AGGREGATE(OEInvTran, OE_INVTRAN_FIELDS)
};

// Field groups that several kinds share.
#define OE_INV_TRAN_FIELD(X) X(CHILD, InvTran, INVTRAN, OEInvTran)
#define OE_INV_SECURITY_FIELDS(X)                           \
  X(CHILD, SecID, SECID, OESecID)                           \
  X(CHILD, Currency, CURRENCY, OECurrency)                  \
  X(CHILD, OrigCurrency, ORIGCURRENCY, OECurrency)
#define OE_INV_UNITS_FIELDS(X)                              \
  X(VALUE, Units, UNITS, OEPrecisionInteger)                \
  X(VALUE, UnitPrice, UNITPRICE, OEPrecisionInteger)
#define OE_INV_COSTS_FIELDS(X)                              \
  X(VALUE, Commission, COMMISSION, OEPrecisionInteger)      \
  X(VALUE, Taxes, TAXES, OEPrecisionInteger)                \
  X(VALUE, Fees, FEES, OEPrecisionInteger)                  \
  X(VALUE, Load, LOAD, OEPrecisionInteger)
#define OE_INV_SUBACCTS_FIELDS(X)                           \
  X(VALUE, SubAcctSec, SUBACCTSEC, OESubAcct)               \
  X(VALUE, SubAcctFund, SUBACCTFUND, OESubAcct)
#define OE_INV_TOTAL_FIELD(X) X(VALUE, Total, TOTAL, OEPrecisionInteger)
#define OE_INV_MOVE_FIELDS(X)                               \
  X(VALUE, SubAcctTo, SUBACCTTO, OESubAcct)                 \
  X(VALUE, SubAcctFrom, SUBACCTFROM, OESubAcct)

#define OE_INVBUY_FIELDS(X)                                 \
  OE_INV_TRAN_FIELD(X)                                      \
  OE_INV_SECURITY_FIELDS(X)                                 \
  OE_INV_UNITS_FIELDS(X)                                    \
  X(VALUE, Markup, MARKUP, OEPrecisionInteger)              \
  OE_INV_COSTS_FIELDS(X)                                    \
  OE_INV_TOTAL_FIELD(X)                                     \
  OE_INV_SUBACCTS_FIELDS(X)

// The body of every buy. Its INVTRAN is linked to the buy kind around it.
// GetSecID(1) makes the security id when there is none.
class OEInvBuy : public OEOwnedAggregate {
  OE_AGGREGATE(OEInvBuy, OE_INVBUY_FIELDS)
};

#define OE_INVSELL_FIELDS(X)                                \
  OE_INV_TRAN_FIELD(X)                                      \
  OE_INV_SECURITY_FIELDS(X)                                 \
  OE_INV_UNITS_FIELDS(X)                                    \
  X(VALUE, Markdown, MARKDOWN, OEPrecisionInteger)          \
  OE_INV_COSTS_FIELDS(X)                                    \
  X(VALUE, Withholding, WITHHOLDING, OEPrecisionInteger)    \
  X(FLAG, TaxExempt, TAXEXEMPT, unsigned short)             \
  OE_INV_TOTAL_FIELD(X)                                     \
  X(VALUE, Gain, GAIN, OEPrecisionInteger)                  \
  OE_INV_SUBACCTS_FIELDS(X)

// The body of every sale.
class OEInvSell : public OEOwnedAggregate {
  OE_AGGREGATE(OEInvSell, OE_INVSELL_FIELDS)
};

// ---------------------------------------------------------------------------
// Buys and sales.

#define OE_INV_BUY_FIELD(X) X(CHILD, InvBuy, INVBUY, OEInvBuy)
#define OE_INV_SELL_FIELD(X) X(CHILD, InvSell, INVSELL, OEInvSell)

#define OE_BUYDEBT_FIELDS(X) OE_INV_BUY_FIELD(X) X(VALUE, AccruedInt, ACCRDINT, OEPrecisionInteger)
class OEBuyDebt : public OEAggregate {
  OE_AGGREGATE(OEBuyDebt, OE_BUYDEBT_FIELDS)
};

#define OE_BUYMF_FIELDS(X)                       \
  OE_INV_BUY_FIELD(X)                            \
  X(VALUE, BuyType, BUYTYPE, OEBuyType)          \
  X(TEXT, RelFITId, RELFITID, OEString255)
class OEBuyMF : public OEAggregate {
  OE_AGGREGATE(OEBuyMF, OE_BUYMF_FIELDS)
};

#define OE_BUYOPT_FIELDS(X)                                                   \
  OE_INV_BUY_FIELD(X)                                                         \
  X(VALUE, OptBuyType, OPTBUYTYPE, OEOptBuyType)                              \
  X(VALUE, FidelityOptBuyType, FIDELITY_OPTBUYTYPE, OEFidelityOptBuyType)     \
  X(VALUE, ShPerCtrct, SHPERCTRCT, uint32_t)
class OEBuyOpt : public OEAggregate {
  OE_AGGREGATE(OEBuyOpt, OE_BUYOPT_FIELDS)
};

class OEBuyOther : public OEAggregate {
  OE_AGGREGATE(OEBuyOther, OE_INV_BUY_FIELD)
};

#define OE_BUYSTOCK_FIELDS(X) OE_INV_BUY_FIELD(X) X(VALUE, BuyType, BUYTYPE, OEBuyType)
class OEBuyStock : public OEAggregate {
  OE_AGGREGATE(OEBuyStock, OE_BUYSTOCK_FIELDS)
};

#define OE_SELLDEBT_FIELDS(X)                            \
  OE_INV_SELL_FIELD(X)                                   \
  X(VALUE, SellReason, SELLREASON, OESellReason)         \
  X(VALUE, AccruedInt, ACCRDINT, OEPrecisionInteger)
class OESellDebt : public OEAggregate {
  OE_AGGREGATE(OESellDebt, OE_SELLDEBT_FIELDS)
};

#define OE_SELLMF_FIELDS(X)                                  \
  OE_INV_SELL_FIELD(X)                                       \
  X(VALUE, SellType, SELLTYPE, OESellType)                   \
  X(VALUE, AvgCostBasis, AVGCOSTBASIS, OEPrecisionInteger)   \
  X(TEXT, RelFITId, RELFITID, OEString255)
class OESellMF : public OEAggregate {
  OE_AGGREGATE(OESellMF, OE_SELLMF_FIELDS)
};

#define OE_SELLOPT_FIELDS(X)                                                  \
  OE_INV_SELL_FIELD(X)                                                        \
  X(VALUE, OptSellType, OPTSELLTYPE, OEOptSellType)                           \
  X(VALUE, FidelityOptSellType, FIDELITY_OPTSELLTYPE, OEFidelityOptSellType)  \
  X(VALUE, ShPerCtrct, SHPERCTRCT, uint32_t)                                  \
  X(TEXT, RelFITId, RELFITID, OEString255)                                    \
  X(VALUE, RelType, RELTYPE, OERelType)                                       \
  X(VALUE, Secured, SECURED, OESecured)
class OESellOpt : public OEAggregate {
  OE_AGGREGATE(OESellOpt, OE_SELLOPT_FIELDS)
};

class OESellOther : public OEAggregate {
  OE_AGGREGATE(OESellOther, OE_INV_SELL_FIELD)
};

#define OE_SELLSTOCK_FIELDS(X) OE_INV_SELL_FIELD(X) X(VALUE, SellType, SELLTYPE, OESellType)
class OESellStock : public OEAggregate {
  OE_AGGREGATE(OESellStock, OE_SELLSTOCK_FIELDS)
};

// ---------------------------------------------------------------------------
// The kinds built directly on INVTRAN.

#define OE_INCOME_FIELDS(X)                                 \
  OE_INV_TRAN_FIELD(X)                                      \
  OE_INV_SECURITY_FIELDS(X)                                 \
  X(VALUE, IncomeType, INCOMETYPE, OEIncomeType)            \
  OE_INV_TOTAL_FIELD(X)                                     \
  OE_INV_SUBACCTS_FIELDS(X)                                 \
  X(VALUE, Withholding, WITHHOLDING, OEPrecisionInteger)    \
  X(FLAG, TaxExempt, TAXEXEMPT, unsigned short)
class OEIncome : public OEAggregate {
  OE_AGGREGATE(OEIncome, OE_INCOME_FIELDS)
};

#define OE_REINVEST_FIELDS(X)                               \
  OE_INV_TRAN_FIELD(X)                                      \
  OE_INV_SECURITY_FIELDS(X)                                 \
  X(VALUE, IncomeType, INCOMETYPE, OEIncomeType)            \
  OE_INV_TOTAL_FIELD(X)                                     \
  X(VALUE, SubAcctSec, SUBACCTSEC, OESubAcct)               \
  OE_INV_UNITS_FIELDS(X)                                    \
  OE_INV_COSTS_FIELDS(X)                                    \
  X(FLAG, TaxExempt, TAXEXEMPT, unsigned short)
class OEReinvest : public OEAggregate {
  OE_AGGREGATE(OEReinvest, OE_REINVEST_FIELDS)
};

// A return of capital and an investment expense carry the same fields.
#define OE_INV_CASHFLOW_FIELDS(X)   \
  OE_INV_TRAN_FIELD(X)              \
  OE_INV_SECURITY_FIELDS(X)         \
  OE_INV_TOTAL_FIELD(X)             \
  OE_INV_SUBACCTS_FIELDS(X)
class OERetOfCap : public OEAggregate {
  OE_AGGREGATE(OERetOfCap, OE_INV_CASHFLOW_FIELDS)
};
class OEInvExpense : public OEAggregate {
  OE_AGGREGATE(OEInvExpense, OE_INV_CASHFLOW_FIELDS)
};

#define OE_MARGININTEREST_FIELDS(X)                         \
  OE_INV_TRAN_FIELD(X)                                      \
  X(CHILD, Currency, CURRENCY, OECurrency)                  \
  X(CHILD, OrigCurrency, ORIGCURRENCY, OECurrency)          \
  OE_INV_TOTAL_FIELD(X)                                     \
  X(VALUE, SubAcctFund, SUBACCTFUND, OESubAcct)
class OEMarginInterest : public OEAggregate {
  OE_AGGREGATE(OEMarginInterest, OE_MARGININTEREST_FIELDS)
};

#define OE_JRNLFUND_FIELDS(X) OE_INV_TRAN_FIELD(X) OE_INV_MOVE_FIELDS(X) OE_INV_TOTAL_FIELD(X)
class OEJrnlFund : public OEAggregate {
  OE_AGGREGATE(OEJrnlFund, OE_JRNLFUND_FIELDS)
};

#define OE_JRNLSEC_FIELDS(X)                                \
  OE_INV_TRAN_FIELD(X)                                      \
  X(CHILD, SecID, SECID, OESecID)                           \
  OE_INV_MOVE_FIELDS(X)                                     \
  X(VALUE, Units, UNITS, OEPrecisionInteger)
class OEJrnlSec : public OEAggregate {
  OE_AGGREGATE(OEJrnlSec, OE_JRNLSEC_FIELDS)
};

#define OE_SPLIT_FIELDS(X)                                  \
  OE_INV_TRAN_FIELD(X)                                      \
  OE_INV_SECURITY_FIELDS(X)                                 \
  OE_INV_SUBACCTS_FIELDS(X)                                 \
  X(VALUE, OldUnits, OLDUNITS, OEPrecisionInteger)          \
  X(VALUE, NewUnits, NEWUNITS, OEPrecisionInteger)          \
  X(VALUE, Numerator, NUMERATOR, OEPrecisionInteger)        \
  X(VALUE, Denominator, DENOMINATOR, OEPrecisionInteger)    \
  X(VALUE, FracCash, FRACCASH, OEPrecisionInteger)
class OESplit : public OEAggregate {
  OE_AGGREGATE(OESplit, OE_SPLIT_FIELDS)
};

#define OE_TRANSFER_FIELDS(X)                                \
  OE_INV_TRAN_FIELD(X)                                       \
  X(CHILD, SecID, SECID, OESecID)                            \
  X(CHILD, InvAcctFrom, INVACCTFROM, OEInvAcctFrom)          \
  X(VALUE, SubAcctSec, SUBACCTSEC, OESubAcct)                \
  OE_INV_UNITS_FIELDS(X)                                     \
  X(VALUE, TferAction, TFERACTION, OETferAction)             \
  X(VALUE, PosType, POSTYPE, OEPosType)                      \
  X(VALUE, AvgCostBasis, AVGCOSTBASIS, OEPrecisionInteger)   \
  X(VALUE, DtPurchase, DTPURCHASE, OEDateTime)
class OETransfer : public OEAggregate {
  OE_AGGREGATE(OETransfer, OE_TRANSFER_FIELDS)
};

#define OE_CLOSUREOPT_FIELDS(X)                         \
  OE_INV_TRAN_FIELD(X)                                  \
  X(CHILD, SecID, SECID, OESecID)                       \
  X(VALUE, OptAction, OPTACTION, OEOptAction)           \
  X(VALUE, Units, UNITS, OEPrecisionInteger)            \
  X(VALUE, ShPerCtrct, SHPERCTRCT, uint32_t)            \
  X(VALUE, SubAcctSec, SUBACCTSEC, OESubAcct)           \
  X(TEXT, RelFITId, RELFITID, OEString255)              \
  X(VALUE, Gain, GAIN, OEPrecisionInteger)
class OEClosureOpt : public OEAggregate {
  OE_AGGREGATE(OEClosureOpt, OE_CLOSUREOPT_FIELDS)
};

// A cash movement of the account: a bank transaction and the sub-account it
// touches. Its own INVTRAN is not part of the file: the transaction list's
// generic index fills it from the bank transaction (GetInvTran makes it).
#define OE_INVBANKTRAN_FIELDS(X)                            \
  X(CHILD, StatementTx, STMTTRN, OEBankStatementTx)         \
  X(VALUE, SubAcctFund, SUBACCTFUND, OESubAcct)             \
  X(CHILD, IndexTran, INVTRAN, OEInvTran)
class OEInvBankTran : public OEAggregate {
  OE_AGGREGATE(OEInvBankTran, OE_INVBANKTRAN_FIELDS)

  // The INVTRAN that stands for this transaction in the generic index, made
  // on first use (null only when memory or the factory fails).
  OEInvTran* GetInvTran() { return GetIndexTran(1); }
};
