#include "LS_CCallOutbound.h"

#include "LS_ClassIdentifiers.h"

template class LS_CCallFace<LS_CCallOutbound, LS_COutbound>;

namespace {

LS_ElementClassRegistration const registration(CID_LS_CallOutbound(), &LS_makeElement<LS_CCallOutbound>);

}  // namespace
