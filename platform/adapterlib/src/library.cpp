// libzorap_cna_provider: the ZORAP_* interface and the control functions,
// delivered from an adapter description.
//
// State: one Library object holds the description in use (its source, the
// parsed host model with its live state), the main and backup trees, the
// blocks handed out to callers, the alarm thread and the flash steering.
// Locks, never nested except where noted:
//   examineMu - one look at the description file at a time; taken before mu
//   mu       - source, model, trees, configuration flag, allocations
//   faultMu  - injected failures
//   alarmMu  - alarm queue, callback, alarm thread
//   flashMu  - next-flash setting, flash epoch
// No lock is held while a caller's callback runs or while a flash write waits.
// mu may be held while alarmMu is taken to queue an alarm, never the reverse.
//
// A rewritten description file is looked at by ZORAP_DidConfigChange, by the
// alarm thread once a second, and by zorap_sim_check_description: a change of
// live state only is taken at once (livestate.h), any other is noted as a
// configuration change for the next backup build.
//
// A host read from sysfs (sysfs.h) is looked at afresh: the live calls read
// the live state of their function, the alarm thread the FC port states once
// a second, ZORAP_DidConfigChange the whole tree, and every backup build
// reads it again. Its flash is never written.
#include <dlfcn.h>
#include <sys/stat.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstring>
#include <list>
#include <map>
#include <mutex>
#include <new>
#include <set>
#include <thread>
#include <unordered_map>
#include <unordered_set>

#include "bounded_file.h"
#include "encode.h"
#include "livestate.h"
#include "model.h"
#include "sysfs.h"
#include "sysfs_files.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

#define ZORAP_EXPORT extern "C" __attribute__((visibility("default")))

namespace zorap_sim {
namespace {

constexpr const char* kFunctionNames[ZORAP_FN_COUNT] = {
    "ZORAP_Initialize",
    "ZORAP_Uninitialize",
    "ZORAP_GetAdapterList",
    "ZORAP_DidConfigChange",
    "ZORAP_ResetConfigChange",
    "ZORAP_UpdateBackupAdapterList",
    "ZORAP_SwapBackupToMainAdapterList",
    "ZORAP_RegisterAlarmNotificationCallback",
    "ZORAP_UnRegisterAlarmNotificationCallback",
    "ZORAP_GetHbaDevicePortProperty",
    "ZORAP_RefreshDeviceStats",
    "ZORAP_GetVpd",
    "ZORAP_GetUUIDFromI2CVPD",
    "ZORAP_GetMBIVersionString",
    "ZORAP_GetSFPData",
    "ZORAP_GetOSName",
    "ZORAP_GetFCoELinkage",
    "ZORAP_GetLinkProperties",
    "ZORAP_GetTransceiverDMIData",
    "ZORAP_GetIPProperties",
    "ZORAP_UpdateFlash",
    "ZORAP_doOptionROMUpdate",
    "ZORAP_FreeMem",
};

// How many replaced main trees are kept alive after a swap, for a reader
// that still walks one (the alarm thread of a caller may, without a lock).
constexpr size_t kRetiredTrees = 2;

// A description file larger than this is refused (the largest host the
// benchmark generates, 1,024 adapters, takes about 6 MB).
constexpr size_t kMaxDescriptionBytes = 16 * 1024 * 1024;
// A flash image larger than this is refused (images are a few MB).
constexpr size_t kMaxFlashImageBytes = 64 * 1024 * 1024;

// How long shutdown waits for a running alarm callback.
constexpr int kCallbackGraceMs = 2000;

void complain(const std::string& message) {
    std::fprintf(stderr, "libzorap_cna_provider: %s\n", message.c_str());
}

// Identity of a description file's content, to notice a change.
struct FileStamp {
    bool exists = false;
    dev_t dev = 0;
    ino_t ino = 0;
    off_t size = 0;
    long long mtimeNs = 0;
    bool operator==(const FileStamp& o) const {
        return exists == o.exists && dev == o.dev && ino == o.ino && size == o.size &&
               mtimeNs == o.mtimeNs;
    }
    bool operator!=(const FileStamp& o) const { return !(*this == o); }
};

FileStamp stampOf(const std::string& path) {
    FileStamp s;
    struct stat st {};
    if (path.empty() || ::stat(path.c_str(), &st) != 0) return s;
    s.exists = true;
    s.dev = st.st_dev;
    s.ino = st.st_ino;
    s.size = st.st_size;
    s.mtimeNs = static_cast<long long>(st.st_mtim.tv_sec) * 1000000000LL + st.st_mtim.tv_nsec;
    return s;
}

// The last complaint about a description file, with the state of the file it
// was about: the file is read again by the look that noticed the change and
// by the backup build after it, and one line is enough for one state of the
// file. Static storage, never destroyed; emptied at unload.
struct LastComplaint {
    std::mutex mu;
    std::string text;
};

LastComplaint& lastComplaint() {
    alignas(LastComplaint) static unsigned char storage[sizeof(LastComplaint)];
    static LastComplaint* instance = new (storage) LastComplaint();
    return *instance;
}

void complainOnce(const std::string& message, const FileStamp& stamp) {
    const std::string key = message + '\n' + std::to_string(stamp.dev) + ':' + std::to_string(stamp.ino) + ':' +
                            std::to_string(stamp.size) + ':' + std::to_string(stamp.mtimeNs);
    {
        LastComplaint& last = lastComplaint();
        std::lock_guard<std::mutex> l(last.mu);
        if (last.text == key) return;
        last.text = key;
    }
    complain(message);
}

void forgetComplaints() {
    LastComplaint& last = lastComplaint();
    std::lock_guard<std::mutex> l(last.mu);
    std::string().swap(last.text);
}

struct Source {
    enum Kind { Default, File, Text } kind = Default;
    std::string path;  // File
    std::string text;  // Text
};

// The description file beside this library, found once when the library is
// loaded. dladdr takes the loader's lock, and an unload that stops the alarm
// thread holds that lock while it waits for the thread: the alarm thread must
// never be the one to look the path up.
std::string fileBesideThisLibrary() {
    Dl_info info{};
    if (dladdr(reinterpret_cast<void*>(&stampOf), &info) != 0 && info.dli_fname) {
        std::string lib = info.dli_fname;
        auto slash = lib.rfind('/');
        return (slash == std::string::npos ? std::string(".") : lib.substr(0, slash)) + "/" +
               ZORAP_SIM_DEFAULT_FILE;
    }
    return ZORAP_SIM_DEFAULT_FILE;
}
const std::string kFileBesideThisLibrary = fileBesideThisLibrary();

// The default description: the environment variable, or the file beside
// this library.
std::string defaultPath() {
    const char* env = std::getenv(ZORAP_SIM_ENV);
    if (env && *env) return env;
    return kFileBesideThisLibrary;
}

struct Loaded {
    Host host;
    std::string path;  // "" for text
    FileStamp stamp;
    bool ok = false;
    std::string configuration;  // configurationOf() the text; "" when not read
};

// Reads a source; a bad description gives a message and an empty host.
Loaded readSource(const Source& src) {
    Loaded out;
    std::string text, what;
    if (src.kind == Source::Text) {
        text = src.text;
        what = "adapter description (JSON text)";
    } else {
        out.path = src.kind == Source::File ? src.path : defaultPath();
        out.stamp = stampOf(out.path);
        what = "adapter description " + out.path;
        // Opened without blocking and taken only as a regular file within the
        // bound: a FIFO, a device, a directory or a huge file gives no adapters.
        bounded_file::Result read = bounded_file::readRegular(out.path.c_str(), kMaxDescriptionBytes);
        if (read.outcome != bounded_file::Outcome::Taken) {
            complainOnce(what + ": " + read.reason + "; no adapters", out.stamp);
            out.host.osName = defaultOsName();
            return out;
        }
        text = std::move(read.text);
        forgetComplaints();  // a later refusal is news again
    }
    try {
        out.host = parseDescription(text);
        out.ok = true;
        out.configuration = configurationOf(text);
    } catch (const std::bad_alloc&) {
        throw;
    } catch (const std::exception& e) {
        complain(what + ": " + e.what() + "; no adapters");
        out.host = Host{};
        out.host.osName = defaultOsName();
    }
    return out;
}

struct Alarm {
    unsigned int device;
    int type;
    std::string text;
};

struct Fault {
    uint32_t code = 0;
    int remaining = 0;
    unsigned long passing = 0;  // calls that still succeed before the failures start
};

class Library {
public:
    // --- description, model and trees (mu) ---
    std::mutex examineMu;
    std::mutex mu;
    bool initialized = false;
    uint32_t traceMask = 0;
    Source source;
    bool modelLoaded = false;  // a model stands that Initialize may use
    uint64_t generation = 0;   // bumped at every model replacement
    Host model;
    std::string modelPath;
    std::string modelConfiguration;  // configurationOf() the model's text
    FileStamp loadedStamp, notedStamp;
    bool configChanged = false;
    std::unique_ptr<Tree> main, backup;
    std::vector<std::unique_ptr<Tree>> retired;
    std::unordered_set<void*> allocations;
    char pathText[4096] = {0};

