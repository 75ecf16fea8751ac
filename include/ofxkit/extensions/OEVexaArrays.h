// Named arrays of the extension sets' repeated items, for applications that
// keep their own lists of them.
#pragma once

#include "ofxkit/extensions/OEVexaUsage.h"
#include "ofxkit/types/OEDynamicArray.h"

OE_TYPED_ARRAY(VexaPlatformInfo, OEVexaPlatformInfo)
OE_TYPED_ARRAY(VexaSurveyItem, OEVexaSurveyItem)
OE_TYPED_ARRAY(VexaOfxMsgSetInfo, OEVexaOfxMsgSetInfo)
OE_TYPED_ARRAY(VexaOfxMessage, OEVexaOfxMessage)
OE_TYPED_ARRAY(VexaService, OEVexaService)
