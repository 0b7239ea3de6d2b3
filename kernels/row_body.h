// The loops of the row moves, written once. No #pragma once, no includes: every back end includes
// this file inside its own unnamed namespace, behind its operations.
//
// Vocabulary that a back end defines:
//
//   V                        kBytes bytes
//   Load(p), Store(p, v)     from and to any address
//   Reverse<n>(v)            the last pixel of n bytes first
//   StorePairs(p, a, b)      the bytes of a and b by turns, 2 kBytes
//   LoadPairs(p, &a, &b)     the same apart
//
// What is left behind the whole steps goes through one more, on copies.

template <int kPixel>
void ReverseRow(uint8_t* dst, const uint8_t* src, size_t pixels) {
    size_t left = pixels * kPixel;
    for (; left >= kBytes; left -= kBytes, src += kBytes)
        Store(dst + left - kBytes, Reverse<kPixel>(Load(src)));
    if (left == 0) return;
    uint8_t copy[kBytes] = {};
    memcpy(copy + kBytes - left, src, left);
    Store(copy, Reverse<kPixel>(Load(copy)));
    memcpy(dst, copy, left);
}

void JoinRow(uint8_t* pairs, const uint8_t* first, const uint8_t* second, size_t count) {
    for (; count >= kBytes; count -= kBytes) {
        StorePairs(pairs, Load(first), Load(second));
        first += kBytes;
        second += kBytes;
        pairs += 2 * kBytes;
    }
    if (count == 0) return;
    uint8_t copy[2][kBytes] = {}, joined[2 * kBytes];
    memcpy(copy[0], first, count);
    memcpy(copy[1], second, count);
    StorePairs(joined, Load(copy[0]), Load(copy[1]));
    memcpy(pairs, joined, 2 * count);
}

void SplitRow(uint8_t* first, uint8_t* second, const uint8_t* pairs, size_t count) {
    V a, b;
    for (; count >= 2 * kBytes; count -= 2 * kBytes) {
        V c, d;
        LoadPairs(pairs, &a, &b);
        LoadPairs(pairs + 2 * kBytes, &c, &d);
        Store(first, a);
        Store(first + kBytes, c);
        Store(second, b);
        Store(second + kBytes, d);
        first += 2 * kBytes;
        second += 2 * kBytes;
        pairs += 4 * kBytes;
    }
    for (; count >= kBytes; count -= kBytes) {
        LoadPairs(pairs, &a, &b);
        Store(first, a);
        Store(second, b);
        first += kBytes;
        second += kBytes;
        pairs += 2 * kBytes;
    }
    if (count == 0) return;
    uint8_t joined[2 * kBytes] = {}, copy[2][kBytes];
    memcpy(joined, pairs, 2 * count);
    LoadPairs(joined, &a, &b);
    Store(copy[0], a);
    Store(copy[1], b);
    memcpy(first, copy[0], count);
    memcpy(second, copy[1], count);
}

constexpr RowBackend MakeBackend() {
    return {ReverseRow<1>, ReverseRow<2>, ReverseRow<4>, JoinRow, SplitRow};
}
