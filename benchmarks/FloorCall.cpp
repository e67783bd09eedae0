#include "FloorCall.h"

namespace
{
std::string const NUMBER = "4420791234";
std::string const LEG_NAME = "left/line 1"; // fits into a string without memory of its own, like a real leg's
} // namespace

void FloorCall::Properties::append(Property* property)
{
    property->next = &m_head;
    property->previous = m_head.previous;
    m_head.previous->next = property;
    m_head.previous = property;
}

void FloorCall::Properties::make(unsigned int count)
{
    for (unsigned int i = 0; i < count; ++i)
    {
        if (i % 7 < 3)
        {
            auto* const text = new Text;
            text->value = NUMBER;
            if (m_firstText == nullptr)
                m_firstText = text;
            append(text);
        }
        else
            append(new Number);
        m_head.previous->id = i;
    }
}

void FloorCall::Properties::assignFirstText(std::string const& value) { m_firstText->value = value; }

void FloorCall::Properties::clear()
{
    while (m_head.next != &m_head)
    {
        Property* const property = m_head.next;
        m_head.next = property->next;
        property->next->previous = property->previous;
        delete property;
    }
    m_firstText = nullptr;
}

void FloorCall::Side::clear()
{
    leg.reset();
    for (auto& event : events)
        event.reset();
    own.clear();
    peer.clear();
    call.clear();
}

void FloorCall::dial(Shape const& shape)
{
    m_dial.make(shape.ofDial);
    m_call = std::make_unique<Call>();
    m_call->name = "0x55d0c0ffee00";
    m_call->deferred = std::make_unique<Event>();
    m_call->properties.make(shape.ofCall);
    m_call->legObservers.add(m_call.get());
    join(m_caller, shape.ofCaller, LEG_NAME);
    join(m_callee, shape.ofCallee, LEG_NAME);
    m_call->legs[0] = m_caller.leg.get();
    m_call->legs[1] = m_callee.leg.get();
    m_caller.peer.make(shape.ofCallee);
    m_callee.peer.make(shape.ofCaller);
    m_caller.call.make(shape.ofCall);
    m_callee.call.make(shape.ofCall);
}

void FloorCall::join(Side& side, unsigned int ownProperties, std::string const& name)
{
    for (auto& event : side.events)
        event = std::make_unique<Event>();
    side.leg = std::make_unique<Leg>();
    side.leg->name = name;
    side.leg->properties.make(ownProperties);
    side.own.make(ownProperties);
    side.leg->observers.add(m_call.get());
    side.leg->observers.add(&side);
    m_call->observers.add(&side);
    m_call->legObservers.add(&side);
}

void FloorCall::change(bool isOfCaller, std::string const& value)
{
    Side& writer = isOfCaller ? m_caller : m_callee;
    Side& reader = isOfCaller ? m_callee : m_caller;
    for (Properties* const place : {&writer.own, &writer.leg->properties, &reader.peer})
        place->assignFirstText(value);
    post(*reader.events[0]);
}

void FloorCall::post(Event& event)
{
    event.next = m_queue;
    m_queue = &event;
    m_queue = event.next; // the turn
    event.next = nullptr;
}

void FloorCall::drop()
{
    for (bool const isOfCaller : {true, false})
        for (unsigned int i = 0; i < 3; ++i) // no data, the cause, released
            change(isOfCaller, NUMBER);
    post(*m_call->deferred);
    m_caller.clear();
    m_callee.clear();
    m_call.reset();
    m_dial.clear();
}

void FloorCall::RUN()
{
    static std::string const names[] = {"Ada Lovelace", "A. Lovelace"};
    FloorCall call;
    call.dial({});
    for (int state = 0; state < 2; ++state) // alerting, connected
        call.change(false, names[0]);
    for (unsigned int round = 0; round < 10; ++round)
        for (bool const isOfCaller : {true, false})
            call.change(isOfCaller, names[round % 2]);
    call.drop();
}
