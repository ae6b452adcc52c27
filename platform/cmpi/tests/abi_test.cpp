// Binary layout of the CMPI 2.0 interface on x86_64 Linux (LP64).
//
// Providers and CIM servers built by other compilers agree on these numbers;
// a header that differs in a single offset loads and then calls the wrong
// function.  Every size, member offset, member size and constant is checked
// at compile time and listed again at run time so that ctest reports it.

#include <cmpift.h>
#include <cmpimacs.h>

#include <gtest/gtest.h>

#include <cstddef>
#include <string>

// X(tag, size)
#define CMPI_ABI_SIZES(X) \
    X(_CMPIArgs, 16) \
    X(_CMPIArgsFT, 56) \
    X(_CMPIArray, 16) \
    X(_CMPIArrayFT, 56) \
    X(_CMPIAssociationMI, 16) \
    X(_CMPIAssociationMIFT, 56) \
    X(_CMPIBroker, 40) \
    X(_CMPIBrokerEncFT, 168) \
    X(_CMPIBrokerExtFT, 168) \
    X(_CMPIBrokerFT, 160) \
    X(_CMPIBrokerMemFT, 120) \
    X(_CMPIContext, 16) \
    X(_CMPIContextFT, 56) \
    X(_CMPIData, 24) \
    X(_CMPIDateTime, 16) \
    X(_CMPIDateTimeFT, 48) \
    X(_CMPIEnumeration, 16) \
    X(_CMPIEnumerationFT, 48) \
    X(_CMPIError, 16) \
    X(_CMPIErrorFT, 216) \
    X(_CMPIIndicationMI, 16) \
    X(_CMPIIndicationMIFT, 72) \
    X(_CMPIInstance, 16) \
    X(_CMPIInstanceFT, 88) \
    X(_CMPIInstanceMI, 16) \
    X(_CMPIInstanceMIFT, 80) \
    X(_CMPIMethodMI, 16) \
    X(_CMPIMethodMIFT, 32) \
    X(_CMPIObjectPath, 16) \
    X(_CMPIObjectPathFT, 160) \
    X(_CMPIPredicate, 16) \
    X(_CMPIPredicateFT, 40) \
    X(_CMPIPropertyMI, 16) \
    X(_CMPIPropertyMIFT, 48) \
    X(_CMPIResult, 16) \
    X(_CMPIResultFT, 64) \
    X(_CMPISelectCond, 16) \
    X(_CMPISelectCondFT, 40) \
    X(_CMPISelectExp, 16) \
    X(_CMPISelectExpFT, 64) \
    X(_CMPIStatus, 16) \
    X(_CMPIString, 16) \
    X(_CMPIStringFT, 32) \
    X(_CMPISubCond, 16) \
    X(_CMPISubCondFT, 48) \
    X(_CMPIValuePtr, 16)

