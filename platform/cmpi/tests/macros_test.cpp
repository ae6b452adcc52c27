// The C convenience macros, used from C, against the fake broker.
#include "fake_broker.h"

#include <gtest/gtest.h>

extern "C" int cmpi_macro_objects(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIResult* rslt);
extern "C" int cmpi_macro_status(const CMPIBroker* mb);

TEST(CmpiMacros, ObjectMacrosCallTheRightTableEntries)
{
    fake::reset();
    CMPIResult* r = fake::newResult();
    EXPECT_EQ(cmpi_macro_objects(fake::broker(), fake::newContext(), r), 0);
    ASSERT_EQ(fake::resultItems(r).size(), 3u);
    EXPECT_EQ(fake::resultItems(r)[0].data.type, CMPI_instance);
    EXPECT_EQ(fake::resultItems(r)[1].data.type, CMPI_ref);
    EXPECT_EQ(fake::resultItems(r)[2].data.value.uint16, 80);
    EXPECT_TRUE(fake::resultDone(r));
    EXPECT_EQ(fake::delivered().size(), 1u);
}

TEST(CmpiMacros, StatusMacros)
{
    fake::reset();
    EXPECT_EQ(cmpi_macro_status(fake::broker()), 0);
}
