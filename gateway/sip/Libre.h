// Libre: the SIP stack's headers, for C++. libre's headers use the fixed-width
// integer types without including their header, so every file of the gateway
// reaches libre through this one.
#pragma once

#include <cstddef>
#include <cstdint>

#include <re.h>