    // --- failures and counters ---
    std::atomic<unsigned long> calls[ZORAP_FN_COUNT] = {};
    std::mutex faultMu;
    Fault faults[ZORAP_FN_COUNT];

    // --- alarms (alarmMu) ---
    std::mutex alarmMu;
    std::condition_variable alarmCv, alarmIdleCv;
    std::list<Alarm> alarmQueue;
    ZORAP_ALARM_CALLBACK callback = nullptr;
    unsigned callbacksRunning = 0;
    uint64_t alarmEpoch = 0;
    std::thread alarmThread;
    std::thread::id alarmThreadId;
    unsigned long alarmsDelivered = 0;

    // --- flash (flashMu) ---
    std::mutex flashMu;
    std::condition_variable flashCv;
    uint64_t flashEpoch = 0;
    bool nextFlashSet = false;
    // What reached the last flash write (under flashMu): the image argument
    // read as a file name, and that file's size (-1 when it isn't a file).
    bool flashImageSeen = false;
    std::string lastFlashImage;
    long long lastFlashBytes = -1;
    uint32_t nextFlashResult = 0, nextFlashDurationMs = 0;
    std::atomic<unsigned long> flashRunning{0};

    // Counts the call and tells whether an injected failure answers it.
    bool injected(zorap_sim_function fn, uint32_t* code) {
        calls[fn].fetch_add(1, std::memory_order_relaxed);
        std::lock_guard<std::mutex> l(faultMu);
        Fault& f = faults[fn];
        if (f.code == 0 || f.remaining == 0) return false;
        if (f.passing > 0) {
            --f.passing;
            return false;
        }
        *code = f.code;
        if (f.remaining > 0) --f.remaining;
        return true;
    }

    void trace(const std::string& text) {
        if (traceMask) std::fprintf(stderr, "zorap: %s\n", text.c_str());
    }

    // Device handles stay with a function (its port and node WWN) across
    // reloads, so a caller holding an older tree still reaches the same port.
    std::map<std::pair<Wwn, Wwn>, uint32_t> handles;
    uint32_t nextHandle = 0x100;

    void assignHandles(Host& h) {
        std::set<uint32_t> used;
        for (auto& a : h.adapters)
            for (auto& p : a.ports)
                for (auto& q : p.protocols) {
                    if (!q.isFc()) continue;
                    auto key = std::make_pair(q.fc.portWwn, q.fc.nodeWwn);
                    auto it = handles.find(key);
                    if (it == handles.end() || used.count(it->second)) {
                        uint32_t h2 = nextHandle++;
                        if (it == handles.end()) handles.emplace(key, h2);
                        q.fc.handle = h2;
                    } else {
                        q.fc.handle = it->second;
                    }
                    used.insert(q.fc.handle);
                }
    }

    // Install a freshly read description (mu held).
    void install(Loaded&& l, bool markChanged) {
        assignHandles(l.host);
        model = std::move(l.host);
        modelPath = l.path;
        modelConfiguration = std::move(l.configuration);
        loadedStamp = notedStamp = l.stamp;
        modelLoaded = true;
        ++generation;
        if (markChanged) configChanged = true;
        copyText(pathText, modelPath);
    }

    int load(const Source& src) {
        Loaded l = readSource(src);
        bool ok = l.ok;
        std::lock_guard<std::mutex> g(mu);
        source = src;
        install(std::move(l), true);
        trace("description loaded from " + (modelPath.empty() ? std::string("JSON text") : modelPath));
        return ok ? 0 : -1;
    }

    // Lookups in the model (mu held).
    struct FcRef {
        Adapter* adapter = nullptr;
        PhysPort* port = nullptr;
        FcFunction* fc = nullptr;
    };
    struct NicRef {
        Adapter* adapter = nullptr;
        PhysPort* port = nullptr;
        NicFunction* nic = nullptr;
    };
    // Handles are unique in a model, so the place of each is kept, per model
    // generation: a build asks for every function by handle, one after the
    // other, and a walk of the whole host for each would make it quadratic.
    // A kept place is checked before it is used; a stale one gives the walk.
    struct FcPlace {
        size_t adapter, port, protocol;
    };
    std::unordered_map<uint32_t, FcPlace> fcPlaces;
    uint64_t fcPlacesGeneration = 0;
    bool fcPlacesValid = false;

