// Job persistence: after every change the whole job map goes to the job file
// (six `key=value` lines per job, see the preference file store), and the
// polling thread reads it back at its start and at every rebuild, keeping the
// jobs whose last change is less than an hour old.
#ifndef VEXLAN_UPDATE_JOBPERSISTENCE_H
#define VEXLAN_UPDATE_JOBPERSISTENCE_H

#include "update/ConcreteJob.h"

// The running provider's map to the file; nothing without a provider.
void SerializeConcreteJobToPrefFile();
// The file back into the running provider's map (the name says "To" although
// it reads); nothing without a provider.
void DeserializeConcreteJobToPrefFile();
// The six lines of one job, each by PrefSetProperty.
void SaveConcreteJobInfo(Concrete_Job job);

// The same for a map of the caller's, under jobStoreLock(). `now` is the
// present time in microseconds (JobTimeNow()).
void SerializeJobsToPrefFile(const ConcreteJobMap& jobs);
void DeserializeJobsFromPrefFile(ConcreteJobMap& jobs, unsigned long long now);

// Reads at most `size` bytes of the file into `buffer`; the number read, or 0
// when the file can't be opened or the read comes short.
unsigned long long GetDataFromFile(const char* path, unsigned long long size, unsigned char* buffer);

// Jobs older than this are dropped when the file is read.
constexpr unsigned long long kJobMaxAgeMicroseconds = 3600000000ULL;

#endif
