/*
 * cmpimacs.h - convenience macros over the CMPI 2.0 function tables.
 *
 * Naming: CM... operate on encapsulated objects and status values,
 * CB... call through the broker's up-call table, CD... are broker
 * debugging services.  Each macro is a thin call through the object's own
 * function table; none of them keeps state.
 */
#ifndef CMPIMACS_H
#define CMPIMACS_H

#include "cmpift.h"

/* ---- status and return ---------------------------------------------- */

#define CMReturn(rc_)                                                        \
    do {                                                                     \
        CMPIStatus stat_ = {(CMPIrc)(rc_), NULL};                                    \
        return stat_;                                                        \
    } while (0)

#define CMReturnWithString(rc_, str_)                                        \
    do {                                                                     \
        CMPIStatus stat_ = {(CMPIrc)(rc_), (str_)};                                  \
        return stat_;                                                        \
    } while (0)

#define CMReturnWithChars(mb_, rc_, chars_)                                  \
    do {                                                                     \
        const CMPIBroker* mbp_ = (mb_);                                      \
        CMPIStatus stat_;                                                    \
        stat_.rc = (CMPIrc)(rc_);                                                    \
        stat_.msg = mbp_ ? mbp_->eft->newString(mbp_, (chars_), NULL) : NULL; \
        return stat_;                                                        \
    } while (0)

/* The status pointer may be NULL; it is copied first so that passing the
 * address of a local draws no "always true" warning. */
#define CMSetStatus(st_, rc_)                                                \
    do {                                                                     \
        CMPIStatus* stp_ = (st_);                                            \
        if (stp_) {                                                          \
            stp_->rc = (CMPIrc)(rc_);                                                \
            stp_->msg = NULL;                                                \
        }                                                                    \
    } while (0)

#define CMSetStatusWithString(st_, rc_, str_)                                \
    do {                                                                     \
        CMPIStatus* stp_ = (st_);                                            \
        if (stp_) {                                                          \
            stp_->rc = (CMPIrc)(rc_);                                                \
            stp_->msg = (str_);                                              \
        }                                                                    \
    } while (0)

#define CMSetStatusWithChars(mb_, st_, rc_, chars_)                          \
    do {                                                                     \
        CMPIStatus* stp_ = (st_);                                            \
        const CMPIBroker* mbp_ = (mb_);                                      \
        if (stp_) {                                                          \
            stp_->rc = (CMPIrc)(rc_);                                                \
            stp_->msg = mbp_ ? mbp_->eft->newString(mbp_, (chars_), NULL) : NULL; \
        }                                                                    \
    } while (0)

/* ---- tests on objects and data -------------------------------------- */

#define CMIsNullObject(o_) ((o_) == NULL || *((void **)(o_)) == NULL)
#define CMIsNullValue(d_) (((d_).state & CMPI_nullValue) != 0)
#define CMIsKeyValue(d_) (((d_).state & CMPI_keyValue) != 0)
#define CMIsArray(d_) (((d_).type & CMPI_ARRAY) != 0)

/* ---- generic object operations -------------------------------------- */

#define CMRelease(o_) ((o_)->ft->release((o_)))
#define CMClone(o_, rc_) ((o_)->ft->clone((o_), (rc_)))

/* ---- broker factories (CMPIBrokerEncFT) ----------------------------- */

#define CMNewInstance(mb_, op_, rc_) ((mb_)->eft->newInstance((mb_), (op_), (rc_)))
#define CMNewObjectPath(mb_, ns_, cn_, rc_)                                  \
    ((mb_)->eft->newObjectPath((mb_), (ns_), (cn_), (rc_)))
#define CMNewString(mb_, s_, rc_) ((mb_)->eft->newString((mb_), (s_), (rc_)))
#define CMNewArgs(mb_, rc_) ((mb_)->eft->newArgs((mb_), (rc_)))
#define CMNewArray(mb_, n_, t_, rc_) ((mb_)->eft->newArray((mb_), (n_), (t_), (rc_)))
#define CMNewDateTime(mb_, rc_) ((mb_)->eft->newDateTime((mb_), (rc_)))
#define CMNewDateTimeFromBinary(mb_, d_, i_, rc_)                            \
    ((mb_)->eft->newDateTimeFromBinary((mb_), (d_), (i_), (rc_)))
