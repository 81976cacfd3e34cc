#include "ColumnListView/ColumnGeometry.h"

#include <algorithm>
#include <cmath>

ColumnLayout LayOutColumns(const std::vector<ColumnShape>& shapes) {
    ColumnLayout layout;
    layout.places.reserve(shapes.size());
    bool pushNext = false;
    for (const ColumnShape& shape : shapes) {
        const float begin = layout.end + 1;
        if (!shape.IsShown()) {
            layout.places.push_back({begin, begin, false});
            continue;
        }
        const ColumnPlace place{begin, begin + shape.width, pushNext};
        layout.places.push_back(place);
        layout.end = place.end;
        const bool isExpander = (shape.flags & CLVF_EXPANDER) != 0;
        if (isExpander || pushNext)
            layout.pushEnd = place.end;
        pushNext = isExpander || (pushNext && (shape.flags & CLVF_PASS_INDENT) != 0);
    }
    return layout;
}

BRect ColumnFrameInRow(const ColumnPlace& place, const BRect& row, float indentation, float pushEnd) {
    const float end = indentation > 0 ? std::min(place.end + indentation, pushEnd) : place.end;
    return {place.begin + indentation, row.top, end, row.bottom};
}

BRect ArrowFrame(const BRect& expanderFrame) {
    const float right = expanderFrame.right - ArrowInset;
    const float top = expanderFrame.top + std::floor((expanderFrame.Height() + 1 - ArrowSize) / 2);
    return {right - ArrowSize + 1, top, right, top + ArrowSize - 1};
}

HeaderHit HitHeader(const std::vector<ColumnShape>& shapes, const ColumnLayout& layout, float x) {
    int32 previous = -1;
    for (std::size_t i = 0; i < shapes.size(); ++i) {
        if (!shapes[i].IsShown())
            continue;
        const auto position = static_cast<int32>(i);
        const auto [begin, end, pushed] = layout.places[i];
        if (x >= begin && x < end + 1) {
            const auto resizable = [&](int32 at) {
                return at >= 0 && (shapes[static_cast<std::size_t>(at)].flags & CLVF_FIXED_WIDTH) == 0;
            };
            if (x <= begin + BorderReach && resizable(previous))
                return {HeaderHit::What::Border, previous};
            if (x >= end - BorderReach && resizable(position))
                return {HeaderHit::What::Border, position};
            return {HeaderHit::What::Header, position};
        }
        previous = position;
    }
    return {};
}
