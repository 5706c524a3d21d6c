// LayoutPicture: draws the segments and windows of a block and the order of their computation.
#ifndef MORVIK_APP_INFO_LAYOUTPICTURE_H
#define MORVIK_APP_INFO_LAYOUTPICTURE_H

#include <vector>

#include "BlockLayout.h"
#include "report/Drawing.h"

namespace morvik {

/// One panel for each division of the block: unit counts that divide it alike share one. Lines are segments; boxes are
/// windows, numbered in processing order and shaded by row.
report::Drawing pictureOf(const BlockLayout& layout);

}  // namespace morvik

#endif