    void indexFcPlaces() {
        fcPlaces.clear();
        for (size_t ai = 0; ai < model.adapters.size(); ++ai)
            for (size_t pi = 0; pi < model.adapters[ai].ports.size(); ++pi)
                for (size_t qi = 0; qi < model.adapters[ai].ports[pi].protocols.size(); ++qi) {
                    const auto& q = model.adapters[ai].ports[pi].protocols[qi];
                    if (q.isFc()) fcPlaces.emplace(q.fc.handle, FcPlace{ai, pi, qi});
                }
    }

    FcRef fcAt(uint32_t handle) {
        try {
            if (!fcPlacesValid || fcPlacesGeneration != generation) {
                fcPlacesValid = false;
                indexFcPlaces();
                fcPlacesGeneration = generation;
                fcPlacesValid = true;
            }
        } catch (...) {
            fcPlaces.clear();
            return {};
        }
        auto it = fcPlaces.find(handle);
        if (it == fcPlaces.end()) return {};
        const FcPlace& at = it->second;
        if (at.adapter >= model.adapters.size()) return {};
        Adapter& a = model.adapters[at.adapter];
        if (at.port >= a.ports.size()) return {};
        PhysPort& p = a.ports[at.port];
        if (at.protocol >= p.protocols.size()) return {};
        auto& q = p.protocols[at.protocol];
        if (!q.isFc() || q.fc.handle != handle) return {};
        return {&a, &p, &q.fc};
    }

    FcRef findFc(uint32_t handle) {
        FcRef kept = fcAt(handle);
        if (kept.fc) return kept;
        for (auto& a : model.adapters)
            for (auto& p : a.ports)
                for (auto& q : p.protocols)
                    if (q.isFc() && q.fc.handle == handle) return {&a, &p, &q.fc};
        return {};
    }
    FcRef findFcByWwn(const Wwn& wwn) {
        for (auto& a : model.adapters)
            for (auto& p : a.ports)
                for (auto& q : p.protocols)
                    if (q.isFc() && q.fc.portWwn == wwn) return {&a, &p, &q.fc};
        return {};
    }
    NicRef findNic(const char* interfaceName) {
        for (auto& a : model.adapters)
            for (auto& p : a.ports)
                for (auto& q : p.protocols)
                    if (q.isNic() && q.nic.interfaceName == interfaceName) return {&a, &p, &q.nic};
        return {};
    }
    Adapter* findAdapterByInstance(uint32_t instance) {
        for (auto& a : model.adapters)
            if (static_cast<uint32_t>(a.instance) == instance) return &a;
        return nullptr;
    }

    // A zeroed block for an out-parameter (mu held).
    void* handOut(size_t size) {
        void* p = std::calloc(1, size);
        if (!p) throw std::bad_alloc();
        try {
            allocations.insert(p);
        } catch (...) {
            std::free(p);
            throw;
        }
        return p;
    }

    // Queues an alarm for the alarm thread; false (dropped) when no callback
    // is registered.
    bool queueAlarm(unsigned int device, int type, std::string text) {
        {
            std::lock_guard<std::mutex> l(alarmMu);
            if (!callback || !alarmThread.joinable()) return false;
            alarmQueue.push_back({device, type, std::move(text)});
        }
        alarmCv.notify_all();
        return true;
    }

    enum class FileChange { None = 0, Live = 1, Configuration = 2 };

    // Looks at the description file in use (nothing for JSON text). When it
    // changed since it was last looked at and differs from the running
    // description only in live state, the model takes the new live state, the
    // file counts as loaded, and each FC port whose state changed raises alarm
    // type 0 for its port index; no configuration change is reported, as a
    // real library reports none when a port changes state. Any other change
    // (or a file that can't be read) is noted as a configuration change.
    FileChange examineDescription() {
        std::lock_guard<std::mutex> once(examineMu);
        Source src;
        FileStamp now;
        uint64_t gen;
        {
            std::lock_guard<std::mutex> g(mu);
            if (!initialized || (source.kind != Source::File && source.kind != Source::Default))
                return FileChange::None;
            std::string path = source.kind == Source::File ? source.path : defaultPath();
            now = stampOf(path);
            if (path == modelPath && now == notedStamp) return FileChange::None;
            notedStamp = now;
            if (path != modelPath || modelConfiguration.empty()) {
                configChanged = true;
                return FileChange::Configuration;
            }
            src = source;
            gen = generation;
        }
        // Read without mu, as a backup build does: the main tree stays usable.
        Loaded fresh = readSource(src);
        std::vector<PortStateChange> changes;
        {
            std::lock_guard<std::mutex> g(mu);
            if (!fresh.ok || generation != gen || fresh.configuration != modelConfiguration) {
                configChanged = true;
                return FileChange::Configuration;
            }
            changes = takeLiveState(model, fresh.host);
            loadedStamp = notedStamp = fresh.stamp;
            trace("live state re-read from " + modelPath);
        }
        for (const PortStateChange& c : changes) queueAlarm(c.portIndex, 0, portStateAlarmText(c));
        return FileChange::Live;
    }

    void raise(const std::vector<PortAlarm>& alarms) {
        for (const PortAlarm& a : alarms) queueAlarm(a.portIndex, 0, a.text);
    }

    // For a host read from sysfs, a live call reads its function's live
    // state afresh; an FC port whose state changed raises its alarm. False
    // when the function's FC host or interface is gone (mu held).
    bool refreshLive(FcFunction& fc) {
        if (!model.sysfs) return true;
        const uint8_t before = fc.stateCode;
        if (!readFcLive(model.sysfs->root, fc)) return false;
        if (fc.stateCode != before) raise({portStateAlarm(fc, before)});
        return true;
    }
    bool refreshLive(NicFunction& nic) { return !model.sysfs || readNicLive(model.sysfs->root, nic); }

    // Looks at a host read from sysfs: the states of its FC ports (an alarm
    // for each change) and, with `configuration`, whether its configuration
    // changed. The tree is read without mu, as a backup build reads it.
    void examineSysfs(bool configuration) {
        std::string root, known;
        uint64_t gen;
        {
            std::lock_guard<std::mutex> g(mu);
            if (!initialized || !model.sysfs) return;
            root = model.sysfs->root;
            if (configuration) known = model.sysfs->configuration;
            gen = generation;
        }
        const std::map<Wwn, uint8_t> states = readFcStates(root);
        const std::string now = configuration ? readSysfsHost(root).sysfs->configuration : known;
        std::lock_guard<std::mutex> g(mu);
        if (generation != gen) return;
        if (now != known) configChanged = true;
        raise(takeFcStates(model, states));
    }

