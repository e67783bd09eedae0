#pragma once

#include "services/CC_ServiceClass.h"

/// Asks the peer to send its party to another number, without waiting for that number to answer.
///
/// The module that receives it carries it out: on its wire where that can transfer, otherwise by dialling the number
/// with another adapter and transferring its call. It tells the outcome the other way, with a
/// CC_ServiceBlindTransferStatus, inside this request or any time later; a module that does not know the service tells
/// nothing, so who asks waits with a timer.
///
///     CC_ServiceBlindTransfer transfer("*7", "49891234");
///     leg.invokeSynchronousService(transfer);
class CC_EXPORT CC_ServiceBlindTransfer : public CC_ServiceClass<CC_ServiceBlindTransfer>
{
public:
    /// `code`: the feature code that asked for it, empty when there was none. Throws std::bad_alloc when memory is out.
    CC_ServiceBlindTransfer(String const& code, String const& number);

    String getInfo() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// As they were given: the feature code, empty when there was none, and whom to connect to. @{
    String const& getCode() const { return m_code; }
    String const& getNumber() const { return m_number; }
    /// @}

    static unsigned int TYPE();

private:
    String m_code;
    String m_number;
};
