// The job file and the preference file store beneath it, without a provider:
// the six-line records, the age limit, what a reader makes of odd content,
// and the file's safety in a directory that everybody may write. Runs under
// tests/isolate.sh, so /var/tmp is private.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "support/Vexlan_NIC_PrefFile.h"
#include "test_files.h"
#include "update/ConcreteJob.h"
#include "update/JobPersistence.h"

namespace {

const char kJobFile[] = "/var/tmp/vxln_cna_provider.config";

using support_test::readFile;

void writeFile(const char* path, const std::string& text, mode_t mode = 0600)
{
    unlink(path);
    const int fd = open(path, O_WRONLY | O_CREAT | O_EXCL, mode);
    ASSERT_GE(fd, 0) << path;
    ASSERT_EQ(write(fd, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    fchmod(fd, mode);
    close(fd);
}

Concrete_Job job(unsigned id, const std::string& description, unsigned long long time, unsigned status,
                 unsigned result)
{
    Concrete_Job j;
    j.id = id;
    j.description = description;
    j.timeOfLastStateChange = time;
    j.status = status;
    j.result = result;
    return j;
}

std::string record(unsigned id, const std::string& desc, unsigned long long time, unsigned status, unsigned result)
{
    const std::string k = std::to_string(id) + "#";
    return k + "ID=" + std::to_string(id) + "\n" + k + "DESC=" + desc + "\n" + k + "TOLSC=" + std::to_string(time) +
           "\n" + k + "STATUS=" + std::to_string(status) + "\n" + k + "RESULT=" + std::to_string(result) + "\n" + k +
           "END=1\n";
}

class JobFile : public ::testing::Test {
protected:
    void SetUp() override
    {
        unlink(kJobFile);
        unlink("/var/tmp/victim");
    }
};

constexpr unsigned long long kNow = 1800000000000000ULL;  // microseconds

TEST_F(JobFile, JobsAreWrittenAsSixLineRecordsInAscendingIdAndReadBack)
{
    ConcreteJobMap jobs;
    jobs[700] = job(700, "SERIAL2 NIC flash update with /img/b at Mon Jan  5 10:00:00 2026.", kNow - 5, 2, 0);
    jobs[12] = job(12, "SERIAL1 FC flash update with /img/a at Mon Jan  5 09:00:00 2026.", kNow - 9, 1, 17);
    SerializeJobsToPrefFile(jobs);
    EXPECT_EQ(readFile(kJobFile),
              record(12, jobs[12].description, kNow - 9, 1, 17) + record(700, jobs[700].description, kNow - 5, 2, 0));
    struct stat st {};
    ASSERT_EQ(stat(kJobFile, &st), 0);
    EXPECT_EQ(st.st_mode & 0777, 0600u);

    ConcreteJobMap back;
    DeserializeJobsFromPrefFile(back, kNow);
    ASSERT_EQ(back.size(), 2u);
    EXPECT_EQ(back[12].description, jobs[12].description);
    EXPECT_EQ(back[12].status, 1u);
    EXPECT_EQ(back[12].result, 17u);
    EXPECT_EQ(back[700].timeOfLastStateChange, kNow - 5);
    EXPECT_EQ(JobStateOfStatus(back[700].status), 7);

    // A shorter set of jobs leaves no tail of the longer file behind.
    jobs.erase(700);
    SerializeJobsToPrefFile(jobs);
    EXPECT_EQ(readFile(kJobFile), record(12, jobs[12].description, kNow - 9, 1, 17));
}

TEST_F(JobFile, AJobIsDroppedAtExactlyOneHourAndWhenTheClockWentBack)
{
    writeFile(kJobFile, record(1, "kept", kNow - kJobMaxAgeMicroseconds + 1, 0, 0) +
                            record(2, "an hour old", kNow - kJobMaxAgeMicroseconds, 2, 0) +
                            record(3, "from the future", kNow + 10, 2, 0));
    ConcreteJobMap jobs;
    DeserializeJobsFromPrefFile(jobs, kNow);
    ASSERT_EQ(jobs.size(), 1u);
    EXPECT_EQ(jobs.begin()->first, 1u);
    // Restored while running: shown as running, though no worker is behind it.
    EXPECT_EQ(JobStateOfStatus(jobs[1].status), 4);
}

TEST_F(JobFile, OddContentIsReadAsFarAsItScans)
{
    // A description with "=" comes back cut there; the records behind it are
    // read as usual. A record without a line takes the field of the one
    // before; a second record with the same id is refused; a value that
    // begins with '#' stops all reading.
    writeFile(kJobFile, "\n   \t\n" + record(5, "a=b", kNow - 1, 2, 0) +
                            "6#ID=6\n6#TOLSC=" + std::to_string(kNow - 2) + "\n6#STATUS=1\n6#END=1\n" +
                            record(5, "second five", kNow - 1, 0, 0) + "7#ID=7\n7#DESC=#stop\n" +
                            record(8, "never read", kNow - 1, 0, 0));
    ConcreteJobMap jobs;
    DeserializeJobsFromPrefFile(jobs, kNow);
    ASSERT_EQ(jobs.size(), 2u);
    EXPECT_EQ(jobs[5].description, "a");
    EXPECT_EQ(jobs[5].status, 2u);
    EXPECT_EQ(jobs[6].description, "a");
    EXPECT_EQ(jobs[6].status, 1u);
    EXPECT_EQ(jobs.count(8), 0u);

    // No file: no job.
    unlink(kJobFile);
    DeserializeJobsFromPrefFile(jobs, kNow);
    EXPECT_TRUE(jobs.empty());
}

TEST_F(JobFile, TheStoreReplacesEveryLineWithTheKeyAndAppendsOtherwise)
{
    // Setting needs an existing file; the write-mode open creates it empty.
    EXPECT_EQ(PrefSetProperty(nullptr, reinterpret_cast<const unsigned char*>("k"),
                              reinterpret_cast<const unsigned char*>("v")),
              -1);
    EXPECT_NE(access(kJobFile, F_OK), 0);
    PrefClosePreferenceFile(PrefOpenPreferenceFileWriteMode(kPrefFileName));
    auto set = [](const char* k, const char* v) {
        return PrefSetProperty(nullptr, reinterpret_cast<const unsigned char*>(k),
                               reinterpret_cast<const unsigned char*>(v));
    };
    EXPECT_EQ(set("alpha", "1"), 0);
    EXPECT_EQ(readFile(kJobFile), "alpha=1\n");
    EXPECT_EQ(set("beta", "alpha"), 0);
    EXPECT_EQ(set("alpha", "a much longer value"), 0);
    // The line whose value equals the key does not match (its last token keeps
    // the newline); the key's own line is replaced, with no old tail.
    EXPECT_EQ(readFile(kJobFile), "alpha=a much longer value\nbeta=alpha\n");
    EXPECT_EQ(set("gamma=x", "2"), 0);
    EXPECT_EQ(set("x", "3"), 0);  // a key equal to a token inside another line replaces that line
    EXPECT_EQ(readFile(kJobFile), "alpha=a much longer value\nbeta=alpha\nx=3\n");
    EXPECT_STREQ(PrefGetProperty(nullptr, reinterpret_cast<const unsigned char*>("beta")), "alpha");
    EXPECT_EQ(PrefGetProperty(nullptr, reinterpret_cast<const unsigned char*>("delta")), nullptr);
}

TEST_F(JobFile, ALinkAtThePathIsNeverFollowed)
{
    writeFile("/var/tmp/victim", "precious\n", 0644);
    ASSERT_EQ(symlink("/var/tmp/victim", kJobFile), 0);
    ConcreteJobMap jobs;
    jobs[1] = job(1, "d", kNow, 0, 0);
    SerializeJobsToPrefFile(jobs);
    EXPECT_EQ(readFile("/var/tmp/victim"), "precious\n");
    struct stat st {};
    ASSERT_EQ(lstat(kJobFile, &st), 0);
    EXPECT_TRUE(S_ISLNK(st.st_mode)) << "a link of somebody else's is left as it is";
    ConcreteJobMap back;
    DeserializeJobsFromPrefFile(back, kNow);
    EXPECT_TRUE(back.empty());
    EXPECT_EQ(PrefOpenPreferenceFile(kPrefFileName), nullptr);
}

TEST_F(JobFile, AFileOfAnotherUserOrWritableByOthersIsNeitherReadNorWritten)
{
    const std::string planted = record(9, "planted", kNow - 1, 2, 0);
    for (int variant = 0; variant < 2; ++variant) {
        writeFile(kJobFile, planted, variant == 0 ? 0600 : 0666);
        if (variant == 0) {
            ASSERT_EQ(chown(kJobFile, 65534, 65534), 0);
        }
        ConcreteJobMap back;
        DeserializeJobsFromPrefFile(back, kNow);
        EXPECT_TRUE(back.empty()) << variant;
        ConcreteJobMap jobs;
        jobs[1] = job(1, "mine", kNow, 0, 0);
        SerializeJobsToPrefFile(jobs);
        EXPECT_EQ(readFile(kJobFile), planted) << variant;
    }
}

// Writers replace the file whole: a reader that opens it at any moment sees
// complete records (as many END lines as ID lines) and never a mixture.
TEST_F(JobFile, AReaderNeverSeesAHalfWrittenFile)
{
    std::atomic<bool> stop{false};
    std::atomic<int> bad{0};
    std::thread reader([&] {
        while (!stop) {
            const std::string text = readFile(kJobFile);
            std::size_t ids = 0, ends = 0;
            for (std::size_t p = text.find("#ID="); p != std::string::npos; p = text.find("#ID=", p + 1))
                ++ids;
            for (std::size_t p = text.find("#END=1\n"); p != std::string::npos; p = text.find("#END=1\n", p + 1))
                ++ends;
            if (ids != ends || (!text.empty() && text.back() != '\n'))
                ++bad;
        }
    });
    for (int round = 0; round < 60; ++round) {
        ConcreteJobMap jobs;
        for (unsigned i = 0; i < static_cast<unsigned>(round % 7 + 1); ++i)
            jobs[i] = job(i, std::string(static_cast<std::size_t>(40 + round), 'x'), kNow, 0, 0);
        SerializeJobsToPrefFile(jobs);
    }
    stop = true;
    reader.join();
    EXPECT_EQ(bad.load(), 0);
}

TEST(JobIds, EveryIdTakenRefusesTheJobInsteadOfDrawingForEver)
{
    ConcreteJobMap jobs;
    for (unsigned id = 0; id < 0xFFFF; ++id)
        jobs[id] = Concrete_Job();
    EXPECT_EQ(PickNextJobIdIn(jobs), kNoJobId);
    jobs.erase(40000);
    EXPECT_EQ(PickNextJobIdIn(jobs), 40000u);
}

}  // namespace
