#pragma once

#include <libpq-fe.h>

/// The client library of PostgreSQL, by its functions' names without their PQ. It is loaded by who asks for it first,
/// and for itself alone: were it linked, the OpenSSL that it brings would be found before the functions of the SIP
/// module that stand in for some of that one's. So a gateway that writes into no such database needs none either.
struct Libpq
{
    decltype(&PQconnectdbParams) connectdbParams;
    decltype(&PQconninfoParse) conninfoParse;
    decltype(&PQconninfoFree) conninfoFree;
    decltype(&PQconsumeInput) consumeInput;
    decltype(&PQerrorMessage) errorMessage;
    decltype(&PQfinish) finish;
    decltype(&PQclear) clear;
    decltype(&PQflush) flush;
    decltype(&PQgetResult) getResult;
    decltype(&PQgetvalue) getvalue;
    decltype(&PQisBusy) isBusy;
    decltype(&PQresultErrorField) resultErrorField;
    decltype(&PQresultStatus) resultStatus;
    decltype(&PQsendQueryParams) sendQueryParams;
    decltype(&PQsetnonblocking) setnonblocking;
    decltype(&PQsocket) socket;
    decltype(&PQstatus) status;

    /// Null where it is not installed.
    static Libpq const* GET();
};
