// CmpiImpl.h - all classes of the CMPI C++ provider wrapper.
//
// The wrapper is linked statically into each provider library and
// compiled with hidden visibility: a provider never binds to another
// wrapper library that the server process may hold.  A provider exports
// only its factories, with CMPI_PROVIDER_FACTORY:
//
//   CMPI_PROVIDER_FACTORY CMPIInstanceMI* Name_Create_InstanceMI(
//       const CMPIBroker* mb, const CMPIContext* ctx, CMPIStatus* rc);
#ifndef CMPI_CPP_CMPIIMPL_H
#define CMPI_CPP_CMPIIMPL_H

#include "cmpidt.h"
#include "cmpift.h"
#include "cmpimacs.h"

#include "CmpiArgs.h"
#include "CmpiArray.h"
#include "CmpiAssociationMI.h"
#include "CmpiBaseMI.h"
#include "CmpiBroker.h"
#include "CmpiContext.h"
#include "CmpiData.h"
#include "CmpiDateTime.h"
#include "CmpiIndicationMI.h"
#include "CmpiInstance.h"
#include "CmpiInstanceMI.h"
#include "CmpiMethodMI.h"
#include "CmpiObjectPath.h"
#include "CmpiProviderBase.h"
#include "CmpiResult.h"
#include "CmpiSelectExp.h"
#include "CmpiStatus.h"
#include "CmpiString.h"

// extern "C" with default visibility, whatever -fvisibility says.
#define CMPI_PROVIDER_FACTORY CMPI_EXTERN_C

#endif
