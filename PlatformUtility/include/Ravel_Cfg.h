// The broadcast-standard setting: 1 selects the Japanese (ARIB) rules, any other
// value the Brazilian (ABNT) ones. Read at parse time, every time.
#ifndef RAVEL_CFG_H
#define RAVEL_CFG_H

#ifdef __cplusplus
extern "C" {
#endif

enum {
  RAVEL_STANDARD_BRAZIL = 0,
  RAVEL_STANDARD_JAPAN = 1
};

int RavelCfg_GetStandard(void);
void RavelCfg_SetStandard(int standard);

#ifdef __cplusplus
}
#endif

#endif
