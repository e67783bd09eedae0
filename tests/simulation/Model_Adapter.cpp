#include "platform/base/XCode.h"
#include "properties/CC_PropertyId.h"
#include "tests/simulation/Model.h"

#include <algorithm>

namespace Simulation
{
using namespace CC_PropertyId;

namespace
{
constexpr unsigned int OK = XCode::OK.getValue();
constexpr unsigned int NO_ELEMENT = XCode::NO_ELEMENT.getValue();
constexpr unsigned int ABSENT = XCode::ABSENT.getValue();
constexpr unsigned int REFUSED = XCode::REFUSED.getValue();
constexpr unsigned int FAILURE = XCode::FAILURE.getValue();
constexpr int NETWORK_OUT_OF_ORDER = 38;

std::size_t AT(int index) { return static_cast<std::size_t>(index); }
} // namespace

int Model::newAdapter(int line, int module)
{
    Adapter adapter;
    adapter.line = line;
    adapter.module = module;
    m_adapters.push_back(adapter);
    return static_cast<int>(m_adapters.size()) - 1;
}

// --- filters ---------------------------------------------------------------------------------------------------------

bool Model::apply(std::vector<FilterRule> const& filters, Container& properties)
{
    bool isOk = true;
    for (FilterRule const& rule : filters)
        switch (rule.what)
        {
        case FilterRule::RENAME:
            properties.set(Values::MAKE_TEXT(NAME, Values::TEXT(rule.parameter)));
            break;
        case FilterRule::DROP:
            properties.remove(rule.getDroppedId());
            break;
        case FilterRule::DERIVE:
            if (Value const* const name = properties.find(NAME); name != nullptr && name->kind == Kind::TEXT)
                properties.set(Values::MAKE_TEXT(DISPLAY, name->text));
            break;
        case FilterRule::TRANSLATE:
            if (properties.find(E164_NUMBER) != nullptr)
                properties.set(Values::MAKE_TEXT(E164_NUMBER, Values::TEXT(rule.parameter)));
            break;
        case FilterRule::ADD:
            properties.set(rule.getAdded());
            break;
        case FilterRule::FAIL:
            isOk = false;
            break;
        default:
            m_isLost = true;
        }
    return isOk;
}

std::vector<FilterRule> const* Model::inputOf(Adapter const& adapter) const
{
    if (adapter.module == NOBODY || !m_modules[AT(adapter.module)].usesInput)
        return nullptr;
    return &m_modules[AT(adapter.module)].input;
}

std::vector<FilterRule> const* Model::outputOf(Adapter const& adapter) const
{
    if (adapter.module == NOBODY || !m_modules[AT(adapter.module)].usesOutput)
        return nullptr;
    return &m_modules[AT(adapter.module)].output;
}

// --- writing ---------------------------------------------------------------------------------------------------------

unsigned int Model::writeOne(int adapter, Target target, Property const& property, bool isFiltered)
{
    return write(adapter, target, {{property}}, true, isFiltered);
}

unsigned int Model::write(int index, Target target, Container const& written, bool isOne, bool isFiltered)
{
    Adapter& adapter = m_adapters[AT(index)];
    bool const isThere = target == Target::PEER  ? adapter.peer != NOBODY
                         : target == Target::OWN ? adapter.own != NOBODY
                                                 : adapter.own != NOBODY && m_legs[AT(adapter.own)].call != NOBODY;
    if (!isThere)
        return ABSENT;
    if (target == Target::PEER && written.find(STATE) != nullptr)
    {
        adapter.isPeerToBeChosen = true; // whatever it falls to does not show
        post(index);
    }
    Container& view = target == Target::OWN    ? adapter.ownView
                      : target == Target::PEER ? adapter.peerView
                                               : adapter.callView;
    if (isOne)
        view.set(written.list.front());
    else
        view.setAllOfGroups(written);
    std::vector<FilterRule> const* const filters = isFiltered ? inputOf(adapter) : nullptr;
    unsigned int result = OK;
    if (filters == nullptr)
        result = writeThrough(index, target, written.list, isOne);
    else
    {
        Container copy = view;
        result = apply(*filters, copy) ? writeThrough(index, target, copy.list, false) : FAILURE;
    }
    return result;
}

unsigned int Model::writeThrough(int index, Target target, Properties const& properties, bool isOne)
{
    Adapter const& adapter = m_adapters[AT(index)];
    if (target == Target::CALL)
    {
        int const call = m_legs[AT(adapter.own)].call;
        isOne ? setOnCall(call, properties.front()) : setSeveralOnCall(call, properties);
        return OK;
    }
    int const leg = target == Target::OWN ? adapter.own : adapter.peer;
    unsigned int const result = isOne ? setOnLeg(leg, properties.front()) : setSeveralOnLeg(leg, properties);
    return result == OK ? OK : FAILURE;
}

// --- views and peers -------------------------------------------------------------------------------------------------

void Model::updateOwn(int index)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (adapter.own == NOBODY)
        return;
    Container copy = m_legs[AT(adapter.own)].properties;
    std::vector<FilterRule> const* const filters = outputOf(adapter);
    if (filters == nullptr || apply(*filters, copy))
        adapter.ownView = copy;
}

