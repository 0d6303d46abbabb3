#include "Gateway.h"

#include <iostream>
#include <utility>

#include "ScriptLanguage.h"
#include "SipStatistics.h"
#include "control/GatewayCommands.h"
#include "registrar/NonceGenerator.h"
#include "sip/Libre.h"

namespace {

// The trunks' instance URN (InstanceId) lives beside a store file, else,
// for a database store or none, in the working directory: a database is
// shared by gateways that are each a user agent of their own.
std::string instanceFile(std::string const& store) {
  bool const file = store != "none" && store.find("://") == std::string::npos && !store.empty();
  return file ? store + ".instance" : "location-gateway.instance";
}

}  // namespace

Gateway::Gateway(ScriptSession& session, Settings settings)
    : m_session(session),
      m_settings(std::move(settings)),
      // The statistics question and /metrics report the library's share too.
      m_clock(m_settings.statistics || !m_settings.control.empty() || !m_settings.metrics.empty()),
      m_registrar(m_clock),
      m_frontEnd(session, m_clock, m_redirector.sources()),
      m_replay(session, m_registrar, m_clock) {
  m_frontEnd.methods().add("REGISTER", m_registrar);
  if (m_settings.relayCalls) {
    m_calls = std::make_unique<Calls>(m_registrar, m_frontEnd.listeners(), m_frontEnd.log());
    m_calls->limit(m_settings.maxCalls);
    m_frontEnd.methods().add("INVITE", *m_calls);
    m_frontEnd.methods().add("CANCEL", *m_calls);
    m_frontEnd.keepDialogs(*m_calls);
  }
  m_mwi = std::make_unique<MessageWaiting>(session, m_clock, m_registrar);
  m_frontEnd.methods().add("NOTIFY", *m_mwi);
  m_frontEnd.keepSubscriptions(*m_mwi);
  m_registrar.addListener(m_mwi.get());
  for (char const* method : {"INVITE", "MESSAGE", "SUBSCRIBE", "OPTIONS"}) {
    pl name;
    pl_set_str(&name, method);
    if (!m_frontEnd.methods().find(name))
      m_frontEnd.methods().add(method, m_redirector);
  }
}

Gateway::~Gateway() {
  m_changes.reset();
  m_calls.reset();
  m_frontEnd.close();
  m_mwi.reset();
  m_trunks.reset();
}

bool Gateway::start(std::string& error) {
  if (!m_signals.watch(error))
    return false;
  if (!BindingStore::open(m_settings.store, m_store, error))
    return false;
  m_registrar.authenticator().offerAlgorithms(m_settings.digest);
  if (!m_settings.nonceKeyFile.empty()) {
    std::vector<uint8_t> key;
    if (!NonceGenerator::loadKeyFile(m_settings.nonceKeyFile, key, error))
      return false;
    m_registrar.authenticator().useNonceKey(key);
  }
  for (std::string const& network : m_settings.redirectFrom)
    m_redirector.sources().allow(network);
  if (m_settings.sourceRate > 0)
    m_frontEnd.limitSourceRate(static_cast<uint32_t>(m_settings.sourceRate));
  if (m_store && !m_replay.restore(*m_store, error))
    return false;
  if (!m_frontEnd.start(m_settings.sip, error))
    return false;
  m_registrar.start(m_frontEnd.stack(), m_settings.expiry, m_settings.natPingSeconds);
  if (m_calls && !m_calls->start(m_frontEnd.stack(), error))
    return false;
  m_trunks = std::make_unique<TrunkRegistrations>(m_frontEnd.stack(), m_session, m_clock);
  m_trunks->useCaFile(m_settings.caFile);
  m_trunks->followBindings(m_registrar);
  m_trunks->useInstanceFile(instanceFile(m_settings.store));
  m_trunks->start();
  if (m_calls)
    m_calls->useTrunks(*m_trunks);
  if (!m_mwi->start(m_frontEnd.stack(), m_frontEnd.dns(), *m_trunks, error))
    return false;
  std::vector<std::string> secure;
  if (!m_frontEnd.startSecure(m_settings.secure, secure, error))
    return false;
  if (m_frontEnd.dnsServers().empty())
    std::cerr << "location-gateway: no DNS server configured: host names will not resolve\n";
  std::cerr << "location-gateway: listening on " << m_frontEnd.listening() << std::endl;
  for (std::string const& transport : secure)
    std::cerr << "location-gateway: listening on " << transport << std::endl;
  if (!startOperations(error)) {
    shutDown();
    return false;
  }
  return true;
}

