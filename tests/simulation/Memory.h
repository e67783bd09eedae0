#pragma once

namespace Simulation
{
/// The process's heap, as the simulator wants it: what is freed is filled with a pattern and kept for a while, so that
/// who uses it falls over at once and in the same way each time; who writes to it, or frees it twice, is found; blocks
/// are counted; and one chosen allocation of the library fails. Under the address sanitizer only the last two.
///
/// A scope tells whose code runs: allocations fail inside the library alone.
class Memory
{
public:
    /// The library runs while it lives.
    class Library
    {
    public:
        Library() : m_before(s_isInLibrary) { s_isInLibrary = true; }
        ~Library() { s_isInLibrary = m_before; }
        Library(Library const&) = delete;
        Library& operator=(Library const&) = delete;

    private:
        bool m_before;
    };
    /// The simulator's own code runs while it lives: a call-out of the library.
    class Ours
    {
    public:
        Ours() : m_before(s_isInLibrary) { s_isInLibrary = false; }
        ~Ours() { s_isInLibrary = m_before; }
        Ours(Ours const&) = delete;
        Ours& operator=(Ours const&) = delete;

    private:
        bool m_before;
    };

    static bool IS_IN_LIBRARY() { return s_isInLibrary; }
    /// The n-th allocation of the library from now on fails, once; 0: none.
    static void FAIL_NTH(unsigned int n);
    /// Whether one has failed since the last FAIL_NTH.
    static bool HAS_FAILED() { return s_hasFailed; }
    /// Blocks in use.
    static long NUMBER_OF_BLOCKS() { return s_blocks; }
    /// What was wrong with a block, null if nothing was; for who looks after it. A fault is fatal unless told
    /// otherwise.
    static void CHECK_KEPT_BLOCKS();

private:
    friend class Heap;
    static thread_local bool s_isInLibrary;
    static long s_blocks;
    static unsigned int s_toFail;
    static bool s_hasFailed;
};
} // namespace Simulation
