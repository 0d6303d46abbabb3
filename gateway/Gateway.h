// Gateway: location-gateway composed. It owns and builds every part (the SIP
// front-end, the registrar and the redirector in the front-end's method
// table, the trunk registrations, message waiting, the binding store and
// its replay, the changes followed over the control socket, the control and
// metrics servers with the autosave), starts them in order, reads their
// statistics and shuts them down. main.cpp only reads the options into
// Settings, runs the scripts and drives this class; no part knows it.
//
// The folders of gateway/, from the bottom up. A file includes from its own
// folder and from the levels below it only, never from a folder beside it
// (siblings stay independent of each other) nor above it, so that each part
// can be built, tested and fuzzed with what lies below it alone.
// tests/gateway/folder-order.py reads this list and checks every include of
// gateway/*/ against it:
//
//   sip/                      the stack, its transports, the table of handlers by method
//   store/                    the bindings that outlive the process
//   registrar/                REGISTER, and the store's rows put back into it
//   redirect/ trunks/         the redirect server; the trunks' registrations and where
//                             requests sent on an identity's behalf go (its outbound face)
//   calls/ mwi/               calls relayed, to subscribers and out through trunks;
//                             message waiting, learnt from message servers and told to phones
//   metrics/                  the statistics and their HTTP exposition
//   control/                  the control socket and what a change there sets off
//
// Gateway.h and main.cpp sit above them all.
//
// Order of the parts' lives, each for a reason:
// - The store is opened and replayed into the registrar before the stack
//   listens, so that the first request already sees every binding; it is
//   closed before the registrar dies (see BindingStore) and outlives it.
// - The registrar and the redirector outlive the front-end, whose method
//   table borrows them, and the redirector's source filter, which its
//   Admission reads.
// - The trunks start on the stack once it is open and die after its
//   transactions were ended (SipFrontEnd::close()), before the stack itself.
//   They listen to the registrar's bindings (a back-to-back trunk registers
//   while a phone of its identity is registered) and leave its listeners
//   when they die, before it.
// - The control socket, the autosave and the metrics come last and go
//   first, before the trunks unregister.
// - Message waiting starts on the stack after the trunks, whose routes its
//   subscriptions use, unsubscribes with them and dies before them, after
//   the stack's transactions were ended.
//
// Everything runs on libre's thread; one Gateway per process, made after
// libre_init() and destroyed before libre_close().
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "CommandTable.h"
#include "ScriptSession.h"
#include "calls/Calls.h"
#include "control/Autosave.h"
#include "control/ControlServer.h"
#include "control/ModelChanges.h"
#include "metrics/GatewayStatistics.h"
#include "metrics/MetricsServer.h"
#include "mwi/MessageWaiting.h"
#include "redirect/Redirector.h"
#include "registrar/BindingReplay.h"
#include "registrar/DigestAuthentication.h"
#include "registrar/ExpiryRange.h"
#include "registrar/Registrar.h"
#include "sip/LibraryClock.h"
#include "sip/SecureTransports.h"
#include "sip/SipFrontEnd.h"
#include "sip/StopSignals.h"
#include "store/BindingStore.h"
#include "trunks/TrunkRegistrations.h"

class Gateway {
 public:
  // What the command line sets; each is described in main.cpp's usage.
  struct Settings {
    SipFrontEnd::Settings sip;
    // The registrar's lifetimes for faces that give none.
    ExpiryRange expiry;
    // OPTIONS to NATed UDP bindings every so many seconds; 0 for none.
    uint32_t natPingSeconds = 0;
    // A file, a postgresql:// URI or "none" (see BindingStore::open).
    std::string store = "location-gateway.sqlite";
    // Whether the statistics line is wanted at exit: the library's share
    // is measured then (and for the control socket and the metrics).
    bool statistics = false;
    std::vector<DigestAlgorithm> digest{DigestAlgorithm::SHA256, DigestAlgorithm::MD5};
    std::string nonceKeyFile;
    std::vector<std::string> redirectFrom;
    // Requests a second from one source, as parsed; 0 for no limit.
    unsigned long sourceRate = 0;
    SecureTransportOptions secure;
    std::string caFile;
    std::string control;
    std::string autosave;
    std::string metrics;
    // --calls relay (the default) or redirect, and --max-calls (0: none).
    bool relayCalls = true;
    uint32_t maxCalls = 0;
  };

  Gateway(ScriptSession& session, Settings settings);
  ~Gateway();
  Gateway(Gateway const&) = delete;
  Gateway& operator=(Gateway const&) = delete;

  // Opens the store, restores it, starts the stack, the trunks and what
  // the settings ask for, writing the start-up lines to standard error.
  // False with an error text when any of them cannot start; what had
  // started then stops when the object dies.
  bool start(std::string& error);
  // Serves until SIGINT or SIGTERM (StopSignals), one sent during start()
  // included.
  void run();
  // After a successful start(): closes the control socket and the metrics,
  // unregisters the trunks, lets the stack finish (at most
  // SipFrontEnd::kShutDownMs) and closes the store.
  void shutDown();

  GatewayStatistics statistics() const;
  // "N requests, CPU ...", the statistics line at exit.
  std::string summary() const;

 private:
  bool startOperations(std::string& error);
  // Around each control line: the registrar drops the bindings of
  // identities the line removed, the trunks and message waiting follow
  // what it changed. From followChanges() on every identity is observed,
  // which a gateway never changed need not pay for.
  void followChanges();
  void beginChange();
  void endChange();

  // First, so that SIGINT and SIGTERM are blocked before anything below
  // could start a thread.
  StopSignals m_signals;
  ScriptSession& m_session;
  Settings const m_settings;
  LibraryClock m_clock;
  std::unique_ptr<BindingStore> m_store;
  Registrar m_registrar;
  Redirector m_redirector;
  SipFrontEnd m_frontEnd;
  BindingReplay m_replay;
  std::unique_ptr<TrunkRegistrations> m_trunks;
  // --calls relay; on the stack after the front-end, ended before it.
  std::unique_ptr<Calls> m_calls;
  // In the method table for NOTIFY and the registrar's listeners from the
  // start; on the stack after the trunks.
  std::unique_ptr<MessageWaiting> m_mwi;
  std::unique_ptr<ModelChanges> m_changes;
  CommandTable m_commands;
  std::unique_ptr<Autosave> m_autosave;
  std::unique_ptr<ControlServer> m_control;
  std::unique_ptr<MetricsServer> m_metrics;
};
