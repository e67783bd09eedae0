#pragma once

#include "sip/stack/SipHandles.h"

#include <memory>
#include <sofia-sip/sdp.h>
#include <string>
#include <string_view>

/// A session description as the stack's parser reads it, and the memory that it is in. What is changed in it is
/// printed.
class SipParsedDescription
{
public:
    explicit SipParsedDescription(std::string_view description);

    /// Null: the stack cannot read it.
    sdp_session_t* get() const { return m_session; }
    /// Of what is put into it.
    su_home_t* getHome() const { return m_home.get(); }
    /// Empty when memory is out. REQUIRES: there is one.
    std::string print() const;

private:
    struct Deleter
    {
        void operator()(sdp_parser_t* parser) const { sdp_parser_free(parser); }
        void operator()(sdp_printer_t* printer) const { sdp_printer_free(printer); }
    };

    SipHome m_home;
    std::unique_ptr<sdp_parser_t, Deleter> m_parser; // its memory is the home's
    sdp_session_t* m_session = nullptr;
};
