// Everything a receiver application needs from the section parser and its
// utility library, in one include.
#ifndef RAVEL_SECTIONPARSER_H
#define RAVEL_SECTIONPARSER_H

// Utility library.
#include "Ravel_CBitInputStream.h"
#include "Ravel_CDateTime.h"
#include "Ravel_CString.h"
#include "Ravel_Cfg.h"
#include "Ravel_List.h"
#include "Ravel_PGL.h"
#include "Ravel_Util.h"

// Foundation.
#include "Ravel_CArray.h"
#include "Ravel_ResultCode.h"

// Transport stream layer.
#include "Ravel_CTSPacket.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_CSectionAssembler.h"
#include "Ravel_CPCR.h"

// Tables.
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableBIT.h"
#include "Ravel_CTableBase.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableNIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableSDT.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"

// DSM-CC data carousel.
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CNASP.h"

// Descriptors.
#include "Ravel_CAdditionalGingaInfo.h"
#include "Ravel_CDescriptorApplication.h"
#include "Ravel_CDescriptorApplicationName.h"
#include "Ravel_CDescriptorAudioComponent.h"
#include "Ravel_CDescriptorBase.h"
#include "Ravel_CDescriptorCRC32.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorCompressionType.h"
#include "Ravel_CDescriptorContent.h"
#include "Ravel_CDescriptorCopyright.h"
#include "Ravel_CDescriptorCountryAvailability.h"
#include "Ravel_CDescriptorDataComponent.h"
#include "Ravel_CDescriptorEstDownloadTime.h"
#include "Ravel_CDescriptorExtendedBroadcaster.h"
#include "Ravel_CDescriptorExtendedEvent.h"
#include "Ravel_CDescriptorGeneralEvent.h"
#include "Ravel_CDescriptorGingaApp.h"
#include "Ravel_CDescriptorGingaAppDataComponent.h"
#include "Ravel_CDescriptorGingaAppLoc.h"
#include "Ravel_CDescriptorInfo.h"
#include "Ravel_CDescriptorLinkage.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CDescriptorLocation.h"
#include "Ravel_CDescriptorLogoTransmission.h"
#include "Ravel_CDescriptorModuleLink.h"
#include "Ravel_CDescriptorNPTReference.h"
#include "Ravel_CDescriptorName.h"
#include "Ravel_CDescriptorNetworkName.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorPartialReception.h"
#include "Ravel_CDescriptorSeries.h"
#include "Ravel_CDescriptorService.h"
#include "Ravel_CDescriptorServiceList.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CDescriptorStreamIdentifier.h"
#include "Ravel_CDescriptorSystemManagement.h"
#include "Ravel_CDescriptorTSInformation.h"
#include "Ravel_CDescriptorTargetRegion.h"
#include "Ravel_CDescriptorTerrDeliverySystem.h"
#include "Ravel_CDescriptorType.h"
#include "Ravel_CDescriptors.h"
#include "Ravel_CObjectCarouselTransmissionFormat.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTxType.h"

#endif
