// RequestHandler: a part that answers the requests of the methods it is
// registered for in a MethodTable, once the front-end has let a request
// through (Admission and its own answers first; see SipFrontEnd::route).
// handle() answers the exchange exactly once, on libre's thread.
//
// The table borrows its handlers and never deletes one, hence the protected
// destructor: whoever composes the gateway owns them and keeps them alive
// for as long as the stack takes requests.
#pragma once

class Exchange;

class RequestHandler {
 public:
  virtual void handle(Exchange& exchange) = 0;

 protected:
  ~RequestHandler() = default;
};
