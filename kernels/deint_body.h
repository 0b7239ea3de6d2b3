// The loops of deinterlacing's line operations, written once. No #pragma once, no includes: every
// back end includes this file inside its own unnamed namespace, behind its operations.
//
// Vocabulary that a back end defines:
//
//   V                        kBytes bytes
//   kTwoAtOnce               whether averages, with so little work a step, do better two steps a
//                            turn than with addresses that move by themselves
//   Load(p), Store(p, v)     from and to any address
//   Average(a, b)            (a + b) >> 1
//   Filtered(a, b, c, d, e)  (4 (b + d) + 2 c - (a + e) + 4) >> 3, clamped to 0..255
//   Rebuilt(f, b, c, d)      f, but (5 f + 3 c + 4) >> 3 where c lies between b and d
//   Sums                     kBytes / 8 pairs of sums, one for every block of 8 columns
//   NoSums()                 zeros
//   AddDifferences(s, x, y, z)  adds the blocks' |x - y| to the first sums, |x - z| to the second
//   StoreScores(p, s)        kBytes / 8 scores: first - second - (3 second >> 4), 0 if negative

constexpr int32_t kBlocks = kBytes / 8;

// The last bytes of a line go through a step of their own, on copies.

/// Up to kBytes bytes. Whole blocks, which most rests are, go by eight bytes at a time.
void CopySome(uint8_t* to, const uint8_t* from, size_t bytes) {
    for (; bytes >= 8; bytes -= 8, to += 8, from += 8)
        memcpy(to, from, 8);
    if (bytes > 0) memcpy(to, from, bytes);
}
V LoadSome(const uint8_t* p, size_t bytes) {
    uint8_t copy[kBytes] = {};
    CopySome(copy, p, bytes);
    return Load(copy);
}
void StoreSome(uint8_t* p, V v, size_t bytes) {
    uint8_t copy[kBytes];
    Store(copy, v);
    CopySome(p, copy, bytes);
}

void AverageLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count) {
    int32_t i = 0;
    for (; kTwoAtOnce && i + 2 * kBytes <= count; i += 2 * kBytes) {
        const V x = Average(Load(a + i), Load(b + i));
        const V y = Average(Load(a + i + kBytes), Load(b + i + kBytes));
        Store(dst + i, x);
        Store(dst + i + kBytes, y);
    }
    dst += i;
    a += i;
    b += i;
    for (count -= i; count >= kBytes; count -= kBytes) {
        Store(dst, Average(Load(a), Load(b)));
        a += kBytes;
        b += kBytes;
        dst += kBytes;
    }
    if (count <= 0) return;
    const size_t rest = static_cast<size_t>(count);
    StoreSome(dst, Average(LoadSome(a, rest), LoadSome(b, rest)), rest);
}

struct MakeFiltered {
    static V Make(V a, V b, V c, V d, V e) { return Filtered(a, b, c, d, e); }
};
struct MakeRebuilt {
    static V Make(V a, V b, V c, V d, V e) { return Rebuilt(Filtered(a, b, c, d, e), b, c, d); }
};
struct MakeHalfRebuilt {
    static V Make(V a, V b, V c, V d, V e) {
        return Average(Rebuilt(Filtered(a, b, c, d, e), b, c, d), c);
    }
};

template <class How>
void FilterLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                const uint8_t* d, const uint8_t* e, int32_t count) {
    int32_t i = 0;
    for (; i + kBytes <= count; i += kBytes) {
        Store(dst + i, How::Make(Load(a + i), Load(b + i), Load(c + i), Load(d + i), Load(e + i)));
    }
    if (i >= count) return;
    const size_t rest = static_cast<size_t>(count - i);
    const auto some = [=](const uint8_t* p) { return LoadSome(p + i, rest); };
    StoreSome(dst + i, How::Make(some(a), some(b), some(c), some(d), some(e)), rest);
}

void FilterInPlace(uint8_t* kept, const uint8_t* b, uint8_t* c, const uint8_t* d, const uint8_t* e,
                   int32_t count) {
    int32_t i = 0;
    for (; i + kBytes <= count; i += kBytes) {
        const V middle = Load(c + i);
        const V made = Filtered(Load(kept + i), Load(b + i), middle, Load(d + i), Load(e + i));
        Store(kept + i, middle);
        Store(c + i, made);
    }
    if (i >= count) return;
    const size_t rest = static_cast<size_t>(count - i);
    const auto some = [=](const uint8_t* p) { return LoadSome(p + i, rest); };
    const V middle = some(c);
    const V made = Filtered(some(kept), some(b), middle, some(d), some(e));
    StoreSome(kept + i, middle, rest);
    StoreSome(c + i, made, rest);
}

/// Every line is loaded once: it is compared with the two above it.
Sums SumsOf(const uint8_t* src, size_t pitch, int32_t lines) {
    Sums sums = NoSums();
    V upper = Load(src), middle = Load(src + pitch);
    for (src += 2 * pitch; lines > 0; --lines, src += pitch) {
        const V lower = Load(src);
        AddDifferences(sums, upper, middle, lower);
        upper = middle;
        middle = lower;
    }
    return sums;
}

void Scores(const uint8_t* src, size_t pitch, int32_t blocks, int32_t lines, uint16_t* scores) {
    for (; blocks >= kBlocks; blocks -= kBlocks, src += kBytes, scores += kBlocks)
        StoreScores(scores, SumsOf(src, pitch, lines));
    if (blocks <= 0) return;
    uint8_t copy[10][kBytes] = {};
    uint16_t some[kBlocks];
    const size_t bytes = static_cast<size_t>(blocks) * 8;
    for (int32_t line = 0; line < lines + 2; ++line)
        memcpy(copy[line], src + pitch * static_cast<size_t>(line), bytes);
    StoreScores(some, SumsOf(copy[0], kBytes, lines));
    memcpy(scores, some, static_cast<size_t>(blocks) * sizeof some[0]);
}

constexpr DeintBackend MakeBackend() {
    return {AverageLine,
            FilterLine<MakeFiltered>,
            FilterInPlace,
            FilterLine<MakeRebuilt>,
            FilterLine<MakeHalfRebuilt>,
            Scores};
}
