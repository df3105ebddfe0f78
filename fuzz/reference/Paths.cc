#include "reference/Paths.h"

namespace reference {

namespace {

bool endsInSeparator(const std::string& path) {
    return !path.empty() && path.back() == '/';
}

std::string lastElement(const std::string& path) {
    return path.substr(path.rfind('/') == path.npos ? 0 : path.rfind('/') + 1);
}

// One deletion of a ".." element; false when there is none.
bool deleteDotDot(std::string& path) {
    for (std::size_t at = 0; at < path.size(); ++at) {
        const bool startsElement = at == 0 || path[at - 1] == '/';
        if (!startsElement || path.compare(at, 2, "..") != 0) continue;
        if (at + 2 == path.size()) {
            path.erase(at > 1 ? at - 1 : at);
            return true;
        }
        if (path[at + 2] == '/') {
            path.erase(at, 3);
            return true;
        }
    }
    return false;
}

}  // namespace

std::string join(const std::string& path, const std::string& element) {
    if (element.empty()) return path;
    const std::string left = endsInSeparator(path) ? path : path + "/";
    const std::size_t first = element.find_first_not_of('/');
    return first == element.npos ? left : left + element.substr(first);
}

std::string leaf(const std::string& path) {
    std::string rest = path;
    while (endsInSeparator(rest))
        rest.pop_back();
    return rest.empty() ? "/" : lastElement(rest);
}

std::string parent(const std::string& path) {
    std::string rest = path;
    while (endsInSeparator(rest))
        rest.pop_back();
    if (rest.empty()) return path.empty() ? "" : "/";
    if (rest.find('/') == rest.npos) return "";
    while (!endsInSeparator(rest))
        rest.pop_back();
    while (endsInSeparator(rest))
        rest.pop_back();
    return rest.empty() ? "/" : rest;
}

std::string extension(const std::string& path) {
    const std::string last = lastElement(path);
    const std::size_t dot = last.rfind('.');
    return dot == last.npos ? "" : last.substr(dot + 1);
}

std::string baseWithoutExtension(const std::string& path) {
    const std::string last = lastElement(path);
    const std::size_t dot = last.rfind('.');
    return dot == 0 || dot == last.npos ? last : last.substr(0, dot);
}

std::string withoutTrailingSeparators(std::string path) {
    while (path.size() > 1 && endsInSeparator(path))
        path.pop_back();
    return path;
}

std::string withoutDotDot(std::string path) {
    while (deleteDotDot(path)) {
    }
    return path;
}

std::string withoutDoubleSeparators(std::string path) {
    while (path.find("//") != path.npos)
        path.erase(path.find("//"), 1);
    return path;
}

std::vector<std::string> pieces(const std::string& list, char separator) {
    std::vector<std::string> found(1);
    for (const char c : list) {
        if (c == separator) {
            found.emplace_back();
        } else {
            found.back() += c;
        }
    }
    std::vector<std::string> kept;
    for (const std::string& piece : found) {
        if (!piece.empty()) kept.push_back(piece);
    }
    return kept;
}

}  // namespace reference
