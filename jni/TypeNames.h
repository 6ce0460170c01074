#ifndef ORZAVS_JNI_TYPENAMES_H
#define ORZAVS_JNI_TYPENAMES_H

#include <map>
#include <string>
#include <utility>
#include <vector>

#include "OrzaVSMobile.h"
#include "jni/ExportSupport.h"
#include "jni/MobileUtils.h"

// The binding's name of every native type that crosses JNI, as its exception messages spell it.

namespace orzavs {
namespace jni {

using StringPair = std::pair<std::string, std::string>;
using MapOfStringToUInt = std::map<std::string, unsigned int>;
using MapOfStringToDouble = std::map<std::string, double>;

ORZAVS_JNI_NAMED(StringPair, "std::pair< std::string,std::string >")
ORZAVS_JNI_NAMED(OrzaVSMobile::FrameROI, "OrzaVSMobile::FrameROI")
ORZAVS_JNI_NAMED(OrzaVSMobile::ExtraFrameData, "OrzaVSMobile::ExtraFrameData")
ORZAVS_JNI_NAMED(OrzaVSMobile::ImageBuffer, "OrzaVSMobile::ImageBuffer")
ORZAVS_JNI_NAMED(OrzaVSMobile::ByteArray, "OrzaVSMobile::ByteArray")
ORZAVS_JNI_NAMED(OrzaVSMobile::FrameID, "OrzaVSMobile::FrameID")
ORZAVS_JNI_NAMED(Tovra::CameraResRequirement, "Tovra::CameraResRequirement")
ORZAVS_JNI_NAMED(OrzaVSMobile::Point2f, "OrzaVSMobile::Point2f")
ORZAVS_JNI_NAMED(OrzaVSMobile::Point3d, "OrzaVSMobile::Point3d")
ORZAVS_JNI_NAMED(Tovra::ResultMetadata, "Tovra::ResultMetadata")
ORZAVS_JNI_NAMED(Tovra::ObjectInfo, "Tovra::ObjectInfo")
ORZAVS_JNI_NAMED(Tovra::Server::ServerResponse, "Tovra::Server::ServerResponse")
ORZAVS_JNI_NAMED(Tovra::Server::ServerResponseHandler, "Tovra::Server::ServerResponseHandler")
ORZAVS_JNI_NAMED(Tovra::Server::ServerRequest, "Tovra::Server::ServerRequest")
ORZAVS_JNI_NAMED(Tovra::Server::ServerDelegate, "Tovra::Server::ServerDelegate")
ORZAVS_JNI_NAMED(Tovra::Server::ServerDelegateInterface, "Tovra::Server::ServerDelegateInterface")
ORZAVS_JNI_NAMED(Tovra::EventDelegateBase, "Tovra::EventDelegateBase")
ORZAVS_JNI_NAMED(Tovra::TovraStateEngineFacade, "Tovra::TovraStateEngineFacade")
ORZAVS_JNI_NAMED(NEONAccelerationResult, "NEONAccelerationResult")
ORZAVS_JNI_NAMED(MobileUtils, "MobileUtils")
ORZAVS_JNI_NAMED(std::vector<int>, "std::vector< int >")
ORZAVS_JNI_NAMED(std::vector<double>, "std::vector< double >")
ORZAVS_JNI_NAMED(std::vector<std::string>, "std::vector< std::string >")
ORZAVS_JNI_NAMED(std::vector<OrzaVSMobile::Point2f>, "std::vector< OrzaVSMobile::Point2f >")
ORZAVS_JNI_NAMED(std::vector<Tovra::ObjectInfo>, "std::vector< Tovra::ObjectInfo >")
ORZAVS_JNI_NAMED(Tovra::Server::ServerRequest::ParamMap, "std::map< std::string,std::string >")
ORZAVS_JNI_NAMED(MapOfStringToUInt, "std::map< std::string,unsigned int >")
ORZAVS_JNI_NAMED(MapOfStringToDouble, "std::map< std::string,double >")

}  // namespace jni
}  // namespace orzavs

#endif
