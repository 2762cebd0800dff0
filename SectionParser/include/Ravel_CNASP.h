// The 20-byte serverId of a DownloadServerInitiate (ISO/IEC 13818-6 7.3.6) as a
// Ginga service location record:
//   AFI 8 | type 8 | carouselId 32 | specifier 32
//   transport_stream_id 16 | original_network_id 16 | service_id 16 | 4 bytes not read
// It is built and traced by the DSI's source (Ravel_CDsmccDSI.cpp).
#ifndef RAVEL_CNASP_H
#define RAVEL_CNASP_H

class RavelCNASP {
 public:
  explicit RavelCNASP(unsigned char* data);
  virtual ~RavelCNASP();

  // 0, or -8 with a trace for null data (members cleared).
  virtual int ParseRawData(unsigned char* data);
  virtual void Show();

  unsigned char GetAFI() const { return iAFI; }
  unsigned char GetType() const { return iType; }
  unsigned int GetCarouselId() const { return iCarouselId; }
  unsigned int GetSpecifier() const { return iSpecifier; }
  unsigned short GetTransportStreamId() const { return iTransportStreamId; }
  unsigned short GetOriginalNetworkId() const { return iOriginalNetworkId; }
  unsigned short GetServiceId() const { return iServiceId; }

  unsigned char iAFI;
  unsigned char iType;
  unsigned int iCarouselId;
  unsigned int iSpecifier;
  unsigned short iTransportStreamId;
  unsigned short iOriginalNetworkId;
  unsigned short iServiceId;

 private:
  void Clear();
};

#endif
