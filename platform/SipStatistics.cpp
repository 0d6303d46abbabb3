#include "SipStatistics.h"

SipStatistics s_sipStatistics;
