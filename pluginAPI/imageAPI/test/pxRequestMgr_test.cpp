// The interrupt check, with the two ways a host stops work: the cancel flag and a handler.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "exRenderCancelled.h"
#include "pxRequestMgr.h"

namespace Zr {
namespace {

// A host's progress meter and stop button in one: counts checks, cancels past a budget.
struct CountingHandler : PxInterruptHandler {
    explicit CountingHandler(int budget) : _budget(budget) {}
    void onInterruptCheck() override {
        if (++_calls > _budget) throw ExRenderCancelled("stopped by the host");
    }
    int _budget, _calls = 0;
};

// Stands for a rasteriser: one check per scanline; returns the scanlines finished.
int drawRows(PxRequestMgr& mgr, int rows) {
    int done = 0;
    try {
        for (; done < rows; ++done) mgr.checkInterrupt();
    } catch (const ExRenderCancelled&) {
        return -done - 1;
    }
    return done;
}

TEST(PxRequestMgr, TheCancelFlagStopsEveryCheckUntilClearedAndGoesBeforeTheHandler) {
    PxRequestMgr mgr;
    EXPECT_EQ(drawRows(mgr, 1000), 1000);
    EXPECT_FALSE(mgr.isCancelRequested());
    mgr.requestCancel();
    EXPECT_TRUE(mgr.isCancelRequested());
    EXPECT_EQ(drawRows(mgr, 10) + drawRows(mgr, 10), -2);
    EXPECT_THROW(mgr.checkInterrupt(), ExBase);  // one of the system's failures
    const RCShdPtr<CountingHandler> handler = makeShared<CountingHandler>(25);
    mgr.setInterruptHandler(handler);
    EXPECT_EQ(drawRows(mgr, 10), -1);
    EXPECT_EQ(handler->_calls, 0);  // the flag spares the handler
    mgr.clearCancel();
    // The handler sees every check, and its failure leaves through the check.
    EXPECT_EQ(drawRows(mgr, 20), 20);
    EXPECT_EQ(drawRows(mgr, 100), -6);  // the budget of 25 ran out on the 26th check
    EXPECT_EQ(handler->_calls, 26);
    mgr.setInterruptHandler(nullptr);
    EXPECT_EQ(drawRows(mgr, 50), 50);
    EXPECT_EQ(handler->getReferenceCount(), 1);  // the manager let go of it
}

TEST(PxRequestMgr, ACancelFromAnotherThreadStopsTheWork) {
    PxRequestMgr& mgr = *PxRequestMgr::getInstance();
    EXPECT_EQ(PxRequestMgr::getInstance(), &mgr);
    std::atomic<bool> started{false};
    bool cancelled = false;
    std::thread worker([&] {
        try {
            for (;;) mgr.checkInterrupt(), started.store(true);
        } catch (const ExRenderCancelled&) {
            cancelled = true;
        }
    });
    while (!started.load()) std::this_thread::yield();
    mgr.requestCancel();
    worker.join();
    mgr.clearCancel();
    EXPECT_TRUE(cancelled);
}

}  // namespace
}  // namespace Zr