// X(tag, member, offset, size)
#define CMPI_ABI_MEMBERS(X) \
    X(_CMPIArgs, ft, 8, 8) \
    X(_CMPIArgs, hdl, 0, 8) \
    X(_CMPIArgsFT, addArg, 24, 8) \
    X(_CMPIArgsFT, clone, 16, 8) \
    X(_CMPIArgsFT, ftVersion, 0, 4) \
    X(_CMPIArgsFT, getArg, 32, 8) \
    X(_CMPIArgsFT, getArgAt, 40, 8) \
    X(_CMPIArgsFT, getArgCount, 48, 8) \
    X(_CMPIArgsFT, release, 8, 8) \
    X(_CMPIArray, ft, 8, 8) \
    X(_CMPIArray, hdl, 0, 8) \
    X(_CMPIArrayFT, clone, 16, 8) \
    X(_CMPIArrayFT, ftVersion, 0, 4) \
    X(_CMPIArrayFT, getElementAt, 40, 8) \
    X(_CMPIArrayFT, getSimpleType, 32, 8) \
    X(_CMPIArrayFT, getSize, 24, 8) \
    X(_CMPIArrayFT, release, 8, 8) \
    X(_CMPIArrayFT, setElementAt, 48, 8) \
    X(_CMPIAssociationMI, ft, 8, 8) \
    X(_CMPIAssociationMI, hdl, 0, 8) \
    X(_CMPIAssociationMIFT, associatorNames, 32, 8) \
    X(_CMPIAssociationMIFT, associators, 24, 8) \
    X(_CMPIAssociationMIFT, cleanup, 16, 8) \
    X(_CMPIAssociationMIFT, ftVersion, 0, 4) \
    X(_CMPIAssociationMIFT, miName, 8, 8) \
    X(_CMPIAssociationMIFT, miVersion, 4, 4) \
    X(_CMPIAssociationMIFT, referenceNames, 48, 8) \
    X(_CMPIAssociationMIFT, references, 40, 8) \
    X(_CMPIBroker, bft, 8, 8) \
    X(_CMPIBroker, eft, 16, 8) \
    X(_CMPIBroker, hdl, 0, 8) \
    X(_CMPIBroker, mft, 32, 8) \
    X(_CMPIBroker, xft, 24, 8) \
    X(_CMPIBrokerEncFT, classPathIsA, 80, 8) \
    X(_CMPIBrokerEncFT, closeMessageFile, 152, 8) \
    X(_CMPIBrokerEncFT, ftVersion, 0, 4) \
    X(_CMPIBrokerEncFT, getMessage, 112, 8) \
    X(_CMPIBrokerEncFT, getMessage2, 160, 8) \
    X(_CMPIBrokerEncFT, getType, 104, 8) \
    X(_CMPIBrokerEncFT, isOfType, 96, 8) \
    X(_CMPIBrokerEncFT, logMessage, 120, 8) \
    X(_CMPIBrokerEncFT, newArgs, 24, 8) \
    X(_CMPIBrokerEncFT, newArray, 40, 8) \
    X(_CMPIBrokerEncFT, newCMPIError, 136, 8) \
    X(_CMPIBrokerEncFT, newDateTime, 48, 8) \
    X(_CMPIBrokerEncFT, newDateTimeFromBinary, 56, 8) \
    X(_CMPIBrokerEncFT, newDateTimeFromChars, 64, 8) \
    X(_CMPIBrokerEncFT, newInstance, 8, 8) \
    X(_CMPIBrokerEncFT, newObjectPath, 16, 8) \
    X(_CMPIBrokerEncFT, newSelectExp, 72, 8) \
    X(_CMPIBrokerEncFT, newString, 32, 8) \
    X(_CMPIBrokerEncFT, openMessageFile, 144, 8) \
    X(_CMPIBrokerEncFT, toString, 88, 8) \
    X(_CMPIBrokerEncFT, trace, 128, 8) \
    X(_CMPIBrokerExtFT, cancelThread, 40, 8) \
    X(_CMPIBrokerExtFT, condWait, 144, 8) \
    X(_CMPIBrokerExtFT, createThreadKey, 64, 8) \
    X(_CMPIBrokerExtFT, destroyCondition, 136, 8) \
    X(_CMPIBrokerExtFT, destroyMutex, 104, 8) \
    X(_CMPIBrokerExtFT, destroyThreadKey, 72, 8) \
    X(_CMPIBrokerExtFT, exitThread, 32, 8) \
    X(_CMPIBrokerExtFT, ftVersion, 0, 4) \
    X(_CMPIBrokerExtFT, getThreadSpecific, 80, 8) \
    X(_CMPIBrokerExtFT, joinThread, 24, 8) \
    X(_CMPIBrokerExtFT, lockMutex, 112, 8) \
    X(_CMPIBrokerExtFT, newCondition, 128, 8) \
    X(_CMPIBrokerExtFT, newMutex, 96, 8) \
    X(_CMPIBrokerExtFT, newThread, 16, 8) \
    X(_CMPIBrokerExtFT, resolveFileName, 8, 8) \
    X(_CMPIBrokerExtFT, setThreadSpecific, 88, 8) \
    X(_CMPIBrokerExtFT, signalCondition, 160, 8) \
    X(_CMPIBrokerExtFT, threadOnce, 56, 8) \
    X(_CMPIBrokerExtFT, threadSleep, 48, 8) \
    X(_CMPIBrokerExtFT, timedCondWait, 152, 8) \
    X(_CMPIBrokerExtFT, unlockMutex, 120, 8) \
    X(_CMPIBrokerFT, associatorNames, 112, 8) \
    X(_CMPIBrokerFT, associators, 104, 8) \
    X(_CMPIBrokerFT, attachThread, 24, 8) \
    X(_CMPIBrokerFT, brokerCapabilities, 0, 4) \
    X(_CMPIBrokerFT, brokerName, 8, 8) \
    X(_CMPIBrokerFT, brokerVersion, 4, 4) \
    X(_CMPIBrokerFT, createInstance, 64, 8) \
    X(_CMPIBrokerFT, deleteInstance, 80, 8) \
    X(_CMPIBrokerFT, deliverIndication, 40, 8) \
    X(_CMPIBrokerFT, detachThread, 32, 8) \
    X(_CMPIBrokerFT, enumerateInstanceNames, 48, 8) \
    X(_CMPIBrokerFT, enumerateInstances, 96, 8) \
    X(_CMPIBrokerFT, execQuery, 88, 8) \
    X(_CMPIBrokerFT, getInstance, 56, 8) \
    X(_CMPIBrokerFT, getProperty, 152, 8) \
    X(_CMPIBrokerFT, invokeMethod, 136, 8) \
    X(_CMPIBrokerFT, modifyInstance, 72, 8) \
    X(_CMPIBrokerFT, prepareAttachThread, 16, 8) \
    X(_CMPIBrokerFT, referenceNames, 128, 8) \
    X(_CMPIBrokerFT, references, 120, 8) \
    X(_CMPIBrokerFT, setProperty, 144, 8) \
    X(_CMPIBrokerMemFT, cmpiCalloc, 32, 8) \
    X(_CMPIBrokerMemFT, cmpiFree, 56, 8) \
    X(_CMPIBrokerMemFT, cmpiMalloc, 24, 8) \
    X(_CMPIBrokerMemFT, cmpiRealloc, 40, 8) \
    X(_CMPIBrokerMemFT, cmpiStrDup, 48, 8) \
    X(_CMPIBrokerMemFT, freeArgs, 80, 8) \
    X(_CMPIBrokerMemFT, freeArray, 96, 8) \
    X(_CMPIBrokerMemFT, freeDateTime, 104, 8) \
    X(_CMPIBrokerMemFT, freeInstance, 64, 8) \
    X(_CMPIBrokerMemFT, freeObjectPath, 72, 8) \
    X(_CMPIBrokerMemFT, freeSelectExp, 112, 8) \
    X(_CMPIBrokerMemFT, freeString, 88, 8) \
    X(_CMPIBrokerMemFT, ftVersion, 0, 4) \
    X(_CMPIBrokerMemFT, mark, 8, 8) \
    X(_CMPIBrokerMemFT, release, 16, 8) \
    X(_CMPIContext, ft, 8, 8) \
    X(_CMPIContext, hdl, 0, 8) \
    X(_CMPIContextFT, addEntry, 48, 8) \
    X(_CMPIContextFT, clone, 16, 8) \
    X(_CMPIContextFT, ftVersion, 0, 4) \
    X(_CMPIContextFT, getEntry, 24, 8) \
    X(_CMPIContextFT, getEntryAt, 32, 8) \
    X(_CMPIContextFT, getEntryCount, 40, 8) \
    X(_CMPIContextFT, release, 8, 8) \
    X(_CMPIData, state, 2, 2) \
    X(_CMPIData, type, 0, 2) \
    X(_CMPIData, value, 8, 16) \
    X(_CMPIDateTime, ft, 8, 8) \
    X(_CMPIDateTime, hdl, 0, 8) \
    X(_CMPIDateTimeFT, clone, 16, 8) \
    X(_CMPIDateTimeFT, ftVersion, 0, 4) \
    X(_CMPIDateTimeFT, getBinaryFormat, 24, 8) \
    X(_CMPIDateTimeFT, getStringFormat, 32, 8) \
    X(_CMPIDateTimeFT, isInterval, 40, 8) \
    X(_CMPIDateTimeFT, release, 8, 8) \
    X(_CMPIEnumeration, ft, 8, 8) \
    X(_CMPIEnumeration, hdl, 0, 8) \
    X(_CMPIEnumerationFT, clone, 16, 8) \
    X(_CMPIEnumerationFT, ftVersion, 0, 4) \
    X(_CMPIEnumerationFT, getNext, 24, 8) \
    X(_CMPIEnumerationFT, hasNext, 32, 8) \
    X(_CMPIEnumerationFT, release, 8, 8) \
    X(_CMPIEnumerationFT, toArray, 40, 8) \
    X(_CMPIError, ft, 8, 8) \
    X(_CMPIError, hdl, 0, 8) \
    X(_CMPIErrorFT, clone, 16, 8) \
    X(_CMPIErrorFT, ftVersion, 0, 4) \
    X(_CMPIErrorFT, getCIMStatusCode, 120, 8) \
    X(_CMPIErrorFT, getCIMStatusCodeDescription, 128, 8) \
    X(_CMPIErrorFT, getErrorSource, 96, 8) \
    X(_CMPIErrorFT, getErrorSourceFormat, 104, 8) \
    X(_CMPIErrorFT, getErrorType, 24, 8) \
    X(_CMPIErrorFT, getMessage, 56, 8) \
    X(_CMPIErrorFT, getMessageArguments, 136, 8) \
    X(_CMPIErrorFT, getMessageID, 48, 8) \
    X(_CMPIErrorFT, getOtherErrorSourceFormat, 112, 8) \
    X(_CMPIErrorFT, getOtherErrorType, 32, 8) \
    X(_CMPIErrorFT, getOwningEntity, 40, 8) \
    X(_CMPIErrorFT, getPerceivedSeverity, 64, 8) \
    X(_CMPIErrorFT, getProbableCause, 72, 8) \
    X(_CMPIErrorFT, getProbableCauseDescription, 80, 8) \
    X(_CMPIErrorFT, getRecommendedActions, 88, 8) \
    X(_CMPIErrorFT, release, 8, 8) \
    X(_CMPIErrorFT, setCIMStatusCodeDescription, 200, 8) \
    X(_CMPIErrorFT, setErrorSource, 176, 8) \
    X(_CMPIErrorFT, setErrorSourceFormat, 184, 8) \
    X(_CMPIErrorFT, setErrorType, 144, 8) \
    X(_CMPIErrorFT, setMessageArguments, 208, 8) \
    X(_CMPIErrorFT, setOtherErrorSourceFormat, 192, 8) \
    X(_CMPIErrorFT, setOtherErrorType, 152, 8) \
    X(_CMPIErrorFT, setProbableCauseDescription, 160, 8) \
    X(_CMPIErrorFT, setRecommendedActions, 168, 8) \
    X(_CMPIIndicationMI, ft, 8, 8) \
    X(_CMPIIndicationMI, hdl, 0, 8) \
    X(_CMPIIndicationMIFT, activateFilter, 40, 8) \
    X(_CMPIIndicationMIFT, authorizeFilter, 24, 8) \
    X(_CMPIIndicationMIFT, cleanup, 16, 8) \
    X(_CMPIIndicationMIFT, deActivateFilter, 48, 8) \
    X(_CMPIIndicationMIFT, disableIndications, 64, 8) \
    X(_CMPIIndicationMIFT, enableIndications, 56, 8) \
    X(_CMPIIndicationMIFT, ftVersion, 0, 4) \
    X(_CMPIIndicationMIFT, miName, 8, 8) \
    X(_CMPIIndicationMIFT, miVersion, 4, 4) \
    X(_CMPIIndicationMIFT, mustPoll, 32, 8) \
    X(_CMPIInstance, ft, 8, 8) \
    X(_CMPIInstance, hdl, 0, 8) \
    X(_CMPIInstanceFT, clone, 16, 8) \
    X(_CMPIInstanceFT, ftVersion, 0, 4) \
    X(_CMPIInstanceFT, getObjectPath, 56, 8) \
    X(_CMPIInstanceFT, getProperty, 24, 8) \
    X(_CMPIInstanceFT, getPropertyAt, 32, 8) \
    X(_CMPIInstanceFT, getPropertyCount, 40, 8) \
    X(_CMPIInstanceFT, release, 8, 8) \
    X(_CMPIInstanceFT, setObjectPath, 72, 8) \
    X(_CMPIInstanceFT, setProperty, 48, 8) \
    X(_CMPIInstanceFT, setPropertyFilter, 64, 8) \
    X(_CMPIInstanceFT, setPropertyWithOrigin, 80, 8) \
    X(_CMPIInstanceMI, ft, 8, 8) \
    X(_CMPIInstanceMI, hdl, 0, 8) \
    X(_CMPIInstanceMIFT, cleanup, 16, 8) \
    X(_CMPIInstanceMIFT, createInstance, 48, 8) \
    X(_CMPIInstanceMIFT, deleteInstance, 64, 8) \
    X(_CMPIInstanceMIFT, enumerateInstanceNames, 24, 8) \
    X(_CMPIInstanceMIFT, enumerateInstances, 32, 8) \
    X(_CMPIInstanceMIFT, execQuery, 72, 8) \
    X(_CMPIInstanceMIFT, ftVersion, 0, 4) \
    X(_CMPIInstanceMIFT, getInstance, 40, 8) \
    X(_CMPIInstanceMIFT, miName, 8, 8) \
    X(_CMPIInstanceMIFT, miVersion, 4, 4) \
    X(_CMPIInstanceMIFT, modifyInstance, 56, 8) \
    X(_CMPIMethodMI, ft, 8, 8) \
    X(_CMPIMethodMI, hdl, 0, 8) \
    X(_CMPIMethodMIFT, cleanup, 16, 8) \
    X(_CMPIMethodMIFT, ftVersion, 0, 4) \
    X(_CMPIMethodMIFT, invokeMethod, 24, 8) \
    X(_CMPIMethodMIFT, miName, 8, 8) \
    X(_CMPIMethodMIFT, miVersion, 4, 4) \
    X(_CMPIObjectPath, ft, 8, 8) \
    X(_CMPIObjectPath, hdl, 0, 8) \
    X(_CMPIObjectPathFT, addKey, 72, 8) \
    X(_CMPIObjectPathFT, clone, 16, 8) \
    X(_CMPIObjectPathFT, ftVersion, 0, 4) \
    X(_CMPIObjectPathFT, getClassName, 64, 8) \
    X(_CMPIObjectPathFT, getClassQualifier, 120, 8) \
    X(_CMPIObjectPathFT, getHostname, 48, 8) \
    X(_CMPIObjectPathFT, getKey, 80, 8) \
    X(_CMPIObjectPathFT, getKeyAt, 88, 8) \
    X(_CMPIObjectPathFT, getKeyCount, 96, 8) \
    X(_CMPIObjectPathFT, getMethodQualifier, 136, 8) \
    X(_CMPIObjectPathFT, getNameSpace, 32, 8) \
    X(_CMPIObjectPathFT, getParameterQualifier, 144, 8) \
    X(_CMPIObjectPathFT, getPropertyQualifier, 128, 8) \
    X(_CMPIObjectPathFT, release, 8, 8) \
    X(_CMPIObjectPathFT, setClassName, 56, 8) \
    X(_CMPIObjectPathFT, setHostAndNameSpaceFromObjectPath, 112, 8) \
    X(_CMPIObjectPathFT, setHostname, 40, 8) \
    X(_CMPIObjectPathFT, setNameSpace, 24, 8) \
    X(_CMPIObjectPathFT, setNameSpaceFromObjectPath, 104, 8) \
    X(_CMPIObjectPathFT, toString, 152, 8) \
    X(_CMPIPredicate, ft, 8, 8) \
    X(_CMPIPredicate, hdl, 0, 8) \
    X(_CMPIPredicateFT, clone, 16, 8) \
    X(_CMPIPredicateFT, evaluateUsingAccessor, 32, 8) \
    X(_CMPIPredicateFT, ftVersion, 0, 4) \
    X(_CMPIPredicateFT, getData, 24, 8) \
    X(_CMPIPredicateFT, release, 8, 8) \
    X(_CMPIPropertyMI, ft, 8, 8) \
    X(_CMPIPropertyMI, hdl, 0, 8) \
    X(_CMPIPropertyMIFT, cleanup, 16, 8) \
    X(_CMPIPropertyMIFT, ftVersion, 0, 4) \
    X(_CMPIPropertyMIFT, getProperty, 32, 8) \
    X(_CMPIPropertyMIFT, miName, 8, 8) \
    X(_CMPIPropertyMIFT, miVersion, 4, 4) \
    X(_CMPIPropertyMIFT, setProperty, 24, 8) \
    X(_CMPIPropertyMIFT, setPropertyWithOrigin, 40, 8) \
    X(_CMPIResult, ft, 8, 8) \
    X(_CMPIResult, hdl, 0, 8) \
    X(_CMPIResultFT, clone, 16, 8) \
    X(_CMPIResultFT, ftVersion, 0, 4) \
    X(_CMPIResultFT, release, 8, 8) \
    X(_CMPIResultFT, returnData, 24, 8) \
    X(_CMPIResultFT, returnDone, 48, 8) \
    X(_CMPIResultFT, returnError, 56, 8) \
    X(_CMPIResultFT, returnInstance, 32, 8) \
    X(_CMPIResultFT, returnObjectPath, 40, 8) \
    X(_CMPISelectCond, ft, 8, 8) \
    X(_CMPISelectCond, hdl, 0, 8) \
    X(_CMPISelectCondFT, clone, 16, 8) \
    X(_CMPISelectCondFT, ftVersion, 0, 4) \
    X(_CMPISelectCondFT, getCountAndType, 24, 8) \
    X(_CMPISelectCondFT, getSubCondAt, 32, 8) \
    X(_CMPISelectCondFT, release, 8, 8) \
    X(_CMPISelectExp, ft, 8, 8) \
    X(_CMPISelectExp, hdl, 0, 8) \
    X(_CMPISelectExpFT, clone, 16, 8) \
    X(_CMPISelectExpFT, evaluate, 24, 8) \
    X(_CMPISelectExpFT, evaluateUsingAccessor, 56, 8) \
    X(_CMPISelectExpFT, ftVersion, 0, 4) \
    X(_CMPISelectExpFT, getCOD, 48, 8) \
    X(_CMPISelectExpFT, getDOC, 40, 8) \
    X(_CMPISelectExpFT, getString, 32, 8) \
    X(_CMPISelectExpFT, release, 8, 8) \
    X(_CMPIStatus, msg, 8, 8) \
    X(_CMPIStatus, rc, 0, 4) \
    X(_CMPIString, ft, 8, 8) \
    X(_CMPIString, hdl, 0, 8) \
    X(_CMPIStringFT, clone, 16, 8) \
    X(_CMPIStringFT, ftVersion, 0, 4) \
    X(_CMPIStringFT, getCharPtr, 24, 8) \
    X(_CMPIStringFT, release, 8, 8) \
    X(_CMPISubCond, ft, 8, 8) \
    X(_CMPISubCond, hdl, 0, 8) \
    X(_CMPISubCondFT, clone, 16, 8) \
    X(_CMPISubCondFT, ftVersion, 0, 4) \
    X(_CMPISubCondFT, getCount, 24, 8) \
    X(_CMPISubCondFT, getPredicate, 40, 8) \
    X(_CMPISubCondFT, getPredicateAt, 32, 8) \
    X(_CMPISubCondFT, release, 8, 8) \
    X(_CMPIValue, Byte, 0, 1) \
    X(_CMPIValue, Double, 0, 8) \
    X(_CMPIValue, Enum, 0, 8) \
    X(_CMPIValue, Float, 0, 4) \
    X(_CMPIValue, Int, 0, 4) \
    X(_CMPIValue, Long, 0, 8) \
    X(_CMPIValue, Short, 0, 2) \
    X(_CMPIValue, args, 0, 8) \
    X(_CMPIValue, array, 0, 8) \
    X(_CMPIValue, boolean, 0, 1) \
    X(_CMPIValue, char16, 0, 2) \
    X(_CMPIValue, chars, 0, 8) \
    X(_CMPIValue, dataPtr, 0, 16) \
    X(_CMPIValue, dateTime, 0, 8) \
    X(_CMPIValue, filter, 0, 8) \
    X(_CMPIValue, inst, 0, 8) \
    X(_CMPIValue, real32, 0, 4) \
    X(_CMPIValue, real64, 0, 8) \
    X(_CMPIValue, ref, 0, 8) \
    X(_CMPIValue, sint16, 0, 2) \
    X(_CMPIValue, sint32, 0, 4) \
    X(_CMPIValue, sint64, 0, 8) \
    X(_CMPIValue, sint8, 0, 1) \
    X(_CMPIValue, string, 0, 8) \
    X(_CMPIValue, uint16, 0, 2) \
    X(_CMPIValue, uint32, 0, 4) \
    X(_CMPIValue, uint64, 0, 8) \
    X(_CMPIValue, uint8, 0, 1) \
    X(_CMPIValuePtr, length, 8, 4) \
    X(_CMPIValuePtr, ptr, 0, 8)

