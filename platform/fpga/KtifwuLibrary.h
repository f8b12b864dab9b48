// The interface framework as the process finds it at run time: Ktifwu().Target_Read(...) calls ktIFW_Target_Read of
// platform/fpga/ktifwu.h. Any thread may call; see BoundFunction.h for what a missing library does.
#pragma once

#include "platform/fpga/BoundFunction.h"
#include "platform/fpga/ktifwu.h"

namespace platform {

struct KtifwuLibrary {
#define KTORBA_BIND(name) BoundFunction<decltype(ktIFW_##name)> name{"ktifwu", "ktIFW_" #name};
  KTORBA_BIND(Context_Contextualize)
  KTORBA_BIND(Context_GetInfo)
  KTORBA_BIND(Context_GetSubsystemAndOffset)
  KTORBA_BIND(Context_CheckVersion)
  KTORBA_BIND(Context_GetChild)
  KTORBA_BIND(Context_GetChildrenByUid)
  KTORBA_BIND(Context_GetAllChildren)
  KTORBA_BIND(Target_Read)
  KTORBA_BIND(Target_ReadArray)
  KTORBA_BIND(Target_Write)
  KTORBA_BIND(Target_WriteArray)
  KTORBA_BIND(Target_Reset)
#undef KTORBA_BIND
};

inline constinit KtifwuLibrary theKtifwuLibrary;

inline KtifwuLibrary& Ktifwu() { return theKtifwuLibrary; }

}  // namespace platform
