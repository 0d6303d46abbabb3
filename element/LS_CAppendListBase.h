// LS_CAppendListBase: the common base of every append list
// (LS_CAppendList<T>); it adds nothing to the element and leaves create()
// abstract.
#pragma once

#include "LS_CElement.h"

class LS_CAppendListBase : public LS_CElement {};
