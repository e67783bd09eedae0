#include "operation/record/Libpq.h"

#include <dlfcn.h>
#include <optional>

namespace
{
/// Whether it is there.
template <class Function>
bool FIND(void* library, char const* name, Function*& function)
{
    function = reinterpret_cast<Function*>(dlsym(library, name));
    return function != nullptr;
}

std::optional<Libpq> LOAD()
{
    void* const library = dlopen("libpq.so.5", RTLD_NOW | RTLD_LOCAL | RTLD_NODELETE);
    Libpq pq{};
    if (library == nullptr || !FIND(library, "PQconnectdbParams", pq.connectdbParams) ||
        !FIND(library, "PQconninfoParse", pq.conninfoParse) || !FIND(library, "PQconninfoFree", pq.conninfoFree) ||
        !FIND(library, "PQconsumeInput", pq.consumeInput) || !FIND(library, "PQerrorMessage", pq.errorMessage) ||
        !FIND(library, "PQfinish", pq.finish) || !FIND(library, "PQclear", pq.clear) ||
        !FIND(library, "PQflush", pq.flush) || !FIND(library, "PQgetResult", pq.getResult) ||
        !FIND(library, "PQgetvalue", pq.getvalue) || !FIND(library, "PQisBusy", pq.isBusy) ||
        !FIND(library, "PQresultErrorField", pq.resultErrorField) ||
        !FIND(library, "PQresultStatus", pq.resultStatus) || !FIND(library, "PQsendQueryParams", pq.sendQueryParams) ||
        !FIND(library, "PQsetnonblocking", pq.setnonblocking) || !FIND(library, "PQsocket", pq.socket) ||
        !FIND(library, "PQstatus", pq.status))
        return std::nullopt;
    return pq;
}
} // namespace

Libpq const* Libpq::GET()
{
    static std::optional<Libpq> const s_loaded = LOAD();
    return s_loaded ? &*s_loaded : nullptr;
}
