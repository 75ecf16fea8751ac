// The maker's branding message set ("VEXA.BRANDMSGSRQV1"): a client names its
// software and the institutions it shows, by business id and the date of the
// branding it holds ("VEXA.BRANDRQ"); the server answers with fresh branding
// for each ("VEXA.BRANDRS"): name, contact data, services, service-provider
// URLs, market tier, web-access features and profile URLs. The market-tier
// request ("VEXA.MKTTIERRQ") fetches the definitions of the tiers.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OESignOn.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/extensions/OEVexaDataConversion.h"
#include "ofxkit/messages/billpay/OEPayee.h"

// A service list's entries: an empty entry is reported as OEPW_NULLPOINTER
// (there is no service to convert), any other text outside the table as
// OEPW_BADFORMAT; either way the entry is not kept.
template <>
struct OEValueTraits<OEVexaService> : OEEnumValueTraits<OEVexaService> {
  static constexpr bool kOwnFaultCode = true;
  static bool FromText(const OEString& text, OEVexaService& value);
};

#define OE_VEXASOFTWARE_FIELDS(X)                                   \
  X(TEXT, SoftwareProductCode, VEXA_SWPRODCD, OEString)             \
  X(TEXT, SoftwareVersion, VEXA_SWVER, OEString)                    \
  X(TEXT, SoftwareOSCode, VEXA_SWOSCD, OEString)                    \
  X(VALUE, VexaDistMethod, VEXA_DISTMETHOD, OEVexaDistMethod)

// The client software asking ("VEXA.SW").
class OEVexaSoftware : public OEAggregate {
  OE_AGGREGATE(OEVexaSoftware, OE_VEXASOFTWARE_FIELDS)
};

#define OE_VEXABIDINFO_FIELDS(X)                         \
  X(VALUE, VexaBID, VEXA_BID, uint32_t)                  \
  X(VALUE, VexaDtUpdate, VEXA_DTUPDATE, OEDateTime)

// One institution's business id and the date of its branding ("VEXA.BIDINFO").
class OEVexaBIDInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaBIDInfo, OE_VEXABIDINFO_FIELDS)
};

#define OE_VEXASELECTBYBID_FIELDS(X) X(LIST, VexaBIDInfo, VEXA_BIDINFO, OEVexaBIDInfo)

// The institutions whose branding is asked for ("VEXA.SELECTBYBID").
class OEVexaSelectByBID : public OEAggregate {
  OE_AGGREGATE(OEVexaSelectByBID, OE_VEXASELECTBYBID_FIELDS)
};

#define OE_VEXASERVICELIST_FIELDS(X) X(VALUES, VexaService, VEXA_SVC, OEVexaService)

// The services an institution offers ("VEXA.SVCLIST"), in the order listed.
class OEVexaServiceList : public OEAggregate {
  OE_AGGREGATE(OEVexaServiceList, OE_VEXASERVICELIST_FIELDS)
};

#define OE_VEXASPURLLIST_FIELDS(X) X(VALUES, VexaSPURL, VEXA_SPURL, OEString255)

// The service provider's URLs ("VEXA.SPURLLIST"), in the order listed.
class OEVexaSPURLList : public OEAggregate {
  OE_AGGREGATE(OEVexaSPURLList, OE_VEXASPURLLIST_FIELDS)
};

#define OE_VEXASPCHANGE_FIELDS(X)                                  \
  X(TEXT, VexaSPProfileURL, VEXA_SPPROFILEURL, OEString)           \
  X(VALUE, VexaBeginDate, VEXA_BEGINDT, OEDateTime)

// A change of service provider: the new provider's profile and when the
// change takes effect ("VEXA.SPCHANGE").
class OEVexaSPChange : public OEAggregate {
  OE_AGGREGATE(OEVexaSPChange, OE_VEXASPCHANGE_FIELDS)
};

#define OE_VEXABROWSERCENTRIC_FIELDS(X)                              \
  X(TEXT, VexaWebFeatureName, VEXA_WEBFEATURENM, OEString32)         \
  X(VALUE, VexaAccessMethod, VEXA_ACCESSMETHOD, OEVexaWebAccess)     \
  X(TEXT, VexaLoginURL, VEXA_LOGINURL, OEString255)

// A feature the institution offers through the browser ("VEXA.BROWSERCENTRIC").
class OEVexaBrowserCentric : public OEAggregate {
  OE_AGGREGATE(OEVexaBrowserCentric, OE_VEXABROWSERCENTRIC_FIELDS)
};

// How to reach an institution's people and site.
#define OE_VEXA_FI_CONTACT_FIELDS(X)          \
  X(TEXT, CSPhone, CSPHONE, OEString32)       \
  X(TEXT, TSPhone, TSPHONE, OEString32)       \
  X(TEXT, FAXPhone, FAXPHONE, OEString32)     \
  X(TEXT, URL, URL, OEString255)              \
  X(TEXT, EMail, EMAIL, OEString80)