    // --- alarm thread ---
    // Each alarm thread serves one epoch; stopping bumps the epoch, so a
    // thread that had to be let go ends by itself when its callback returns.
    void alarmLoop(uint64_t epoch) {
        std::unique_lock<std::mutex> l(alarmMu);
        for (;;) {
            // Between alarms the thread looks at the description file and at
            // the FC ports of a host read from sysfs once a second, so a port
            // state written to the file, or a port that changes state, raises
            // its alarm by itself.
            if (!alarmCv.wait_for(l, std::chrono::seconds(1),
                                  [&] { return alarmEpoch != epoch || !alarmQueue.empty(); })) {
                l.unlock();
                try {
                    examineDescription();
                    examineSysfs(false);
                } catch (...) {  // no memory: the next look tries again
                }
                l.lock();
                continue;
            }
            if (alarmEpoch != epoch) break;
            Alarm a = std::move(alarmQueue.front());
            alarmQueue.pop_front();
            ZORAP_ALARM_CALLBACK cb = callback;
            if (cb) {
                ++callbacksRunning;
                l.unlock();
                std::vector<unsigned char> text(a.text.begin(), a.text.end());
                text.push_back('\0');
                cb(a.device, a.type, static_cast<int>(a.text.size()), text.data());
                l.lock();
                --callbacksRunning;
                ++alarmsDelivered;
            }
            alarmIdleCv.notify_all();
        }
    }

    void startAlarmThread() {  // alarmMu held
        if (alarmThread.joinable()) return;
        uint64_t epoch = alarmEpoch;
        alarmThread = std::thread([this, epoch] { alarmLoop(epoch); });
        alarmThreadId = alarmThread.get_id();
    }

    // Ends the alarm thread.  A callback that is running gets a bounded time
    // to return: a caller may hold its own lock here that the callback waits
    // for, and must not be blocked for ever.
    void stopAlarmThread() {
        std::thread t;
        {
            std::lock_guard<std::mutex> l(alarmMu);
            callback = nullptr;
            ++alarmEpoch;
            alarmQueue.clear();
            t = std::move(alarmThread);
            alarmThreadId = std::thread::id();
        }
        alarmCv.notify_all();
        alarmIdleCv.notify_all();
        if (!t.joinable()) return;
        if (t.get_id() == std::this_thread::get_id()) {
            t.detach();  // called from inside the callback
            return;
        }
        bool idle;
        {
            std::unique_lock<std::mutex> l(alarmMu);
            idle = alarmIdleCv.wait_for(l, std::chrono::milliseconds(kCallbackGraceMs),
                                        [&] { return callbacksRunning == 0; });
        }
        if (idle) {
            t.join();
        } else {
            complain("alarm callback still running at shutdown; its thread is let go");
            t.detach();
        }
    }

    // Ends every flash wait at once (shutdown).
    void abortFlashWrites() {
        {
            std::lock_guard<std::mutex> l(flashMu);
            ++flashEpoch;
        }
        flashCv.notify_all();
    }

    void releaseTrees() {  // mu held
        main.reset();
        backup.reset();
        std::vector<std::unique_ptr<Tree>>().swap(retired);
    }

    // The image argument is a file name; it is read up to its terminator
    // within kMaxImageName bytes, and the file's size noted for the tests.
    void noteFlashImage(const unsigned char* image) {
        constexpr size_t kMaxImageName = 4096;
        const char* name = reinterpret_cast<const char*>(image);
        const size_t n = strnlen(name, kMaxImageName);
        std::string text(name, n);
        long long bytes = -1;
        if (n < kMaxImageName) {
            const bounded_file::Result file = bounded_file::checkRegular(text.c_str(), kMaxFlashImageBytes);
            if (file.outcome == bounded_file::Outcome::Taken)
                bytes = static_cast<long long>(file.size);
            else if (file.outcome == bounded_file::Outcome::Refused)
                complain("flash image " + text + ": " + file.reason);
        }
        std::lock_guard<std::mutex> l(flashMu);
        flashImageSeen = true;
        lastFlashImage = std::move(text);
        lastFlashBytes = bytes;
    }

    ZORAP_STATUS flashWrite(bool nic, uint32_t adapterInstance, uint32_t deviceHandle) {
        uint32_t result, durationMs;
        uint64_t gen, epoch;
        int32_t instance;
        {
            std::lock_guard<std::mutex> g(mu);
            if (!initialized) return ZORAP_ERR_NOT_INITIALIZED;
            if (model.sysfs) return ZORAP_ERR_NOT_SUPPORTED;  // the running system's flash is never written
            Adapter* a = nic ? findAdapterByInstance(adapterInstance) : findFc(deviceHandle).adapter;
            if (!a) return ZORAP_ERR_NOT_FOUND;
            instance = a->instance;
            result = model.flashResult;
            durationMs = model.flashDurationMs;
            gen = generation;
            trace("flash write on adapter " + a->serialNumber);
        }
        {
            std::unique_lock<std::mutex> l(flashMu);
            if (nextFlashSet) {
                result = nextFlashResult;
                durationMs = nextFlashDurationMs;
                nextFlashSet = false;
            }
            epoch = flashEpoch;
            flashRunning.fetch_add(1);
            flashCv.notify_all();
            bool aborted = flashCv.wait_for(l, std::chrono::milliseconds(durationMs),
                                            [&] { return flashEpoch != epoch; });
            flashRunning.fetch_sub(1);
            flashCv.notify_all();
            if (aborted) return ZORAP_ERR_FAILED;
        }
        if (result == ZORAP_OK) {
            std::lock_guard<std::mutex> g(mu);
            Adapter* a = generation == gen ? findAdapterByInstance(static_cast<uint32_t>(instance)) : nullptr;
            if (a) {
                if (a->afterFlashVersions) a->versions = *a->afterFlashVersions;
                for (const auto& kv : a->afterFlashVpd) {
                    auto it = std::find_if(a->vpd.begin(), a->vpd.end(),
                                           [&](const auto& e) { return e.first == kv.first; });
                    if (it != a->vpd.end())
                        it->second = kv.second;
                    else
                        a->vpd.push_back(kv);
                }
            }
            configChanged = true;
        }
        return result;
    }
};

Library& lib() {
    // Static storage, never destroyed: calls that come late during process
    // exit still find a valid (emptied) object.
    alignas(Library) static unsigned char storage[sizeof(Library)];
    static Library* instance = new (storage) Library();
    return *instance;
}

// Runs a contract function: counts it, applies an injected failure, and keeps
// every exception inside the library.
template <typename Body>
ZORAP_STATUS run(zorap_sim_function fn, Body&& body) {
    uint32_t code = 0;
    if (lib().injected(fn, &code)) return code;
    try {
        return body(lib());
    } catch (const std::bad_alloc&) {
        return ZORAP_ERR_NO_MEMORY;
    } catch (const std::exception& e) {
        complain(std::string(kFunctionNames[fn]) + ": " + e.what());
        return ZORAP_ERR_FAILED;
    } catch (...) {
        return ZORAP_ERR_FAILED;
    }
}

bool parseWwnText(const char* text, Wwn& out) {
    if (!text) return false;
    std::string digits;
    for (const char* p = text; *p; ++p) {
        if (*p == ':' || *p == '-' || *p == ' ') continue;
        if (!std::isxdigit(static_cast<unsigned char>(*p))) return false;
        digits += *p;
    }
    if (digits.size() != 16) return false;
    for (size_t i = 0; i < 8; ++i)
        out[i] = static_cast<uint8_t>(std::stoul(digits.substr(2 * i, 2), nullptr, 16));
    return true;
}

template <typename T>
void releaseAll(T& object) {
    T empty{};
    std::swap(object, empty);
}

template <typename Body>
int control(const char* what, Body&& body) {
    try {
        return body(lib());
    } catch (const std::exception& e) {
        complain(std::string(what) + ": " + e.what());
        return -1;
    } catch (...) {
        return -1;
    }
}

}  // namespace
}  // namespace zorap_sim

