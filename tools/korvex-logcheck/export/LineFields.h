#pragma once

#include <vector>

#include "export/LineShape.h"
#include "util/Logger/LayoutPieces.h"

// The fields of the pieces, in their order, up to the end of the line. Texts side by side are one.
// Throws Doubt for a piece that does not show what it stands for.
std::vector<LineField> fieldsOf(const std::vector<LayoutPiece>& pieces);
