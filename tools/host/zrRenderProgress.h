#pragma once
// Progress and cancellation of a render, through the renderer's interrupt checks.
//
// The renderer asks the installed interrupt handler once per scanline of each triangle. This
// handler throws ExRenderCancelled as soon as Ctrl-C has been pressed (catchInterrupts installs
// the signal handler; a second Ctrl-C ends the process at once), and now and then redraws a
// progress bar on standard error from the tiles done so far. The bar is drawn only when asked
// to, which a host does when standard error is a terminal.
#include <atomic>
#include <chrono>
#include <mutex>

#include "pxInterruptHandler.h"

namespace Zr {

class ZrRenderProgress : public PxInterruptHandler {
public:
    explicit ZrRenderProgress(bool showBar) : _showBar(showBar) {}

    // From now on Ctrl-C sets the interrupted flag instead of ending the process.
    static void catchInterrupts();
    // Whether Ctrl-C has been pressed since catchInterrupts.
    static bool interrupted();

    void onInterruptCheck() override;

    // The frame about to be rendered (counted from 1) of frameCount, in tileCount tiles.
    void startFrame(int frame, int frameCount, int tileCount);
    // Called by the rendering threads as each tile is done.
    void tileDone();
    // Clears the bar's line.
    void finish();

private:
    void draw(bool force);

    const bool _showBar;
    std::atomic<int> _tilesDone{0};
    std::atomic<unsigned> _checks{0};
    int _tileCount = 1;
    int _frame = 1;
    int _frameCount = 1;
    std::mutex _drawing;
    std::chrono::steady_clock::time_point _lastDrawn{};
    bool _drawn = false;
};

}  // namespace Zr
