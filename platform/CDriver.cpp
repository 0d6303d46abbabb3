#include "CDriver.h"

CDriver::CDriver(UUID const& did, String const& name, Lock* lock)
    : CInherit(lock), m_did(did), m_name(name) {}