/// A State that the refresh finds, and nobody tells of, hides a fall: the peer is chosen anew in the next turn.
void Model::updatePeer(int index, std::set<unsigned int> const* told)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (adapter.peer != NOBODY && follow(index, adapter.peerView, m_legs[AT(adapter.peer)].properties) &&
        told != nullptr && told->count(STATE) == 0)
        adapter.isPeerToBeChosen = true;
}

void Model::updateCall(int index)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (adapter.own != NOBODY && m_legs[AT(adapter.own)].call != NOBODY)
        std::ignore = follow(index, adapter.callView, m_calls[AT(m_legs[AT(adapter.own)].call)].properties);
}

/// Whether the State differed.
bool Model::follow(int index, Container& view, Container const& source)
{
    bool isState = false;
    Container copy = source;
    if (std::vector<FilterRule> const* const filters = outputOf(m_adapters[AT(index)]))
        apply(*filters, copy);
    for (Property const& property : copy.list)
    {
        Value const* const seen = view.find(property.id);
        if (seen != nullptr && *seen == property.value)
            continue;
        view.set(property);
        mark(index, property.id);
        isState = isState || property.id == STATE;
    }
    for (std::size_t i = 0; i < view.list.size();)
        if (unsigned int const id = view.list[i].id; copy.find(id) == nullptr)
        {
            view.remove(id);
            mark(index, id);
            isState = isState || id == STATE;
        }
        else
            ++i;
    return isState;
}

void Model::mark(int index, unsigned int id)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (!adapter.hasEvents)
        return;
    adapter.marked.insert(id);
    post(index);
}

void Model::post(int index)
{
    if (!std::exchange(m_adapters[AT(index)].isPending, true))
        m_queue.emplace_back(Who::ADAPTER, index);
}

bool Model::linkPeer(int index)
{
    Adapter& adapter = m_adapters[AT(index)];
    int const call = adapter.own != NOBODY ? m_legs[AT(adapter.own)].call : NOBODY;
    int const chosen = call != NOBODY ? otherMostActive(call, adapter.own, adapter.peer) : NOBODY;
    if (chosen == NOBODY)
    {
        unlinkPeer(index);
        return true;
    }
    if (chosen == adapter.peer)
        return false;
    ++m_legs[AT(chosen)].references;
    int const former = adapter.peer;
    adapter.peer = chosen;
    if (former != NOBODY)
        giveUp(former);
    updatePeer(index, nullptr);
    return true;
}

void Model::unlinkPeer(int index)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (adapter.peer == NOBODY)
        return;
    int const former = adapter.peer;
    adapter.peer = NOBODY;
    Container const view = adapter.peerView;
    adapter.peerView.list.clear();
    giveUp(former);
    for (Property const& property : view.list)
        mark(index, property.id);
}

