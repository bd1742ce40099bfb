// The conversions over vectors. Included by one file for each vector type, after its operations on quarters of 16
// bytes, within that file's unnamed namespace: the code must not be shared between files that are compiled for
// different processors.
//
// A quarter holds four pixels as 32-bit numbers or two pixels as four 16-bit channels each.

// Coefficients of two neighbouring 16-bit numbers, as a word.
constexpr std::int32_t Pair(std::int32_t low, std::int32_t high) noexcept {
    return static_cast<std::int32_t>((static_cast<std::uint32_t>(high) << 16) |
                                     (static_cast<std::uint32_t>(low) & 0xFFFFu));
}

// The coefficients are wider than 16 bits; parts of them are applied to four times the numbers.
void ToBgra(const std::uint8_t* source, Bgra* out, std::int32_t width, std::uint8_t alpha) noexcept {
    std::int32_t x = 0;
    for (; x + kPixels <= width; x += kPixels) {
        const Vector groups = LoadGroups(source + std::ptrdiff_t{x} * 2);  // Y0 Cb Y1 Cr
        const Vector fourfold = ShiftLeft16<2>(groups);
        const Vector chroma = Words<1, 3, 1, 3>(groups);
        const Vector lumaCr = Words<0, 3, 2, 3>(fourfold), lumaCb = Words<0, 1, 2, 1>(fourfold);
        const auto sum = [&](Vector pair, std::int32_t own, std::int32_t both, std::int32_t bias) {
            return ShiftRight32<16>(
                Add32(Add32(MulAdd(pair, All32(own)), MulAdd(chroma, All32(both))), All32(bias)));
        };
        const Vector red = sum(lumaCr, Pair(19071, 26148), Pair(0, 3), -14608761);
        const Vector green = sum(lumaCr, Pair(19071, -13320), Pair(-25690, -1), 8887730);
        const Vector blue = sum(lumaCb, Pair(19071, 32767), Pair(1118, 0), -18140365);
        // Four times blue, red, green and alpha each, clamped to bytes, then in turn.
        const Vector bytes = PackUnsigned(PackSigned(blue, red), PackSigned(green, All32(alpha)));
        const Vector pairs = InterleaveBytes(bytes);
        StorePixels(out + x, InterleaveWords(pairs));
    }
    kPlainYcbcrKernels.toBgra(source + std::ptrdiff_t{x} * 2, out + x, width - x, alpha);
}

void FromBgra(const Bgra* in, std::uint8_t* destination, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x + kPixels <= width; x += kPixels) {
        const Vector pixels = LoadPixels(in + x);
        const Vector low = LowChannels(pixels), high = HighChannels(pixels);  // blue, green, red, alpha
        // 33030 G as 65536 G - 32506 G: the coefficient then fits, and G is added behind the shift.
        const Vector weights = Alternating(Pair(6423, -32506), Pair(16843, 0));
        const Vector biases =
            Alternating(0x108000, 0x100000);  // the left pixel is rounded, the right one truncated
        const Vector lowLuma = MulAdd(low, weights), highLuma = MulAdd(high, weights);
        const Vector sums = Add32(EvenWords(lowLuma, highLuma), OddWords(lowLuma, highLuma));
        const Vector green = And(ShiftRight32<8>(pixels), All32(0xFF));
        const Vector luma = Add32(ShiftRight32<16>(Add32(sums, biases)), green);

        const Vector both = Add16(LeftPixels(low, high), RightPixels(low, high));
        const Vector cb = MulAdd(both, Alternating(Pair(28770, -19071), Pair(-9699, 0)));
        const Vector cr = MulAdd(both, Alternating(Pair(-4653, -24117), Pair(28770, 0)));
        const Vector chroma =
            ShiftRight32<17>(Add32(Add32(EvenWords(cb, cr), OddWords(cb, cr)), All32(-0xFF0000)));
        // Cb Cb Cr Cr
        const Vector inTurn = Words<0, 2, 1, 3>(PackSigned(And(chroma, All32(0xFF)), All32(0)));
        const Vector lumas = PackSigned(And(luma, All32(0xFF)), All32(0));
        StoreGroups(destination + std::ptrdiff_t{x} * 2, Or(lumas, ShiftLeft16<8>(inTurn)));
    }
    kPlainYcbcrKernels.fromBgra(in + x, destination + std::ptrdiff_t{x} * 2, width - x);
}

constexpr YcbcrKernels kKernels = {ToBgra, FromBgra};
