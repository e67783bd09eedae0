#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

/// The memory work that a TwoPartyCall cannot avoid, and nothing else: the floor under its cost.
///
/// It makes and frees what a call keeps, in blocks of the size that the library's objects have: the call, two legs,
/// their events, and every property that is stored once the call is up, as a node with a virtual destructor in a list
/// (its text copied). A change assigns the value in the three places where it is kept: the writer's view, its leg and
/// the peer's view; it searches, compares, filters, logs and decides nothing. An event is a node put into a queue and
/// taken out, a registration an entry in an array.
class FloorCall
{
public:
    /// How many properties are stored of each side, of the call, and of the dial that the adapter remembers.
    struct Shape
    {
        unsigned int ofCaller = 12;
        unsigned int ofCallee = 11;
        unsigned int ofCall = 3;
        unsigned int ofDial = 13;
    };

    FloorCall() = default;
    FloorCall(FloorCall const&) = delete;
    FloorCall& operator=(FloorCall const&) = delete;

    /// Up to and with the other side's acceptance.
    void dial(Shape const& shape);
    /// One changed property of one side: three assignments and one event.
    void change(bool isOfCaller, std::string const& value);
    void drop();
    /// All of a TwoPartyCall that talks and hangs up.
    static void RUN();

private:
    struct Property
    {
        virtual ~Property() = default;
        Property* next = nullptr;
        Property* previous = nullptr;
        unsigned int id = 0;
    };
    struct Text : Property
    {
        std::string value;
    };
    struct Number : Property
    {
        unsigned long long value = 0;
    };
    /// A circular list that owns its nodes.
    class Properties
    {
    public:
        Properties() { m_head.next = m_head.previous = &m_head; }
        ~Properties() { clear(); }
        Properties(Properties const&) = delete;
        Properties& operator=(Properties const&) = delete;
        /// Three of seven are texts, as of a side's number, name, network and its indicators.
        void make(unsigned int count);
        void assignFirstText(std::string const& value);
        void clear();

    private:
        void append(Property* property);

        struct Head : Property
        {
        };
        Head m_head;
        Text* m_firstText = nullptr;
    };
    struct Event
    {
        virtual ~Event() = default;
        Event* next = nullptr;
        void* owner = nullptr;
        unsigned char rest[40];
    };
    struct Registrations
    {
        void* observers[4];
        unsigned int counts[4];
        unsigned int number = 0;
        void add(void* observer)
        {
            observers[number] = observer;
            counts[number++] = 1;
        }
    };
    struct Leg
    {
        std::string name;
        Registrations observers;
        Properties properties;
    };
    struct Call
    {
        std::string name;
        Leg* legs[4];
        Registrations observers;
        Registrations legObservers;
        Properties properties;
        std::unique_ptr<Event> deferred;
    };
    /// What an adapter holds of the call. The adapter itself is the module's and is made once.
    struct Side
    {
        std::unique_ptr<Leg> leg;
        std::unique_ptr<Event> events[2];
        Properties own;
        Properties peer;
        Properties call;
        void clear();
    };

    void join(Side& side, unsigned int ownProperties, std::string const& name);
    void post(Event& event);

    std::unique_ptr<Call> m_call;
    Side m_caller;
    Side m_callee;
    Properties m_dial;
    Event* m_queue = nullptr;
};
