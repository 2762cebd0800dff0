#include "Ravel_CDsmccMsgBase.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDsmccMsgBase");

RavelCDsmccBase::RavelCDsmccBase(unsigned char* data) {
  ClearHeader();
  RavelCDsmccBase::ParseRawData(data);
}

RavelCDsmccBase::~RavelCDsmccBase() {}

void RavelCDsmccBase::ClearHeader() {
  iProtocolDiscriminator = 0;
  iDsmccType = 0;
  iMessageId = 0;
  iTransactionId = 0;
  iAdaptationLength = 0;
  iMessageLength = 0;
}

int RavelCDsmccBase::ParseRawData(unsigned char* data) {
  if (data == 0) {
    ClearHeader();
    return kRavelErrInvalidArgument;
  }
  RavelCReadWindow window(RavelCReadWindow::SectionOfMessage(data));
  iProtocolDiscriminator = RavelCReadWindow::Read8(data);
  iDsmccType = RavelCReadWindow::Read8(data + 1);
  iMessageId = RavelCReadWindow::Read16(data + 2);
  iTransactionId = RavelCReadWindow::Read32(data + 4);
  // data[8] is reserved.
  iAdaptationLength = RavelCReadWindow::Read8(data + 9);
  iMessageLength = RavelCReadWindow::Read16(data + 10);
  if (iMessageId == RAVEL_DSMCC_MSG_DII || iMessageId == RAVEL_DSMCC_MSG_DDB || iMessageId == RAVEL_DSMCC_MSG_DSI) {
    return kRavelOk;
  }
  // Reported with the dsmccType byte, and parsed on.
  RAVEL_TRACE(RAVEL_CAROUSEL_WARNING, "Unknown DSMCC Type! dsmccType=[0x%02x]\n", iDsmccType);
  return kRavelOk;
}

void RavelCDsmccBase::Show() {
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP,
              "DSMCC Header: protocolDiscriminator=[0x%02x], dsmccType=[0x%02x], messageID=[0x%04x]\n",
              iProtocolDiscriminator, iDsmccType, iMessageId);
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP, "DSMCC Header: transaction_id=[0x%08x], adaptationLength=[%d], messageLength=[%d]\n",
              iTransactionId, iAdaptationLength, iMessageLength);
}
