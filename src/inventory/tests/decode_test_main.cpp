// Test entry of the decoder tests: the diagnostic log is off unless a test
// turns it on under a private /opt.
#include <gtest/gtest.h>

#include "support/Vexlan_FC_Utils_CMPI.h"

int main(int argc, char** argv) {
    g_EnableDebugPrint = false;
    g_EnableLogError = false;
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
