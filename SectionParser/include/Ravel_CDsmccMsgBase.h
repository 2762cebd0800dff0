// DSM-CC message header shared by the data carousel messages, ISO/IEC 13818-6
// 7.2 (dsmccMessageHeader) and 7.3 (dsmccDownloadDataHeader):
//   protocolDiscriminator 8 | dsmccType 8 | messageId 16 | transactionId (downloadId) 32
//   reserved 8 | adaptationLength 8 | messageLength 16 | dsmccAdaptationHeader
// The message body starts at byte 12 + adaptationLength; the adaptation header
// itself is not decoded. Objects are built over the first byte of this header,
// which in a carousel section follows the 8-byte section header.
#ifndef RAVEL_CDSMCCMSGBASE_H
#define RAVEL_CDSMCCMSGBASE_H

// Message ids of the data carousel.
#define RAVEL_DSMCC_MSG_DII 0x1002
#define RAVEL_DSMCC_MSG_DDB 0x1003
#define RAVEL_DSMCC_MSG_DSI 0x1006

class RavelCDsmccBase {
 public:
  explicit RavelCDsmccBase(unsigned char* data);
  virtual ~RavelCDsmccBase();

  // 0, or -8 for null data (members cleared). A message id other than DII, DDB
  // and DSI is traced and parsed on all the same.
  virtual int ParseRawData(unsigned char* data);
  virtual void Show();

  unsigned char GetProtocolDiscriminator() const { return iProtocolDiscriminator; }
  unsigned char GetDsmccType() const { return iDsmccType; }
  unsigned short GetMessageId() const { return iMessageId; }
  unsigned int GetTransactionId() const { return iTransactionId; }
  unsigned char GetAdaptationLength() const { return iAdaptationLength; }
  unsigned short GetMessageLength() const { return iMessageLength; }

  unsigned char iProtocolDiscriminator;
  unsigned char iDsmccType;
  unsigned short iMessageId;
  unsigned int iTransactionId;  // downloadId in a DDB
  unsigned char iAdaptationLength;
  unsigned short iMessageLength;

 protected:
  void ClearHeader();
};

#endif
