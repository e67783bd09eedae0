#pragma once

#include "media/context/MediaOptions.h"
#include "media/file/RecordingWriter.h"
#include "platform/base/TYPtr.h"
#include "platform/media/MG_IContextRepository.h"
#include "platform/media/MG_ITerminationRepository.h"

class MediaCore;
class MediaLoop;
class TYEventLoop;

/// The media layer of the process: the datapath's threads, and the repository in which call control finds contexts.
/// Made, used and ended on the signalling thread.
///
///     MediaLayer media(options, callControlLoop);
///     CallControl::SET_DP_EVENT_LOOP(&media.getDatapathLoop());
///     CallControl::SET_MG_CONTEXT_REPOSITORY(media.getContexts());
///     CallControl::SET_MG_TERMINATION_REPOSITORY(media.getTerminations());
///     media.start();
///
/// Contexts and legs may outlive it; they then do nothing any more.
class MediaLayer
{
public:
    /// `signalling`: the loop from which observers are told; it must outlive this. Throws std::runtime_error with
    /// the reason when the system refuses, or the tones cannot be read.
    MediaLayer(MediaOptions const& options, TYEventLoop& signalling);
    ~MediaLayer();
    MediaLayer(MediaLayer const&) = delete;
    MediaLayer& operator=(MediaLayer const&) = delete;

    /// Who is told, on a thread of the media layer, of a recording that came to nothing or has gaps. Before the start.
    void setRecordingFailure(RecordingWriter::Failure const& failure);
    /// Writes what was recorded up to now: for those who turn the loops by hand.
    void writeRecordings();

    /// Starts the threads. Whoever does not turns the loops by hand, as tests do.
    void start();

    MG_IContextRepository* getContexts() const;
    MG_ITerminationRepository* getTerminations() const { return m_terminations.get(); }
    /// The first datapath loop's events, for call control.
    TYEventLoop& getDatapathLoop() const;
    /// REQUIRES: index < the number of threads.
    MediaLoop& getLoop(unsigned int index) const;

private:
    TYPtr<MediaCore> m_core;
    TYPtr<MG_ITerminationRepository> m_terminations;
};
