// The investment statement: the request ("INVSTMTRQ") with what it asks to
// include, the response ("INVSTMTRS") with its lists and balances, and the
// profile descriptions of the investment and securities-list message sets.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OEBalance.h"
#include "ofxkit/messages/bank/OEStatementRq.h"
#include "ofxkit/messages/invest/OEInvLists.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"

#define OE_INCPOS_FIELDS(X)                    \
  X(VALUE, DtAsOf, DTASOF, OEDateTime)         \
  X(FLAG, Include, INCLUDE, unsigned short)

// Whether to include positions, and as of when.
class OEIncPos : public OEAggregate {
  OE_AGGREGATE(OEIncPos, OE_INCPOS_FIELDS)
};

#define OE_BALLIST_FIELDS(X) X(LIST, Balance, BAL, OEBalance)
class OEBalList : public OEAggregate {
  OE_AGGREGATE(OEBalList, OE_BALLIST_FIELDS)
};

#define OE_INVBAL_FIELDS(X)                                      \
  X(CHILD, BalList, BALLIST, OEBalList)                          \
  X(VALUE, AvailCash, AVAILCASH, OEPrecisionInteger)             \
  X(VALUE, MarginBalance, MARGINBALANCE, OEPrecisionInteger)     \
  X(VALUE, ShortBalance, SHORTBALANCE, OEPrecisionInteger)       \
  X(VALUE, BuyPower, BUYPOWER, OEPrecisionInteger)

// The cash, margin and short balances of an account, and its other balances.
class OEInvBal : public OEAggregate {
  OE_AGGREGATE(OEInvBal, OE_INVBAL_FIELDS)
};

#define OE_INVSTMTRQ_FIELDS(X)                                   \
  X(CHILD, InvAcctFrom, INVACCTFROM, OEInvAcctFrom)              \
  X(CHILD, IncTransaction, INCTRAN, OEIncTransaction)            \
  X(FLAG, IncludeOpenOrders, INCOO, unsigned short)              \
  X(CHILD, IncPos, INCPOS, OEIncPos)                             \
  X(FLAG, IncludeBalance, INCBAL, unsigned short)

class OEInvStmtRq : public OETransBase {
  OE_AGGREGATE(OEInvStmtRq, OE_INVSTMTRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_INVSTMTRS_FIELDS(X)                                   \
  X(VALUE, DtAsOf, DTASOF, OEDateTime)                           \
  X(TEXT, CurrencyDefault, CURDEF, OEString3)                    \
  X(CHILD, InvAcctFrom, INVACCTFROM, OEInvAcctFrom)              \
  X(CHILD, InvTranList, INVTRANLIST, OEInvTranList)              \
  X(CHILD, InvPosList, INVPOSLIST, OEInvPosList)                 \
  X(CHILD, InvBal, INVBAL, OEInvBal)                             \
  X(CHILD, InvOOList, INVOOLIST, OEInvOOList)                    \
  X(TEXT, MarketingInfo, MKTGINFO, OEString360)

class OEInvStmtRs : public OETransBase {
  OE_AGGREGATE(OEInvStmtRs, OE_INVSTMTRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_INVSTMTMSGSETV1_FIELDS(X)                         \
  X(FLAG, TranDnld, TRANDNLD, unsigned short)                \
  X(FLAG, OODnld, OODNLD, unsigned short)                    \
  X(FLAG, PosDnld, POSDNLD, unsigned short)                  \
  X(FLAG, BalDnld, BALDNLD, unsigned short)                  \
  X(FLAG, CanEMail, CANEMAIL, unsigned short)

// What an institution's investment statements can carry.
class OEInvStmtMsgSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEInvStmtMsgSetV1, OE_INVSTMTMSGSETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};

#define OE_SECLISTMSGSETV1_FIELDS(X) X(FLAG, SecListRqDnld, SECLISTRQDNLD, unsigned short)

// Whether the institution answers securities-list requests.
class OESecListMsgSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OESecListMsgSetV1, OE_SECLISTMSGSETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};
