// BindingListener: told when an identity's bindings at this gateway come
// and go, for the parts above the registrar that act on them, which the
// registrar itself knows nothing of: a phone that just registered is told
// what messages wait, and a back-to-back trunk is registered upstream only
// while a phone of its identity is registered here.
//
// Called on libre's thread once the change is made, and for a REGISTER
// once it has been answered, so that what a listener sends the phone
// follows the 200. The identity lives for the call only: one the registrar
// made for a user that only "DEFAULT" answers goes with its last binding.
// The registrar borrows its listeners and tells them nothing once it is
// being destroyed; a listener being told adds or removes none.
#pragma once

#include "LS_IIdentity.h"

class BindingListener {
 public:
  virtual ~BindingListener() = default;
  // A REGISTER filed at least one new contact for identity (a refresh is
  // not new), or the store brought identity its first bindings; first:
  // it had none before.
  virtual void onBound(LS_IIdentity* identity, bool first) = 0;
  // identity's last binding went: removed, run out, its way in lost, its
  // identity removed by a change, or taken away by the store.
  virtual void onUnbound(LS_IIdentity* identity) = 0;
};
