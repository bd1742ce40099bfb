// The glow's inner loops over vectors. Included by one file for each vector type `Lanes`, after the type,
// within that file's unnamed namespace: the code must not be shared between files that are compiled for
// different processors.
//
// Loops over cells go on to the end of a vector, into the room behind a row; loops over pixels never do.

void KeepHighlights(CellRow cells, std::int32_t count) noexcept {
    const Lanes floor = Lanes::All(kHighlightFloor);
    for (std::int32_t i = 0; i < count; i += Lanes::kCells, cells += Lanes::kSize) {
        const Lanes cell = Lanes::Load(cells);
        const Lanes half = SaturatingDifference(Luma(cell), floor);
        const Lanes above = half + half;
        const Lanes t = SaturatingSum(above, MulHigh(above, Lanes::All(kHighlightStretch)));
        const Lanes quarter = MulHigh(MulHigh(t, t), Lanes::All(49151) - ShiftRight<1>(t));
        Store(cells, MulHigh(cell, ShiftLeft<2>(quarter)));
    }
}

// With the number of pairs known, weights and pointers stay where the processor reaches them at once.
template <int kPairs>
void FilterPairs(ConstCellRow middle, const ConstCellRow* before, const ConstCellRow* after, CellRow out,
                 std::int32_t count, const GlowTaps& taps) noexcept {
    const Lanes middleWeight = Lanes::All(taps.middle);
    Lanes weights[kPairs];
    ConstCellRow befores[kPairs], afters[kPairs];
    for (std::size_t p = 0; p < kPairs; ++p) {
        weights[p] = Lanes::All(taps.pair[p]);
        befores[p] = before[p];
        afters[p] = after[p];
    }
    for (std::int32_t i = 0; i < count * kCellLanes; i += Lanes::kSize) {
        Lanes sum = MulHigh(Lanes::Load(middle + i), middleWeight);
        for (int p = 0; p < kPairs; ++p) {
            sum = sum + MulHigh(Lanes::Load(befores[p] + i) + Lanes::Load(afters[p] + i), weights[p]);
        }
        Store(out + i, sum);
    }
}

void Filter(ConstCellRow middle, const ConstCellRow* before, const ConstCellRow* after, CellRow out,
            std::int32_t count, const GlowTaps& taps) noexcept {
    const auto filter = taps.pairs == 2 ? FilterPairs<2> : FilterPairs<GlowTaps::kMostPairs>;
    filter(middle, before, after, out, count, taps);
}

Lanes ThreeToOne(Lanes near, Lanes far) noexcept {
    return Mean(near, Mean(near, far));
}

void HalveRows(const ConstCellRow rows[4], CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; i += Lanes::kSize) {
        const Lanes inner = Mean(Lanes::Load(rows[1] + i), Lanes::Load(rows[2] + i));
        const Lanes outer = Mean(Lanes::Load(rows[0] + i), Lanes::Load(rows[3] + i));
        Store(out + i, ThreeToOne(inner, outer));
    }
}

void Between(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; i += Lanes::kSize) {
        Store(out + i, ThreeToOne(Lanes::Load(near + i), Lanes::Load(far + i)));
    }
}

void Mix(CellRow out, ConstCellRow other, std::int32_t count, std::uint16_t ownShare,
         std::uint16_t otherShare) noexcept {
    const Lanes own = Lanes::All(ownShare), others = Lanes::All(otherShare);
    for (std::int32_t i = 0; i < count * kCellLanes; i += Lanes::kSize) {
        Store(out + i, MulHigh(Lanes::Load(out + i), own) + MulHigh(Lanes::Load(other + i), others));
    }
}

void Lift(CellRow cells, std::int32_t count, std::uint16_t strength) noexcept {
    for (std::int32_t i = 0; i < count * kCellLanes; i += Lanes::kSize) {
        const Lanes v = Lanes::Load(cells + i);
        Store(cells + i, MulHigh(v + MulHigh(v + v, Lanes::All(32767) - v), Lanes::All(strength)));
    }
}

void Approach(ConstCellRow near, ConstCellRow far, CellRow out, std::int32_t count,
              std::int16_t share) noexcept {
    const Lanes shares = Lanes::All(share);
    for (std::int32_t i = 0; i < count * kCellLanes; i += Lanes::kSize) {
        Store(out + i, Approached(Lanes::Load(near + i), Lanes::Load(far + i), shares));
    }
}

void Screen(const Bgra* in, Bgra* out, ConstCellRow veil, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x <= width - kScreenPixels; x += kScreenPixels, veil += kScreenPixels * kCellLanes) {
        ScreenPixels(in + x, out + x, LoadVeil(veil));
    }
    kPlainGlowKernels.screen(in + x, out + x, veil, width - x);
}

void ScreenFourfold(const Bgra* in, Bgra* out, ConstCellRow veil, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x <= width - kScreenPixels; x += kScreenPixels, veil += kScreenPixels / 4 * kCellLanes) {
        ScreenPixels(in + x, out + x, SpreadVeil(veil));
    }
    kPlainGlowKernels.screenFourfold(in + x, out + x, veil, width - x);
}

constexpr GlowKernels kKernels = {AverageBlocks, KeepHighlights, Filter,      HalveRows,
                                  HalveAlong,    Between,        DoubleAlong, Mix,
                                  Lift,          Approach,       Screen,      ScreenFourfold};
