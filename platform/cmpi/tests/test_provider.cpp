#include "test_provider.h"

std::atomic<int> TestProvider::live{0};
std::atomic<int> TestProvider::cleanups{0};
std::atomic<bool> TestProvider::unloadable{true};

CmpiProviderBase testProviderBase;

CMPIInstanceMIFT testInstFT = {
    200, 200, "instanceTest", CmpiBaseMI::driveBaseCleanup,
    CmpiInstanceMI::driveEnumInstanceNames, CmpiInstanceMI::driveEnumInstances,
    CmpiInstanceMI::driveGetInstance, CmpiInstanceMI::driveCreateInstance,
    CmpiInstanceMI::driveSetInstance, CmpiInstanceMI::driveDeleteInstance,
    CmpiInstanceMI::driveExecQuery};

CMPIAssociationMIFT testAssocFT = {
    200, 200, "associationTest", CmpiBaseMI::driveBaseCleanup,
    CmpiAssociationMI::driveAssociators, CmpiAssociationMI::driveAssociatorNames,
    CmpiAssociationMI::driveReferences, CmpiAssociationMI::driveReferenceNames};

CMPIMethodMIFT testMethFT = {200, 200, "methodTest", CmpiBaseMI::driveBaseCleanup,
                             CmpiMethodMI::driveInvokeMethod};

CMPIIndicationMIFT testIndFT = {
    200, 200, "indicationTest", CmpiBaseMI::driveBaseCleanup,
    CmpiIndicationMI::driveAuthorizeFilter, CmpiIndicationMI::driveMustPoll,
    CmpiIndicationMI::driveActivateFilter, CmpiIndicationMI::driveDeActivateFilter,
    CmpiIndicationMI::driveEnableIndications, CmpiIndicationMI::driveDisableIndications};
