#include "media/context/MediaLayer.h"

#include "media/context/MediaCore.h"

namespace
{
/// Legs make their terminations through their call's context; call control only keeps this.
class Terminations : public MG_ITerminationRepository
{
};
} // namespace

MediaLayer::MediaLayer(MediaOptions const& options, TYEventLoop& signalling)
    : m_core(new MediaCore(options, signalling)), m_terminations(new Terminations)
{
}

MediaLayer::~MediaLayer() { m_core->close(); }

void MediaLayer::start() { m_core->start(); }

void MediaLayer::setRecordingFailure(RecordingWriter::Failure const& failure)
{
    if (m_core->getRecordings() != nullptr)
        m_core->getRecordings()->setFailure(failure);
}

void MediaLayer::writeRecordings()
{
    if (m_core->getRecordings() != nullptr)
        m_core->getRecordings()->write();
}

MG_IContextRepository* MediaLayer::getContexts() const { return m_core.get(); }

TYEventLoop& MediaLayer::getDatapathLoop() const { return m_core->getLoop(0).getEvents(); }

MediaLoop& MediaLayer::getLoop(unsigned int index) const { return m_core->getLoop(index); }