#define CMNewDateTimeFromChars(mb_, s_, rc_)                                 \
    ((mb_)->eft->newDateTimeFromChars((mb_), (s_), (rc_)))
#define CMNewSelectExp(mb_, q_, l_, p_, rc_)                                 \
    ((mb_)->eft->newSelectExp((mb_), (q_), (l_), (p_), (rc_)))
#define CMNewCMPIError(mb_, o_, id_, m_, s_, pc_, cs_, rc_)                  \
    ((mb_)->eft->newCMPIError((mb_), (o_), (id_), (m_), (s_), (pc_), (cs_), (rc_)))
#define CMClassPathIsA(mb_, op_, cn_, rc_)                                   \
    ((mb_)->eft->classPathIsA((mb_), (op_), (cn_), (rc_)))
#define CDToString(mb_, o_, rc_) ((mb_)->eft->toString((mb_), (void *)(o_), (rc_)))
#define CDIsOfType(mb_, o_, t_, rc_)                                         \
    ((mb_)->eft->isOfType((mb_), (void *)(o_), (t_), (rc_)))
#define CDGetType(mb_, o_, rc_) ((mb_)->eft->getType((mb_), (void *)(o_), (rc_)))
#define CMLogMessage(mb_, sev_, id_, text_, str_)                            \
    ((mb_)->eft->logMessage((mb_), (sev_), (id_), (text_), (str_)))
#define CMTraceMessage(mb_, lvl_, comp_, text_, str_)                        \
    ((mb_)->eft->trace((mb_), (lvl_), (comp_), (text_), (str_)))

/* ---- CMPIString ----------------------------------------------------- */

#define CMGetCharPtr(s_) ((s_)->ft->getCharPtr((s_), NULL))
#define CMGetCharsPtr(s_, rc_) ((s_)->ft->getCharPtr((s_), (rc_)))

/* ---- CMPIObjectPath ------------------------------------------------- */

#define CMGetNameSpace(op_, rc_) ((op_)->ft->getNameSpace((op_), (rc_)))
#define CMSetNameSpace(op_, ns_) ((op_)->ft->setNameSpace((op_), (ns_)))
#define CMGetHostname(op_, rc_) ((op_)->ft->getHostname((op_), (rc_)))
#define CMSetHostname(op_, hn_) ((op_)->ft->setHostname((op_), (hn_)))
#define CMGetClassName(op_, rc_) ((op_)->ft->getClassName((op_), (rc_)))
#define CMSetClassName(op_, cn_) ((op_)->ft->setClassName((op_), (cn_)))
#define CMAddKey(op_, n_, v_, t_) ((op_)->ft->addKey((op_), (n_), (CMPIValue *)(v_), (t_)))
#define CMGetKey(op_, n_, rc_) ((op_)->ft->getKey((op_), (n_), (rc_)))
#define CMGetKeyAt(op_, i_, n_, rc_) ((op_)->ft->getKeyAt((op_), (i_), (n_), (rc_)))
#define CMGetKeyCount(op_, rc_) ((op_)->ft->getKeyCount((op_), (rc_)))
#define CMSetNameSpaceFromObjectPath(op_, src_)                              \
    ((op_)->ft->setNameSpaceFromObjectPath((op_), (src_)))
#define CMSetHostAndNameSpaceFromObjectPath(op_, src_)                       \
    ((op_)->ft->setHostAndNameSpaceFromObjectPath((op_), (src_)))
#define CMObjectPathToString(op_, rc_) ((op_)->ft->toString((op_), (rc_)))

/* ---- CMPIInstance --------------------------------------------------- */

