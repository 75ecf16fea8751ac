#include "ofxkit/messages/billpay/OEPayee.h"

OE_DEFINE_AGGREGATE(OEPayee, OEAggregate, OE_PAYEE_FIELDS, PAYEE,
                    .Valid(OE_TAGS(NAME, ADDR1, ADDR2, ADDR3, CITY, STATE, POSTALCODE, COUNTRY, PHONE))
                    .Required(OE_TAGS(NAME, ADDR1, CITY, STATE, POSTALCODE, PHONE)))
