#pragma once
// A histogram over a closed-open range [min, max): a number of bins, each with a writable
// weight, and a writable total that the filler keeps alongside. Subclasses decide where the bin
// edges lie; the bins are numbered from min upwards.
#include <vector>

namespace Zr {

template <class T>
class RnHistogram {
public:
    virtual ~RnHistogram();

    int getNbBins() const { return static_cast<int>(_bins.size()); }
    T getMin() const { return _min; }
    T getMax() const { return _max; }

    // The bin that holds value: from 0 to getNbBins() - 1 inside [min, max), a negative index
    // below min (and for NaN), getNbBins() or more from max upwards. A bin holds its lower edge
    // and not its upper one, exactly as getBinStart and getBinEnd state them.
    virtual int findBin(T value) const = 0;
    // The lower edge of bin; getBinStart(0) is min. Edges ascend with the bin index.
    virtual T getBinStart(int bin) const = 0;
    // The upper edge of bin, which is the lower edge of the next one; max for the last bin.
    virtual T getBinEnd(int bin) const = 0;
    // The width of bin that densities are measured against. By default the distance between
    // the bin's edges; a layout that knows its widths exactly may give them unrounded.
    virtual T getBinWidth(int bin) const { return getBinEnd(bin) - getBinStart(bin); }

    // The weight of a bin. The index must be a bin of the histogram.
    T getBin(int bin) const;
    void setBin(int bin, T weight);
    T& operator[](int bin);
    const T& operator[](int bin) const;

    // The total is the filler's bookkeeping, normally the sum of what went into the bins; it is
    // not recomputed from the bins.
    T getTotal() const { return _total; }
    void setTotal(T total) { _total = total; }

    // Adds weight to the bin of value and to the total when value lies in the range; returns
    // whether it did.
    bool addSample(T value, T weight = T(1));

protected:
    // nbBins at least 1 and min less than max, else an assertion failure. All bins and the
    // total start at 0.
    RnHistogram(int nbBins, T min, T max);
    RnHistogram(const RnHistogram&) = default;
    RnHistogram& operator=(const RnHistogram&) = default;

private:
    void checkBin(int bin) const;

    std::vector<T> _bins;
    T _total = T(0);
    T _min;
    T _max;
};

extern template class RnHistogram<float>;
extern template class RnHistogram<double>;

}  // namespace Zr
