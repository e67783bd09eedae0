#pragma once

#include "platform/signalling/QCause.h"
#include "services/CC_ServiceClass.h"

/// Tells the side that asked for a blind transfer what became of it.
///
///     CC_ServiceBlindTransferStatus status(QCause::USER_BUSY);
///     leg.invokeSynchronousService(status);
class CC_EXPORT CC_ServiceBlindTransferStatus : public CC_ServiceClass<CC_ServiceBlindTransferStatus>
{
public:
    /// NONE when the transfer succeeded.
    explicit CC_ServiceBlindTransferStatus(QCause cause);

    String getInfo() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// NONE when the transfer succeeded.
    QCause getCause() const { return m_cause; }

    static unsigned int TYPE();

private:
    QCause m_cause;
};
