#pragma once

#include "operation/record/LineFile.h"
#include "operation/record/RecordSpool.h"
#include "operation/record/RecordStore.h"
#include "operation/record/RecordTarget.h"

#include <chrono>
#include <memory>
#include <string>

/// Records for a database. While that is away they wait on the disk, and come to it in their order once it is back;
/// what it will never have, such as a text that its character set lacks, is set aside in a file.
class RecordDelivery : public RecordTarget
{
public:
    /// `name`: of the database in the log, and of its files in the folder. Throws std::runtime_error when these cannot
    /// be opened.
    RecordDelivery(std::string const& name, std::unique_ptr<RecordStore> store, std::string const& folder);

    // --- RecordTarget
    std::size_t take(RecordLines const& lines) override;
    bool deliver() override;

private:
    using Clock = std::chrono::steady_clock;

    bool store(RecordLines const& lines);
    bool storeEach(RecordLines const& lines);
    void noteAway();
    void noteBack();
    bool isDue() const { return !m_isAway || Clock::now() >= m_next; }

    std::string m_name;
    std::string m_refusedFile;
    std::unique_ptr<RecordStore> m_store;
    RecordSpool m_spool;
    bool m_isFirst = true;
    bool m_isAway = false;
    Clock::time_point m_next; // try, when it is away
};
