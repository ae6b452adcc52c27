// The handle and value classes of the wrapper against the fake broker:
// type codes, conversions and their failures, the documented answers for
// absent keys, properties and arguments, and null handles.
#include "CmpiImpl.h"
#include "fake_broker.h"

#include <gtest/gtest.h>

#include <cstring>
#include <functional>

namespace {

class Values : public ::testing::Test {
protected:
    void SetUp() override
    {
        fake::reset();
        CmpiProviderBase::setBroker(fake::broker());
    }
};

CMPIrc rcOf(const std::function<void()>& f)
{
    try {
        f();
    } catch (const CmpiStatus& st) {
        return st.rc();
    }
    return CMPI_RC_OK;
}

TEST_F(Values, ConstructorsPickTheCmpiType)
{
    struct Row {
        CmpiData data;
        CMPIType type;
    } rows[] = {
        {CmpiData(CMPISint8(-1)), CMPI_sint8},     {CmpiData(CMPISint16(-2)), CMPI_sint16},
        {CmpiData(CMPISint32(-3)), CMPI_sint32},   {CmpiData(CMPISint64(-4)), CMPI_sint64},
        {CmpiData(-5L), CMPI_sint64},              {CmpiData(CMPIUint8(1)), CMPI_uint8},
        {CmpiData(CMPIUint16(2)), CMPI_uint16},    {CmpiData(CMPIUint32(3)), CMPI_uint32},
        {CmpiData(CMPIUint64(4)), CMPI_uint64},    {CmpiData(5UL), CMPI_uint64},
        {CmpiData(1.5f), CMPI_real32},             {CmpiData(2.5), CMPI_real64},
        {CmpiData(true), CMPI_boolean},            {CmpiTrue, CMPI_boolean},
        {CmpiCharData(65), CMPI_char16},           {CmpiData("text"), CMPI_chars},
        {CmpiData(std::string("s")), CMPI_chars},  {CmpiData(7), CMPI_sint32},
        {CmpiData(CmpiArray(2, CMPI_uint16)), CMPI_uint16A},
        {CmpiData(CmpiArray(1, CMPI_stringA)), CMPI_stringA},
        {CmpiData(CmpiObjectPath("root/t", "T_A")), CMPI_ref},
        {CmpiData(CmpiDateTime(CMPIUint64(10), true)), CMPI_dateTime},
    };
    for (const Row& r : rows) {
        EXPECT_EQ(r.data.getType(), r.type);
        EXPECT_FALSE(r.data.isNullValue());
    }
    EXPECT_EQ(CmpiData().getType(), CMPI_null);
    EXPECT_TRUE(CmpiData().isNullValue());
}

TEST_F(Values, ConversionsCheckTheType)
{
    EXPECT_EQ(static_cast<CMPIUint16>(CmpiData(CMPIUint16(513))), 513);
    EXPECT_EQ(static_cast<CMPIUint8>(CmpiData(CMPIUint8(200))), 200);
    EXPECT_EQ(static_cast<CMPIBoolean>(CmpiData(true)), 1);  // booleans read as unsigned char
    EXPECT_EQ(static_cast<CMPIUint16>(CmpiCharData(65)), 65);  // char16 reads as unsigned short
    EXPECT_EQ(static_cast<CMPISint32>(CmpiData(-3)), -3);
    EXPECT_EQ(static_cast<CMPIUint64>(CmpiData(CMPIUint64(1) << 40)), CMPIUint64(1) << 40);
    EXPECT_DOUBLE_EQ(static_cast<CMPIReal64>(CmpiData(2.5)), 2.5);

    EXPECT_EQ(rcOf([] { (void)static_cast<CMPIUint32>(CmpiData(CMPIUint16(1))); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(rcOf([] { (void)static_cast<CMPISint32>(CmpiData(CMPIUint32(1))); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(rcOf([] { (void)static_cast<const char*>(CmpiData(5)); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(rcOf([] { CmpiArray a = CmpiData(5); (void)a; }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(rcOf([] { CmpiObjectPath p = CmpiData("x"); (void)p; }), CMPI_RC_ERR_TYPE_MISMATCH);
    // A numeric conversion of an absent value still checks the type.
    EXPECT_EQ(rcOf([] { (void)static_cast<CMPIUint16>(CmpiData()); }), CMPI_RC_ERR_TYPE_MISMATCH);
}

TEST_F(Values, NullValuesGiveNullHandles)
{
    CmpiData none;
    EXPECT_EQ(static_cast<const char*>(none), nullptr);
    EXPECT_TRUE(static_cast<CmpiString>(none).isNull());
    EXPECT_TRUE(static_cast<CmpiObjectPath>(none).isNull());
    EXPECT_TRUE(static_cast<CmpiInstance>(none).isNull());
    CmpiArray arr = none;
    EXPECT_EQ(arr.size(), 0u);
    EXPECT_EQ(static_cast<const char*>(CmpiData(static_cast<const char*>(nullptr))), nullptr);
}

TEST_F(Values, CharsAreCopiedAtConstruction)
{
    char buffer[16];
    std::strcpy(buffer, "first");
    CmpiData d(buffer);
    std::strcpy(buffer, "second");
    EXPECT_STREQ(static_cast<const char*>(d), "first");
    CmpiData copy = d;
    EXPECT_STREQ(static_cast<const char*>(copy), "first");
}

TEST_F(Values, ArraysCheckElementTypesAndIndexes)
{
    CmpiArray u16(2, CMPI_uint16);
    EXPECT_EQ(u16.size(), 2u);
    EXPECT_EQ(u16.getType(), CMPI_uint16);
    u16[0] = CmpiData(CMPIUint16(7));
    u16[1] = CmpiData(CMPIUint16(32768));
    EXPECT_EQ(static_cast<CMPIUint16>(u16[1]), 32768);
    EXPECT_EQ(static_cast<CMPIUint16>(u16[0].getData()), 7);
    EXPECT_EQ(rcOf([&] { u16[0] = CmpiData(CMPIUint32(1)); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(rcOf([&] { (void)u16[-1].getData(); }), CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_NE(rcOf([&] { (void)u16[2].getData(); }), CMPI_RC_OK);

    CmpiArray strings(1, CMPI_string);
    strings[0] = CmpiData("abc");  // chars into a string array
    EXPECT_STREQ(static_cast<const char*>(strings[0]), "abc");

    // Through a CmpiData and back, as a property value travels.
    CmpiArray back = CmpiData(u16);
    EXPECT_EQ(back.size(), 2u);
    EXPECT_EQ(rcOf([] { CmpiArray().getType(); }), CMPI_RC_ERR_INVALID_HANDLE);
}

TEST_F(Values, ObjectPathKeysAndNames)
{
    CmpiObjectPath op("root/sample", "Sample_Widget");
    op.setKey("Name", CmpiData("w1"));
    op.setKey("Slot", CmpiData(CMPIUint16(3)));
    op.setKey("Name", CmpiData("w2"));  // replaces
    EXPECT_EQ(op.getKeyCount(), 2u);
    EXPECT_STREQ(op.getKey("name"), "w2");
    EXPECT_EQ(static_cast<CMPIUint16>(op.getKey("Slot")), 3);
    CmpiString keyName;
    EXPECT_EQ(static_cast<CMPIUint16>(op.getKey(1, &keyName)), 3);
    EXPECT_STREQ(keyName.charPtr(), "Slot");
    EXPECT_TRUE(op.getClassName().equals("Sample_Widget"));
    EXPECT_TRUE(op.getNameSpace().equalsIgnoreCase("ROOT/SAMPLE"));
    op.setHostname("h1");
    EXPECT_STREQ(op.getHostname().charPtr(), "h1");

    // An absent key throws, naming the key.
    try {
        (void)op.getKey("Missing");
        FAIL() << "getKey of an absent key returned";
    } catch (const CmpiStatus& st) {
        EXPECT_EQ(st.rc(), CMPI_RC_ERR_NOT_FOUND);
        EXPECT_STREQ(st.msg(), "Missing");
    }
}

TEST_F(Values, ClassPathIsAFollowsTheHierarchy)
{
    fake::addSubclass("Sample_Widget", "Sample_Base");
    CmpiObjectPath op("root/sample", "Sample_Widget");
    EXPECT_TRUE(op.classPathIsA("Sample_Widget"));
    EXPECT_TRUE(op.classPathIsA("sample_base"));
    EXPECT_FALSE(op.classPathIsA("Sample_Other"));
    EXPECT_EQ(rcOf([&] { op.classPathIsA(nullptr); }), CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(Values, NullHandlesThrowInsteadOfCrashing)
{
    CmpiObjectPath none(static_cast<CMPIObjectPath*>(nullptr));
    EXPECT_EQ(rcOf([&] { none.getClassName(); }), CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(rcOf([&] { none.classPathIsA("X"); }), CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(rcOf([&] { CmpiInstance inst(none); }), CMPI_RC_ERR_INVALID_HANDLE);
    CmpiResult rslt(static_cast<CMPIResult*>(nullptr));
    EXPECT_EQ(rcOf([&] { rslt.returnDone(); }), CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(CmpiString().charPtr(), nullptr);
    EXPECT_FALSE(CmpiString().equals("x"));
}

TEST_F(Values, NoBrokerMeansFailedNotCrash)
{
    CmpiProviderBase::setBroker(nullptr);
    EXPECT_EQ(rcOf([] { CmpiObjectPath op("root/t", "T"); }), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(rcOf([] { CmpiArray a(1, CMPI_uint8); }), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(rcOf([] { CmpiDateTime now; }), CMPI_RC_ERR_FAILED);
}

TEST_F(Values, InstancePropertiesAndFilter)
{
    CmpiObjectPath op("root/sample", "Sample_Widget");
    CmpiInstance plain(op);
    plain.setProperty("Name", CmpiData("w1"));
    plain.setProperty("Count", CmpiData(CMPIUint32(9)));
    EXPECT_EQ(plain.getPropertyCount(), 2u);
    EXPECT_EQ(static_cast<CMPIUint32>(plain.getProperty("Count")), 9u);
    EXPECT_TRUE(plain.getObjectPath().getClassName().equals("Sample_Widget"));

    CmpiData missing = plain.getProperty("Nope");  // absent: no throw
    EXPECT_TRUE(missing.isNotFound());
    EXPECT_TRUE(missing.isNullValue());

    static const char* props[] = {"Count", nullptr};
    static const char* keys[] = {"Name", nullptr};
    CmpiInstance filtered(op);
    filtered.setPropertyFilter(props, keys);
    filtered.setProperty("Name", CmpiData("w1"));
    filtered.setProperty("Count", CmpiData(CMPIUint32(1)));
    filtered.setProperty("Other", CmpiData(CMPIUint32(2)));
    EXPECT_EQ(filtered.getPropertyCount(), 2u);
    EXPECT_TRUE(filtered.getProperty("Other").isNotFound());

    CmpiInstance nokeys(op);
    nokeys.setPropertyFilter(props, nullptr);  // null keys: an empty list
    nokeys.setProperty("Name", CmpiData("w1"));
    EXPECT_TRUE(nokeys.getProperty("Name").isNotFound());
    EXPECT_EQ(rcOf([&] { plain.setProperty("", CmpiData(1)); }), CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(Values, AbsentArgumentsReadAsNull)
{
    CmpiArgs in;
    in.setArg("URI", CmpiData("file:///tmp/x"));
    CmpiArray opts(2, CMPI_uint16);
    opts[0] = CmpiData(CMPIUint16(5));
    opts[1] = CmpiData(CMPIUint16(32768));
    in.setArg("Options", CmpiData(opts));
    EXPECT_EQ(in.getArgCount(), 2u);
    EXPECT_STREQ(static_cast<const char*>(in.getArg("URI")), "file:///tmp/x");
    CmpiArray back = in.getArg("Options");
    ASSERT_EQ(back.size(), 2u);
    EXPECT_EQ(static_cast<CMPIUint16>(back[1]), 32768);

    CmpiData target = in.getArg("Target");
    EXPECT_TRUE(target.isNullValue());
    EXPECT_TRUE(target.isNotFound());
    EXPECT_EQ(static_cast<const char*>(in.getArg("Target")), nullptr);
    CmpiArray none = in.getArg("InstallOptions");
    EXPECT_EQ(none.size(), 0u);
    CmpiString name;
    EXPECT_STREQ(static_cast<const char*>(in.getArg(0, &name)), "file:///tmp/x");
    EXPECT_STREQ(name.charPtr(), "URI");
}

TEST_F(Values, DateTimesFromBinaryAndIntervalText)
{
    CmpiDateTime abs(CMPIUint64(1700000000000000ull), false);
    EXPECT_FALSE(abs.isInterval());
    EXPECT_EQ(abs.getDateTime(), 1700000000000000ull);
    CmpiDateTime iv(CMPIUint64(5000000), true);
    EXPECT_TRUE(iv.isInterval());

    CmpiDateTime halfHour("00000000003000.000000:000");
    EXPECT_TRUE(halfHour.isInterval());
    EXPECT_EQ(halfHour.getDateTime(), 30ull * 60 * 1000000);
    EXPECT_EQ(rcOf([] { CmpiDateTime bad("garbage"); }), CMPI_RC_ERR_INVALID_PARAMETER);

    CmpiDateTime now;
    EXPECT_GT(now.getDateTime(), 1600000000000000ull);
    CmpiDateTime fromData = CmpiData(iv);
    EXPECT_EQ(fromData.getDateTime(), 5000000u);
}

TEST_F(Values, StatusValueAndCForm)
{
    CmpiStatus ok;
    EXPECT_EQ(ok.rc(), CMPI_RC_OK);
    EXPECT_FALSE(ok.hasMsg());
    EXPECT_STREQ(ok.msg(), "");  // printable even without a message
    CmpiStatus nf(CMPI_RC_ERR_NOT_FOUND, "key-1");
    EXPECT_STREQ(nf.msg(), "key-1");
    EXPECT_TRUE(nf.hasMsg());
    EXPECT_FALSE(CmpiStatus(CMPI_RC_ERR_FAILED, static_cast<const char*>(nullptr)).hasMsg());
    CmpiObjectPath op("root/t", "T");
    op.setKey("K", CmpiData("v1"));
    EXPECT_STREQ(CmpiStatus(CMPI_RC_ERR_NOT_FOUND, op.getKey("K")).msg(), "v1");
    EXPECT_STREQ(CmpiStatus(CMPI_RC_ERR_FAILED, std::string("s")).msg(), "s");
    // An empty text is a message all the same.
    EXPECT_NE(CmpiStatus(CMPI_RC_ERR_FAILED, "").status(fake::broker()).msg, nullptr);

    CMPIStatus c = nf.status(fake::broker());
    EXPECT_EQ(c.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(fake::text(c.msg), "key-1");
    EXPECT_EQ(nf.status(nullptr).msg, nullptr);  // no broker: no message handle
    EXPECT_EQ(CmpiStatus(CMPI_RC_ERR_FAILED).status(fake::broker()).msg, nullptr);

    CmpiStatus back(c);  // the text is copied out of the CMPIString
    EXPECT_EQ(back.rc(), CMPI_RC_ERR_NOT_FOUND);
    EXPECT_STREQ(back.msg(), "key-1");
}

TEST_F(Values, ResultsAndContexts)
{
    CMPIResult* r = fake::newResult();
    CmpiResult rslt(r);
    CmpiObjectPath op("root/sample", "Sample_Widget");
    rslt.returnData(op);
    rslt.returnData(CmpiInstance(op));
    rslt.returnData(CmpiData(CMPIUint32(4096)));
    rslt.returnDone();
    ASSERT_EQ(fake::resultItems(r).size(), 3u);
    EXPECT_EQ(fake::resultItems(r)[0].data.type, CMPI_ref);
    EXPECT_EQ(fake::resultItems(r)[1].data.type, CMPI_instance);
    EXPECT_EQ(fake::resultItems(r)[2].data.value.uint32, 4096u);
    EXPECT_TRUE(fake::resultDone(r));

    CMPIContext* c = fake::newContext();
    CMPIValue v;
    v.uint32 = 3;
    c->ft->addEntry(c, CMPIInvocationFlags, &v, CMPI_uint32);
    CmpiContext ctx(c);
    EXPECT_EQ(static_cast<CMPIUint32>(ctx.getEntry(CmpiContext::invocationFlags)), 3u);
    EXPECT_TRUE(ctx.getEntry("none").isNotFound());

    CmpiSelectExp se(fake::newSelectExp("SELECT * FROM X"));
    EXPECT_STREQ(se.getString().charPtr(), "SELECT * FROM X");
}

TEST_F(Values, BrokerUpCalls)
{
    CmpiBroker broker(fake::broker());
    CmpiContext ctx(fake::newContext());
    CmpiContext prepared = broker.prepareAttachThread(ctx);
    EXPECT_FALSE(prepared.isNull());
    broker.attachThread(prepared);
    EXPECT_EQ(fake::attachedThreads(), 1);
    broker.detachThread(prepared);
    EXPECT_EQ(fake::attachedThreads(), 0);

    CmpiInstance ind(broker.newObjectPath("root/sample", "Sample_Alert"));
    broker.deliverIndication(prepared, "root/interop", ind);
    ASSERT_EQ(fake::delivered().size(), 1u);
    EXPECT_EQ(fake::delivered()[0].ns, "root/interop");
    EXPECT_EQ(rcOf([&] { broker.deliverIndication(prepared, nullptr, ind); }),
              CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_STREQ(broker.newString("abc").charPtr(), "abc");
}

} // namespace
