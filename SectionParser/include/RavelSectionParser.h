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
#include "Ravel_ByteOrder.h"
#include "Ravel_CArray.h"
#include "Ravel_CDateCode.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

// Transport stream layer.

// Tables.
#include "Ravel_CTableBase.h"

// Descriptors.
#include "Ravel_CDescriptorBase.h"
#include "Ravel_CDescriptorNetworkName.h"

#endif