// X(name, value). The enumerations of CMPIError (type, severity, probable
// cause, source format) are left out: nothing here creates or reads an error
// object, and each of their values stands spelt out in cmpidt.h.
#define CMPI_ABI_CONSTANTS(X) \
    X(CMPICurrentVersion, 200) \
    X(CMPIVersion100, 100) \
    X(CMPIVersion200, 200) \
    X(CMPI_ARRAY, 8192) \
    X(CMPI_Byte, 192) \
    X(CMPI_ByteA, 8384) \
    X(CMPI_COND_COD, 1) \
    X(CMPI_COND_DOC, 0) \
    X(CMPI_DEV_DEBUG, 4) \
    X(CMPI_Double, 12) \
    X(CMPI_DoubleA, 8204) \
    X(CMPI_ENC, 4096) \
    X(CMPI_ENCA, 12288) \
    X(CMPI_FLAG_DeepInheritance, 2) \
    X(CMPI_FLAG_IncludeClassOrigin, 8) \
    X(CMPI_FLAG_IncludeQualifiers, 4) \
    X(CMPI_FLAG_LocalOnly, 1) \
    X(CMPI_Float, 8) \
    X(CMPI_FloatA, 8200) \
    X(CMPI_INTEGER, 192) \
    X(CMPI_INTEGERA, 8384) \
    X(CMPI_Int, 224) \
    X(CMPI_IntA, 8416) \
    X(CMPI_LEV_INFO, 1) \
    X(CMPI_LEV_VERBOSE, 3) \
    X(CMPI_LEV_WARNING, 2) \
    X(CMPI_Long, 240) \
    X(CMPI_LongA, 8432) \
    X(CMPI_MB_AssociationTraversal, 9) \
    X(CMPI_MB_BasicQualifierSupport, 71) \
    X(CMPI_MB_BasicRead, 1) \
    X(CMPI_MB_BasicWrite, 3) \
    X(CMPI_MB_Class_0, 1) \
    X(CMPI_MB_Class_1, 3) \
    X(CMPI_MB_Class_2, 7) \
    X(CMPI_MB_Indications, 129) \
    X(CMPI_MB_InstanceManipulation, 7) \
    X(CMPI_MB_OSEncapsulationSupport, 256) \
    X(CMPI_MB_QueryExecution, 17) \
    X(CMPI_MB_QueryNormalization, 49) \
    X(CMPI_MB_Supports_Extended_Error, 32768) \
    X(CMPI_MB_Supports_IndicationMI, 512) \
    X(CMPI_MB_Supports_IndicationPolling, 1024) \
    X(CMPI_MB_Supports_MemEnhancements, 16384) \
    X(CMPI_MB_Supports_PropertyMI, 256) \
    X(CMPI_MB_Supports_Qualifier, 4096) \
    X(CMPI_MB_Supports_QueryNormalization, 2048) \
    X(CMPI_MB_Supports_Schema, 12288) \
    X(CMPI_PredOp_And, 13) \
    X(CMPI_PredOp_Equals, 1) \
    X(CMPI_PredOp_GreaterThan, 5) \
    X(CMPI_PredOp_GreaterThanOrEquals, 4) \
    X(CMPI_PredOp_Isa, 7) \
    X(CMPI_PredOp_LessThan, 3) \
    X(CMPI_PredOp_LessThanOrEquals, 6) \
    X(CMPI_PredOp_Like, 9) \
    X(CMPI_PredOp_NotEquals, 2) \
    X(CMPI_PredOp_NotIsa, 8) \
    X(CMPI_PredOp_NotLike, 10) \
    X(CMPI_PredOp_Not_Null, 11) \
    X(CMPI_PredOp_Null, 12) \
    X(CMPI_PredOp_Or, 14) \
    X(CMPI_RC_DO_NOT_UNLOAD, 50) \
    X(CMPI_RC_ERROR, 200) \
    X(CMPI_RC_ERROR_SYSTEM, 100) \
    X(CMPI_RC_ERR_ACCESS_DENIED, 2) \
    X(CMPI_RC_ERR_ALREADY_EXISTS, 11) \
    X(CMPI_RC_ERR_CLASS_HAS_CHILDREN, 8) \
    X(CMPI_RC_ERR_CLASS_HAS_INSTANCES, 9) \
    X(CMPI_RC_ERR_FAILED, 1) \
    X(CMPI_RC_ERR_INVALID_CLASS, 5) \
    X(CMPI_RC_ERR_INVALID_DATA_TYPE, 61) \
    X(CMPI_RC_ERR_INVALID_HANDLE, 60) \
    X(CMPI_RC_ERR_INVALID_NAMESPACE, 3) \
    X(CMPI_RC_ERR_INVALID_PARAMETER, 4) \
    X(CMPI_RC_ERR_INVALID_QUERY, 15) \
    X(CMPI_RC_ERR_INVALID_SUPERCLASS, 10) \
    X(CMPI_RC_ERR_METHOD_NOT_AVAILABLE, 16) \
    X(CMPI_RC_ERR_METHOD_NOT_FOUND, 17) \
    X(CMPI_RC_ERR_NOT_FOUND, 6) \
    X(CMPI_RC_ERR_NOT_SUPPORTED, 7) \
    X(CMPI_RC_ERR_NO_SUCH_PROPERTY, 12) \
    X(CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED, 14) \
    X(CMPI_RC_ERR_TYPE_MISMATCH, 13) \
    X(CMPI_RC_NEVER_UNLOAD, 51) \
    X(CMPI_RC_OK, 0) \
    X(CMPI_REAL, 8) \
    X(CMPI_REALA, 8200) \
    X(CMPI_SEV_ERROR, 1) \
    X(CMPI_SEV_INFO, 2) \
    X(CMPI_SEV_WARNING, 3) \
    X(CMPI_SIMPLE, 2) \
    X(CMPI_SIMPLEA, 8194) \
    X(CMPI_SINT, 192) \
    X(CMPI_SINTA, 8384) \
    X(CMPI_Short, 208) \
    X(CMPI_ShortA, 8400) \
    X(CMPI_UINT, 128) \
    X(CMPI_UINTA, 8320) \
    X(CMPI_args, 4608) \
    X(CMPI_badValue, 32768) \
    X(CMPI_boolean, 2) \
    X(CMPI_booleanA, 8194) \
    X(CMPI_booleanString, 5634) \
    X(CMPI_char16, 3) \
    X(CMPI_char16A, 8195) \
    X(CMPI_charString, 5632) \
    X(CMPI_chars, 5888) \
    X(CMPI_charsA, 14080) \
    X(CMPI_charsptr, 6656) \
    X(CMPI_charsptrA, 14848) \
    X(CMPI_class, 4864) \
    X(CMPI_classNameString, 5888) \
    X(CMPI_dateTime, 6144) \
    X(CMPI_dateTimeA, 14336) \
    X(CMPI_dateTimeString, 7680) \
    X(CMPI_enumeration, 5376) \
    X(CMPI_filter, 5120) \
    X(CMPI_goodValue, 0) \
    X(CMPI_instance, 4096) \
    X(CMPI_instanceA, 12288) \
    X(CMPI_integerString, 5872) \
    X(CMPI_keyBoolean, 2) \
    X(CMPI_keyInteger, 240) \
    X(CMPI_keyRef, 4352) \
    X(CMPI_keyString, 5632) \
    X(CMPI_keyValue, 512) \
    X(CMPI_nameString, 7680) \
    X(CMPI_notFound, 1024) \
    X(CMPI_null, 0) \
    X(CMPI_nullValue, 256) \
    X(CMPI_numericString, 5884) \
    X(CMPI_ptr, 6400) \
    X(CMPI_real32, 8) \
    X(CMPI_real32A, 8200) \
    X(CMPI_real64, 12) \
    X(CMPI_real64A, 8204) \
    X(CMPI_realString, 5644) \
    X(CMPI_ref, 4352) \
    X(CMPI_refA, 12544) \
    X(CMPI_sint16, 208) \
    X(CMPI_sint16A, 8400) \
    X(CMPI_sint32, 224) \
    X(CMPI_sint32A, 8416) \
    X(CMPI_sint64, 240) \
    X(CMPI_sint64A, 8432) \
    X(CMPI_sint8, 192) \
    X(CMPI_sint8A, 8384) \
    X(CMPI_string, 5632) \
    X(CMPI_stringA, 13824) \
    X(CMPI_uint16, 144) \
    X(CMPI_uint16A, 8336) \
    X(CMPI_uint32, 160) \
    X(CMPI_uint32A, 8352) \
    X(CMPI_uint64, 176) \
    X(CMPI_uint64A, 8368) \
    X(CMPI_uint8, 128) \
    X(CMPI_uint8A, 8320)

