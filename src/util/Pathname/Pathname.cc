#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include "base/Assert.h"

#include <algorithm>

inline namespace korvex {

const char Pathname::sep = '/';
const Pathname Pathname::root("/");
const Pathname Pathname::cur(".");
const Pathname Pathname::parent("..");

namespace {

// Not the public constant, because that one may not be constructed yet in a static initialiser, or
// may be destroyed in an exit handler.
constexpr char kSep = '/';

}  // namespace

Pathname::Pathname(const DirectoryEntry& entry) : std::string(entry.name()) {}

Pathname& Pathname::operator/=(const std::string& s) {
    if (s.empty()) return *this;
    const std::string element(s, std::min(s.find_first_not_of(kSep), s.size()));  // s may be *this
    addTrailingSep();
    append(element);
    return *this;
}

Pathname& Pathname::operator/=(const char* s) {
    return *this /= std::string(s);
}

Pathname& Pathname::operator/=(const DirectoryEntry& entry) {
    return *this /= entry.name();
}

Pathname Pathname::operator/(const std::string& s) const {
    return Pathname(*this) /= s;
}

Pathname Pathname::operator/(const char* s) const {
    return Pathname(*this) /= s;
}

Pathname Pathname::operator/(const DirectoryEntry& entry) const {
    return Pathname(*this) /= entry;
}

bool Pathname::isAbsolute() const {
    return !empty() && front() == kSep;
}

bool Pathname::containsSep() const {
    return find(kSep) != npos;
}

Pathname Pathname::toLeaf() const {
    const std::size_t last = find_last_not_of(kSep);
    if (last == npos) return Pathname(&kSep, 1);
    const std::size_t before = rfind(kSep, last);
    const std::size_t x = before == npos ? 0 : before + 1;
    const std::size_t p = last + 1;
    KORVEX_ASSERT(x < p);
    return substr(x, p - x);
}

Pathname Pathname::toParent() const {
    Pathname result(*this);
    result.stripElement();
    return result;
}

std::string Pathname::ext() const {
    const std::size_t mark = find_last_of("/.");
    return mark == npos || (*this)[mark] == kSep ? std::string() : substr(mark + 1);
}

std::string Pathname::basenameWithoutExt() const {
    if (empty() || back() == kSep) return {};
    const std::size_t before = rfind(kSep);
    const std::size_t start = before == npos ? 0 : before + 1;
    const std::size_t dot = rfind('.');
    return dot == npos || dot <= start ? substr(start) : substr(start, dot - start);
}

void Pathname::addTrailingSep() {
    if (empty() || back() != kSep) push_back(kSep);
}

void Pathname::removeTrailingSeps() {
    const std::size_t last = find_last_not_of(kSep);
    if (!empty()) resize(last == npos ? 1 : last + 1);
}

void Pathname::stripElement() {
    if (empty()) return;
    const std::size_t last = find_last_not_of(kSep);
    const std::size_t before = last == npos ? npos : rfind(kSep, last);
    const std::size_t parentLast = before == npos ? npos : find_last_not_of(kSep, before);
    if (parentLast != npos) {
        resize(parentLast + 1);
    } else {
        resize(front() == kSep ? 1 : 0);
    }
}

// An element ".." is deleted with the separator after it; the last element, with the separator
// before it. The text around a deleted element never forms another ".." element, so one pass is
// enough.
void Pathname::removeDotDotSlash() {
    std::string kept;
    kept.reserve(size());
    for (std::size_t start = 0; start < size();) {
        const std::size_t end = std::min(find(kSep, start), size());
        const bool last = end == size();
        if (compare(start, end - start, "..") != 0) {
            kept.append(*this, start, end - start + (last ? 0 : 1));
        } else if (last && kept.size() > 1) {
            kept.pop_back();
        }
        start = end + 1;
    }
    assign(kept);
}

void Pathname::removeDoubleSeps() {
    erase(std::unique(begin(), end(), [](char a, char b) { return a == kSep && b == kSep; }),
          end());
}

Pathname Pathname::removeDoubleSeps(const Pathname& p) {
    Pathname result(p);
    result.removeDoubleSeps();
    return result;
}

Pathname Pathname::removeDoubleSeps(const char* p) {
    return removeDoubleSeps(Pathname(p));
}

}  // namespace korvex