#define CMGetProperty(i_, n_, rc_) ((i_)->ft->getProperty((i_), (n_), (rc_)))
#define CMGetPropertyAt(i_, x_, n_, rc_) ((i_)->ft->getPropertyAt((i_), (x_), (n_), (rc_)))
#define CMGetPropertyCount(i_, rc_) ((i_)->ft->getPropertyCount((i_), (rc_)))
#define CMSetProperty(i_, n_, v_, t_)                                        \
    ((i_)->ft->setProperty((i_), (n_), (CMPIValue *)(v_), (t_)))
#define CMGetObjectPath(i_, rc_) ((i_)->ft->getObjectPath((i_), (rc_)))
#define CMSetObjectPath(i_, op_) ((i_)->ft->setObjectPath((i_), (op_)))
#define CMSetPropertyFilter(i_, pl_, k_) ((i_)->ft->setPropertyFilter((i_), (pl_), (k_)))

/* ---- CMPIArgs ------------------------------------------------------- */

#define CMAddArg(a_, n_, v_, t_) ((a_)->ft->addArg((a_), (n_), (CMPIValue *)(v_), (t_)))
#define CMGetArg(a_, n_, rc_) ((a_)->ft->getArg((a_), (n_), (rc_)))
#define CMGetArgAt(a_, i_, n_, rc_) ((a_)->ft->getArgAt((a_), (i_), (n_), (rc_)))
#define CMGetArgCount(a_, rc_) ((a_)->ft->getArgCount((a_), (rc_)))

/* ---- CMPIArray ------------------------------------------------------ */

#define CMGetArrayCount(a_, rc_) ((a_)->ft->getSize((a_), (rc_)))
#define CMGetArrayType(a_, rc_) ((a_)->ft->getSimpleType((a_), (rc_)))
#define CMGetArrayElementAt(a_, i_, rc_) ((a_)->ft->getElementAt((a_), (i_), (rc_)))
#define CMSetArrayElementAt(a_, i_, v_, t_)                                  \
    ((a_)->ft->setElementAt((a_), (i_), (CMPIValue *)(v_), (t_)))

/* ---- CMPIEnumeration ------------------------------------------------ */

#define CMGetNext(e_, rc_) ((e_)->ft->getNext((e_), (rc_)))
#define CMHasNext(e_, rc_) ((e_)->ft->hasNext((e_), (rc_)))
#define CMToArray(e_, rc_) ((e_)->ft->toArray((e_), (rc_)))

/* ---- CMPIResult ----------------------------------------------------- */

#define CMReturnData(r_, v_, t_) ((r_)->ft->returnData((r_), (CMPIValue *)(v_), (t_)))
#define CMReturnInstance(r_, i_) ((r_)->ft->returnInstance((r_), (i_)))
#define CMReturnObjectPath(r_, op_) ((r_)->ft->returnObjectPath((r_), (op_)))
#define CMReturnDone(r_) ((r_)->ft->returnDone((r_)))
#define CMReturnError(r_, e_) ((r_)->ft->returnError((r_), (e_)))

/* ---- CMPIContext ---------------------------------------------------- */

#define CMGetContextEntry(c_, n_, rc_) ((c_)->ft->getEntry((c_), (n_), (rc_)))
#define CMGetContextEntryAt(c_, i_, n_, rc_) ((c_)->ft->getEntryAt((c_), (i_), (n_), (rc_)))
#define CMGetContextEntryCount(c_, rc_) ((c_)->ft->getEntryCount((c_), (rc_)))
#define CMAddContextEntry(c_, n_, v_, t_)                                    \
    ((c_)->ft->addEntry((c_), (n_), (CMPIValue *)(v_), (t_)))

/* ---- CMPIDateTime --------------------------------------------------- */

#define CMGetBinaryFormat(d_, rc_) ((d_)->ft->getBinaryFormat((d_), (rc_)))
#define CMGetStringFormat(d_, rc_) ((d_)->ft->getStringFormat((d_), (rc_)))
#define CMIsInterval(d_, rc_) ((d_)->ft->isInterval((d_), (rc_)))

/* ---- CMPISelectExp -------------------------------------------------- */

#define CMEvaluateSelExp(s_, i_, rc_) ((s_)->ft->evaluate((s_), (i_), (rc_)))
#define CMEvaluateSelExpUsingAccessor(s_, a_, p_, rc_)                       \
    ((s_)->ft->evaluateUsingAccessor((s_), (a_), (p_), (rc_)))
