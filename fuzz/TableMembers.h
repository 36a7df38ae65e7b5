// The members of the table that records are written into: all kinds of types, under names that
// hostile values use.

#ifndef VORNJSONDB_FUZZ_TABLEMEMBERS_H
#define VORNJSONDB_FUZZ_TABLEMEMBERS_H

namespace fuzzhost {

constexpr char kTableMembers[] =
    "a:string,b:int,c:long long,d:Json::objectValue,e:Json::arrayValue,f:Json::Value,member:any,"
    "cpptype:bool,t:unsigned long long,x:float,z:double";
constexpr char kTableKey[] = "b";

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_TABLEMEMBERS_H
