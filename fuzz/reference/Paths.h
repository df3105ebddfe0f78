#pragma once

#include <string>
#include <vector>

// Paths once more, by splitting and by rescanning from the start after each change.
namespace reference {

std::string join(const std::string& path, const std::string& element);
std::string leaf(const std::string& path);
std::string parent(const std::string& path);
std::string extension(const std::string& path);
std::string baseWithoutExtension(const std::string& path);
std::string withoutTrailingSeparators(std::string path);
std::string withoutDotDot(std::string path);
std::string withoutDoubleSeparators(std::string path);
std::vector<std::string> pieces(const std::string& list, char separator);

}  // namespace reference
