// LayoutPicture: how a block is cut into segments and windows, and the order in which they are computed.
#ifndef MORVIK_APP_INFO_LAYOUTPICTURE_H
#define MORVIK_APP_INFO_LAYOUTPICTURE_H

#include <vector>

#include "BlockLayout.h"
#include "report/Drawing.h"

namespace morvik {

/// A panel for each way in which the block is divided: unit counts that divide it alike share one. A line is a segment,
/// a box a window with its number in the order, the shade its row.
report::Drawing pictureOf(const BlockLayout& layout);

}  // namespace morvik

#endif
