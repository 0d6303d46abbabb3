// MetricsServer: GET /metrics over HTTP (--metrics ADDR:PORT) through libre's
// own HTTP server, for a Prometheus scraper. Each request takes a fresh
// reading from the source on libre's thread and answers it as
// PrometheusExposition renders it; any other path gets 404, another method
// on /metrics 405. Owned by the Gateway; dying closes the listening socket.
#pragma once

#include <functional>
#include <string>

#include "metrics/GatewayStatistics.h"
#include "sip/Libre.h"

class MetricsServer {
 public:
  using Source = std::function<GatewayStatistics()>;

  explicit MetricsServer(Source source) : m_source(std::move(source)) {}
  ~MetricsServer();
  MetricsServer(MetricsServer const&) = delete;
  MetricsServer& operator=(MetricsServer const&) = delete;

  // listen: "ADDR:PORT", port 0 taking a free one; the bound address in
  // bound, or the reason in error.
  bool start(std::string const& listen, std::string& bound, std::string& error);

 private:
  static void onRequest(http_conn* connection, http_msg const* request, void* server);

  Source m_source;
  http_sock* m_socket = nullptr;
};