void Model::onLegChanged(int index, int leg, std::set<unsigned int> const& changed)
{
    Adapter const& adapter = m_adapters[AT(index)];
    if (adapter.own == NOBODY)
        return;
    if (leg == adapter.own)
        return updateOwn(index);
    Value const* const value = adapter.peerView.find(STATE);
    bool const hasState = value != nullptr && value->kind == Kind::STATE;
    int const seen = hasState ? static_cast<int>(value->number) - 2 : 0;
    int const level = m_legs[AT(leg)].getState();
    bool const isState = changed.count(STATE) != 0;
    if (leg != adapter.peer)
    {
        if (isState && hasState && level > seen)
            linkPeer(index);
        return;
    }
    bool const isToBeChosen = isState && (!hasState || level < seen);
    if (!isToBeChosen || !linkPeer(index))
        updatePeer(index, &changed);
}

void Model::onRelinked(int index, int leg, int newCall, int oldCall)
{
    if (m_adapters[AT(index)].own != leg)
        return;
    if (oldCall != NOBODY)
    {
        removeLegObserver(oldCall, Who::ADAPTER, index);
        m_calls[AT(oldCall)].callObservers.remove(Who::ADAPTER, index);
    }
    if (newCall != NOBODY)
    {
        updateCall(index);
        m_calls[AT(newCall)].callObservers.add(Who::ADAPTER, index);
        addLegObserver(newCall, Who::ADAPTER, index);
    }
    linkPeer(index);
}

void Model::handle(int index)
{
    if (m_adapters[AT(index)].peer != NOBODY && std::exchange(m_adapters[AT(index)].isPeerToBeChosen, false))
        linkPeer(index);
    Adapter& adapter = m_adapters[AT(index)];
    std::set<unsigned int> const told = std::exchange(adapter.marked, {});
    if (!told.empty())
        hearLine(adapter, CallOut::PEER_CHANGED, told);
}

void Model::destroyEvents(Adapter& adapter)
{
    adapter.hasEvents = false;
    adapter.isPending = false;
    adapter.isPeerToBeChosen = false;
    adapter.marked.clear();
    std::erase(m_queue, std::pair(Who::ADAPTER, static_cast<int>(&adapter - m_adapters.data())));
}

// --- dial, accept, drop, transfer ------------------------------------------------------------------------------------

bool Model::startOwnLeg(int index, Container& properties, int state)
{
    Adapter& adapter = m_adapters[AT(index)];
    properties.set(Values::MAKE_STATE(state));
    properties.set(Values::MAKE_CAUSE(0, 0));
    adapter.own = newLeg();
    if (properties.find(NETWORK) == nullptr)
    {
        bool const isShared = (m_first[2] >> static_cast<unsigned int>(adapter.module) % 8 & 1) != 0;
        properties.set(Values::MAKE_TEXT(NETWORK, isShared ? "shared" : "net-" + std::to_string(adapter.module)));
    }
    if (write(index, Target::OWN, properties, false, true) != OK)
        return false;
    m_legs[AT(m_adapters[AT(index)].own)].observers.add(Who::ADAPTER, index);
    return true;
}

unsigned int Model::fail(int adapter, unsigned int result)
{
    drop(adapter, NETWORK_OUT_OF_ORDER, 0);
    return result;
}

unsigned int Model::dial(int index, unsigned int context, unsigned int called, Container const& own,
                         Container const& offered, Container const& ofCall, unsigned long long media)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (adapter.isE164)
        adapter.last = LastDial{context, called, own, offered, ofCall, media};
    if (adapter.own != NOBODY || adapter.hasEvents || adapter.module == NOBODY)
        return REFUSED;
    Context const& in = m_contexts[context];
    if (!in.exists || std::find(in.providers.begin(), in.providers.end(), called) == in.providers.end())
        return FAILURE;
    adapter.hasEvents = true;
    return goOnDialling(index, context, called, own, offered, ofCall, media);
}