bool Gateway::startOperations(std::string& error) {
  if (!m_settings.autosave.empty())
    m_autosave = std::make_unique<Autosave>(m_session, m_settings.autosave);
  if (!m_settings.control.empty()) {
    addScriptCommands(m_commands);
    addGatewayCommands(
        m_commands, m_registrar, *m_trunks, [this] { return statistics(); }, m_calls.get());
    addMessageWaitingCommand(m_commands, *m_mwi);
    m_control = std::make_unique<ControlServer>(m_session, m_commands);
    followChanges();
    m_control->onLine([this] { beginChange(); },
                      [this](bool applied) {
                        endChange();
                        if (m_autosave && applied)
                          m_autosave->changed();
                      });
    if (!m_control->start(m_settings.control, error))
      return false;
    std::cerr << "location-gateway: control socket " << m_settings.control << std::endl;
  }
  if (!m_settings.metrics.empty()) {
    m_metrics = std::make_unique<MetricsServer>([this] { return statistics(); });
    std::string bound;
    if (!m_metrics->start(m_settings.metrics, bound, error))
      return false;
    std::cerr << "location-gateway: metrics on http://" << bound << "/metrics" << std::endl;
  }
  return true;
}

void Gateway::run() {
  re_main(nullptr);
}

void Gateway::shutDown() {
  m_metrics.reset();
  m_control.reset();
  m_autosave.reset();
  m_trunks->stop();
  m_mwi->stop();
  // The calls end with a BYE or a CANCEL each, sent while the stack finishes.
  if (m_calls)
    m_calls->endAll();
  m_frontEnd.shutDown();
  if (m_store)
    m_store->close();
}

void Gateway::followChanges() {
  m_changes = std::make_unique<ModelChanges>(*m_session.locationMaster());
}

void Gateway::beginChange() {
  m_changes->begin();
}

void Gateway::endChange() {
  m_changes->end();
  m_registrar.dropRemoved(m_changes->removed(), m_changes->anyServiceChanged());
  if (m_changes->anyServiceChanged())
    m_trunks->followAll();
  else
    m_trunks->follow(m_changes->touched(), m_changes->removed());
  if (m_changes->anyServiceChanged())
    return m_mwi->followAll();
  std::vector<RefPtr<LS_IIdentity>> touched = m_changes->touched();
  touched.insert(touched.end(), m_changes->mwiTouched().begin(), m_changes->mwiTouched().end());
  m_mwi->follow(touched, m_changes->removed());
}

GatewayStatistics Gateway::statistics() const {
  GatewayStatistics statistics;
  statistics.answers = m_frontEnd.answers().counts();
  statistics.failedAuthentications = m_registrar.failedAuthentications();
  statistics.bindings = m_registrar.bindingCount();
  statistics.bindingsDropped = m_registrar.bindingsDropped();
  if (m_calls) {
    Calls::Statistics const& calls = m_calls->statistics();
    statistics.callsRelayed = true;
    statistics.callsActive = calls.active;
    statistics.callsSetUp = calls.setUp;
    statistics.callsFailed = calls.failed;
    for (uint64_t bound : Calls::setUpBoundsMs())
      statistics.callSetUpBoundsSeconds.push_back(static_cast<double>(bound) / 1000.0);
    statistics.callSetUpBuckets = calls.setUpBuckets;
    statistics.callSetUpSeconds = calls.setUpSecondsSum;
  }
  if (BindingStore const* const store = m_registrar.store()) {
    statistics.storeRowsRefused = store->rowsRefused();
    statistics.storeChangesDropped = store->changesDropped();
  }
  statistics.registeredContacts = s_sipStatistics.getInboundRegistrations();
  m_trunks->forEach([&](std::string const& path, bool registered) {
    statistics.trunks.push_back(GatewayStatistics::Trunk{path, registered});
  });
  statistics.mwiSubscriptions = m_mwi->countByState();
  statistics.mwiNotifiesRelayed = m_mwi->notifiesRelayed();
  statistics.cpuSeconds = LibraryClock::cpuSeconds();
  statistics.librarySeconds = m_clock.librarySeconds();
  return statistics;
}

std::string Gateway::summary() const {
  return std::to_string(m_frontEnd.requests()) + " requests, " + m_clock.summary();
}
