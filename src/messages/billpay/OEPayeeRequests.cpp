#include "ofxkit/messages/billpay/OEPayeeRequests.h"

OE_DEFINE_AGGREGATE(OEPayeeBase, OETransBase, OE_PAYEEBASE_FIELDS, NONE, )

const OEString32& OEPayeeBase::GetPayAccount() const {
  static const OEString32 kNone;
  const OEString32* first = GetPayAccount(0);
  return first ? *first : kNone;
}

// A payee from the standard list is named by its id alone; any other comes
// with its address (and perhaps the account it is paid into).
OE_DEFINE_AGGREGATE(OEPayeeRq, OEPayeeBase, OE_PAYEERQ_FIELDS, PAYEERQ,
                    .Valid(OE_TAGS(PAYEE, BANKACCTTO, PAYEEID, PAYACCT))
                    .Alternatives(OE_TAGS(PAYEEID, PAYEE))
                    .Excludes(OE_TAG_PAYEEID, OE_TAG_BANKACCTTO))

// An account to pay into is only meaningful with the payee's address.
OE_DEFINE_AGGREGATE(OEPayeeRs, OEPayeeBase, OE_PAYEERS_FIELDS, PAYEERS,
                    .Valid(OE_TAGS(PAYEE, BANKACCTTO, EXTDPAYEE, PAYEELSTID, PAYACCT))
                    .Required(OE_TAGS(PAYEELSTID))
                    .RequiresIf(OE_TAG_BANKACCTTO, OE_TAG_PAYEE))
OE_DEFINE_AGGREGATE(OEPayeeModifyRq, OEPayeeBase, OE_PAYEELSTID_FIELD, PAYEEMODRQ,
                    .Valid(OE_TAGS(PAYEE, BANKACCTTO, PAYEELSTID, PAYACCT))
                    .Required(OE_TAGS(PAYEELSTID))
                    .RequiresIf(OE_TAG_BANKACCTTO, OE_TAG_PAYEE))
OE_DEFINE_AGGREGATE(OEPayeeModifyRs, OEPayeeBase, OE_PAYEERS_FIELDS, PAYEEMODRS,
                    .Valid(OE_TAGS(PAYEE, BANKACCTTO, EXTDPAYEE, PAYEELSTID, PAYACCT))
                    .Required(OE_TAGS(PAYEELSTID))
                    .RequiresIf(OE_TAG_BANKACCTTO, OE_TAG_PAYEE))

OE_DEFINE_AGGREGATE(OEPayeeDeleteBase, OETransBase, OE_PAYEELSTID_FIELD, NONE,
                    .Valid(OE_TAGS(PAYEELSTID))
                    .Required(OE_TAGS(PAYEELSTID)))
OE_DEFINE_AGGREGATE(OEPayeeDeleteRq, OEPayeeDeleteBase, OE_NO_FIELDS, PAYEEDELRQ,
                    .Valid(OE_TAGS(PAYEELSTID))
                    .Required(OE_TAGS(PAYEELSTID)))
OE_DEFINE_AGGREGATE(OEPayeeDeleteRs, OEPayeeDeleteBase, OE_NO_FIELDS, PAYEEDELRS,
                    .Valid(OE_TAGS(PAYEELSTID))
                    .Required(OE_TAGS(PAYEELSTID)))
