-- The system database: organisation, people, sessions, numbering, log, settings, schedules, and the tables of the report
-- server that the library touches. Runs once in an empty database, on the embedded engine and on SQL Server.
--
-- There are no foreign keys: deletes go from the parent down, in orders of their own. Text columns take Unicode; keys stay
-- short enough for an index. Columns that a row may leave empty are NULL, and NULL reads as an empty text, 0 or no date.

-- Departments form one tree: superDept is the deptId above, 0 at the top; path is ".", then the ids from the top down, each
-- with a "." behind it.
create table departments (
  deptId int identity(1,1) not null,
  deptNo nvarchar(100) not null,
  deptName nvarchar(200) not null,
  superDept int null default 0,
  fullName nvarchar(4000) null,
  path nvarchar(850) null,
  isOrg smallint null default 0,
  isOuter smallint null default 0,
  primary key (deptId)
)
create index departments_deptNo on departments (deptNo)
create index departments_path on departments (path)
create index departments_superDept on departments (superDept)
create index departments_isOrg on departments (isOrg)
go

-- roleSpec of "Report Owners" holds the lock of a backup.
create table roles (
  roleId int identity(1,1) not null,
  roleName nvarchar(50) not null default '',
  roleDesc nvarchar(500) null default '',
  roleSpec ntext null,
  builtIn smallint null default 0,
  CreUId int null,
  CreUName nvarchar(100) null,
  CreateTime datetime null,
  UpdUId int null,
  UpdUName nvarchar(100) null,
  UpdTime datetime null,
  OtherCanUpd smallint null default 0,
  primary key (roleId)
)
go

-- A job is a role held in a department.
create table jobs (
  jobId int identity(1,1) not null,
  roleId int not null,
  deptId int not null,
  primary key (jobId)
)
create index jobs_roleId on jobs (roleId)
create index jobs_deptId on jobs (deptId)
go

-- accstate: 0 normal, 1 locked, 2 waiting for audit, 3 refused. lgts counts failed sign-ons in a row. userPwd is encrypted
-- under userName. isRole is 0 but for rows of a very old layout.
create table users (
  userId int identity(1,1) not null,
  userName nvarchar(100) not null,
  userLogin nvarchar(100) not null,
  userPwd nvarchar(1000) null,
  userDesc nvarchar(500) null,
  mobilePhone nvarchar(50) null,
  email nvarchar(200) null,
  isAbstract smallint not null default 0,
  isRole smallint not null default 0,
  deptId int null,
  useSms smallint null default 0,
  useKey smallint null default 0,
  accstate smallint null default 0,
  pwdDate datetime null default getdate(),
  lockDate datetime null,
  lgts int not null default 0,
  uType smallint not null default 0,
  domain nvarchar(100) null,
  company nvarchar(200) null,
  address nvarchar(500) null,
  zipcode nvarchar(20) null,
  Telephone nvarchar(50) null,
  isOuter smallint null default 0,
  ldsName nvarchar(200) null,
  ldDn nvarchar(1000) null,
  ipList nvarchar(4000) null,
  synLogin smallint null default 0,
  PwdNoChange smallint null default 0,
  useOTPAuth smallint null default 0,
  OTPTokenId nvarchar(100) null,
  primary key (userId),
  unique (userLogin)
)
create index users_deptId on users (deptId)
create index users_userName on users (userName)
go

create table userPwdHis (
  userId int not null,
  creDate datetime null,
  pwd nvarchar(1000) null
)
create index userPwdHis_userId on userPwdHis (userId, creDate)
go

create table agentuser (
  agentuserid int not null
)
create index agentuser_agentuserid on agentuser (agentuserid)
go

create table userJob (
  userId int not null,
  jobId int not null,
  primary key (userId, jobId)
)
create index userJob_jobId on userJob (jobId)
go

-- flag 1: the supervisor is whoever holds jobId; 2: it is the user mgrId.
create table userMgr (
  UserId int not null,
  flag smallint not null,
  mgrId int null,
  jobId int null
)
create index userMgr_UserId on userMgr (UserId)
create index userMgr_jobId on userMgr (jobId)
create index userMgr_mgrId on userMgr (mgrId)
go

create table ItemGroups (
  gId int identity(1,1) not null,
  gName nvarchar(100) not null,
  gDesc nvarchar(1000) null,
  primary key (gId)
)
create index ItemGroups_gName on ItemGroups (gName)
go

create table GrpUser (
  gId int not null,
  userId int not null
)
create index GrpUser_gId on GrpUser (gId, userId)
create index GrpUser_userId on GrpUser (userId, gId)
go

create table grpRole (
  gId int not null,
  roleId int not null
)
create index grpRole_gId on grpRole (gId, roleId)
create index grpRole_roleId on grpRole (roleId, gId)
go

