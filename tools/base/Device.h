#pragma once

#include <string>
#include <vector>

/// The devices that the program can run on: folders of platform libraries, between which the
/// dynamic loader chooses.
namespace CommandLine::Device {

struct Entry {
  std::string name;
  std::string folder;
  bool loaded;
};

/// \return the devices that are installed beside the host platform, by name.
std::vector<Entry> List();

/// Makes the program run on a device: returns when it does, else starts the program anew with the
/// same arguments. Throws a `Failure` when the device can't be loaded.
/// \param name the name of a device in `List`
/// \param arguments the program's own, ended by a null
void Use(const std::string& name, char** arguments);

}  // namespace CommandLine::Device
