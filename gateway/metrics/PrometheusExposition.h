// PrometheusExposition: a GatewayStatistics reading in the Prometheus text
// exposition format, version 0.0.4, as GET /metrics answers it. Names carry
// the location_gateway_ prefix, counters end in _total, times are in
// seconds; every family has its HELP and TYPE lines, even while it has no
// sample yet, so that a scraper sees the same families from the start.
#pragma once

#include <string>

#include "metrics/GatewayStatistics.h"

namespace PrometheusExposition {

// The Content-Type the format is served with.
constexpr char kContentType[] = "text/plain; version=0.0.4; charset=utf-8";

std::string render(GatewayStatistics const& statistics);

}  // namespace PrometheusExposition