-- The policy of passwords and locks: one row, id 1, made by its first save. Flags are bit, since -1 is written for True.
create table saferule (
  id int not null,
  minLen smallint null,
  maxDay smallint null,
  charSet nvarchar(3) null,
  cycle smallint null,
  lockExp bit null,
  lockErr bit null,
  errTimes smallint null,
  awa bit null,
  sleepnn smallint null,
  awm bit null,
  primary key (id)
)
go

create table seslog (
  sesId nvarchar(50) not null,
  userLogin nvarchar(100) null,
  computer nvarchar(128) null,
  dbname nvarchar(128) null,
  ip nvarchar(100) null,
  begintime datetime null default getdate(),
  moduName nvarchar(100) null,
  lastActTime datetime null default getdate(),
  primary key (sesId)
)
go

create table QVUserRegInfo (
  UserId int not null,
  isOuter smallint null default 0,
  submitTime datetime null,
  Company nvarchar(200) null,
  deptName nvarchar(200) null,
  Email nvarchar(200) null,
  telephone nvarchar(50) null,
  MobilePhone nvarchar(50) null,
  address nvarchar(500) null,
  zipcode nvarchar(20) null,
  userDesc nvarchar(4000) null,
  checkTime datetime null,
  noPassReason nvarchar(4000) null
)
create index QVUserRegInfo_UserId on QVUserRegInfo (UserId)
go

-- Mails wait here for the service that delivers them: emState 0 waiting, emTime when queued.
create table QVMailQ (
  emId int identity(1,1) not null,
  emType smallint null,
  emTo nvarchar(500) null,
  emSubject nvarchar(1000) null,
  emBody ntext null,
  emState smallint not null default 0,
  emTime datetime null default getdate(),
  primary key (emId)
)
go

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

create table RptDirectory (
  class nvarchar(100) not null,
  superClass nvarchar(100) null,
  path nvarchar(850) null,
  fullName nvarchar(4000) null,
  ordNo smallint null,
  ordPath nvarchar(400) null,
  CreUId int null,
  CreUName nvarchar(100) null,
  CreateTime datetime null,
  UpdUId int null,
  UpdUName nvarchar(100) null,
  UpdTime datetime null,
  OtherCanUpd smallint null default 0,
  primary key (class)
)
create index RptDirectory_superClass on RptDirectory (superClass)
create index RptDirectory_path on RptDirectory (path)
go

create table AclRule (
  id int not null,
  RWType smallint null,
  RWDeptSet smallint null,
  RWRoleSet smallint null,
  DesignType smallint null,
  DesignDeptSet smallint null,
  DesignRoleSet smallint null,
  excludeAdmin smallint null,
  primary key (id)
)
go

-- The company and the settings: one row, id 1. The company's name is also the name of the department _root.
create table homeinfo (
  id int not null,
  companyName nvarchar(200) null,
  companyEnName nvarchar(200) null,
  address nvarchar(500) null,
  zip nvarchar(20) null,
  tel nvarchar(50) null,
  fax nvarchar(50) null,
  email nvarchar(200) null,
  webUrl nvarchar(500) null,
  bankName nvarchar(200) null,
  BankAccount nvarchar(100) null,
  TaxNo nvarchar(100) null,
  JPerson nvarchar(100) null,
  AcctDay smallint null default 1,
  AcctTime smallint null default 1,
  timeOut int null default 0,
  smState smallint null default 0,
  attLimit nvarchar(1000) null,
  savePwd smallint null default 0,
  useOTPAuth smallint null default 0,
  allowOuter smallint null default 0,
  roleGrp smallint null default 0,
  domainUser smallint null default 0,
  autoRegUser smallint null default 0,
  regPrompt nvarchar(4000) null,
  allowSendEmail smallint null default 1,
  smtpServer nvarchar(200) null,
  smtpPort int null default 25,
  emailSender nvarchar(200) null,
  emailAddress nvarchar(200) null,
  emailSubject nvarchar(1000) null,
  emailContent ntext null,
  emailPContent ntext null,
  emailRContent ntext null,
  emailPassword nvarchar(1000) null,
  smtpState smallint null default 0,
  smtpAuth smallint null default 0,
  smtpUseSSL smallint null default 0,
  ldEnable smallint null default 0,
  LDSName nvarchar(200) null,
  LDHost nvarchar(200) null,
  LDport int null default 389,
  LDBaseDN nvarchar(1000) null,
  LDBindDN nvarchar(1000) null,
  LDPasswd nvarchar(1000) null,
  UpdTime datetime null default getdate(),
  LoginNewsUrl nvarchar(1000) null,
  loginTitle nvarchar(500) null,
  LoginImage image null,
  customFormIcon image null,
  primary key (id)
)
go

