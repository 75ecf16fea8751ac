// The part every message-set profile shares ("MSGSETCORE"): version, server
// URL, security, sign-on realm, languages, synchronisation mode and the
// extension's time-out and certificate ids.
#pragma once

#include "ofxkit/core/OEAggregate.h"

#define OE_MESSAGESETCORE_FIELDS(X)                                  \
  X(VALUE, Ver, VER, int32_t)                                        \
  X(TEXT, URL, URL, OEString255)                                     \
  X(VALUE, OFXSecurity, OFXSEC, OEOFXSecurity)                       \
  X(FLAG, TransportSecurity, TRANSPSEC, unsigned short)              \
  X(TEXT, SignOnRealm, SIGNONREALM, OEString32)                      \
  X(VALUES, Language, LANGUAGE, OELanguage)                          \
  X(VALUE, SyncMode, SYNCMODE, OESyncMode)                           \
  X(FLAG, RespFileer, RESPFILEER, unsigned short)                    \
  X(TEXT, ServiceProviderName, SPNAME, OEString32)                   \
  X(VALUE, VexaTimeout, VEXA_TIMEOUT, unsigned short)                \
  X(VALUES, VexaMSSCertID, VEXA_MSSCERTID, OEString32)               \
  X(VALUES, VexaType1CertID, VEXA_TYPE1CERTID, OEString32)

class OEMessageSetCore : public OEAggregate {
  OE_AGGREGATE(OEMessageSetCore, OE_MESSAGESETCORE_FIELDS)
};
