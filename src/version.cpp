// The provider's version, shown in the polling thread's start banner.
namespace vexlan {
extern const char kProviderVersion[];
const char kProviderVersion[] = "1.5.6";
}  // namespace vexlan