-- Scheduled tasks, the backup plans among them, and their runs: state 0 pending, 1 succeeded, 2 failed.
create table tasks (
  taskId int identity(1,1) not null,
  taskName nvarchar(200) not null,
  taskType int not null,
  cTime datetime null,
  schType int null,
  cycle smallint null,
  cycleNum smallint null,
  wk nvarchar(20) null,
  md smallint null,
  tod smallint null,
  startTime datetime null,
  hInterval smallint null,
  intervalUnit smallint null,
  schDesc nvarchar(1000) null,
  primary key (taskId),
  unique (taskName)
)
create table QVBkPlan (
  taskId int not null,
  path nvarchar(1000) null,
  delOld smallint null default 0,
  delNum smallint null,
  delUnit smallint null,
  primary key (taskId)
)
create table QVTaskSche (
  taskId int not null,
  schNo int not null,
  pTime datetime null,
  state smallint not null default 0,
  msg nvarchar(1000) null,
  primary key (taskId, schNo)
)
create index QVTaskSche_state on QVTaskSche (state, pTime)
go

-- The release of this layout.
create table sysinfo (
  release nvarchar(20) null
)
go

create table QVTmpSafe (
  protectPwd nvarchar(1000) null
)
go

-- The report server's own tables, with no more than the library touches. No column of repTmps has the name of a column of
-- syslog, since the queries of the log leave their columns unqualified.
create table reports (
  repId int not null,
  repName nvarchar(200) null,
  primary key (repId)
)
create table repTmps (
  rtUid nvarchar(100) not null,
  repId int null,
  fullName nvarchar(4000) null,
  rtPwd nvarchar(1000) null,
  ifCheckOut smallint null default 0,
  checkOutBy int null,
  primary key (rtUid)
)
create table repAcl (
  repId int not null,
  jobId int not null,
  authType smallint null
)
create index repAcl_jobId on repAcl (jobId)
create table fldAcl (
  fldId int not null,
  jobId int not null
)
create index fldAcl_jobId on fldAcl (jobId)
create table cfprocesses (
  pId int not null,
  rtUid nvarchar(100) null,
  primary key (pId)
)
create table cftasks (
  tId int not null,
  pId int null,
  tName nvarchar(200) null,
  primary key (tId)
)
create table cftJob (
  tId int not null,
  jobId int not null
)
create index cftJob_jobId on cftJob (jobId)
create table CFWorkItems (
  wiId nvarchar(100) not null,
  state smallint null default 0,
  checkOutBy int null,
  checkOutByName nvarchar(100) null,
  primary key (wiId)
)
go

-- The tree, walked from its roots down, the roots being the rows with nothing above them. A ring of departments hangs on no
-- root and so is left out. l is 1 for a root.
create view QV_v_Dept as
with tree (deptId, l) as (
  select d.deptId, 1
  from departments d
  where not exists (select s.deptId from departments s where s.deptId = d.superDept)
  union all
  select d.deptId, t.l + 1
  from tree t inner join departments d on d.superDept = t.deptId
)
select d.deptNo, d.deptId, d.deptName, d.fullName, d.isOrg, d.path, d.superDept, s.deptNo as superNo, d.isOuter, t.l
from tree t
inner join departments d on d.deptId = t.deptId
left outer join departments s on s.deptId = d.superDept
go

-- Each department with its organisation: the nearest department at or above it that is one, else _root. The cross join makes
-- the embedded engine go by department: it would go through all of an organisation for each user that it looks at.
create view QV_v_DeptOrg_1WithLevel as
with tree (deptId, orgId, l) as (
  select d.deptId,
    case when d.isOrg = 1 then d.deptId else (select min(r.deptId) from departments r where r.deptNo = '_root') end, 1
  from departments d
  where not exists (select s.deptId from departments s where s.deptId = d.superDept)
  union all
  select d.deptId, case when d.isOrg = 1 then d.deptId else t.orgId end, t.l + 1
  from tree t inner join departments d on d.superDept = t.deptId
)
select d.deptId, d.deptName, d.fullName as deptfullName, t.orgId, o.deptNo as orgno, t.l
from departments d
cross join tree t
left outer join departments o on o.deptId = t.orgId
where t.deptId = d.deptId
go

create view QV_v_DeptOrg_1 as
select deptId, deptName, deptfullName, orgId, orgno from QV_v_DeptOrg_1WithLevel
go