using zorap_sim::Library;

// ===========================================================================
// The ZORAP_* interface
// ===========================================================================

ZORAP_EXPORT ZORAP_STATUS ZORAP_Initialize(int logMask, int reserved) {
    (void)reserved;
    return zorap_sim::run(ZORAP_FN_Initialize, [&](Library& L) -> ZORAP_STATUS {
        zorap_sim::Source src;
        {
            std::lock_guard<std::mutex> g(L.mu);
            L.traceMask = static_cast<uint32_t>(logMask);
            if (L.initialized) return ZORAP_OK;
            src = L.source;
            if (L.modelLoaded) {
                L.main = zorap_sim::buildTree(L.model);
                L.initialized = true;
                L.configChanged = false;
                L.trace("initialized with " + std::to_string(L.model.adapters.size()) + " adapters");
                return ZORAP_OK;
            }
        }
        zorap_sim::Loaded loaded = zorap_sim::readSource(src);
        std::lock_guard<std::mutex> g(L.mu);
        if (L.initialized) return ZORAP_OK;
        L.install(std::move(loaded), false);
        L.main = zorap_sim::buildTree(L.model);
        L.initialized = true;
        L.configChanged = false;
        L.trace("initialized with " + std::to_string(L.model.adapters.size()) + " adapters");
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_Uninitialize(void) {
    return zorap_sim::run(ZORAP_FN_Uninitialize, [](Library& L) -> ZORAP_STATUS {
        L.stopAlarmThread();
        L.abortFlashWrites();
        std::lock_guard<std::mutex> g(L.mu);
        L.releaseTrees();
        L.initialized = false;
        L.modelLoaded = false;
        L.configChanged = false;
        zorap_sim::sysfs::forgetRefusals();  // a new start reports its refusals again
        L.trace("uninitialized");
        return ZORAP_OK;
    });
}

ZORAP_EXPORT _zorap_adapter_list_t* ZORAP_GetAdapterList(void) {
    _zorap_adapter_list_t* result = nullptr;
    zorap_sim::run(ZORAP_FN_GetAdapterList, [&](Library& L) -> ZORAP_STATUS {
        std::lock_guard<std::mutex> g(L.mu);
        if (L.initialized && L.main) result = &L.main->header;
        return ZORAP_OK;
    });
    return result;
}

ZORAP_EXPORT int ZORAP_DidConfigChange(void) {
    uint32_t code = 0;
    Library& L = zorap_sim::lib();
    if (L.injected(ZORAP_FN_DidConfigChange, &code)) return static_cast<int>(code);
    try {
        L.examineDescription();
        L.examineSysfs(true);
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return 0;
        return L.configChanged ? 1 : 0;
    } catch (...) {
        return 0;
    }
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_ResetConfigChange(void) {
    return zorap_sim::run(ZORAP_FN_ResetConfigChange, [](Library& L) -> ZORAP_STATUS {
        std::lock_guard<std::mutex> g(L.mu);
        L.configChanged = false;
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_UpdateBackupAdapterList(void) {
    return zorap_sim::run(ZORAP_FN_UpdateBackupAdapterList, [](Library& L) -> ZORAP_STATUS {
        zorap_sim::Source src;
        uint64_t gen;
        bool reload = false;
        {
            std::lock_guard<std::mutex> g(L.mu);
            if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
            src = L.source;
            gen = L.generation;
            if (src.kind != zorap_sim::Source::Text) {
                std::string path =
                    src.kind == zorap_sim::Source::File ? src.path : zorap_sim::defaultPath();
                reload = path != L.modelPath || zorap_sim::stampOf(path) != L.loadedStamp;
            }
            reload = reload || L.model.sysfs.has_value();  // the running system is read again
        }
        // The file is read without the lock: the main tree stays usable.
        zorap_sim::Loaded loaded;
        if (reload) loaded = zorap_sim::readSource(src);
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        if (reload && L.generation == gen) {
            // A port state that changed since the last look raises its alarm
            // before the new host takes the state over.
            if (L.model.sysfs && loaded.host.sysfs)
                L.raise(zorap_sim::takeFcStates(L.model, zorap_sim::fcStatesOf(loaded.host)));
            zorap_sim::FileStamp keepNoted = L.notedStamp;
            L.install(std::move(loaded), false);
            L.notedStamp = keepNoted;  // a change not yet reported stays reportable
            L.trace("description re-read from " + L.modelPath);
        }
        L.backup = zorap_sim::buildTree(L.model);
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_SwapBackupToMainAdapterList(void) {
    return zorap_sim::run(ZORAP_FN_SwapBackupToMainAdapterList, [](Library& L) -> ZORAP_STATUS {
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        if (!L.backup) return ZORAP_ERR_NOT_PRESENT;
        if (L.main) L.retired.push_back(std::move(L.main));
        L.main = std::move(L.backup);
        while (L.retired.size() > zorap_sim::kRetiredTrees) L.retired.erase(L.retired.begin());
        L.trace("backup tree swapped to main");
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_RegisterAlarmNotificationCallback(ZORAP_ALARM_CALLBACK callback) {
    return zorap_sim::run(ZORAP_FN_RegisterAlarmNotificationCallback, [&](Library& L) -> ZORAP_STATUS {
        if (!callback) return ZORAP_ERR_INVALID_PARAMETER;
        {
            std::lock_guard<std::mutex> g(L.mu);
            if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        }
        std::lock_guard<std::mutex> l(L.alarmMu);
        L.callback = callback;
        L.startAlarmThread();
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_UnRegisterAlarmNotificationCallback(ZORAP_ALARM_CALLBACK callback) {
    return zorap_sim::run(ZORAP_FN_UnRegisterAlarmNotificationCallback, [&](Library& L) -> ZORAP_STATUS {
        // No new call starts after this; one that runs may still finish
        // (ZORAP_Uninitialize waits for it).
        std::lock_guard<std::mutex> l(L.alarmMu);
        if (!callback || L.callback != callback) return ZORAP_ERR_NOT_FOUND;
        L.callback = nullptr;
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetHbaDevicePortProperty(uint32_t deviceHandle, uint32_t index,
                                                         void* portRecord) {
    (void)index;
    return zorap_sim::run(ZORAP_FN_GetHbaDevicePortProperty, [&](Library& L) -> ZORAP_STATUS {
        if (!portRecord) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findFc(deviceHandle);
        if (!ref.fc || !L.refreshLive(*ref.fc)) return ZORAP_ERR_NOT_FOUND;
        _zorap_port_property_t prop{};
        zorap_sim::encodePortProperty(*ref.fc, &prop);
        std::memcpy(portRecord, &prop, sizeof prop);
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_RefreshDeviceStats(_tagZORAPSDMDevice* device) {
    return zorap_sim::run(ZORAP_FN_RefreshDeviceStats, [&](Library& L) -> ZORAP_STATUS {
        if (!device) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findFc(device->deviceHandle);
        if (!ref.fc || !L.refreshLive(*ref.fc)) return ZORAP_ERR_NOT_FOUND;
        zorap_sim::encodeFcStats(*ref.fc, device);
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetVpd(uint32_t deviceHandle, uint32_t index, uint8_t* buffer,
                                       uint32_t* size) {
    (void)index;
    return zorap_sim::run(ZORAP_FN_GetVpd, [&](Library& L) -> ZORAP_STATUS {
        if (!buffer || !size) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findFc(deviceHandle);
        if (!ref.fc) return ZORAP_ERR_NOT_FOUND;
        if (!ref.adapter->hasVpd) return ZORAP_ERR_NOT_PRESENT;
        std::vector<uint8_t> vpd = zorap_sim::encodeVpd(*ref.adapter);
        if (vpd.size() > *size) {
            *size = static_cast<uint32_t>(vpd.size());
            return ZORAP_ERR_BUFFER_TOO_SMALL;
        }
        std::memcpy(buffer, vpd.data(), vpd.size());
        *size = static_cast<uint32_t>(vpd.size());
        return ZORAP_OK;
    });
}

namespace {
// A newly allocated text for an out-parameter.
ZORAP_STATUS handOutText(Library& L, const std::string& s, char** text, uint32_t* length) {
    char* p = static_cast<char*>(L.handOut(s.size() + 1));
    std::memcpy(p, s.c_str(), s.size() + 1);
    *text = p;
    if (length) *length = static_cast<uint32_t>(s.size());
    return ZORAP_OK;
}
}  // namespace

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetUUIDFromI2CVPD(_tagZORAPSDMDevice* device, char** text,
                                                  uint32_t* length) {
    return zorap_sim::run(ZORAP_FN_GetUUIDFromI2CVPD, [&](Library& L) -> ZORAP_STATUS {
        if (!device || !text) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findFc(device->deviceHandle);
        if (!ref.fc) return ZORAP_ERR_NOT_FOUND;
        if (!ref.adapter->i2cUuid) return ZORAP_ERR_NOT_PRESENT;
        return handOutText(L, *ref.adapter->i2cUuid, text, length);
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetMBIVersionString(_tagZORAPSDMDevice* device, char** text,
                                                    uint32_t* length) {
    return zorap_sim::run(ZORAP_FN_GetMBIVersionString, [&](Library& L) -> ZORAP_STATUS {
        if (!device || !text) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findFc(device->deviceHandle);
        if (!ref.fc) return ZORAP_ERR_NOT_FOUND;
        if (!ref.adapter->versions.mbi) return ZORAP_ERR_NOT_PRESENT;
        return handOutText(L, zorap_sim::mbiVersionString(*ref.adapter->versions.mbi), text, length);
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetSFPData(_tagZORAPSDMDevice* device, uint8_t* buffer) {
    return zorap_sim::run(ZORAP_FN_GetSFPData, [&](Library& L) -> ZORAP_STATUS {
        if (!device || !buffer) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findFc(device->deviceHandle);
        if (!ref.fc) return ZORAP_ERR_NOT_FOUND;
        if (!ref.port->transceiver) return ZORAP_ERR_NOT_PRESENT;
        zorap_sim::encodeTransceiverPages(*ref.port->transceiver, buffer);
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetOSName(char* buffer, uint32_t* size) {
    return zorap_sim::run(ZORAP_FN_GetOSName, [&](Library& L) -> ZORAP_STATUS {
        if (!buffer || !size) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        const std::string& os = L.model.osName;
        if (os.size() + 1 > *size) {
            *size = static_cast<uint32_t>(os.size() + 1);
            return ZORAP_ERR_BUFFER_TOO_SMALL;
        }
        std::memcpy(buffer, os.c_str(), os.size() + 1);
        *size = static_cast<uint32_t>(os.size());
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetFCoELinkage(const char* interfaceName, void** array,
                                               uint32_t* count) {
    return zorap_sim::run(ZORAP_FN_GetFCoELinkage, [&](Library& L) -> ZORAP_STATUS {
        if (!interfaceName || !array || !count) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findNic(interfaceName);
        if (!ref.nic) return ZORAP_ERR_NOT_FOUND;
        *array = nullptr;
        *count = 0;
        const auto& links = ref.nic->fcoe;
        if (links.empty()) return ZORAP_OK;
        auto* out = static_cast<_zorap_fcoe_linkage_t*>(L.handOut(links.size() * sizeof(_zorap_fcoe_linkage_t)));
        for (size_t i = 0; i < links.size(); ++i) zorap_sim::encodeFcoeLinkage(links[i], &out[i]);
        *array = out;
        *count = static_cast<uint32_t>(links.size());
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetLinkProperties(const char* interfaceName,
                                                  _zorap_link_properties_t* properties) {
    return zorap_sim::run(ZORAP_FN_GetLinkProperties, [&](Library& L) -> ZORAP_STATUS {
        if (!interfaceName || !properties) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findNic(interfaceName);
        if (!ref.nic || !L.refreshLive(*ref.nic)) return ZORAP_ERR_NOT_FOUND;
        zorap_sim::encodeLinkProperties(*ref.nic, properties);
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetTransceiverDMIData(const char* interfaceName, uint32_t* length,
                                                      uint8_t* buffer) {
    return zorap_sim::run(ZORAP_FN_GetTransceiverDMIData, [&](Library& L) -> ZORAP_STATUS {
        if (!interfaceName || !length || !buffer) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findNic(interfaceName);
        if (!ref.nic) return ZORAP_ERR_NOT_FOUND;
        // The running system's module is read afresh through the kernel.
        uint8_t pages[zorap_sim::kTransceiverPagesSize];
        if (L.model.sysfs ? !zorap_sim::sysfs::modulePages(L.model.sysfs->root, interfaceName, pages)
                          : !ref.port->transceiver)
            return ZORAP_ERR_NOT_PRESENT;
        if (*length < zorap_sim::kTransceiverPagesSize) {
            *length = zorap_sim::kTransceiverPagesSize;
            return ZORAP_ERR_BUFFER_TOO_SMALL;
        }
        if (L.model.sysfs)
            std::memcpy(buffer, pages, sizeof pages);
        else
            zorap_sim::encodeTransceiverPages(*ref.port->transceiver, buffer);
        *length = zorap_sim::kTransceiverPagesSize;
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_GetIPProperties(const char* interfaceName, void** record) {
    return zorap_sim::run(ZORAP_FN_GetIPProperties, [&](Library& L) -> ZORAP_STATUS {
        if (!interfaceName || !record) return ZORAP_ERR_INVALID_PARAMETER;
        std::lock_guard<std::mutex> g(L.mu);
        if (!L.initialized) return ZORAP_ERR_NOT_INITIALIZED;
        auto ref = L.findNic(interfaceName);
        if (!ref.nic) return ZORAP_ERR_NOT_FOUND;
        void* block = L.handOut(zorap_sim::ipPropertiesBlockSize(*ref.nic));
        zorap_sim::encodeIpProperties(*ref.nic, block);
        *record = block;
        return ZORAP_OK;
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_UpdateFlash(uint32_t adapterInstance, const unsigned char* image,
                                            uint32_t flags) {
    (void)flags;
    return zorap_sim::run(ZORAP_FN_UpdateFlash, [&](Library& L) -> ZORAP_STATUS {
        if (!image) return ZORAP_ERR_INVALID_PARAMETER;
        L.noteFlashImage(image);
        return L.flashWrite(true, adapterInstance, 0);
    });
}

ZORAP_EXPORT ZORAP_STATUS ZORAP_doOptionROMUpdate(_tagZORAPSDMDevice* device,
                                                  const unsigned char* image, uint32_t flags) {
    (void)flags;
    return zorap_sim::run(ZORAP_FN_doOptionROMUpdate, [&](Library& L) -> ZORAP_STATUS {
        if (!device || !image) return ZORAP_ERR_INVALID_PARAMETER;
        L.noteFlashImage(image);
        return L.flashWrite(false, 0, device->deviceHandle);
    });
}

ZORAP_EXPORT void ZORAP_FreeMem(void* memory) {
    Library& L = zorap_sim::lib();
    uint32_t ignored = 0;
    (void)L.injected(ZORAP_FN_FreeMem, &ignored);  // counted; a failure cannot be shown
    if (!memory) return;
    bool known;
    {
        std::lock_guard<std::mutex> g(L.mu);
        known = L.allocations.erase(memory) != 0;
    }
    if (known) {
        std::free(memory);
    } else {
        char text[128];
        std::snprintf(text, sizeof text, "ZORAP_FreeMem: %p was not handed out by this library; ignored",
                      memory);
        zorap_sim::complain(text);
    }
}

// ===========================================================================
// Controls
// ===========================================================================

ZORAP_EXPORT const char* zorap_sim_function_name(int function) {
    if (function < 0 || function >= ZORAP_FN_COUNT) return nullptr;
    return zorap_sim::kFunctionNames[function];
}

ZORAP_EXPORT int zorap_sim_function_from_name(const char* name) {
    if (!name) return -1;
    for (int i = 0; i < ZORAP_FN_COUNT; ++i) {
        const char* full = zorap_sim::kFunctionNames[i];
        if (std::strcmp(full, name) == 0 || std::strcmp(full + 6, name) == 0) return i;
    }
    return -1;
}

ZORAP_EXPORT int zorap_sim_load_file(const char* path) {
    return zorap_sim::control("zorap_sim_load_file", [&](Library& L) {
        if (!path || !*path) {
            zorap_sim::complain("zorap_sim_load_file: no path given");
            return -1;
        }
        zorap_sim::Source s;
        s.kind = zorap_sim::Source::File;
        s.path = path;
        return L.load(s);
    });
}

ZORAP_EXPORT int zorap_sim_load_json(const char* jsonText) {
    return zorap_sim::control("zorap_sim_load_json", [&](Library& L) {
        zorap_sim::Source s;
        s.kind = zorap_sim::Source::Text;
        s.text = jsonText ? jsonText : "";
        return L.load(s);
    });
}

ZORAP_EXPORT int zorap_sim_load_default(void) {
    return zorap_sim::control("zorap_sim_load_default", [](Library& L) { return L.load(zorap_sim::Source{}); });
}

ZORAP_EXPORT const char* zorap_sim_description_path(void) {
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> g(L.mu);
    return L.pathText;
}

ZORAP_EXPORT int zorap_sim_set_link_state(const char* interfaceName, uint32_t linkState) {
    return zorap_sim::control("zorap_sim_set_link_state", [&](Library& L) {
        std::lock_guard<std::mutex> g(L.mu);
        auto ref = L.findNic(interfaceName ? interfaceName : "");
        if (!ref.nic) {
            zorap_sim::complain(std::string("zorap_sim_set_link_state: no interface ") +
                                (interfaceName ? interfaceName : "(null)"));
            return -1;
        }
        ref.nic->linkState = linkState;
        return 0;
    });
}

ZORAP_EXPORT int zorap_sim_set_link_speed(const char* interfaceName, uint64_t speedMbps) {
    return zorap_sim::control("zorap_sim_set_link_speed", [&](Library& L) {
        std::lock_guard<std::mutex> g(L.mu);
        auto ref = L.findNic(interfaceName ? interfaceName : "");
        if (!ref.nic) {
            zorap_sim::complain(std::string("zorap_sim_set_link_speed: no interface ") +
                                (interfaceName ? interfaceName : "(null)"));
            return -1;
        }
        ref.nic->linkSpeed = speedMbps;
        return 0;
    });
}

namespace {
template <typename Change>
int changeFc(const char* what, const char* portWWN, Change&& change) {
    return zorap_sim::control(what, [&](Library& L) {
        zorap_sim::Wwn wwn{};
        if (!zorap_sim::parseWwnText(portWWN, wwn)) {
            zorap_sim::complain(std::string(what) + ": not a WWN: " + (portWWN ? portWWN : "(null)"));
            return -1;
        }
        std::lock_guard<std::mutex> g(L.mu);
        auto ref = L.findFcByWwn(wwn);
        if (!ref.fc) {
            zorap_sim::complain(std::string(what) + ": no FC port with WWN " + portWWN);
            return -1;
        }
        change(*ref.fc);
        return 0;
    });
}
}  // namespace

ZORAP_EXPORT int zorap_sim_set_fc_port_state(const char* portWWN, uint8_t stateCode) {
    return changeFc("zorap_sim_set_fc_port_state", portWWN,
                    [&](zorap_sim::FcFunction& fc) { fc.stateCode = stateCode; });
}

ZORAP_EXPORT int zorap_sim_set_fc_port_stats(const char* portWWN, const uint32_t counters[9]) {
    if (!counters) return -1;
    return changeFc("zorap_sim_set_fc_port_stats", portWWN, [&](zorap_sim::FcFunction& fc) {
        std::copy(counters, counters + 9, fc.stats.begin());
    });
}

ZORAP_EXPORT int zorap_sim_raise_alarm(unsigned int deviceNumber, int coreAlarmType, const char* text) {
    return zorap_sim::control("zorap_sim_raise_alarm", [&](Library& L) {
        return L.queueAlarm(deviceNumber, coreAlarmType, text ? text : "") ? 0 : -1;
    });
}

ZORAP_EXPORT int zorap_sim_check_description(void) {
    return zorap_sim::control("zorap_sim_check_description",
                              [](Library& L) { return static_cast<int>(L.examineDescription()); });
}

ZORAP_EXPORT int zorap_sim_wait_alarms_idle(uint32_t timeoutMs) {
    return zorap_sim::control("zorap_sim_wait_alarms_idle", [&](Library& L) {
        std::unique_lock<std::mutex> l(L.alarmMu);
        bool idle = L.alarmIdleCv.wait_for(l, std::chrono::milliseconds(timeoutMs), [&] {
            return L.alarmQueue.empty() && L.callbacksRunning == 0;
        });
        return idle ? 0 : -1;
    });
}

ZORAP_EXPORT unsigned long zorap_sim_alarms_delivered(void) {
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> l(L.alarmMu);
    return L.alarmsDelivered;
}

ZORAP_EXPORT void zorap_sim_set_next_flash(uint32_t result, uint32_t durationMs) {
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> l(L.flashMu);
    L.nextFlashSet = true;
    L.nextFlashResult = result;
    L.nextFlashDurationMs = durationMs;
}

ZORAP_EXPORT int zorap_sim_last_flash_image(char* name, size_t size, long long* bytes) {
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> l(L.flashMu);
    if (!L.flashImageSeen) return -1;
    if (name && size > 0) {
        const size_t n = std::min(size - 1, L.lastFlashImage.size());
        std::memcpy(name, L.lastFlashImage.data(), n);
        name[n] = '\0';
    }
    if (bytes) *bytes = L.lastFlashBytes;
    return 0;
}

ZORAP_EXPORT unsigned long zorap_sim_flash_writes_running(void) {
    return zorap_sim::lib().flashRunning.load();
}

ZORAP_EXPORT int zorap_sim_wait_flash_writes(unsigned long count, uint32_t timeoutMs) {
    return zorap_sim::control("zorap_sim_wait_flash_writes", [&](Library& L) {
        std::unique_lock<std::mutex> l(L.flashMu);
        bool reached = L.flashCv.wait_for(l, std::chrono::milliseconds(timeoutMs),
                                          [&] { return L.flashRunning.load() == count; });
        return reached ? 0 : -1;
    });
}

ZORAP_EXPORT int zorap_sim_fail(int function, uint32_t code, int times) {
    if (function < 0 || function >= ZORAP_FN_COUNT) {
        zorap_sim::complain("zorap_sim_fail: no such function " + std::to_string(function));
        return -1;
    }
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> l(L.faultMu);
    L.faults[function] = (code == 0 || times == 0) ? zorap_sim::Fault{} : zorap_sim::Fault{code, times};
    return 0;
}

ZORAP_EXPORT int zorap_sim_fail_call(int function, uint32_t code, unsigned long callNumber, int times) {
    if (callNumber == 0) {
        zorap_sim::complain("zorap_sim_fail_call: calls are counted from 1");
        return -1;
    }
    if (zorap_sim_fail(function, code, times) != 0) return -1;
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> l(L.faultMu);
    L.faults[function].passing = L.faults[function].code != 0 ? callNumber - 1 : 0;
    return 0;
}

ZORAP_EXPORT unsigned long zorap_sim_call_count(int function) {
    if (function < 0 || function >= ZORAP_FN_COUNT) return 0;
    return zorap_sim::lib().calls[function].load();
}

ZORAP_EXPORT unsigned long zorap_sim_outstanding_allocations(void) {
    Library& L = zorap_sim::lib();
    std::lock_guard<std::mutex> g(L.mu);
    return static_cast<unsigned long>(L.allocations.size());
}

ZORAP_EXPORT void zorap_sim_reset(void) {
    Library& L = zorap_sim::lib();
    {
        std::lock_guard<std::mutex> l(L.faultMu);
        for (auto& f : L.faults) f = zorap_sim::Fault{};
        for (auto& c : L.calls) c.store(0);
    }
    {
        std::lock_guard<std::mutex> l(L.flashMu);
        L.nextFlashSet = false;
        L.flashImageSeen = false;
        L.lastFlashImage.clear();
        L.lastFlashBytes = -1;
    }
    {
        std::lock_guard<std::mutex> l(L.alarmMu);
        L.alarmQueue.clear();
        L.alarmsDelivered = 0;
    }
    L.alarmIdleCv.notify_all();
}

// On unload (dlclose or process exit): end the alarm thread and the flash
// waits, and release the trees, so nothing runs in unmapped code.
__attribute__((destructor)) static void zorap_sim_unload() {
    try {
        Library& L = zorap_sim::lib();
        L.stopAlarmThread();
        L.abortFlashWrites();
        std::lock_guard<std::mutex> g(L.mu);
        L.releaseTrees();
        L.initialized = false;
        // Swapped with empty objects, so every heap block goes (an assigned
        // empty string would keep its old buffer).
        zorap_sim::releaseAll(L.model);
        zorap_sim::releaseAll(L.source);
        zorap_sim::releaseAll(L.modelPath);
        zorap_sim::releaseAll(L.modelConfiguration);
        zorap_sim::releaseAll(L.handles);
        zorap_sim::releaseAll(L.fcPlaces);
        L.fcPlacesValid = false;
        // Blocks still handed out are the caller's leak; the set that knew
        // them goes, so that a leak checker sees them.
        zorap_sim::releaseAll(L.allocations);
        std::lock_guard<std::mutex> f(L.flashMu);
        L.flashImageSeen = false;
        zorap_sim::releaseAll(L.lastFlashImage);
        L.lastFlashBytes = -1;
        zorap_sim::sysfs::forgetRefusals();
        zorap_sim::forgetComplaints();
    } catch (...) {
    }
}
