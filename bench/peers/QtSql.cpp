// Qt 5 SQL; its records are Qt's own JSON objects, which are converted for the comparison only.

#include <QtCore/QCoreApplication>
#include <QtCore/QJsonArray>
#include <QtCore/QJsonDocument>
#include <QtCore/QJsonObject>
#include <QtCore/QVariant>
#include <QtSql/QSqlDatabase>
#include <QtSql/QSqlQuery>
#include <sstream>

#include "Peer.h"

namespace bench {

namespace {

class QtSql {
  public:
    using Record = QJsonObject;
    using Records = QJsonArray;

    static QJsonObject FromJson(const Json::Value& jRecord) {
        std::ostringstream Text;
        Text << jRecord;
        return QJsonDocument::fromJson(QByteArray::fromStdString(Text.str())).object();
    }

    static Json::Value ToJson(const QJsonObject& One) { return ToJson(QJsonDocument(One)); }
    static Json::Value ToJson(const QJsonArray& All) { return ToJson(QJsonDocument(All)); }

    QtSql() : m_strConnection(NextName()), m_Db(Open(m_strConnection)) {
        Run(QString::fromStdString(EightMembers().strSqlCreate));
        Require(m_Db.transaction(), "Qt: transaction");
    }

    ~QtSql() {
        m_Db = QSqlDatabase();
        QSqlDatabase::removeDatabase(m_strConnection);
    }

    QtSql(const QtSql&) = delete;
    QtSql& operator=(const QtSql&) = delete;

    void Create(const QJsonObject& In, QJsonObject& Stored) {
        QSqlQuery Insert(m_Db);
        Insert.prepare(kPeerInsert);
        Insert.addBindValue(In["active"].toBool() ? 1 : 0);
        Insert.addBindValue(In["amount"].toInt());
        Insert.addBindValue(In["city"].toString());
        Insert.addBindValue(In["id"].toInt());
        Insert.addBindValue(In["level"].toInt());
        Insert.addBindValue(In["name"].toString());
        Insert.addBindValue(In["note"].toString());
        Insert.addBindValue(
            QString::fromUtf8(QJsonDocument(In["tags"].toArray()).toJson(QJsonDocument::Compact)));
        Require(Insert.exec(), "Qt: insert");
        QSqlQuery Select = Run(kPeerSelectStored);
        Require(Select.next(), "Qt: the stored row");
        Stored = ReadRow(Select);
    }

    void Get(int nId, QJsonObject& Found) {
        QSqlQuery Select(m_Db);
        Select.setForwardOnly(true);
        Select.prepare(kPeerSelectByKey);
        Select.addBindValue(nId);
        Require(Select.exec() && Select.next(), "Qt: the row with this key");
        Found = ReadRow(Select);
    }

    void List(QJsonArray& All) {
        All = QJsonArray();
        QSqlQuery Select = Run(kPeerSelect);
        while (Select.next()) {
            All.append(ReadRow(Select));
        }
    }

  private:
    static Json::Value ToJson(const QJsonDocument& Document) {
        std::istringstream Text(Document.toJson(QJsonDocument::Compact).toStdString());
        Json::Value jValue;
        Text >> jValue;
        return jValue;
    }

    static QString NextName() {
        static int s_nConnections = 0;
        return QString::number(++s_nConnections);
    }

    static QSqlDatabase Open(const QString& strConnection) {
        // Drivers are plugins, and an application object has to be there to load them.
        static int s_nArguments = 1;
        static char s_szName[] = "peers";
        static char* s_pArguments[] = {s_szName, nullptr};
        static const QCoreApplication s_Application(s_nArguments, s_pArguments);
        QSqlDatabase Db = QSqlDatabase::addDatabase("QSQLITE", strConnection);
        Db.setDatabaseName(":memory:");
        Require(Db.open(), "Qt: open");
        return Db;
    }

    QSqlQuery Run(const QString& strSql) {
        QSqlQuery Query(m_Db);
        Query.setForwardOnly(true);
        Require(Query.exec(strSql), "Qt: exec");
        return Query;
    }

    static QJsonObject ReadRow(const QSqlQuery& Select) {
        QJsonObject One;
        One["active"] = Select.value(0).toInt() == 1;
        One["amount"] = Select.value(1).toInt();
        One["city"] = Select.value(2).toString();
        One["id"] = Select.value(3).toInt();
        One["level"] = Select.value(4).toInt();
        One["name"] = Select.value(5).toString();
        One["note"] = Select.value(6).toString();
        One["tags"] = QJsonDocument::fromJson(Select.value(7).toString().toUtf8()).array();
        return One;
    }

    QString m_strConnection;
    QSqlDatabase m_Db;
};

VORN_BENCH_PEER(QtSql);

}  // namespace

}  // namespace bench
