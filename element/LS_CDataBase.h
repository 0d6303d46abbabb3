// LS_CDataBase: the common base of every data value (LS_CData<T>); it adds
// nothing to the element and leaves create() abstract.
#pragma once

#include "LS_CElement.h"

class LS_CDataBase : public LS_CElement {};
