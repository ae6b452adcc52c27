// Settings of the provider, from the text file "vexlancna.properties".
//
// The file is read by two independent readers that differ on purpose:
//
// - LoadProviderProperties(), called once by the provider's constructor, reads
//   /opt/Vexlan_Corporation/CNAProviders/vexlancna.properties line by line and
//   sets the log switches g_EnableDebugPrint, g_EnableLogError,
//   g_EnableZORAPLog and the three configured texts below. A key may stand
//   anywhere in a line (case-sensitive), the value follows the line's last
//   "=", log switches are on for a value greater than 0.
//
// - Vexlan_NIC_Properties::instance() reads "vexlancna.properties" relative to
//   the working directory once, word by word, and holds the poll interval and
//   the namespaces. Keys are matched at the start of a word without regard to
//   case, so a setting must be written without blanks ("ErrorLog=1").
#ifndef VEXLAN_SUPPORT_VEXLAN_NIC_PROPERTIES_H
#define VEXLAN_SUPPORT_VEXLAN_NIC_PROPERTIES_H

#define VEXLAN_PROPERTIES_FILE_NAME "vexlancna.properties"
#define VEXLAN_PROPERTIES_DIRECTORY_FORMAT "/opt/Vexlan_Corporation/CNAProviders/%s"

// Set by LoadProviderProperties.
extern bool g_EnableZORAPLog;        // "ZORAPLog": selects the adapter library's log mask
extern char g_InteropNamespace[256]; // "InteropNamespace", default "root/PG_InterOp"
extern char g_CIMOMNameVersion[256]; // "CIMOMNameVersion", default "Pegasus CIM Server"
extern char g_CIMSchemaVersion[256]; // "CIMSchemaVersion", default "Unknown Version"

// The provider constructor's reading of the settings: switches both logs off,
// sets the defaults, reads the file (a missing file leaves the defaults) and,
// with the debug log on, writes the configuration lines to the log.
void LoadProviderProperties();

// Writes the bare file name "vexlancna.properties" into `buffer`. Returns 1,
// or 0 when `size` is 20 or less or the name does not fit.
int getPropertyFilePath(char* buffer, unsigned int size);

class Vexlan_NIC_Properties {
public:
    // The one object, created and read at the first call; later calls return
    // it unchanged. Safe to call from several threads.
    static Vexlan_NIC_Properties* instance();

    // Sets the defaults and calls reload(). instance() is the way to the
    // shared object; a separate object reads the file afresh.
    Vexlan_NIC_Properties();
    virtual ~Vexlan_NIC_Properties();

    // Reads the file found through getPropertyFilePath over the current
    // values; a missing file leaves them as they are.
    void reload();

    bool debugLog;                        // "DebugLog", default false
    bool errorLog;                        // "ErrorLog", default false
    int linkStatusPollIntervalSeconds;    // "LinkStatusPollIntervalSeconds", default 180
    char interopNamespace[256];           // "InteropNamespace", default "root/PG_InterOp"
    char implementationNamespace[256];    // always "root/vexlan_cmpi"

    static Vexlan_NIC_Properties* singleton;

    Vexlan_NIC_Properties(Vexlan_NIC_Properties const&) = delete;
    Vexlan_NIC_Properties& operator=(Vexlan_NIC_Properties const&) = delete;
};

#endif
