#include "media/context/MediaCore.h"

#include "media/rtp/ChannelTermination.h"

#include <algorithm>
#include <array>
#include <ctime>
#include <stdexcept>

namespace
{
/// Calls' and legs' alike.
std::atomic<unsigned long long> s_lastNumber{0};

/// The time of day, as a part of file names: 20261122T184501Z.
std::string NOW()
{
    std::time_t const now = std::time(nullptr);
    std::tm parts;
    std::array<char, 20> text;
    std::strftime(text.data(), text.size(), "%Y%m%dT%H%M%SZ", gmtime_r(&now, &parts));
    return text.data();
}

MediaOptions BROUGHT_INTO_RANGE(MediaOptions options)
{
    options.threads = std::clamp(options.threads, 1u, 64u);
    options.reportInterval = std::clamp(options.reportInterval, 100u, 3600000u);
    options.learningTime = std::min(options.learningTime, 3600000u);
    return options;
}
} // namespace

MediaCore::MediaCore(MediaOptions const& options, TYEventLoop& signalling)
    : m_options(BROUGHT_INTO_RANGE(options))
    , m_news(new Mailbox<MediaNews>(
          signalling, [](void* self) { static_cast<MediaCore*>(self)->onNews(); }, this))
    , m_ports(options.firstPort, options.lastPort, options.differentiation)
    , m_random(std::random_device()())
{
    std::string error;
    if (!m_tones.read(m_options.tones.empty() ? ToneTable::BUILT_IN() : m_options.tones, m_options.country, error))
        throw std::runtime_error("tones: " + error);
    if (!m_options.recordings.empty())
    {
        m_recordings = std::make_unique<RecordingWriter>();
        m_recordingsPrefix = m_options.recordings + "/" + NOW() + "-";
    }
    for (unsigned int i = 0; i < m_options.threads; ++i)
        m_loops.push_back(std::make_unique<MediaLoop>(*m_news, m_tones));
}

void MediaCore::start()
{
    for (std::unique_ptr<MediaLoop> const& loop : m_loops)
        loop->start();
    if (m_recordings != nullptr)
        m_recordings->start();
}

void MediaCore::close()
{
    for (std::unique_ptr<MediaLoop> const& loop : m_loops)
        loop->stop(); // all of them before the first ends: they hand legs to each other
    m_loops.clear();
    m_recordings.reset(); // nobody puts any more
    m_news.reset();
    m_legs.clear();
}

XCode MediaCore::createContext(TYPtr<MG_IContext>& context)
{
    if (m_loops.empty())
        return XCode::REFUSED;
    CallMedia* const made = new (std::nothrow) CallMedia(*this, ++s_lastNumber, m_nextLoop);
    if (made == nullptr)
        return XCode::NO_ELEMENT;
    m_nextLoop = (m_nextLoop + 1) % m_options.threads;
    context.set(made);
    record(*made);
    return XCode::OK;
}

/// Without memory the call is not recorded: it matters more.
void MediaCore::record(CallMedia& call)
try
{
    if (m_recordings == nullptr)
        return;
    auto const recording =
        std::make_shared<CallRecording>(m_recordingsPrefix + std::to_string(call.getNumber()) + ".wav");
    m_recordings->add(recording);
    call.record(recording);
}
catch (std::bad_alloc const&)
{
}

RtpTermination::Seed MediaCore::makeSeed()
{
    return {static_cast<std::uint32_t>(m_random()), static_cast<std::uint16_t>(m_random()),
            static_cast<std::uint32_t>(m_random()), m_random()};
}

std::unique_ptr<RtpTermination> MediaCore::createTermination(unsigned long long number, RtpPorts&& ports)
{
    return std::make_unique<RtpTermination>(number, std::move(ports), m_options, makeSeed());
}

std::unique_ptr<LegMedia> MediaCore::createChannelLeg(CallMedia& call, Descriptor&& channel, MediaObserver& observer,
                                                      CallMedia::Part part)
try
{
    if (m_loops.empty() || channel.get() < 0)
        return nullptr;
    std::unique_ptr<LegMedia> leg(new LegMedia(call, observer, ++s_lastNumber));
    m_legs[leg->m_number] = leg.get();
    MediaOrder::Make make{
        call.m_number, std::make_unique<ChannelTermination>(leg->m_number, std::move(channel), m_options, makeSeed())};
    make.leg->setCaller(part == CallMedia::Part::CALLER);
    if (!getLoopOf(call)->post(std::move(make)))
        return nullptr;
    leg->describe(ChannelTermination::DESCRIPTION());
    return leg;
}
catch (std::bad_alloc const&)
{
    return nullptr;
}

std::unique_ptr<LegMedia> MediaCore::createLeg(CallMedia& call, IpAddress const& local, MediaObserver& observer,
                                               CallMedia::Part part)
try
{
    RtpPorts ports;
    if (m_loops.empty() || !local.isHostType() || !m_ports.open(local, ports).isOk())
        return nullptr;
    std::unique_ptr<LegMedia> leg(new LegMedia(call, observer, ++s_lastNumber));
    leg->m_rtp = ports.address;
    leg->m_rtcp = ports.getRtcp();
    m_legs[leg->m_number] = leg.get();
    MediaOrder::Make make{call.m_number, createTermination(leg->m_number, std::move(ports))};
    leg->m_cell = make.leg->getCell();
    make.leg->setCaller(part == CallMedia::Part::CALLER);
    return getLoopOf(call)->post(std::move(make)) ? std::move(leg) : nullptr;
}
catch (std::bad_alloc const&)
{
    return nullptr;
}

void MediaCore::remove(LegMedia const& leg) { m_legs.erase(leg.m_number); }

MediaLoop* MediaCore::getLoopOf(CallMedia const& call) const
{
    return m_loops.empty() ? nullptr : m_loops[call.m_loop].get();
}

void MediaCore::post(CallMedia const& call, MediaOrder::Any&& order)
{
    if (MediaLoop* const loop = getLoopOf(call))
        loop->post(std::move(order));
}

void MediaCore::onNews()
{
    TYPtr<MediaCore> const self(this); // an observer may end the layer
    m_news->take([this](MediaNews const& news) { take(news); });
}

/// The call remembers by which way as long as the observer is told: it may end the leg, and the call with it.
void MediaCore::tellDigit(LegMedia& leg, MediaNews const& news)
{
    TYPtr<CallMedia> const call(leg.m_call.get());
    call->m_digitTold = news.isSound ? CallMedia::SOUND : CallMedia::EVENT;
    leg.m_observer.onDigit(news.digit, news.amount);
    call->m_digitTold = CallMedia::NONE;
}

void MediaCore::take(MediaNews const& news)
{
    auto const found = m_legs.find(news.leg);
    if (found == m_legs.end())
        return; // it has ended meanwhile
    LegMedia& leg = *found->second;
    switch (news.kind)
    {
    case MediaNews::DIGIT:
        tellDigit(leg, news);
        break;
    case MediaNews::SILENCE:
        leg.m_observer.onSilence(news.amount);
        break;
    case MediaNews::SPEECH:
        leg.m_observer.onSpeech();
        break;
    case MediaNews::QUALITY:
        leg.m_observer.onQuality(news.quality);
        break;
    case MediaNews::REPORT:
        leg.m_observer.onReport(news.report);
        break;
    }
}
