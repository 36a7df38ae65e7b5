#include "Failure.h"

namespace VORN_JSON_DB {

namespace {

struct NameRow {
    StatusCode eCode;
    const char* szName;
};

constexpr NameRow kNames[] = {
    {StatusCode::kOk, "ok"},
    {StatusCode::kNotFound, "not-found"},
    {StatusCode::kDuplicate, "duplicate"},
    {StatusCode::kConstraint, "constraint"},
    {StatusCode::kLocked, "locked"},
    {StatusCode::kRefused, "refused"},
    {StatusCode::kReadOnly, "read-only"},
    {StatusCode::kDiskFull, "disk-full"},
    {StatusCode::kIoError, "io-error"},
    {StatusCode::kCorrupt, "corrupt"},
    {StatusCode::kNotADatabase, "not-a-database"},
    {StatusCode::kInterrupted, "interrupted"},
    {StatusCode::kNoMemory, "no-memory"},
    {StatusCode::kMisuse, "misuse"},
};

}  // namespace

StatusCode Status::Code() const {
    return m_pDetails ? m_pDetails->eCode : StatusCode::kOk;
}

const char* Status::CodeName() const {
    return kNames[static_cast<size_t>(Code())].szName;
}

Retry Status::Advice() const {
    return m_pDetails ? m_pDetails->eRetry : Retry::kNever;
}

const std::string& Status::Message() const {
    return m_pDetails ? m_pDetails->strMessage : vornjsondb::None<std::string>();
}

const FindingList& Status::Findings() const {
    return m_pDetails ? m_pDetails->vecFindings : vornjsondb::None<FindingList>();
}

int Status::SqliteCode() const {
    return m_pDetails ? m_pDetails->nSqliteCode : SQLITE_OK;
}

int Status::SystemError() const {
    return m_pDetails ? m_pDetails->nSystemError : 0;
}

}  // namespace VORN_JSON_DB
