-- The system database from layout 1 to layout 2. The embedded engine runs it by itself when it opens an installation of
-- layout 1. On SQL Server it may be run once, by hand: the library works without it, sign-ons and the chains of departments
-- are faster with it.

-- The organisation of a department is looked for among those that are one.
create index departments_isOrg on departments (isOrg)
go

-- The two views below went through the whole tree for any one job.
drop view QV_v_JobDeptPath
go
drop view QV_v_JobDeptPathWithLevel
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
