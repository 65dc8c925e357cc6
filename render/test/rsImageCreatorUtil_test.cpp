// Which row functions the image creators get: the plug-in API's for the renderer's nine formats,
// and an abort or an untouched reader for anything else.
#include <gtest/gtest.h>

#include "exBase.h"
#include "rsImageCreatorUtil.h"

namespace Zr {
namespace {

using Util = RsImageCreatorUtil;

IxPixelFormat formatOf(int comps, int depth) {
    IxPixelFormat format;
    format._comps = static_cast<IxPixelFormat::Comps>(comps);
    format._depth = static_cast<IxPixelFormat::Depth>(depth);
    return format;
}

// Writers abort for a channel count outside 1, 3, 4 or a depth outside 8, 16, 32 (COMPLEX
// included), in both families. The reader aborts for a bad channel count at a known depth, while
// an unknown depth leaves the table's reader as it was. (That the nine formats get their own
// reader and writers is seen in every format that the image creator's tests resolve into.)
TEST(RsImageCreatorUtil, SelectorsTakeTheNineFormatsAndAbortOnOthers) {
    const int goodComps[] = {1, 3, 4}, badComps[] = {0, 2, 5};
    const int goodDepths[] = {8, 16, 32}, badDepths[] = {0, 7, 64};
    const Util::RowReader marker = IxRowCodec::selectReader(formatOf(4, 32));
    for (bool accumulate : {false, true}) {
        for (int d : goodDepths)
            for (int c : badComps) {
                Util::RowFunctions table;
                EXPECT_THROW(Util::selectRowWriter(table, formatOf(c, d), accumulate), ExProgramAborted);
                EXPECT_EQ(table._writer, nullptr);
                EXPECT_THROW(Util::selectRowReader(table, formatOf(c, d)), ExProgramAborted);
            }
        for (int d : badDepths)
            for (int c : goodComps) {
                Util::RowFunctions table;
                EXPECT_THROW(Util::selectRowWriter(table, formatOf(c, d), accumulate), ExProgramAborted);
                table._reader = marker;
                EXPECT_NO_THROW(Util::selectRowReader(table, formatOf(c, d)));
                EXPECT_EQ(table._reader, marker);
            }
    }
}

}  // namespace
}  // namespace Zr
