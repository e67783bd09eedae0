#pragma once

#include <cstddef>
#include <cstdint>
#include <type_traits>

/// How a recording is laid out, in memory and in a file alike, for who writes it (CC_RecordWriter) and who reads it.
///
/// A header, then a ring of records. Positions count octets since the recording began and never wrap: the record at a
/// position stands in the ring at the position modulo the capacity. A record never wraps either: what is left at the
/// end of the ring is filled by a PADDING. So the ring's beginning always is a record's, too.
///
/// A record bears the low part of its own position, so that a reader finds out what was overwritten while it read, and
/// the header's `head` moves behind a record when that is complete: whatever ends the process, what lies between `tail`
/// and `head` is whole. Numbers have the byte order of the machine that wrote them.
namespace CC_RecordFormat
{
/// A recording begins with these octets.
inline constexpr char MAGIC[8] = {'c', 'c', 'r', 'e', 'c', 'o', 'r', 'd'};
/// Of this layout and of what the numbers in it mean (Kind, Writer, CC_PropertyClasses). Adding at the end of these
/// keeps it.
inline constexpr std::uint32_t VERSION = 3;
/// Reads as another number on a machine of another byte order.
inline constexpr std::uint32_t BYTE_ORDER_MARK = 0x01020304;
/// Of records and of everything that a position points to.
inline constexpr std::size_t ALIGNMENT = 8;
/// Octets of a text at most, a Brief's apart; longer ones are cut short.
inline constexpr std::size_t LARGEST_TEXT = 200;

/// The octets of the words that hold so many: of all that stands in a record before something else.
constexpr std::size_t WORDS_OF(std::size_t octets) { return (octets + 3) / 4 * 4; }

/// What a recording begins with.
struct Header
{
    char magic[8];           ///< MAGIC
    std::uint32_t version;   ///< VERSION
    std::uint32_t byteOrder; ///< BYTE_ORDER_MARK
    std::uint64_t capacity;  ///< octets of the ring
    std::uint64_t head;      ///< the position behind the last record
    std::uint64_t tail;      ///< the position of the oldest record
    std::int64_t monotonic;  ///< when the recording began, in nanoseconds of the clock that the records bear
    std::int64_t realtime;   ///< the same moment, in nanoseconds since 1970
    std::uint64_t process;   ///< the number that the system gave the process
};
static_assert(sizeof(Header) == 64 && std::is_trivially_copyable_v<Header>);

/// What happened. In brackets: the record's `detail`, then what follows the record.
enum class Kind : std::uint8_t
{
    PADDING,
    CALL_ACQUIRED,   ///< a pool made the call
    CALL_GIVEN_BACK, ///< the call went back to its pool
    CALL_ENDED,
    CALL_CHANGED, ///< [property id; Change] a property of the call
    LEG_MADE,
    LEG_NAMED, ///< [; text]
    LEG_JOINED,
    LEG_LEFT,
    LEG_MOVED,   ///< [; the number of the call before] of one call to another: both calls and the leg were told
    LEG_CHANGED, ///< [property id; Change] a property of the leg
    LEG_ENDED,
    DIALLING,     ///< [; text: provider and destination]
    DIALLED,      ///< [XCode] what came of it
    OFFERED,      ///< [; text: the endpoint]
    OFFER_TAKEN,  ///< [XCode; text: the endpoint] what the endpoint said
    ACCEPTED,     ///< [XCode]
    TRANSFERRED,  ///< [XCode; the number of the other call, whether the own leg left] the other call's legs to here
    DROPPED,      ///< [cause; SIP code]
    FAILED,       ///< [; text: the operation and why]
    SERVICE,      ///< [; text: class] asked by the leg's adapter
    SERVICE_TOLD, ///< [; the number of the asking leg, text: class] to the leg's module
    TOLD,         ///< [how many ToldIds; these, MOST_TOLD at most] the leg's module, of peer and call
    CLEANED_UP,   ///< [CleanUp] a call looked after itself
    PUSHED_BACK,  ///< the leg's module was asked to step back from an internal loop
    LOCK_TAKEN,
    LOCK_GIVEN_BACK,
    ALSO_CHANGED, ///< AlsoChanged, not Record: one more property in the change before, right behind it
    NUMBER_OF_KINDS
};

/// Who wrote a property.
enum class Writer : std::uint8_t
{
    OUTSIDE, ///< code outside any adapter
    OWN,     ///< the adapter of the leg `by`, to its own leg
    PEER,    ///< the adapter of the leg `by`, to its peer
    CALL,    ///< the adapter of the leg `by`, to the call
    POOL,    ///< the pool that makes the call
    LEG,     ///< the leg itself, when it is made
    FILTER,  ///< a filter of an endpoint, past the adapter
    NUMBER_OF_WRITERS
};

/// What a call's clean-up came to.
enum class CleanUp : std::uint8_t
{
    KEPT,       ///< a leg is live
    GIVEN_BACK, ///< none is
    OVERTAKEN,  ///< somebody who was told released the call
    NUMBER_OF_CLEAN_UPS
};

/// What every event begins with.
struct Record
{
    std::uint32_t stamp;      ///< the position, low part
    std::uint16_t size;       ///< with all that follows and belongs to it, a multiple of ALIGNMENT
    Kind kind;                ///< what happened
    Writer writer;            ///< of a change
    std::int64_t nanoseconds; ///< of the monotonic clock
    std::uint64_t call;       ///< serial numbers; 0: none
    std::uint64_t leg;        ///< the same
    std::uint32_t turn;       ///< of the call-control loop, low part
    std::uint32_t detail;     ///< as the kind says
};
static_assert(sizeof(Record) == 40 && std::is_trivially_copyable_v<Record>);

/// One of several properties that were written together: all else is as in the change before.
struct AlsoChanged
{
    std::uint32_t stamp;      ///< as a Record's
    std::uint16_t size;       ///< as a Record's
    Kind kind;                ///< ALSO_CHANGED
    std::uint8_t reserved;    ///< 0
    std::uint32_t propertyId; ///< the old and the new value follow (Brief)
};
static_assert(sizeof(AlsoChanged) == 12 && std::is_trivially_copyable_v<AlsoChanged>);

/// A property's value in little room: up to two numbers and the beginning of a text.
struct Brief
{
    static constexpr std::uint8_t NOTHING = 255;     ///< no property
    static constexpr std::uint8_t OTHER_CLASS = 254; ///< a module's class: the text is the class's name
    static constexpr unsigned int MOST_TEXT = 32;    ///< octets of a text that are kept