#define OE_VEXABRANDDETAILS_FIELDS(X)                                             \
  X(CHILD, FI, FI, OEFI)                                                          \
  X(CHILD, VexaServiceList, VEXA_SVCLIST, OEVexaServiceList)                      \
  X(CHILD, VexaSPURLList, VEXA_SPURLLIST, OEVexaSPURLList)                        \
  X(TEXT, VexaBrandName, VEXA_BRANDNAME, OEString)                                \
  X(VALUE, VexaBrandStatus, VEXA_STATUS, OEVexaBrandStatus)                       \
  X(VALUE, VexaNPCFlag, VEXA_NPCFLAG, OEVexaNPCFlag)                              \
  X(VALUE, VexaTierType, VEXA_MKTTIERTYPE, OEVexaTierType)                        \
  X(TEXT, VexaTierCode, VEXA_MKTTIERCD, OEString)                                 \
  X(VALUE, VexaDistMethod, VEXA_MKTDISTMETHOD, OEVexaDistMethod)                  \
  X(VALUE, BIDRef1, VEXA_BIDREF1, uint32_t)                                       \
  OE_ADDRESS_FIELDS(X)                                                            \
  OE_VEXA_FI_CONTACT_FIELDS(X)                                                    \
  X(VALUE, BrandCategory, VEXA_BRANDCATEGORY, OEVexaBrandCategory)                \
  X(TEXT, FIProfileURL, VEXA_FIPROFILEURL, OEString)                              \
  X(TEXT, VexaMktgIndexFileURL, VEXA_FIMKTINDEXFILEURL, OEString)                 \
  X(TEXT, TradingURL, VEXA_TRADINGURL, OEString)                                  \
  X(VALUES, VexaDistinguishedName, VEXA_DISTNAME, OEString1000)                      \
  X(TEXT, VexaFIShortName, VEXA_FISHORTNM, OEString)                              \
  X(VALUES, VexaProfileCertID, VEXA_PROFCERTID, OEString64)                       \
  X(FLAG, UserSpecificProfile, VEXA_USERSPECIFICPROF, unsigned short)             \
  X(TEXT, EnrollURL, VEXA_ENROLLURL, OEString)                                    \
  X(TEXT, FIMessage, VEXA_FIMESSAGE, OEString)                                    \
  X(TEXT, NewProfileURL, VEXA_NEWPROFILEURL, OEString)                            \
  X(CHILD, SpChange, VEXA_SPCHANGE, OEVexaSPChange)                               \
  X(LIST, VexaBrowserCentric, VEXA_BROWSERCENTRIC, OEVexaBrowserCentric)

// An institution's branding ("VEXA.BRANDDETAILS"). It has no third address
// line: "ADDR3" is not among its tags.
class OEVexaBrandDetails : public OEAggregate {
  OE_AGGREGATE(OEVexaBrandDetails, OE_VEXABRANDDETAILS_FIELDS)
};

#define OE_VEXABRANDDATA_FIELDS(X)                                 \
  X(CHILD, VexaBIDInfo, VEXA_BIDINFO, OEVexaBIDInfo)               \
  X(CHILD, VexaBrandDetails, VEXA_BRANDDETAILS, OEVexaBrandDetails)

// The branding of one institution, keyed by its business id ("VEXA.BRANDDATA").
class OEVexaBrandData : public OEAggregate {
  OE_AGGREGATE(OEVexaBrandData, OE_VEXABRANDDATA_FIELDS)
};

#define OE_VEXABRANDDATALIST_FIELDS(X) X(LIST, VexaBrandData, VEXA_BRANDDATA, OEVexaBrandData)

class OEVexaBrandDataList : public OEAggregate {
  OE_AGGREGATE(OEVexaBrandDataList, OE_VEXABRANDDATALIST_FIELDS)
};

#define OE_VEXABRANDRQ_FIELDS(X)                                   \
  X(CHILD, VexariSoftware, VEXA_SW, OEVexaSoftware)                \
  X(CHILD, VexaSelectByBid, VEXA_SELECTBYBID, OEVexaSelectByBID)

class OEVexaBrandRq : public OETransBase {
  OE_AGGREGATE(OEVexaBrandRq, OE_VEXABRANDRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_VEXABRANDRS_FIELDS(X)                                      \
  X(CHILD, VexariSoftware, VEXA_SW, OEVexaSoftware)                   \
  X(CHILD, VexaBrandDataList, VEXA_BRANDDATALIST, OEVexaBrandDataList)

class OEVexaBrandRs : public OETransBase {
  OE_AGGREGATE(OEVexaBrandRs, OE_VEXABRANDRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_VEXATIERDEF_FIELDS(X)                                 \
  X(VALUE, VexaTierType, VEXA_TIERTYPE, OEVexaTierType)          \
  X(TEXT, VexaTierCode, VEXA_TIERCD, OEString)                   \
  X(VALUE, VexaDistMethod, VEXA_DISTMETHOD, OEVexaDistMethod)    \
  X(VALUES, VexaFeatureName, VEXA_FEATURENM, OEString255)

// One market tier and the features it carries ("VEXA.TIERDEF").
class OEVexaTierDef : public OEAggregate {
  OE_AGGREGATE(OEVexaTierDef, OE_VEXATIERDEF_FIELDS)
};

#define OE_VEXAMKTTIERRQ_FIELDS(X) X(VALUE, VexaTierDtUpdate, VEXA_TIERDTUPDATE, OEDateTime)

class OEVexaMktTierRq : public OETransBase {
  OE_AGGREGATE(OEVexaMktTierRq, OE_VEXAMKTTIERRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_VEXAMKTTIERRS_FIELDS(X)                          \
  X(LIST, VexaTierDef, VEXA_TIERDEF, OEVexaTierDef)         \
  OE_VEXAMKTTIERRQ_FIELDS(X)

class OEVexaMktTierRs : public OETransBase {
  OE_AGGREGATE(OEVexaMktTierRs, OE_VEXAMKTTIERRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
