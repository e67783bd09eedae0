#pragma once

#include <cstdio>
#include <span>
#include <string>

/// The frames of a D channel in a file that packet analysers read (the format of libpcap, link type 177: LAPD as the
/// Linux kernel hands it out, with a header of 16 octets that tells the direction).
class Capture
{
public:
    Capture() = default;
    ~Capture();
    Capture(Capture const&) = delete;
    Capture& operator=(Capture const&) = delete;

    /// Whether the file can be written.
    bool open(std::string const& file);
    /// `isNetworks`: that side sent it. Nothing happens before `open`.
    void write(std::span<unsigned char const> frame, bool isNetworks);

private:
    std::FILE* m_file = nullptr;
};