    std::uint8_t place = NOTHING; ///< of the class in CC_PropertyClasses
    std::uint8_t textSize = 0;    ///< octets of the text that are there
    std::uint16_t textLength = 0; ///< of the whole text, 65535 as well when it is longer
    std::uint32_t first = 0;      ///< the value, or its low half
    std::uint32_t second = 0;     ///< what belongs to it, or its high half
    char text[MOST_TEXT];         ///< as far as `textSize` says
};

/// How a Brief begins in a recording. The first and the second number follow where `shape` says so, then the text, in
/// whole words.
struct BriefHead
{
    static constexpr std::uint8_t HAS_FIRST = 0x80;  ///< else it is 0
    static constexpr std::uint8_t HAS_SECOND = 0x40; ///< the same
    static constexpr std::uint8_t TEXT_SIZE = 0x3f;  ///< the others are the text's size

    std::uint8_t place;       ///< as a Brief's
    std::uint8_t shape;       ///< what follows
    std::uint16_t textLength; ///< as a Brief's
};
static_assert(sizeof(BriefHead) == 4 && Brief::MOST_TEXT <= BriefHead::TEXT_SIZE);
/// Octets of a Brief in a recording at most.
inline constexpr std::size_t LARGEST_BRIEF = sizeof(BriefHead) + 2 * sizeof(std::uint32_t) + Brief::MOST_TEXT;

/// What a change begins with; the name of the filter's class follows, then the old and the new value (Brief).
struct Change
{
    std::uint64_t by;            ///< the serial number of the writing adapter's leg; 0: none
    std::uint8_t filterPlace;    ///< in the list of filters, from 0; 255 as well when it is further behind
    std::uint8_t filterNameSize; ///< 0: no filter has made the value different
    std::uint8_t reserved[6];    ///< 0
};
static_assert(sizeof(Change) == 16);

/// Ids of properties that a module was told of: a word of CC_Flags.
struct ToldIds
{
    std::uint32_t wordIndex; ///< bit n of `bits` stands for the id 32 * wordIndex + n
    std::uint32_t bits;      ///< 0 as well
};
static_assert(sizeof(ToldIds) == 8);
/// Of these in a TOLD at most.
inline constexpr unsigned int MOST_TOLD = 16;
} // namespace CC_RecordFormat
