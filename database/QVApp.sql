-- The application database: numbering and a log of its own, and every other table and view of the system database under its
-- own name, so that an object connected with either name works. Runs once in an empty database, on the embedded engine and
-- on SQL Server.

-- Numbering: the rules, the last number of each period, the numbers that records hold (rcId empty: free again).
create table idRule (
  idName nvarchar(100) not null,
  preFix nvarchar(50) null,
  ymdStyle smallint not null default 0,
  noStyle smallint not null default 0,
  reuseStyle smallint not null default 0,
  nws smallint not null default 0,
  predefined int not null default 0,
  primary key (idName)
)
create table idRec (
  idName nvarchar(100) not null,
  ymd datetime not null,
  maxId nvarchar(200) null,
  primary key (idName, ymd)
)
create table idDel (
  idName nvarchar(100) not null,
  theId nvarchar(200) not null,
  ymd datetime null,
  rcId nvarchar(100) null,
  yy int null,
  mm int null,
  dd int null,
  sesId nvarchar(50) null,
  state smallint null default 1
)
create index idDel_rcId on idDel (idName, rcId)
create index idDel_theId on idDel (idName, theId)
create index idDel_sesId on idDel (sesId)
go

create table syslog (
  logId nvarchar(50) not null,
  logtype int not null,
  UserId int null,
  LogTime datetime null default getdate(),
  UserName nvarchar(100) null,
  UserLogin nvarchar(100) null,
  computer nvarchar(128) null,
  FuncName nvarchar(200) null,
  OpDesc nvarchar(4000) null,
  rcId nvarchar(100) null,
  wiId nvarchar(100) null,
  rtId nvarchar(100) null,
  application int null default 0,
  replacerName nvarchar(100) null
)
create index syslog_logtype on syslog (logtype, LogTime)
go

-- The numbers that a session holds, under the name by which its end returns them.
create synonym QVIdDel for QVApp..idDel
go

create synonym departments for QVSys..departments
create synonym roles for QVSys..roles
create synonym jobs for QVSys..jobs
create synonym users for QVSys..users
create synonym userPwdHis for QVSys..userPwdHis
create synonym agentuser for QVSys..agentuser
create synonym userJob for QVSys..userJob
create synonym userMgr for QVSys..userMgr
create synonym ItemGroups for QVSys..ItemGroups
create synonym GrpUser for QVSys..GrpUser
create synonym grpRole for QVSys..grpRole
create synonym saferule for QVSys..saferule
create synonym seslog for QVSys..seslog
create synonym QVUserRegInfo for QVSys..QVUserRegInfo
create synonym QVMailQ for QVSys..QVMailQ
create synonym RptDirectory for QVSys..RptDirectory
create synonym AclRule for QVSys..AclRule
create synonym homeinfo for QVSys..homeinfo
create synonym tasks for QVSys..tasks
create synonym QVBkPlan for QVSys..QVBkPlan
create synonym QVTaskSche for QVSys..QVTaskSche
create synonym sysinfo for QVSys..sysinfo
create synonym QVTmpSafe for QVSys..QVTmpSafe
create synonym reports for QVSys..reports
create synonym repTmps for QVSys..repTmps
create synonym repAcl for QVSys..repAcl
create synonym fldAcl for QVSys..fldAcl
create synonym cfprocesses for QVSys..cfprocesses
create synonym cftasks for QVSys..cftasks
create synonym cftJob for QVSys..cftJob
create synonym CFWorkItems for QVSys..CFWorkItems
create synonym QV_v_Dept for QVSys..QV_v_Dept
create synonym QV_v_DeptOrg_1WithLevel for QVSys..QV_v_DeptOrg_1WithLevel
create synonym QV_v_DeptOrg_1 for QVSys..QV_v_DeptOrg_1
create synonym QV_v_JobDeptPathWithLevel for QVSys..QV_v_JobDeptPathWithLevel
create synonym QV_v_JobDeptPath for QVSys..QV_v_JobDeptPath
create synonym v_userRole for QVSys..v_userRole
go

insert into idRule (idName, preFix, ymdStyle, noStyle, reuseStyle, nws, predefined) values ('_ses', '', 3, 6, 0, 0, 1)
insert into idRule (idName, preFix, ymdStyle, noStyle, reuseStyle, nws, predefined) values ('_log', '', 3, 8, 0, 0, 1)
insert into idRule (idName, preFix, ymdStyle, noStyle, reuseStyle, nws, predefined) values ('_RC', 'RC', 3, 6, 0, 0, 1)
go
