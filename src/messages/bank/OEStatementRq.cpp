#include "ofxkit/messages/bank/OEStatementRq.h"

OE_DEFINE_AGGREGATE(OEIncTransaction, OEAggregate, OE_INCTRANSACTION_FIELDS, INCTRAN,
                    .Valid(OE_TAGS(DTSTART, DTEND, INCLUDE))
                    .Required(OE_TAGS(INCLUDE)))

OE_DEFINE_AGGREGATE(OEGenericStatementRq, OETransBase, OE_GENERICSTATEMENTRQ_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEBankStatementRq, OEGenericStatementRq, OE_NO_FIELDS, STMTRQ,
                    .Valid(OE_TAGS(BANKACCTFROM, INCTRAN))
                    .Required(OE_TAGS(BANKACCTFROM)))
OE_DEFINE_AGGREGATE(OECCStatementRq, OEGenericStatementRq, OE_NO_FIELDS, CCSTMTRQ,
                    .Valid(OE_TAGS(CCACCTFROM, INCTRAN))
                    .Required(OE_TAGS(CCACCTFROM)))
