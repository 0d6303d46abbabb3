// Listeners: the addresses the gateway answers on, each with UDP and TCP on
// the stack. What is listening is exactly what the start-up line says: a
// listener that cannot be opened is a start-up error naming it, never a
// transport quietly left out.
//
// Decisions, with their reasons:
// - An address given as "0.0.0.0" or "[::]" stands for every address of
//   that family the machine's interfaces have up at start-up, each opened
//   on its own, as Kamailio does when told no address. libre refuses to
//   bind an unspecified address, and rightly for a SIP stack: it writes
//   the transport's own address into Via and Contact, where 0.0.0.0 would
//   tell a peer nothing. IPv6 link-local addresses are left out, since they
//   need an interface scope that neither the stack nor a SIP URI carries.
//   An address added later needs a restart.
// - Loopback addresses are opened last. For requests of its own (trunk
//   registrations, keep-alives) libre sends from the first transport of the
//   destination's family, and a socket bound to loopback reaches nothing
//   beyond the machine.
// - Port 0 takes a free port, the same for UDP and TCP of one given
//   address (all the addresses it stands for included): a port is drawn
//   from the system for UDP, and when TCP or another address then finds it
//   taken, everything opened is closed and the whole set is opened again
//   with fresh ports, a few times at most.
//
// Owned by the front-end; the transports themselves belong to the stack
// and die with it. Everything runs on libre's thread.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

class Listeners {
 public:
  struct Listener {
    sip_transp transport;
    sa address;  // as bound, port included
  };

  // listens: "ADDR:PORT" each, "[IPv6]:PORT" for IPv6. False with a
  // message naming the listener in error; the stack then holds some of the
  // transports or none.
  bool open(sip& stack, std::vector<std::string> const& listens, std::string& error);

  std::vector<Listener> const& listeners() const { return m_listeners; }
  // Whether a URI's host and port (5060 when none) are those of a
  // listener: a request to it is a request to the gateway itself.
  bool names(uri const& target) const;
  // "udp:ADDR:PORT tcp:ADDR:PORT ...", in the order opened.
  std::string describe() const;

  static constexpr unsigned int kAttempts = 8;

 private:
  // One given listen address: the machine's addresses it stands for, and
  // the port asked for (0 for a free one).
  struct Request {
    std::string text;
    std::vector<sa> addresses;
    uint16_t port;
  };

  bool read(std::string const& text, Request& request, std::string& error);
  // 0, or the error of the first transport that failed, named in failed.
  int openAll(sip& stack, std::vector<Request> const& requests, std::string& failed);

  std::vector<Listener> m_listeners;
};
