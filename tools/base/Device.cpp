#include "Device.h"

#include "Failure.h"

#include <fmt/format.h>
#include <link.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <new>
#include <system_error>

namespace CommandLine::Device {
namespace {

namespace fs = std::filesystem;

constexpr const char* kHostLibrary = "libosp-appfw.so.1";    // common to all devices
constexpr const char* kDeviceLibrary = "libosp-media.so.1";  // one in each device's folder
constexpr const char* kLoaderPath = "LD_LIBRARY_PATH";

/// A search among the libraries of this process.
struct Search {
  std::string library;
  fs::path folder;
};

int Compare(dl_phdr_info* info, std::size_t, void* context) {
  auto& search = *static_cast<Search*>(context);
  const fs::path path(info->dlpi_name);
  if (path.filename() != search.library) return 0;
  std::error_code ignored;
  search.folder = fs::canonical(path, ignored).parent_path();
  return 1;
}

/// \return the folder that a library was loaded from; empty when it isn't loaded.
fs::path FolderOf(const char* library) {
  Search search{library, {}};
  dl_iterate_phdr(Compare, &search);
  return search.folder;
}

bool StartsWithFolder(const std::string& loaderPath, const std::string& folder) {
  return loaderPath.substr(0, loaderPath.find(':')) == folder;
}

[[noreturn]] void StartAnew(const std::string& loaderPath, char** arguments) {
  if (setenv(kLoaderPath, loaderPath.c_str(), 1) != 0) throw std::bad_alloc();
  std::error_code error;
  const fs::path program = fs::read_symlink("/proc/self/exe", error);
  if (!error) execv(program.c_str(), arguments);
  FailWithSystemError("start the program anew", error ? error.value() : errno);
}

}  // namespace

std::vector<Entry> List() {
  std::vector<Entry> devices;
  const fs::path loaded = FolderOf(kDeviceLibrary);
  std::error_code ignored;
  for (const fs::directory_entry& entry : fs::directory_iterator(FolderOf(kHostLibrary), ignored)) {
    if (!fs::exists(entry.path() / kDeviceLibrary, ignored)) continue;
    devices.push_back({entry.path().filename(), entry.path(), entry.path() == loaded});
  }
  std::sort(devices.begin(), devices.end(),
            [](const Entry& one, const Entry& other) { return one.name < other.name; });
  return devices;
}

void Use(const std::string& name, char** arguments) {
  const std::vector<Entry> devices = List();
  const auto device = std::find_if(devices.begin(), devices.end(),
                                   [&](const Entry& entry) { return entry.name == name; });
  if (device == devices.end()) throw Failure(fmt::format("there is no device '{}'", name));
  if (device->loaded) return;

  const char* before = std::getenv(kLoaderPath);
  const std::string loaderPath = before == nullptr ? "" : before;
  if (StartsWithFolder(loaderPath, device->folder)) {  // started anew already, and in vain
    throw Failure(fmt::format("cannot load the device '{}' from {}", name, device->folder));
  }
  StartAnew(loaderPath.empty() ? device->folder : device->folder + ":" + loaderPath, arguments);
}

}  // namespace CommandLine::Device
