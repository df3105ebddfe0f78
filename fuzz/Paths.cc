#include <korvex/util/Pathname.h>

#include "Check.h"
#include "Input.h"
#include "reference/Paths.h"

// A path and an element to join: every operation on the text as the slow way does it.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Input input(data, size);
    const Pathname path(input.line());
    const std::string other = input.rest();

    checkSame(path / other, reference::join(path, other), "/");
    checkSame(path.toLeaf(), reference::leaf(path), "toLeaf");
    checkSame(path.toParent(), reference::parent(path), "toParent");
    checkSame(path.ext(), reference::extension(path), "ext");
    checkSame(path.basenameWithoutExt(), reference::baseWithoutExtension(path),
              "basenameWithoutExt");
    check(path.isAbsolute() == (path.compare(0, 1, "/") == 0), "isAbsolute");
    check(path.containsSep() == (path.find('/') != path.npos), "containsSep");
    Pathname changed = path;
    changed.removeTrailingSeps();
    checkSame(changed, reference::withoutTrailingSeparators(path), "removeTrailingSeps");
    changed = path;
    changed.addTrailingSep();
    checkSame(changed, path + (path.empty() || path.back() != '/' ? "/" : ""), "addTrailingSep");
    changed = path;
    changed.removeDotDotSlash();
    checkSame(changed, reference::withoutDotDot(path), "removeDotDotSlash");
    checkSame(Pathname::removeDoubleSeps(path), reference::withoutDoubleSeparators(path),
              "removeDoubleSeps");

    const PathList list(upToNul(other), ':');
    const auto pieces = reference::pieces(upToNul(other), ':');
    check(list.size() == pieces.size(), "how many pieces");
    for (std::size_t i = 0; i < pieces.size(); ++i)
        checkSame(list[i], pieces[i], "a piece");
    return 0;
}
