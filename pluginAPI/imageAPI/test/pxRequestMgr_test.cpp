// The interrupt check, with the two ways a host stops work: the cancel flag and a handler.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "exRenderCancelled.h"
#include "pxRequestMgr.h"

namespace Zr {
namespace {

// A host's progress meter and stop button in one: counts checks, cancels past a budget.
class CountingHandler : public PxInterruptHandler {
public:
    explicit CountingHandler(int budget) : _budget(budget) {}
    void onInterruptCheck() override {
        if (++_calls > _budget) throw ExRenderCancelled("stopped by the host");
    }
    int _budget;
    int _calls = 0;
};

// Stands for a rasteriser: one check per scanline; returns the scanlines finished.
int drawRows(PxRequestMgr& mgr, int rows, int* finished = nullptr) {
    int done = 0;
    for (int y = 0; y < rows; ++y, ++done) {
        if (finished) *finished = done;
        mgr.checkInterrupt();
    }
    return done;
}

TEST(PxRequestMgr, TheCancelFlagStopsEveryCheckUntilCleared) {
    PxRequestMgr mgr;
    EXPECT_EQ(drawRows(mgr, 1000), 1000);
    mgr.requestCancel();
    for (int attempt = 0; attempt < 2; ++attempt) EXPECT_THROW(drawRows(mgr, 10), ExRenderCancelled);
    // One of the system's failures: a host catching ExBase catches it.
    EXPECT_THROW(mgr.checkInterrupt(), ExBase);
    mgr.clearCancel();
    EXPECT_EQ(drawRows(mgr, 10), 10);
}

TEST(PxRequestMgr, AHandlerSeesEveryCheckAndItsFailureLeavesThroughTheCheck) {
    PxRequestMgr mgr;
    const RCShdPtr<CountingHandler> handler = makeShared<CountingHandler>(25);
    mgr.setInterruptHandler(handler);
    EXPECT_EQ(drawRows(mgr, 20), 20);
    int finished = 0;
    EXPECT_THROW(drawRows(mgr, 100, &finished), ExRenderCancelled);
    EXPECT_EQ(finished, 5);  // the budget of 25 ran out on the 26th check
    EXPECT_EQ(handler->_calls, 26);

    // The cancel flag goes first and spares the handler.
    mgr.requestCancel();
    EXPECT_THROW(mgr.checkInterrupt(), ExRenderCancelled);
    EXPECT_EQ(handler->_calls, 26);
    mgr.clearCancel();

    mgr.setInterruptHandler(nullptr);
    EXPECT_EQ(drawRows(mgr, 50), 50);
    EXPECT_EQ(handler->_calls, 26);
    EXPECT_EQ(handler->getReferenceCount(), 1);  // the manager let go of it
}

TEST(PxRequestMgr, ACancelFromAnotherThreadStopsTheWork) {
    PxRequestMgr& mgr = *PxRequestMgr::getInstance();
    EXPECT_EQ(PxRequestMgr::getInstance(), &mgr);
    std::atomic<bool> started{false};
    bool cancelled = false;
    std::thread worker([&] {
        try {
            for (;;) {
                mgr.checkInterrupt();
                started.store(true);
            }
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
