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
// included), in both families and from the replacing selector. The reader aborts for a bad
// channel count at a known depth, while an unknown depth leaves the table's reader as it was.
// Every known format selects the reader, the replacing and the adding writer of its format.
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
                EXPECT_THROW(Util::getReplacingRowWriter(formatOf(c, d)), ExProgramAborted);
                EXPECT_THROW(Util::selectRowReader(table, formatOf(c, d)), ExProgramAborted);
            }
        for (int d : badDepths)
            for (int c : goodComps) {
                Util::RowFunctions table;
                EXPECT_THROW(Util::selectRowWriter(table, formatOf(c, d), accumulate), ExProgramAborted);
                EXPECT_THROW(Util::getReplacingRowWriter(formatOf(c, d)), ExProgramAborted);
                table._reader = marker;
                EXPECT_NO_THROW(Util::selectRowReader(table, formatOf(c, d)));
                EXPECT_EQ(table._reader, marker);
            }
    }
    for (int d : goodDepths)
        for (int c : goodComps) {
            const IxPixelFormat format = formatOf(c, d);
            Util::RowFunctions replacing, adding;
            Util::selectRowReader(replacing, format);
            Util::selectRowWriter(replacing, format, false);
            Util::selectRowWriter(adding, format, true);
            EXPECT_EQ(replacing._reader, IxRowCodec::selectReader(format));
            EXPECT_EQ(replacing._writer, IxRowCodec::selectWriter(format));
            EXPECT_EQ(adding._writer, IxRowCodec::selectAddingWriter(format));
            EXPECT_EQ(Util::getReplacingRowWriter(format), replacing._writer);
        }
}

}  // namespace
}  // namespace Zr
