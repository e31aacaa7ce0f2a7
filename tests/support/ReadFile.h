/// \file
#pragma once

#include <fstream>
#include <iterator>
#include <string>

/// \return what a file holds
inline std::string ReadFile(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}
