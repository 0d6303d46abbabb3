#include "sip/SecureTransports.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <sstream>

namespace {

bool readFile(std::string const& name, std::string& text) {
  std::ifstream file(name, std::ios::binary);
  if (!file)
    return false;
  std::ostringstream content;
  content << file.rdbuf();
  text = content.str();
  return true;
}

bool isSips(uri const& address) {
  return pl_strcasecmp(&address.scheme, "sips") == 0;
}

// The certificate and key joined in a private file while add() runs.
class JoinedPem {
 public:
  JoinedPem(std::string const& certificate, std::string const& key) {
    char directory[] = "/tmp/location-gateway-XXXXXX";
    if (!mkdtemp(directory))
      return;
    m_directory = directory;
    m_path = m_directory + "/wss.pem";
    mode_t const previous = umask(077);
    std::ofstream file(m_path, std::ios::binary);
    umask(previous);
    file << certificate << "\n" << key;
    if (!file.flush())
      m_path.clear();
  }
  ~JoinedPem() {
    if (!m_directory.empty()) {
      unlink((m_directory + "/wss.pem").c_str());
      rmdir(m_directory.c_str());
    }
  }
  JoinedPem(JoinedPem const&) = delete;
  JoinedPem& operator=(JoinedPem const&) = delete;

  std::string const& path() const { return m_path; }

 private:
  std::string m_directory;
  std::string m_path;
};

}  // namespace

SecureTransports::~SecureTransports() {
  mem_deref(m_tls);
}

bool SecureTransports::add(sip& stack,
                           SecureTransportOptions const& options,
                           std::vector<std::string>& bound,
                           std::string& error) {
  if (options.tls.empty() && options.wss.empty() && options.ws.empty())
    return true;
  if ((!options.ws.empty() || !options.wss.empty()) && !webSocketFixed() &&
      !options.allowVulnerableWebSocket) {
    error = std::string("libre ") + sys_libre_version_get() +
            " can be crashed by any WebSocket peer (CVE-2026-50161, fixed in 4.8.1); "
            "--ws and --wss need a newer libre or --allow-vulnerable-websocket";
    return false;
  }
  bool const secure = !options.tls.empty() || !options.wss.empty();
  std::string certificate;
  std::string key;
  if (secure) {
    if (options.certificate.empty()) {
      error = "--tls and --wss need --certificate (and --key unless the certificate file holds it)";
      return false;
    }
    if (!readFile(options.certificate, certificate) ||
        !readFile(options.key.empty() ? options.certificate : options.key, key)) {
      error = "cannot read the certificate or key: " + std::string(std::strerror(errno));
      return false;
    }
  }
  struct Wanted {
    sip_transp transport;
    std::string const& address;
  };
  for (Wanted const& wanted : {Wanted{SIP_TRANSP_TLS, options.tls}, Wanted{SIP_TRANSP_WS, options.ws},
                               Wanted{SIP_TRANSP_WSS, options.wss}}) {
    if (wanted.address.empty())
      continue;
    sa address;
    if (sa_decode(&address, wanted.address.c_str(), wanted.address.size()) != 0) {
      error = "cannot read the address " + wanted.address + " (ADDR:PORT)";
      return false;
    }
    int result = 0;
    if (wanted.transport == SIP_TRANSP_TLS) {
      result = tls_alloc(&m_tls, TLS_METHOD_SSLV23, nullptr, nullptr);
      if (result == 0)
        result =
            tls_set_certificate_pem(m_tls, certificate.data(), certificate.size(), key.data(), key.size());
      if (result != 0) {
        error = "the certificate or key is not usable (PEM, matching)";
        return false;
      }
      result = sip_transp_add(&stack, SIP_TRANSP_TLS, &address, m_tls);
    } else if (wanted.transport == SIP_TRANSP_WSS) {
      JoinedPem const joined(certificate, key);
      result = joined.path().empty()
                   ? EIO
                   : sip_transp_add_websock(&stack, SIP_TRANSP_WSS, &address, true, joined.path().c_str());
    } else {
      result = sip_transp_add_websock(&stack, SIP_TRANSP_WS, &address, true, nullptr);
    }
    if (result == 0)
      result = sip_transp_laddr(&stack, &address, wanted.transport, nullptr);
    if (result != 0) {
      error = std::string("cannot listen for ") + sip_transp_name(wanted.transport) + " on " +
              wanted.address + ": " + std::strerror(result);
      return false;
    }
    char text[80];
    re_snprintf(text, sizeof text, "%s:%J", sip_transp_name(wanted.transport), &address);
    std::string name = text;
    for (char& c : name)
      c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    bound.push_back(name);
  }
  return true;
}

bool SecureTransports::webSocketFixed() {
  unsigned int major = 0;
  unsigned int minor = 0;
  unsigned int patch = 0;
  if (std::sscanf(sys_libre_version_get(), "%u.%u.%u", &major, &minor, &patch) < 2)
    return false;
  return major != 4 ? major > 4 : minor != 8 ? minor > 8 : patch >= 1;
}

bool SecureTransports::sipsOverPlainTransport(sip_msg const& request) {
  if (request.tp == SIP_TRANSP_TLS || request.tp == SIP_TRANSP_WSS)
    return false;
  return isSips(request.uri) || isSips(request.to.uri);
}
