#pragma once

/// All of `libcallcontrol-diagnosis`, for programs that look into call control: what a recording tells.

#include "callcontrol.h"
#include "diagnosis/CC_BriefText.h"
#include "diagnosis/CC_Explanation.h"
#include "diagnosis/CC_JsonLine.h"
#include "diagnosis/CC_Recording.h"
#include "diagnosis/CC_RecordingReport.h"
