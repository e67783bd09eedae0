#pragma once

#include "testing/Journal.h"

#include <string>

class CC_Call;
class CC_CallLeg;

/// The base of the kit's recorders: a name and the journal to which its lines go, each as "name: what happened".
///
///     class RecordingAlarm : public Alarm, public Recorder
///     {
///     public:
///         using Recorder::Recorder;
///         void raise(char const* why) override { record(std::string("raised ") + why); }
///     };
///
///     RecordingAlarm alarm("alarm");
///     EXPECT_EQ(alarm.take(), (Lines{"alarm: raised too hot"}));
class Recorder
{
public:
    /// `journal` must outlive the recorder; null: it keeps a journal of its own.
    explicit Recorder(std::string name, Journal* journal = nullptr);
    Recorder(Recorder const&) = delete;
    Recorder& operator=(Recorder const&) = delete;

    /// What stands in front of each line.
    std::string const& getRecorderName() const { return m_recorderName; }
    /// The one that was given, else its own.
    Journal& getJournal() { return *m_journal; }
    /// The lines of the journal, which other recorders may share.
    Lines const& getLines() const { return m_journal->getLines(); }
    /// The same; the journal is empty afterwards.
    Lines take() { return m_journal->take(); }

protected:
    ~Recorder() = default;
    /// Writes the line, with the name in front of it.
    void record(std::string const& what);
    /// The name that the journal knows for the call, else "call".
    std::string textOf(CC_Call const* call) const;
    /// The name that the journal knows for the leg, else the leg's own, else "leg".
    std::string textOf(CC_CallLeg const* leg) const;

private:
    std::string m_recorderName;
    Journal m_ownJournal;
    Journal* m_journal;
};
