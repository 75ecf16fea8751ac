// A payee's name, postal address and telephone ("PAYEE"): in bill payments,
// payee requests and the transactions of a statement.
#pragma once

#include "ofxkit/core/OEAggregate.h"

// A postal address, as payees, institutions and users have one.
#define OE_ADDRESS_FIELDS(X)                     \
  X(TEXT, Address1, ADDR1, OEString32)           \
  X(TEXT, Address2, ADDR2, OEString32)           \
  X(TEXT, Address3, ADDR3, OEString32)           \
  X(TEXT, City, CITY, OEString32)                \
  X(TEXT, State, STATE, OEString5)               \
  X(TEXT, PostalCode, POSTALCODE, OEString11)    \
  X(TEXT, Country, COUNTRY, OEString3)

#define OE_PAYEE_FIELDS(X)                       \
  X(TEXT, Name, NAME, OEString32)                \
  OE_ADDRESS_FIELDS(X)                           \
  X(TEXT, Phone, PHONE, OEString32)

class OEPayee : public OEAggregate {
  OE_AGGREGATE(OEPayee, OE_PAYEE_FIELDS)
};
