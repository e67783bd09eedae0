// Not a test of its own: a process with a black box that is killed while a call is up, after another was refused.
#include "callcontrol.h"
#include "testing/CallControlFixture.h"
#include "testing/DrivenClock.h"
#include "testing/FakeModule.h"

#include <csignal>
#include <cstdlib>
#include <tuple>

namespace
{
/// The other side is to see numbers in the international form.
class International : public CC_PropertyFilter
{
public:
    CC_PropertyFilter* clone() const override { return new International(*this); }
    XCode apply(CC_PropertyContainer& properties) const override
    {
        String const* const number =
            properties.get(Key::E164_NUMBER).get() != nullptr ? &properties.get(Key::E164_NUMBER)->getValue() : nullptr;
        if (number == nullptr || !number->view().starts_with("0"))
            return XCode::OK;
        std::string const international = "49" + std::string(number->view().substr(1));
        return properties.set(Key::E164_NUMBER, international.c_str());
    }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }
};

XCode DIAL(FakeModule& from, char const* number, QPresentationIndicator indicator)
{
    CC_PropertyContainer own;
    std::ignore = own.set(Key::E164_NUMBER, number);
    std::ignore = own.set(Key::PRESENTATION_INDICATOR, indicator);
    return from.dial("sip", "4989123", own, CC_PropertyContainer::EMPTY(), CC_PropertyContainer::EMPTY());
}
} // namespace

int main(int count, char** values)
{
    std::size_t const octets = count == 3 ? std::strtoul(values[2], nullptr, 10) : 65536;
    if (count < 2 || !CC_Recorder::OPEN(values[1], octets).isOk())
        return 1;
    CallControlFixture callControl;
    DrivenClock clock;
    CC_PropertyFilterContainer filters;
    std::ignore = filters.addFilter(International());
    FakeModule isdn("isdn", "", nullptr, &filters);
    FakeModule sip("sip");
    sip.rejectOffers(QCause::USER_BUSY);
    std::ignore = DIAL(isdn, "0891111", QPresentationIndicator::RESTRICTED);
    callControl.m_loop.settle();
    isdn.hangUp();
    callControl.m_loop.settle();

    sip.acceptOffers();
    std::ignore = DIAL(isdn, "0892222", QPresentationIndicator::ALLOWED);
    callControl.m_loop.settle();
    clock.advance(250);
    std::ignore = sip.become(FakeModule::State::ALERTING);
    callControl.m_loop.settle();
    clock.advance(4000);
    std::ignore = sip.become(FakeModule::State::CONNECTED);
    callControl.m_loop.settle();
    sip.key("7");
    std::raise(SIGKILL);
}
