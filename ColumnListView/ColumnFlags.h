// What a column may do and how it sorts: shared by the columns, the list and the rules that know no window.
#pragma once

#include "platform/Types.h"

constexpr uint32 CLVF_SORTABLE = 0x001;       // can be a sort key; header clicks sort by it
constexpr uint32 CLVF_FIXED_POSITION = 0x002; // its drag group cannot be dragged
constexpr uint32 CLVF_FIXED_WIDTH = 0x004;    // the person cannot resize it
constexpr uint32 CLVF_KEEP_FIRST = 0x008;     // stays before every column without this flag
constexpr uint32 CLVF_KEEP_LAST = 0x010;      // stays after every column without this flag
constexpr uint32 CLVF_HIDDEN = 0x020;         // not shown; takes no space
constexpr uint32 CLVF_JOIN_HEADER = 0x040;    // no header divider between it and the next shown column
constexpr uint32 CLVF_MOVE_WITH_NEXT = 0x080; // one drag group with the next column in display order
constexpr uint32 CLVF_EXPANDER = 0x100;       // holds the outline's arrows; at most one in a list
constexpr uint32 CLVF_PASS_INDENT = 0x200; // when pushed, passes the indentation on to the next shown column
constexpr uint32 CLVF_TRUNCATE_HEADER = 0x400; // a label that does not fit is shortened, not clipped
constexpr uint32 CLVF_WIDTH_NOTICE = 0x800;    // every row is told when this column's width changes

enum class CLVSortMode : int32 { Ascending = 0, Descending = 1, None = 2 };
