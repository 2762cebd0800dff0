#include "Ravel_Cfg.h"

namespace {
int gStandard = RAVEL_STANDARD_BRAZIL;
}

extern "C" int RavelCfg_GetStandard(void) { return gStandard; }

extern "C" void RavelCfg_SetStandard(int standard) { gStandard = standard; }
