#pragma once

#include "isdn/link/IsdnLink.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

/// The other end of a line for tests: the stack itself, its calls driven in verbs, what it hears noted line by line. It
/// clears what the near side clears.
class IsdnFarSide final : public IsdnLinkObserver
{
public:
    using Lines = std::vector<std::string>;

    IsdnFarSide(IsdnLine& line, IsdnLink::Options const& options, TYEventLoop& loop, SignallingLoop& watch)
        : m_link(line, options, loop, watch, *this)
    {
        m_link.open();
    }

    template <class Work>
    auto ask(Work const& work)
    {
        return m_link.ask(work);
    }
    /// Places a call; the request may be changed before it goes out.
    void call(char const* number, bool isComplete = true, int channel = 20, bool isExclusive = false,
              std::function<void(pri_sr*)> const& change = {})
    {
        pri_sr* const request = pri_sr_new();
        std::string called = number;
        pri_sr_set_channel(request, channel, isExclusive, 0);
        pri_sr_set_bearer(request, PRI_TRANS_CAP_SPEECH, PRI_LAYER_1_ALAW);
        pri_sr_set_called(request, called.data(), PRI_NATIONAL_ISDN, isComplete);
        if (change)
            change(request);
        ask([&](pri* stack) { return m_call = pri_new_call(stack); });
        ask([&](pri* stack) { return pri_setup(stack, m_call, request); });
        pri_sr_free(request);
    }
    void requestDigits()
    {
        ask([&](pri* stack) { return pri_setup_ack(stack, m_call, m_channel, 0, 0); });
    }
    void proceed()
    {
        ask([&](pri* stack) { return pri_proceeding(stack, m_call, m_channel, 0); });
    }
    void ring(bool isInBand = false)
    {
        ask([&](pri* stack) { return pri_acknowledge(stack, m_call, m_channel, isInBand); });
    }
    void progress()
    {
        ask([&](pri* stack) { return pri_progress(stack, m_call, m_channel, 1); });
    }
    void answer()
    {
        ask([&](pri* stack) { return pri_answer(stack, m_call, m_channel, 0); });
    }
    void clear(int cause)
    {
        ask([&](pri* stack) { return pri_hangup(stack, m_call, cause); });
    }
    void dial(char digit)
    {
        ask([&](pri* stack) { return pri_information(stack, m_call, digit); });
    }
    void key(char const* digits)
    {
        ask([&](pri* stack) { return pri_keypad_facility(stack, m_call, digits); });
    }
    void notify(int indicator)
    {
        ask([&](pri* stack) { return pri_notify(stack, m_call, 0, indicator); });
    }
    void hold(q931_call* call)
    {
        ask([&](pri* stack) { return pri_hold(stack, call); });
    }
    void retrieve(q931_call* call, int channel)
    {
        ask([&](pri* stack) { return pri_retrieve(stack, call, channel); });
    }
    IsdnLink& getLink() { return m_link; }
    q931_call* getCall() const { return m_call; }
    int getChannel() const { return m_channel & 0xff; }
    void useChannel(int channel) { m_channel = channel; }

    bool has(std::string const& text) const { return std::find(told.begin(), told.end(), text) != told.end(); }
    Lines take() { return std::exchange(told, {}); }

    Lines told;
    bool isSilent = false;                         ///< notes nothing, answers nothing
    std::function<void(pri_event const&)> onEvent; ///< before it is noted

private:
    void onLinkChange(bool isUp) override { told.push_back(isUp ? "up" : "down"); }
    void onLinkEvent(pri_event& event) override
    {
        if (isSilent)
            return;
        if (onEvent)
            onEvent(event);
        std::string text = pri_event2str(event.e) + std::strlen("PRI_EVENT_");
        switch (event.e)
        {
        case PRI_EVENT_RING:
            m_call = event.ring.call;
            m_channel = event.ring.channel;
            text += std::string(" ") + event.ring.callednum + (event.ring.complete != 0 ? "." : "");
            break;
        case PRI_EVENT_INFO_RECEIVED:
            text += std::string(" ") + event.ring.callednum;
            break;
        case PRI_EVENT_KEYPAD_DIGIT:
            text += std::string(" ") + event.digit.digits;
            break;
        case PRI_EVENT_NOTIFY:
            text += " " + std::to_string(event.notify.info);
            break;
        case PRI_EVENT_PROCEEDING:
        case PRI_EVENT_PROGRESS:
            m_channel = event.proceeding.channel;
            text += (event.proceeding.progressmask & PRI_PROG_INBAND_AVAILABLE) != 0 ? " in band" : "";
            break;
        case PRI_EVENT_RINGING:
            text += (event.ringing.progressmask & PRI_PROG_INBAND_AVAILABLE) != 0 ? " in band" : "";
            break;
        case PRI_EVENT_HANGUP_REQ:
        case PRI_EVENT_HANGUP:
        case PRI_EVENT_HANGUP_ACK:
        {
            int const cause = event.hangup.cause;
            text += " " + std::to_string(cause);
            q931_call* const ended = event.hangup.call;
            if (event.e != PRI_EVENT_HANGUP_ACK) // else the stack has it no more
                ask([&](pri* stack) { return pri_hangup(stack, ended, event.e == PRI_EVENT_HANGUP_REQ ? cause : -1); });
            break;
        }
        default:
            break;
        }
        told.push_back(text);
    }

    q931_call* m_call = nullptr;
    int m_channel = 0;
    IsdnLink m_link;
};