unsigned int Model::goOnDialling(int index, unsigned int context, unsigned int called, Container const& own,
                                 Container const& offered, Container const& ofCall, unsigned long long media)
{
    Container properties = own;
    if (!startOwnLeg(index, properties, 6))
        return fail(index, FAILURE);
    int const call = acquire(context, media);
    if (call == NOBODY)
        return fail(index, NO_ELEMENT);
    std::vector<FilterRule> const* const filters = inputOf(m_adapters[AT(index)]);
    Container written = ofCall;
    if (filters != nullptr && !apply(*filters, written))
    {
        defer(call);
        return fail(index, FAILURE);
    }
    setSeveralOnCall(call, written.list);
    addCallLeg(call, m_adapters[AT(index)].own);
    Container filtered = offered;
    if (filters != nullptr && !apply(*filters, filtered))
        return fail(index, FAILURE);
    return offer(called, call) == OK ? OK : fail(index, FAILURE);
}

unsigned int Model::accept(int index, int call, Container const& own)
{
    Adapter& adapter = m_adapters[AT(index)];
    if (adapter.own != NOBODY || adapter.hasEvents || adapter.module == NOBODY)
        return REFUSED;
    adapter.hasEvents = true;
    Container properties = own;
    if (!startOwnLeg(index, properties, 1))
        return fail(index, FAILURE);
    addCallLeg(call, m_adapters[AT(index)].own);
    return OK;
}

void Model::drop(int index, int cause, unsigned int value)
{
    int const own = m_adapters[AT(index)].own;
    if (own == NOBODY)
        return;
    if (int const call = m_legs[AT(own)].call; call != NOBODY)
    {
        removeLegObserver(call, Who::ADAPTER, index);
        m_calls[AT(call)].callObservers.remove(Who::ADAPTER, index);
    }
    m_legs[AT(own)].observers.remove(Who::ADAPTER, index);
    writeOne(index, Target::OWN, Values::MAKE_NUMBER(PROVIDES_DATA, Kind::BOOLEAN, 0));
    if (cause != -1 || value != 0)
        writeOne(index, Target::OWN, Values::MAKE_CAUSE(cause, value));
    m_legs[AT(own)].isFixed = true;
    writeOne(index, Target::OWN, Values::MAKE_STATE(-1));
    if (m_legs[AT(own)].getState() != -1) // no filter keeps a leg, and with it its call, from its end
        setOnLeg(own, Values::MAKE_STATE(-1));
    Adapter& adapter = m_adapters[AT(index)];
    adapter.own = NOBODY;
    giveUp(own);
    adapter.ownView.list.clear();
    adapter.peerView.list.clear();
    if (int const peer = std::exchange(adapter.peer, NOBODY); peer != NOBODY)
        giveUp(peer);
    destroyEvents(adapter);
    adapter.callView.list.clear();
}

unsigned int Model::transferCalls(int index, int other, bool isRemoving)
{
    int const a = m_adapters[AT(index)].own;
    int const b = m_adapters[AT(other)].own;
    int const callOfA = a != NOBODY ? m_legs[AT(a)].call : NOBODY;
    int const callOfB = b != NOBODY ? m_legs[AT(b)].call : NOBODY;
    if (callOfA == NOBODY || callOfB == NOBODY || callOfA == callOfB)
        return REFUSED;
    if (isRemoving)
    {
        transfer(NOBODY, a);
        defer(callOfA);
    }
    for (;;)
    {
        std::vector<int> const& legs = m_calls[AT(callOfB)].legs;
        auto const next = std::find_if(legs.begin(), legs.end(), [b](int leg) { return leg != b; });
        if (next == legs.end())
            return OK;
        addCallLeg(callOfA, *next);
    }
}

// --- offers ----------------------------------------------------------------------------------------------------------

