/* Compiles the CMPI headers as C and reports a few layouts to the C++ test,
 * so that both languages are known to see the same structures. */
#include <cmpift.h>
#include <cmpimacs.h>
#include <stddef.h>

int cmpi_abi_c_sizes(int which);

int cmpi_abi_c_sizes(int which)
{
    switch (which) {
    case 0: return (int)sizeof(CMPIData);
    case 1: return (int)sizeof(CMPIBrokerEncFT);
    case 2: return (int)sizeof(CMPIInstanceMIFT);
    case 3: return (int)offsetof(CMPIIndicationMIFT, disableIndications);
    case 4: return (int)sizeof(CMPIBroker);
    default: return -1;
    }
}
