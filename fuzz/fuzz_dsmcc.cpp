// DSM-CC messages through the safe entry layer. The first byte chooses the
// class: by message id, or the DSI, DII or DDB whatever the id says. Parsed
// objects are copied, compared and dumped.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CSafeSection.h"

namespace {

void UseDII(RavelCDsmccDII& dii) {
  dii.Show();
  RavelCDsmccDII copy(dii);
  copy.Show();
  for (int i = 0; i < copy.GetNumberOfModules(); ++i) {
    RavelCModuleInfo* module = copy.GetModuleInfo(i);
    RavelCModuleInfo moduleCopy(*module);
    moduleCopy.Show();
    copy.GetModuleInfoByID(module->GetModuleId());
  }
  copy.GetModuleInfo(copy.GetNumberOfModules());
}

void UseDDB(RavelCDsmccDDB& ddb) {
  ddb.Show();
  RavelCDsmccDDB copy(ddb);
  RavelCDsmccDDB assigned(0);
  assigned = copy;
  (void)(assigned == ddb);
  (void)(assigned < ddb);
  (void)(assigned >= ddb);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  if (size == 0) return 0;
  std::vector<unsigned char> message(data + 1, data + size);
  const unsigned char* bytes = message.data();
  int count = static_cast<int>(message.size());
  RavelCSafeSection safe;
  switch (data[0] % 4) {
    case 0:
      if (safe.ParseMessage(bytes, count) == kRavelSafeOk) {
        safe.Show();
        if (RavelCDsmccBase* copy = safe.CopyMessage()) {
          copy->Show();
          delete copy;
        }
      }
      break;
    case 1: {
      RavelCDsmccDSI dsi(0);
      if (safe.ParseMessageInto(bytes, count, dsi) == kRavelSafeOk) {
        dsi.Show();
        dsi.GetNASP().Show();
      }
      break;
    }
    case 2: {
      RavelCDsmccDII dii(0);
      if (safe.ParseMessageInto(bytes, count, dii) == kRavelSafeOk) UseDII(dii);
      break;
    }
    default: {
      RavelCDsmccDDB ddb(0);
      if (safe.ParseMessageInto(bytes, count, ddb) == kRavelSafeOk) UseDDB(ddb);
      break;
    }
  }
  return 0;
}