unsigned int Model::offer(unsigned int number, int call)
{
    Module& module = m_modules[number];
    if (!module.exists)
        return FAILURE;
    if (module.usesOutput)
    {
        Container offered; // what is in it nobody looks at
        apply(module.output, offered);
    }
    unsigned int line = module.answerMode == 1 ? 1 : 0;
    int const first = module.adapters[0];
    bool const isFree = first != NOBODY && m_adapters[AT(first)].own == NOBODY;
    if (module.answerMode == 2 && !isFree)
        line = 1;
    switch (module.answerMode)
    {
    case 3:
        reject(number, call, module.cause);
        return OK;
    case 4:
        module.held = call;
        return OK;
    case 5:
        return FAILURE;
    case 6:
        return OK;
    default:
        break;
    }
    unsigned int result = FAILURE;
    if (int const adapter = module.adapters[line]; adapter != NOBODY)
        result = accept(adapter, call,
                        CONTAINER({Values::MAKE_NUMBER(CALL_LEG_ID, Kind::UNSIGNED, 10 + number * 2 + line)}));
    return module.answerMode == 7 ? REFUSED : result;
}

void Model::reject(unsigned int module, int call, unsigned int cause)
{
    int const adapter = newAdapter(NOBODY, static_cast<int>(module));
    std::ignore = accept(adapter, call, CONTAINER({Values::MAKE_NUMBER(CALL_LEG_ID, Kind::UNSIGNED, 10 + 0xff)}));
    drop(adapter, static_cast<int>(cause), 0);
    m_adapters[AT(adapter)].isAlive = false;
}

// --- services and overlap sending ------------------------------------------------------------------------------------

void Model::service(int index, unsigned int which, unsigned int text)
{
    Adapter const& adapter = m_adapters[AT(index)];
    if (adapter.isE164 && which % 6 < 2 && keyIn(index, which % 6, text))
        return;
    if (adapter.own != NOBODY)
        deliverService(adapter.own);
}

/// Whether the service goes no further.
bool Model::keyIn(int index, unsigned int which, unsigned int text)
{
    Adapter& adapter = m_adapters[AT(index)];
    Value const* const value = adapter.peerView.find(STATE);
    int const state = value != nullptr && value->kind == Kind::STATE ? static_cast<int>(value->number) - 2 : -1;
    if (state < 1 || state > 4)
        return false;
    if (which == 0)
        adapter.last.offered.set(
            Values::MAKE_TEXT(E164_NUMBER, adapter.last.offered.text(E164_NUMBER) + Values::TEXT(text)));
    Value const* const receiving = adapter.peerView.find(SUPPORTS_OVERLAP_RECEIVING);
    bool const receives = receiving == nullptr || receiving->kind != Kind::BOOLEAN || receiving->number != 0;
    if (state != 2 || receives)
        return false;
    if (which == 1)
        return true;
    if (adapter.last.media == 0 && adapter.own != NOBODY && m_legs[AT(adapter.own)].call != NOBODY)
    {
        Value const* const media = m_calls[AT(m_legs[AT(adapter.own)].call)].properties.find(CONTEXT);
        if (media != nullptr && media->kind == Kind::MEDIA)
            adapter.last.media = media->number;
    }
    drop(index, 16, 0);
    if (adapter.last.media == 0 && adapter.isOverriding)
        hear(0x100 + static_cast<unsigned int>(adapter.line), CallOut::PEER_CHANGED, {CONTEXT});
    LastDial const last = m_adapters[AT(index)].last;
    std::ignore = dial(index, last.context, last.called, last.own, last.offered, last.ofCall, last.media);
    return true;
}

// --- media -----------------------------------------------------------------------------------------------------------

unsigned long long Model::requestMedia() { return m_hasMedia && !m_isMediaFailing ? ++m_lastMedia : 0; }

int Model::acquire(unsigned int index, unsigned long long media)
{
    Context& context = m_contexts[index];
    if (!context.exists)
        return NOBODY;
    if (context.calls.empty())
        hear(0x200, CallOut::REBOOT_ADD);
    int const call = newCall(static_cast<int>(index));
    context.calls.push_back(call);
    ++m_callsAdded;
    m_maxActiveCalls = std::max(m_maxActiveCalls, m_callsAdded - m_callsRemoved);
    setOnCall(call, {CONTEXT, {Kind::MEDIA, media != 0 ? media : requestMedia()}});
    hearGuests(context.observers, CallOut::CALL_CREATED);
    return call;
}
} // namespace Simulation
