#include "LS_CCallInbound.h"

#include "LS_ClassIdentifiers.h"

template class LS_CCallFace<LS_CCallInbound, LS_CInbound>;

namespace {

LS_ElementClassRegistration const registration(CID_LS_CallInbound(), &LS_makeElement<LS_CCallInbound>);

}  // namespace
