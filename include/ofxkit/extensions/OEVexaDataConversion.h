// The conversions of the maker's extension sets go by the names their users
// know. Each is OEDataConversion itself under another name: every value of
// every set converts through the one list of enumerations, so
// OEVexaBrandDataConversion::VexaBrandStatusToString and
// OEDataConversion::VexaBrandStatusToString are the same function.
#pragma once

#include "ofxkit/types/OEDataConversion.h"

// Brand status, NPC flag, market-tier type, brand category, distribution method.
class OEVexaBrandDataConversion : public OEDataConversion {};
// The services an institution offers (service lists).
class OEVexaCommDataConversion : public OEDataConversion {};
// How a browser-centric feature may be reached.
class OEVexaWebAccessDataConversion : public OEDataConversion {};
// Customer types of the usage logs.
class OEVexaCISDataConversion : public OEDataConversion {};
