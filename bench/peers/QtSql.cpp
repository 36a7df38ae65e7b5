// Qt 5 SQL, queries prepared when they are used, and queries kept. Records are Qt's own JSON
// objects, which are converted for the comparison only.

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

class QtStore {
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

  protected:
    QtStore() : m_strConnection(NextName()), m_Db(Open(m_strConnection)) {
        QSqlQuery CreateTable(m_Db);
        Require(CreateTable.exec(QString::fromStdString(EightMembers().strSqlCreate)), "Qt: table");
        Require(m_Db.transaction(), "Qt: transaction");
    }

    ~QtStore() {
        m_Db = QSqlDatabase();
        QSqlDatabase::removeDatabase(m_strConnection);
    }

    QtStore(const QtStore&) = delete;
    QtStore& operator=(const QtStore&) = delete;

    QSqlQuery Prepared(const char* szSql) const {
        QSqlQuery Query(m_Db);
        Query.setForwardOnly(true);
        Require(Query.prepare(szSql), "Qt: prepare");
        return Query;
    }

    static void Run(QSqlQuery& Query) { Require(Query.exec(), "Qt: exec"); }

    static void Insert(QSqlQuery& Into, const QJsonObject& In) {
        Into.bindValue(0, In["active"].toBool() ? 1 : 0);
        Into.bindValue(1, In["amount"].toInt());
        Into.bindValue(2, In["city"].toString());
        Into.bindValue(3, In["id"].toInt());
        Into.bindValue(4, In["level"].toInt());
        Into.bindValue(5, In["name"].toString());
        Into.bindValue(6, In["note"].toString());
        Into.bindValue(7, QString::fromUtf8(
                              QJsonDocument(In["tags"].toArray()).toJson(QJsonDocument::Compact)));
        Run(Into);
    }

    static void SelectOne(QSqlQuery& Select, QJsonObject& Found) {
        Run(Select);
        Require(Select.next(), "Qt: the row");
        Found = ReadRow(Select);
    }

    static void SelectAll(QSqlQuery& Select, QJsonArray& All) {
        All = QJsonArray();
        Run(Select);
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

class QtSql : public QtStore {
  public:
    void Create(const QJsonObject& In, QJsonObject& Stored) {
        QSqlQuery Into = Prepared(kPeerInsert);
        Insert(Into, In);
        QSqlQuery Select = Prepared(kPeerSelectStored);
        SelectOne(Select, Stored);
    }

    void Get(int nId, QJsonObject& Found) {
        QSqlQuery Select = Prepared(kPeerSelectByKey);
        Select.bindValue(0, nId);
        SelectOne(Select, Found);
    }

    void List(QJsonArray& All) {
        QSqlQuery Select = Prepared(kPeerSelect);
        SelectAll(Select, All);
    }
};

class QtSqlPreparedOnce : public QtStore {
  public:
    void Create(const QJsonObject& In, QJsonObject& Stored) {
        Insert(m_Insert, In);
        SelectOne(m_SelectStored, Stored);
        m_SelectStored.finish();
    }

    void Get(int nId, QJsonObject& Found) {
        m_SelectByKey.bindValue(0, nId);
        SelectOne(m_SelectByKey, Found);
        m_SelectByKey.finish();
    }

    void List(QJsonArray& All) {
        SelectAll(m_Select, All);
        m_Select.finish();
    }

  private:
    QSqlQuery m_Insert = Prepared(kPeerInsert);
    QSqlQuery m_SelectStored = Prepared(kPeerSelectStored);
    QSqlQuery m_SelectByKey = Prepared(kPeerSelectByKey);
    QSqlQuery m_Select = Prepared(kPeerSelect);
};

VORN_BENCH_PEER(QtSql);
VORN_BENCH_PEER(QtSqlPreparedOnce);

}  // namespace

}  // namespace bench