-- For each job the departments on the path of its department, from that one upwards: x is 0 for the job's own department
-- and 1 above it, l the level in the tree. The way up is gone twice, since only its end tells how high the department lies.
-- A way into a ring has no end, and is left out: mark is a department on the way, a new one each time that the way has
-- doubled, and whoever comes back to it goes in a ring.
create view QV_v_JobDeptPathWithLevel as
with way (jobid, deptid, superDeptId, l, mark, doubled) as (
  select j.jobId, j.deptId, d.superDept, 1, d.deptId, 1
  from jobs j inner join departments d on d.deptId = j.deptId
  union all
  select w.jobid, w.deptid, s.superDept, w.l + 1,
    case when w.l = w.doubled then s.deptId else w.mark end, case when w.l = w.doubled then w.l * 2 else w.doubled end
  from way w inner join departments s on s.deptId = w.superDeptId
  where s.deptId <> w.mark
),
chain (jobid, deptid, x, pathDeptId, superDeptId, l) as (
  select w.jobid, w.deptid, 0, d.deptId, d.superDept, w.l
  from way w
  left outer join departments s on s.deptId = w.superDeptId
  inner join departments d on d.deptId = w.deptid
  where s.deptId is null
  union all
  select c.jobid, c.deptid, 1, s.deptId, s.superDept, c.l - 1
  from chain c inner join departments s on s.deptId = c.superDeptId
)
select c.jobid, c.deptid, c.x, c.pathDeptId, d.deptName as pathDeptName, c.superDeptId, d.fullName, d.path, d.deptNo, c.l
from chain c
inner join departments d on d.deptId = c.pathDeptId
go

create view QV_v_JobDeptPath as
select jobid, deptid, x, pathDeptId, pathDeptName, superDeptId, fullName, path, deptNo from QV_v_JobDeptPathWithLevel
go

-- The roles of a user, held by a job or through a group, each once.
create view v_userRole as
select uj.userId, r.roleName
from userJob uj
inner join jobs j on j.jobId = uj.jobId
inner join roles r on r.roleId = j.roleId
union
select gu.userId, r.roleName
from GrpUser gu
inner join grpRole gr on gr.gId = gu.gId
inner join roles r on r.roleId = gr.roleId
go

-- First rows. The ids are fixed: other rows and statements rely on them.
set identity_insert departments on
insert into departments (deptId, deptNo, deptName, superDept, fullName, path, isOrg, isOuter)
  values (1, '_root', 'Company', 0, 'Company', '.1.', 1, 0)
insert into departments (deptId, deptNo, deptName, superDept, fullName, path, isOrg, isOuter)
  values (2, '_out', 'Outside users', 0, 'Outside users', '.2.', 0, 1)
set identity_insert departments off
go

set identity_insert roles on
insert into roles (roleId, roleName, roleDesc, builtIn) values (1, 'Administrators', 'Manage the whole system', 1)
insert into roles (roleId, roleName, roleDesc, builtIn) values (2, 'Report Designers', 'Design report templates', 1)
insert into roles (roleId, roleName, roleDesc, builtIn) values (3, 'Dept Admin', 'Manage a department and all below it', 1)
insert into roles (roleId, roleName, roleDesc, builtIn) values (4, 'Report Owners', 'Own report templates', 1)
insert into roles (roleId, roleName, roleDesc, builtIn) values (5, 'Process Admin', 'Manage processes', 1)
insert into roles (roleId, roleName, roleDesc, builtIn) values (6, 'Notice Admin', 'Manage notices', 1)
set identity_insert roles off
go

-- Jobs 3 and 4 stand for roles 4 and 3, in this order.
set identity_insert jobs on
insert into jobs (jobId, roleId, deptId) values (1, 1, 1)
insert into jobs (jobId, roleId, deptId) values (2, 2, 1)
insert into jobs (jobId, roleId, deptId) values (3, 4, 1)
insert into jobs (jobId, roleId, deptId) values (4, 3, 1)
set identity_insert jobs off
go

-- The administrator stays locked until a first password is set.
set identity_insert users on
insert into users (userId, userName, userLogin, userPwd, isAbstract, isRole, deptId, accstate, lockDate)
  values (1, 'Administrator', 'Admin', '', 1, 0, 1, 1, getdate())
set identity_insert users off
insert into userJob (userId, jobId) values (1, 1)
go

insert into idRule (idName, preFix, ymdStyle, noStyle, reuseStyle, nws, predefined) values ('_ses', '', 3, 6, 0, 0, 1)
insert into idRule (idName, preFix, ymdStyle, noStyle, reuseStyle, nws, predefined) values ('_log', '', 3, 8, 0, 0, 1)
insert into idRule (idName, preFix, ymdStyle, noStyle, reuseStyle, nws, predefined) values ('_RC', 'RC', 3, 6, 0, 0, 1)
go

insert into homeinfo (id, companyName) values (1, 'Company')
insert into QVTmpSafe (protectPwd) values ('')
insert into sysinfo (release) values ('8.1')
go
