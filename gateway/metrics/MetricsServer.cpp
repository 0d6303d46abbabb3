#include "metrics/MetricsServer.h"

#include <cstring>

#include "metrics/PrometheusExposition.h"

MetricsServer::~MetricsServer() {
  mem_deref(m_socket);
}

bool MetricsServer::start(std::string const& listen, std::string& bound, std::string& error) {
  sa address;
  if (sa_decode(&address, listen.c_str(), listen.size()) != 0) {
    error = "cannot read the metrics address " + listen + " (ADDR:PORT)";
    return false;
  }
  int result = http_listen(&m_socket, &address, onRequest, this);
  if (result == 0)
    result = tcp_sock_local_get(http_sock_tcp(m_socket), &address);
  if (result != 0) {
    error = "cannot serve metrics on " + listen + ": " + std::strerror(result);
    return false;
  }
  char text[64];
  re_snprintf(text, sizeof text, "%J", &address);
  bound = text;
  return true;
}

void MetricsServer::onRequest(http_conn* connection, http_msg const* request, void* argument) {
  MetricsServer& server = *static_cast<MetricsServer*>(argument);
  if (pl_strcmp(&request->path, "/metrics") != 0) {
    http_ereply(connection, 404, "Not Found");
    return;
  }
  if (pl_strcmp(&request->met, "GET") != 0) {
    http_ereply(connection, 405, "Method Not Allowed");
    return;
  }
  std::string const body = PrometheusExposition::render(server.m_source());
  http_creply(connection, 200, "OK", PrometheusExposition::kContentType, "%b", body.data(), body.size());
}
