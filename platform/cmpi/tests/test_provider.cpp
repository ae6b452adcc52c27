#include "test_provider.h"

std::atomic<int> TestProvider::live{0};
std::atomic<int> TestProvider::cleanups{0};
std::atomic<bool> TestProvider::unloadable{true};

CmpiProviderBase testProviderBase;

CMPIInstanceMIFT testInstFT = cmpiInstanceMIFT("instanceTest");

CMPIAssociationMIFT testAssocFT = cmpiAssociationMIFT("associationTest");

CMPIMethodMIFT testMethFT = cmpiMethodMIFT("methodTest");

CMPIIndicationMIFT testIndFT = cmpiIndicationMIFT("indicationTest");
