/* The convenience macros of cmpimacs.h used from C, as C providers use
 * them; macros_test.cpp runs these against the fake broker.  Each function
 * returns 0 when every call landed where it should, else the step that
 * went wrong. */
#include <cmpift.h>
#include <cmpimacs.h>
#include <string.h>

int cmpi_macro_objects(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIResult* rslt);
int cmpi_macro_status(const CMPIBroker* mb);

int cmpi_macro_objects(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIResult* rslt)
{
    CMPIStatus rc = {CMPI_RC_OK, NULL};
    CMPIObjectPath* op = CMNewObjectPath(mb, "root/t", "T_Macro", &rc);
    if (rc.rc != CMPI_RC_OK || op == NULL)
        return 1;
    CMPIString* key = CMNewString(mb, "k1", &rc);
    CMAddKey(op, "Name", &key, CMPI_string);
    CMPIData d = CMGetKey(op, "Name", &rc);
    if (rc.rc != CMPI_RC_OK || d.type != CMPI_string || strcmp(CMGetCharPtr(d.value.string), "k1") != 0)
        return 2;
    if (CMGetKeyCount(op, &rc) != 1)
        return 3;
    CMPIInstance* inst = CMNewInstance(mb, op, &rc);
    CMPIUint16 port = 80;
    CMSetProperty(inst, "Port", &port, CMPI_uint16);
    d = CMGetProperty(inst, "Port", &rc);
    if (rc.rc != CMPI_RC_OK || d.type != CMPI_uint16 || d.value.uint16 != 80)
        return 4;
    if (!CMClassPathIsA(mb, op, "T_Macro", &rc))
        return 5;
    if (strcmp(CMGetCharPtr(CMGetClassName(op, &rc)), "T_Macro") != 0 ||
        strcmp(CMGetCharPtr(CMGetNameSpace(op, &rc)), "root/t") != 0)
        return 6;
    CMPIArray* arr = CMNewArray(mb, 2, CMPI_uint16, &rc);
    CMSetArrayElementAt(arr, 1, &port, CMPI_uint16);
    if (CMGetArrayCount(arr, &rc) != 2 || CMGetArrayElementAt(arr, 1, &rc).value.uint16 != 80)
        return 7;
    CMReturnInstance(rslt, inst);
    CMReturnObjectPath(rslt, op);
    CMReturnData(rslt, &port, CMPI_uint16);
    CMReturnDone(rslt);
    if (CBDeliverIndication(mb, ctx, "root/t", inst).rc != CMPI_RC_OK)
        return 8;
    CMPIDateTime* dt = CMNewDateTimeFromBinary(mb, 5000000ull, 1, &rc);
    if (CMGetBinaryFormat(dt, &rc) != 5000000ull || !CMIsInterval(dt, &rc))
        return 9;
    return 0;
}

static CMPIStatus returnWithChars(const CMPIBroker* mb)
{
    CMReturnWithChars(mb, CMPI_RC_ERR_NOT_FOUND, "gone");
}

static CMPIStatus returnPlain(void)
{
    CMReturn(CMPI_RC_ERR_FAILED);
}

int cmpi_macro_status(const CMPIBroker* mb)
{
    CMPIStatus a = returnWithChars(mb);
    if (a.rc != CMPI_RC_ERR_NOT_FOUND || a.msg == NULL || strcmp(CMGetCharPtr(a.msg), "gone") != 0)
        return 1;
    CMPIStatus b = returnPlain();
    if (b.rc != CMPI_RC_ERR_FAILED || b.msg != NULL)
        return 2;
    CMPIStatus c = {CMPI_RC_OK, NULL};
    CMSetStatusWithChars(mb, &c, CMPI_RC_ERR_ACCESS_DENIED, "no");
    if (c.rc != CMPI_RC_ERR_ACCESS_DENIED || strcmp(CMGetCharPtr(c.msg), "no") != 0)
        return 3;
    CMSetStatus(&c, CMPI_RC_OK);
    if (c.rc != CMPI_RC_OK || c.msg != NULL)
        return 4;
    CMSetStatus((CMPIStatus*)NULL, CMPI_RC_ERR_FAILED); /* a null status pointer is allowed */
    CMPIData nul = {CMPI_uint16, CMPI_nullValue, {0}};
    if (!CMIsNullValue(nul) || CMIsKeyValue(nul) || CMIsArray(nul))
        return 5;
    return 0;
}