#define CMGetSelExpString(s_, rc_) ((s_)->ft->getString((s_), (rc_)))
#define CMGetDoc(s_, rc_) ((s_)->ft->getDOC((s_), (rc_)))
#define CMGetCod(s_, rc_) ((s_)->ft->getCOD((s_), (rc_)))

/* ---- broker up-calls (CMPIBrokerFT) --------------------------------- */

#define CBGetClassification(mb_) ((mb_)->bft->brokerCapabilities)
#define CBBrokerVersion(mb_) ((mb_)->bft->brokerVersion)
#define CBBrokerName(mb_) ((mb_)->bft->brokerName)
#define CBPrepareAttachThread(mb_, c_) ((mb_)->bft->prepareAttachThread((mb_), (c_)))
#define CBAttachThread(mb_, c_) ((mb_)->bft->attachThread((mb_), (c_)))
#define CBDetachThread(mb_, c_) ((mb_)->bft->detachThread((mb_), (c_)))
#define CBDeliverIndication(mb_, c_, ns_, i_)                                \
    ((mb_)->bft->deliverIndication((mb_), (c_), (ns_), (i_)))
#define CBEnumInstanceNames(mb_, c_, op_, rc_)                               \
    ((mb_)->bft->enumerateInstanceNames((mb_), (c_), (op_), (rc_)))
#define CBEnumInstances(mb_, c_, op_, p_, rc_)                               \
    ((mb_)->bft->enumerateInstances((mb_), (c_), (op_), (p_), (rc_)))
#define CBGetInstance(mb_, c_, op_, p_, rc_)                                 \
    ((mb_)->bft->getInstance((mb_), (c_), (op_), (p_), (rc_)))
#define CBCreateInstance(mb_, c_, op_, i_, rc_)                              \
    ((mb_)->bft->createInstance((mb_), (c_), (op_), (i_), (rc_)))
#define CBModifyInstance(mb_, c_, op_, i_, p_)                               \
    ((mb_)->bft->modifyInstance((mb_), (c_), (op_), (i_), (p_)))
#define CBDeleteInstance(mb_, c_, op_) ((mb_)->bft->deleteInstance((mb_), (c_), (op_)))
#define CBExecQuery(mb_, c_, op_, q_, l_, rc_)                               \
    ((mb_)->bft->execQuery((mb_), (c_), (op_), (q_), (l_), (rc_)))
#define CBAssociators(mb_, c_, op_, ac_, rc2_, r_, rr_, p_, rc_)             \
    ((mb_)->bft->associators((mb_), (c_), (op_), (ac_), (rc2_), (r_), (rr_), (p_), (rc_)))
#define CBAssociatorNames(mb_, c_, op_, ac_, rc2_, r_, rr_, rc_)             \
    ((mb_)->bft->associatorNames((mb_), (c_), (op_), (ac_), (rc2_), (r_), (rr_), (rc_)))
#define CBReferences(mb_, c_, op_, rc2_, r_, p_, rc_)                        \
    ((mb_)->bft->references((mb_), (c_), (op_), (rc2_), (r_), (p_), (rc_)))
#define CBReferenceNames(mb_, c_, op_, rc2_, r_, rc_)                        \
    ((mb_)->bft->referenceNames((mb_), (c_), (op_), (rc2_), (r_), (rc_)))
#define CBInvokeMethod(mb_, c_, op_, m_, in_, out_, rc_)                     \
    ((mb_)->bft->invokeMethod((mb_), (c_), (op_), (m_), (in_), (out_), (rc_)))
#define CBSetProperty(mb_, c_, op_, n_, v_, t_)                              \
    ((mb_)->bft->setProperty((mb_), (c_), (op_), (n_), (CMPIValue *)(v_), (t_)))
#define CBGetProperty(mb_, c_, op_, n_, rc_)                                 \
    ((mb_)->bft->getProperty((mb_), (c_), (op_), (n_), (rc_)))

#endif /* CMPIMACS_H */
