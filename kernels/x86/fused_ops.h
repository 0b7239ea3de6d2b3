// The fused kernels' vocabulary on x86, the same for every width of its registers. No #pragma once,
// no includes: included inside a back end's unnamed namespace, behind the instructions by their
// names there. Interleaving and packing work within 128 bits, both ways alike.

/// Of 32-bit terms, one for two pixels: those above zero, and those below without their sign, each
/// cut to 65535 and given to both pixels.
struct Term {
    W up, down;
};
Term MakeTerm(D terms) {
    const W up = PackUnsigned(terms, terms);
    const D negated = Sub(Set(0), terms);
    const W down = PackUnsigned(negated, negated);
    return {LowWords(up, up), LowWords(down, down)};
}

struct Terms {
    Term red, green, blue;
};
Terms LoadTerms(const uint32_t* blue, const uint32_t* red) {
    const D b = Load(blue), r = Load(red);
    // Twice the sum of the low halves, wrapped to 16 bits.
    const D green = ShrSigned<15>(Shl<16>(Add(b, r)));
    return {MakeTerm(ShrSigned<15>(r)), MakeTerm(green), MakeTerm(ShrSigned<15>(b))};
}