// In C++ every struct or union tag is itself a type name.
#define CMPI_CHECK_SIZE(tag, size) \
    static_assert(sizeof(tag) == (size), "sizeof " #tag);
#define CMPI_CHECK_MEMBER(tag, member, offset, size)                         \
    static_assert(offsetof(tag, member) == (offset), "offset " #tag "." #member); \
    static_assert(sizeof(static_cast<tag *>(nullptr)->member) == (size),    \
                  "size " #tag "." #member);
#define CMPI_CHECK_CONSTANT(name, value) \
    static_assert(static_cast<long long>(name) == (value), "value " #name);

CMPI_ABI_SIZES(CMPI_CHECK_SIZE)
CMPI_ABI_MEMBERS(CMPI_CHECK_MEMBER)
CMPI_ABI_CONSTANTS(CMPI_CHECK_CONSTANT)

namespace {

struct Row {
    std::string what;
    long long actual;
    long long expected;
};

#define CMPI_ROW_SIZE(tag, size) {"sizeof " #tag, static_cast<long long>(sizeof(tag)), (size)},
#define CMPI_ROW_MEMBER(tag, member, offset, size)                                   \
    {"offset " #tag "." #member, static_cast<long long>(offsetof(tag, member)), (offset)}, \
    {"size " #tag "." #member,                                                       \
     static_cast<long long>(sizeof(static_cast<tag *>(nullptr)->member)), (size)},
#define CMPI_ROW_CONSTANT(name, value) {#name, static_cast<long long>(name), (value)},

void expectRows(const Row *rows, size_t n)
{
    for (size_t i = 0; i < n; ++i)
        EXPECT_EQ(rows[i].actual, rows[i].expected) << rows[i].what;
}

} // namespace

TEST(CmpiAbi, StructSizes)
{
    static const Row rows[] = {CMPI_ABI_SIZES(CMPI_ROW_SIZE)};
    EXPECT_EQ(sizeof(rows) / sizeof(rows[0]), 46u);
    expectRows(rows, sizeof(rows) / sizeof(rows[0]));
}

TEST(CmpiAbi, MemberOffsetsAndSizes)
{
    static const Row rows[] = {CMPI_ABI_MEMBERS(CMPI_ROW_MEMBER)};
    EXPECT_EQ(sizeof(rows) / sizeof(rows[0]), 2u * 324u);
    expectRows(rows, sizeof(rows) / sizeof(rows[0]));
}

TEST(CmpiAbi, ConstantValues)
{
    static const Row rows[] = {CMPI_ABI_CONSTANTS(CMPI_ROW_CONSTANT)};
    EXPECT_EQ(sizeof(rows) / sizeof(rows[0]), 158u);
    expectRows(rows, sizeof(rows) / sizeof(rows[0]));
}

// The headers must also compile as C: servers and many providers are C.
extern "C" int cmpi_abi_c_sizes(int which);

TEST(CmpiAbi, CLanguageViewAgrees)
{
    EXPECT_EQ(cmpi_abi_c_sizes(0), static_cast<int>(sizeof(CMPIData)));
    EXPECT_EQ(cmpi_abi_c_sizes(1), static_cast<int>(sizeof(CMPIBrokerEncFT)));
    EXPECT_EQ(cmpi_abi_c_sizes(2), static_cast<int>(sizeof(CMPIInstanceMIFT)));
    EXPECT_EQ(cmpi_abi_c_sizes(3), static_cast<int>(offsetof(CMPIIndicationMIFT, disableIndications)));
    EXPECT_EQ(cmpi_abi_c_sizes(4), static_cast<int>(sizeof(CMPIBroker)));
}
