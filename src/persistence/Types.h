#pragma once
// The value types are in values/Types.h; this name stays only for the files
// that still include it by this path.
#include "values/Types.h"
