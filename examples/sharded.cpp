// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// One database for each tenant: a folder of files, which are opened when they are needed. More
/// load means more files, on more machines; the folder may lie on a replicated file system, about
/// which see contrib/scale-out/scale-out.md.
///
///     sharded [FOLDER]
///
/// Stores three invoices for each of eight tenants and prints how many each tenant has, and all of
/// them together. A second run replaces the invoices.
#include <VornJsonDbApi.h>

#include <filesystem>
#include <iostream>
#include <map>
#include <memory>
#include <stdexcept>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// One owner for each file: it keeps the lock until it closes the file, and nobody else reads or
// writes there. WAL is the cheapest way to commit, and with the exclusive lock it needs no memory
// that is shared, which two machines do not have. The order counts.
const char* const kSettings = "pragma locking_mode=exclusive; pragma journal_mode=wal";

struct Close {
    void operator()(sqlite3* pDb) const { sqlite3_close(pDb); }
};
using Database = std::unique_ptr<sqlite3, Close>;

int keepText(void* pText, int, char** aszValues, char**)
{
    *static_cast<std::string*>(pText) = aszValues[0];
    return 0;
}

Database openFile(const std::string& strPath)
{
    sqlite3* pDb = nullptr;
    int iStatus = sqlite3_open(strPath.c_str(), &pDb);
    Database database(pDb);
    std::string strMode;  // the last setting returns what it is set to
    if (SQLITE_OK == iStatus) iStatus = sqlite3_exec(pDb, kSettings, keepText, &strMode, nullptr);
    if (SQLITE_OK != iStatus) throw std::runtime_error(strPath + ": " + sqlite3_errmsg(pDb));
    if ("wal" != strMode) throw std::runtime_error(strPath + ": the journal is " + strMode);
    return database;
}

// The file of a tenant and a handle for each of its tables; here there is one.
class Tenant {
public:
    explicit Tenant(const std::string& strPath) : database_(openFile(strPath))
    {
        std::string strName = "invoice";
        std::string strCreate =
            "create table if not exists invoice (id integer primary key, customer text)";
        Json::Value jDefinition;
        jDefinition[strName]["member"]["customer"]["cpptype"] = "string";
        jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
        pInvoices_ =
            std::make_unique<VornJsonDbApi>(database_.get(), strName, jDefinition, strCreate);
        if (0 > pInvoices_->tableCreate())
            throw std::runtime_error(strPath + ": " + sqlite3_errmsg(database_.get()));
    }

    VornJsonDbApi& invoices() { return *pInvoices_; }

private:
    Database database_;  // closed after the handle is gone
    std::unique_ptr<VornJsonDbApi> pInvoices_;
};

class Tenants {
public:
    explicit Tenants(std::filesystem::path folder) : folder_(std::move(folder))
    {
        std::filesystem::create_directories(folder_);
    }

    // The name becomes the name of a file, so it must not lead elsewhere.
    Tenant& operator[](const std::string& strName)
    {
        static const char szAllowed[] = "abcdefghijklmnopqrstuvwxyz0123456789-";
        if (strName.empty() || std::string::npos != strName.find_first_not_of(szAllowed))
            throw std::runtime_error("\"" + strName + "\" cannot be the name of a tenant");
        std::unique_ptr<Tenant>& pTenant = open_[strName];
        if (!pTenant) pTenant = std::make_unique<Tenant>((folder_ / (strName + ".db")).string());
        return *pTenant;
    }

private:
    std::filesystem::path folder_;
    std::map<std::string, std::unique_ptr<Tenant>> open_;
};

void storeInvoice(Tenant& tenant, int iId, const char* szCustomer)
{
    Json::Value jInvoice;
    jInvoice["customer"] = szCustomer;
    jInvoice["id"] = iId;
    if (0 > tenant.invoices().recSave(jInvoice, false))
        throw std::runtime_error("an invoice was not stored, see the log");
}

unsigned countInvoices(Tenant& tenant)
{
    Json::Value jAll(Json::objectValue);
    Json::Value jInvoices(Json::arrayValue);
    if (0 > tenant.invoices().recList(jAll, jInvoices))
        throw std::runtime_error("the invoices were not listed, see the log");
    return jInvoices.size();
}

void useTenants(Tenants& tenants)
{
    constexpr int iTenants = 8;
    const auto nameOf = [](int i) { return "tenant-" + std::to_string(i); };
    for (int i = 1; i <= iTenants; ++i) {
        int iId = 0;
        for (const char* szCustomer : {"Ada", "Grace", "Hedy"})
            storeInvoice(tenants[nameOf(i)], ++iId, szCustomer);
    }
    // What concerns several tenants is the host's to put together: no statement sees two files.
    unsigned uAll = 0;
    for (int i = 1; i <= iTenants; ++i) {
        const unsigned uInvoices = countInvoices(tenants[nameOf(i)]);
        std::cout << nameOf(i) << ": " << uInvoices << " invoices\n";
        uAll += uInvoices;
    }
    std::cout << "together: " << uAll << " invoices\n";
}

}  // namespace

int main(int argc, char** argv)
{
    try {
        Tenants tenants(1 < argc ? argv[1] : "tenants");
        useTenants(tenants);
    } catch (const std::exception& error) {
        std::cerr << "sharded: " << error.what() << '\n';
        return 1;
    }
}
