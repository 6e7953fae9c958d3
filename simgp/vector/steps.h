// Rows as sequences of vector steps, right to the last pixel.
#ifndef SIMGP_VECTOR_STEPS_H
#define SIMGP_VECTOR_STEPS_H

#include <stddef.h>
#include <string.h>

namespace simgp::SIMD_TARGET {

// Less than a vector
// ------------------------------------------------------------------------------------------------
//
// It goes through the stack. What a vector is loaded from there should have been stored by one: the
// processor would have to wait until several stores have reached the cache. Hence the last sample of
// an odd row, the commonest part of all, is staged by whole vectors.

// Copies `count` bytes, a few.
[[gnu::noinline, maybe_unused]] static void copy_few(uint8_t *to, const uint8_t *from,
                                                     ptrdiff_t count) {
    const auto move = [&](ptrdiff_t n) __attribute__((always_inline)) {
        memcpy(to, from, size_t(n));
        to += n;
        from += n;
    };
    for (; count >= 16; count -= 16) move(16);
    if (count & 8) move(8);
    if (count & 4) move(4);
    if (count & 2) move(2);
    if (count & 1) move(1);
}

// Puts `count` >= 1 samples of `size` bytes, 1 to 4, where `vectors` vectors will be read. What is
// behind them has no meaning.
[[gnu::noinline, maybe_unused]] static void stage_few(uint8_t *to, int vectors, const uint8_t *from,
                                                      int count, int size) {
    u8v first = set_u8(0);
    if (count == 1) {
        uint32_t sample = 0;
        for (int k = 0; k < size; k++) sample |= uint32_t(from[k]) << 8 * k;
        first = set_u32(sample);
    }
    int i = 0;
    do store(to + i * bytes, first);
    while (++i < vectors);
    if (count > 1) copy_few(to, from, ptrdiff_t(size) * count);
}

// Steps
// ------------------------------------------------------------------------------------------------

// Calls step(x) for every Step of `count` >= Step samples. The last step ends at the last sample and
// may do some again.
template <int Step = bytes, class F>
inline void whole_steps(ptrdiff_t count, F step) {
    ptrdiff_t x = 0;
    for (;;) {
        // Nothing in here depends on where the row ends.
        do {
            step(x);
            x += Step;
        } while (x <= count - Step);
        if (x == count) return;
        x = count - Step;
    }
}

// The same with step(x, pixels), for which load(x) is called one step ahead: that hides the loads' latency, and
// keeps a row right whose output lies over samples. Whatever was stored by then lies before the pixels that a
// load is for.
template <int Step = bytes, class Load, class F>
inline void whole_steps_ahead(ptrdiff_t count, Load load, F step) {
    const ptrdiff_t last = count - Step;
    ptrdiff_t x = 0;
    auto pixels = load(0);
    if constexpr (moves_pointers) {
        ptrdiff_t next = last < Step ? last : Step;
        for (;;) {
            // Nothing in here depends on where the row ends.
            do {
                const auto ahead = load(next);
                step(x, pixels);
                pixels = ahead;
                x += Step;
                next += Step;
            } while (next <= last);
            // The last pixels have been loaded and stored, or loaded, or neither.
            if (x == count) return;
            if (x > last) x = last;
            next = last;
        }
    }
    for (;;) {
        const ptrdiff_t next = x + Step <= last ? x + Step : last;
        const auto ahead = load(next);
        step(x, pixels);
        if (next == x) return;
        x = next;
        pixels = ahead;
    }
}

// Samples in steps of `Step`: vector(x) does so many of them from x on, one(x) one. The last step
// ends at the last sample and may do some again.
template <int Step = bytes, class Vector, class One>
inline void in_steps(ptrdiff_t count, Vector vector, One one) {
    if (count < Step)
        for (ptrdiff_t x = 0; x < count; x++) one(x);
    else
        whole_steps<Step>(count, vector);
}

// Lines and what little is done to them
// ------------------------------------------------------------------------------------------------

// Where lines are read or written; a sample of each has so many bytes.
template <class T, int... Sizes>
struct lines {
    T *p[sizeof...(Sizes)];
};
template <int... Sizes>
using lines_in = lines<const uint8_t, Sizes...>;
template <int... Sizes>
using lines_out = lines<uint8_t, Sizes...>;

// The same lines `count` samples further on.
template <class T, int... Sizes>
[[gnu::always_inline]] inline lines<T, Sizes...> further(lines<T, Sizes...> l, ptrdiff_t count) {
    int k = 0;
    ((l.p[k++] += Sizes * count), ...);
    return l;
}
// The next step's lines.
template <int Step, class T, int... Sizes>
[[gnu::always_inline]] inline lines<T, Sizes...> next(lines<T, Sizes...> l) {
    int k = 0;
    ((l.p[k] += Sizes * Step, step_pointer(l.p[k++])), ...);
    return l;
}

// store(out.p, load(in.p)) for every Step of `count` >= Step samples. The last step ends at the last
// sample and may do some again; nothing may overlap. Where loads and stores move pointers, so many
// steps are loaded at once, so that one need not wait for the other.
template <int AtOnce = 1, int Step = bytes, class In, class Out, class Load, class Store>
[[gnu::always_inline]] inline void move_steps(ptrdiff_t count, In in, Out out, Load load,
                                              Store store) {
    if constexpr (!moves_pointers) {
        whole_steps<Step>(count,
                          [&](ptrdiff_t x) { store(further(out, x).p, load(further(in, x).p)); });
        return;
    }
    const size_t all = size_t(count) / Step;
    size_t steps = AtOnce == 2 ? all % 2 : all;
    ptrdiff_t rest = ptrdiff_t(size_t(count) % Step);
    if constexpr (AtOnce == 2)
        for (size_t twice = all / 2; twice != 0; twice--) {
            const auto a = load(in.p);
            in = next<Step>(in);
            const auto b = load(in.p);
            in = next<Step>(in);
            store(out.p, a);
            out = next<Step>(out);
            store(out.p, b);
            out = next<Step>(out);
        }
    for (;;) {
        for (; steps != 0; steps--) {
            store(out.p, load(in.p));
            in = next<Step>(in);
            out = next<Step>(out);
        }
        if (rest == 0) return;
        keep_behind(rest);
        in = further(in, rest - Step);
        out = further(out, rest - Step);
        steps = 1;
        rest = 0;
    }
}

// put(out.p, compute(pixels)) for every Step of `count` >= Step samples, where load(in.p) gives the pixels.
// Those of the next step are loaded when these have been computed and before they are stored, which keeps
// the row right where output lies over samples, as in whole_steps_ahead. The last step ends at the last sample
// and may do some again.
template <int Step, class In, class Out, class Load, class Compute, class Put>
[[gnu::always_inline]] inline void move_steps_ahead(ptrdiff_t count, In in, Out out, Load load,
                                                    Compute compute, Put put) {
    const ptrdiff_t rest = ptrdiff_t(size_t(count) % Step);
    auto pixels = load(in.p);
    in = next<Step>(in);
    size_t steps = size_t(count) / Step - 1;
    // All whole steps but the last; that one, behind which the last samples are loaded; these.
    for (int part = 0;; part++) {
        for (; steps != 0; steps--) {
            const auto done = compute(pixels);
            pixels = load(in.p);
            in = next<Step>(in);
            put(out.p, done);
            out = next<Step>(out);
        }
        if (part == 2 || (part == 1 && rest == 0)) return;
        in = further(in, part == 0 && rest != 0 ? rest - Step : -Step);
        if (part == 1) out = further(out, rest - Step);
        steps = 1;
    }
}

// Calls f(flag): where loops are that short, one for each of its values, which it knows.
template <bool Flag>
struct known_flag {
    constexpr operator bool() const { return Flag; }
};
template <class F>
[[gnu::always_inline]] inline void with_flag(bool flag, F f) {
    if constexpr (!moves_pointers)
        f(flag);
    else if (flag)
        f(known_flag<true>());
    else
        f(known_flag<false>());
}

// What move_steps does, of any number of samples; one(out.p, in.p) does one of those of less than a
// step.
template <int AtOnce = 1, int Step = bytes, class In, class Out, class Load, class Store, class One>
[[gnu::always_inline]] inline void move_line(ptrdiff_t count, In in, Out out, Load load,
                                             Store store, One one) {
    if (count < Step)
        for (ptrdiff_t x = 0; x < count; x++) one(further(out, x).p, further(in, x).p);
    else
        move_steps<AtOnce, Step>(count, in, out, load, store);
}

// The same of `pairs` >= 1 pairs: half(out.p, in.p) does half a step of them, one(out.p, in.p) one.
template <class In, class Out, class Load, class Store, class Half, class One>
inline void move_pairs(ptrdiff_t pairs, In in, Out out, Load load, Store store, Half half,
                       One one) {
    const auto at = [&](ptrdiff_t i, const auto &f) { f(further(out, i).p, further(in, i).p); };
    if (pairs < bytes / 2) {
        for (ptrdiff_t i = 0; i < pairs; i++) at(i, one);
        return;
    }
    if (pairs < bytes) {
        if (pairs > bytes / 2) at(0, half);
        return at(pairs - bytes / 2, half);
    }
    if constexpr (moves_pointers) return move_steps<2>(pairs, in, out, load, store);
    const auto whole = [&](ptrdiff_t i) { store(further(out, i).p, load(further(in, i).p)); };
    ptrdiff_t i = 0;
    for (; i + 2 * bytes <= pairs; i += 2 * bytes) {
        whole(i);
        whole(i + bytes);
    }
    if (i + bytes <= pairs) {
        whole(i);
        i += bytes;
    }
    if (i < pairs) whole(pairs - bytes);
}

}  // namespace simgp::SIMD_TARGET

#endif
